#pragma once

#include <string>
#include <vector>

#include "files/file_operation.h"
#include "metadata/tags/tag_edit.h"

namespace fotomill::desktop {

// How to change tags; take it on the main thread.
struct TagFilesOptions {
  bool commentFiles = false;
  TagSources sources = {};
};
TagFilesOptions TagFilesOptionsFromSettings();

// Changes the tags of pictures and keeps the old contents of their files and sidecars. Files that
// need no change are neither steps nor failures. May take long; any thread.
FileOperationResult TagFiles(const std::vector<std::string>& paths, const TagChanges& changes,
                             const TagFilesOptions& options, const FileOperationProgress& progress);

}  // namespace fotomill::desktop
