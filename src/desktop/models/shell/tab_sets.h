#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace fotomill::desktop {

// Named sets of tabs: files "NAME.fmwtabset" in the data folder, as session.h describes them.
// TabsetCurrentName names the one in use, to which the tabs of this run are written in the end.

// The names of all sets, in order.
std::vector<std::string> TabSetNames();
// The file of a set; empty for a name that no file can have.
std::string TabSetFile(std::string_view name);
// The name of the set in use.
std::string CurrentTabSet();
// Whether there is a set of that name.
bool HasTabSet(std::string_view name);
// False when the file is still there.
[[nodiscard]] bool DeleteTabSet(std::string_view name);

}  // namespace fotomill::desktop
