#include "desktop/models/files/open_wildcard.h"

#include <algorithm>

#include "core/text.h"
#include "registry/registry.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

std::string OpenWildcard() {
  std::string wildcard;
  for (const FilterPair& pair : OpenFileFilter()) {
    std::string description = Tr(pair.description);
    std::ranges::replace(description, '|', ' ');  // the separator may occur in plug-in texts
    wildcard += (wildcard.empty() ? "" : "|") + description + "|" + pair.patterns + ";" +
                LowerCase(pair.patterns);
  }
  return wildcard;
}

int FirstOpenFilter() {
  const int32_t kept = settings.OpenFilterIndex;
  return kept >= 0 && static_cast<size_t>(kept) < OpenFileFilter().size() ? kept : 0;
}

}  // namespace fotomill::desktop
