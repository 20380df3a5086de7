#include "platform/paths.h"

namespace fotomill::platform {

std::string JoinPath(const PathParts& parts) {
  std::string path;
  path.reserve(parts.drive.size() + parts.folder.size() + parts.base.size() +
               parts.extension.size());
  path.append(parts.drive).append(parts.folder).append(parts.base).append(parts.extension);
  return path;
}

std::string FolderOf(std::string_view path) {
  const PathParts parts = SplitPath(path);
  return std::string(parts.drive).append(parts.folder);
}

std::string JoinFolder(std::string_view folder, std::string_view name) {
  std::string path(folder);
  if (!path.empty() && path.back() != kSeparator) path += kSeparator;
  return path.append(name);
}

std::string_view FileNameOf(std::string_view path) {
  const PathParts parts = SplitPath(path);
  return path.substr(parts.drive.size() + parts.folder.size());
}

std::string_view ExtensionOf(std::string_view path) {
  const std::string_view extension = SplitPath(path).extension;
  return extension.empty() ? extension : extension.substr(1);
}

}  // namespace fotomill::platform
