#pragma once

#include <cstddef>
#include <span>
#include <string>
#include <vector>

namespace fotomill::desktop {

// A folder in a path.
struct Crumb {
  std::string label;
  std::string folder;

  bool operator==(const Crumb&) const = default;
};

// The folders in an absolute path, from
// the root to the folder itself.
std::vector<Crumb> CrumbsOf(const std::string& folder);

// Completions of a typed path, given the names in its folder: full paths in the same order, but
// those with matching case first. Empty if the path is complete: it ends with a separator or one of
// the names.
std::vector<std::string> Completions(const std::string& typed,
                                     const std::vector<std::string>& names);

// The first crumb to show: as many of the last ones as fit in `room`, at least one. If not all fit,
// a button of width `more` replaces the others.
size_t FirstCrumbShown(std::span<const int> widths, int room, int more);

}  // namespace fotomill::desktop
