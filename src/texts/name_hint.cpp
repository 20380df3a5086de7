#include "texts/name_hint.h"

#include "core/nearest_name.h"
#include "texts/texts.h"

namespace fotomill {

std::string NearestNameHint(std::string_view typed, std::span<const std::string_view> names) {
  const std::string_view nearest = NearestName(typed, names);
  return nearest.empty() ? std::string()
                         : std::string(" ").append(Tr("Did you mean \"%1\"?", nearest));
}

}  // namespace fotomill
