#pragma once

#include <functional>
#include <string>
#include <vector>

#include "core/workers/stop_token.h"

namespace fotomill::desktop {

// What a walk through folders meets.
struct FolderWalk {
  // The files that a browser would list in a folder, in natural order; relative to the first one.
  std::function<void(const std::vector<std::string>& names)> files;
  // A folder cannot be read: why, in sentences.
  std::function<void(const std::string& problem)> problem;
};

// Walks through a folder and, on request, its subfolders: each one's files before its folders.
// Hidden files and folders are left out, links to folders not followed.
void WalkFolder(const std::string& folder, bool subfolders, const StopToken& stop,
                const FolderWalk& walk);

}  // namespace fotomill::desktop
