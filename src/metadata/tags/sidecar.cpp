#include "metadata/tags/sidecar.h"

#include "core/text.h"
#include "metadata/xmp/xmp_tags.h"
#include "platform/existence.h"
#include "platform/file_view.h"
#include "platform/paths.h"

namespace fotomill {

std::vector<std::string> SidecarNames(const std::string& picture) {
  const platform::PathParts parts = platform::SplitPath(picture);
  std::vector<std::string> names = {picture + ".xmp"};
  if (!parts.extension.empty()) {
    names.push_back(platform::JoinPath({parts.drive, parts.folder, parts.base, ".xmp"}));
  }
  return names;
}

std::string FindSidecar(const std::string& picture) {
  const std::vector<std::string> names = SidecarNames(picture);
  if (platform::ExistenceOf(names[0]) == platform::Existence::Yes) return names[0];
  if (names.size() < 2 || names[1] == picture ||
      platform::ExistenceOf(names[1]) != platform::Existence::Yes)
    return {};
  platform::FileView file;
  XmpTags tags;
  if (file.Open(names[1]) && ReadXmpTags(file.Bytes(), tags) == Status::Ok &&
      !tags.sidecarFor.empty() &&
      !EqualIgnoringCase(tags.sidecarFor, platform::ExtensionOf(picture)))
    return {};
  return names[1];
}

std::string CommentFileName(const std::string& picture, const std::string& folder,
                            const std::string& extension) {
  const std::string name = std::string(platform::FileNameOf(picture)) + "." + extension;
  return platform::JoinFolder(folder.empty() ? platform::FolderOf(picture) : folder, name);
}

}  // namespace fotomill
