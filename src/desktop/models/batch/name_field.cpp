#include "desktop/models/batch/name_field.h"

#include "core/text.h"
#include "platform/paths.h"

namespace fotomill::desktop {

std::string NameInField(const std::string& path, const std::string& folder) {
  const platform::PathParts parts = platform::SplitPath(path);
  const std::string own = platform::FolderOf(path);
  return own == folder ? std::string(parts.base) : own + std::string(parts.base);
}

std::string PathOfField(const std::string& text, const std::string& extension,
                        const std::string& offered) {
  const std::string folder = platform::FolderOf(offered);
  // a name that ends like the extension is not cut if it was only confirmed
  if (text == NameInField(offered, folder)) return offered;
  if (text.empty()) return {};
  const bool typed = EqualIgnoringCase(platform::ExtensionOf(text), extension);
  const std::string name = typed ? text : text + "." + extension;
  const bool relative =
      platform::SplitPath(name).drive.empty() && !name.starts_with(platform::kSeparator);
  return relative ? platform::JoinFolder(folder, name) : name;
}

}  // namespace fotomill::desktop
