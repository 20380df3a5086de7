#include "desktop/models/batch/name_field.h"

#include "core/text.h"
#include "platform/paths.h"

namespace fotomill::desktop {

std::string NameInField(const std::string& path, const std::string& folder) {
  const platform::PathParts parts = platform::SplitPath(path);
  const std::string own = platform::FolderOf(path);
  return own == folder ? std::string(parts.base) : own + std::string(parts.base);
}

std::string PathOfField(const std::string& text, const std::string& extension) {
  const bool typed = EqualIgnoringCase(platform::ExtensionOf(text), extension);
  return text.empty() || typed ? text : text + "." + extension;
}

}  // namespace fotomill::desktop
