#pragma once

#include <cstddef>
#include <functional>
#include <span>
#include <string>
#include <vector>

#include "files/rename_log.h"

namespace fotomill {

// A step of a plan: renames the file `index` of the list, perhaps to a spare name first.
struct RenameStep {
  size_t index = 0;
  std::string from, to;
};
// Steps of one file, or of several files that exchange their names in a circle: all or none.
using RenameGroup = std::vector<RenameStep>;

// Orders renames so that each new name is free by the time it is needed, although files of the list
// may have it now. Paths are absolute, old ones are different, and no file keeps its name. Of
// several files with the same new name, all but the first come last. A circle takes a detour over
// `spareName`, a free name in the folder of the given path.
std::vector<RenameGroup> PlanRenames(
    std::span<const RenamedFile> files,
    const std::function<std::string(const std::string& path)>& spareName);

// What is left to undo of the steps of a log, in the order of the files' first steps: from the
// first name of each file to its present one. Leaves out steps that did not happen, as the program
// was ended first, by asking `exists` for their names.
std::vector<RenamedFile> RenamesToUndo(std::span<const RenamedFile> steps,
                                       const std::function<bool(const std::string& path)>& exists);

}  // namespace fotomill
