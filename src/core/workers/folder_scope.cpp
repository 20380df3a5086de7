#include "core/workers/folder_scope.h"

#include "platform/paths.h"
#include "platform/volumes.h"

namespace fotomill {

FolderScope::FolderScope(const std::string& path) {
  if (!CoreRelease::HoldsCore()) return;
  // Consecutive files are mostly in the same folder.
  thread_local std::string lastFolder;
  thread_local bool lastIsSlow = false;
  const platform::PathParts parts = platform::SplitPath(path);
  const bool here = parts.drive.empty() && parts.folder.empty();
  std::string folder =
      here ? std::string(".") : std::string(parts.drive) + std::string(parts.folder);
  if (folder != lastFolder) {
    release_.emplace();
    const platform::DriveKind kind = platform::VolumeOf(folder).kind;
    lastIsSlow = kind == platform::DriveKind::Network || kind == platform::DriveKind::Optical;
    lastFolder = std::move(folder);
  }
  if (lastIsSlow) {
    if (!release_) release_.emplace();
  } else {
    release_.reset();
  }
}

}  // namespace fotomill
