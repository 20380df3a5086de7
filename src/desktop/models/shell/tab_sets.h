#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace fotomill::desktop {

// Named tab sets: files "NAME.fmwtabset" in the data folder; see session.h for the format.
// TabsetCurrentName is the current one, to which the tabs are saved on exit.

// All names, sorted.
std::vector<std::string> TabSetNames();
// Path of a set; empty if the name is invalid.
std::string TabSetFile(std::string_view name);
// Name of the current set.
std::string CurrentTabSet();
// Whether a set exists.
bool HasTabSet(std::string_view name);
// False if the file still exists.
[[nodiscard]] bool DeleteTabSet(std::string_view name);

}  // namespace fotomill::desktop
