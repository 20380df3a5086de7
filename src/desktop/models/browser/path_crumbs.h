#pragma once

#include <cstddef>
#include <span>
#include <string>
#include <vector>

namespace fotomill::desktop {

// One folder on the way to another.
struct Crumb {
  std::string label;
  std::string folder;

  bool operator==(const Crumb&) const = default;
};

// The folders on the way to a folder given by its absolute path, the root first, the folder itself
// last.
std::vector<Crumb> CrumbsOf(const std::string& folder);

// How a typed path may continue, with the names of the folders in the folder that it names: whole
// paths in their order, those of equal case first. None for a path that is complete: it ends in a
// separator, or in one of the names.
std::vector<std::string> Completions(const std::string& typed,
                                     const std::vector<std::string>& names);

// Crumbs so wide are put into a room from the last one on; where not all of them fit, a button
// `more` wide stands for the others. The first one shown; the last one always is.
size_t FirstCrumbShown(std::span<const int> widths, int room, int more);

}  // namespace fotomill::desktop
