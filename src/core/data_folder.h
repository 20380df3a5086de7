#pragma once

#include <string>
#include <string_view>

namespace fotomill {

// The folder of the configuration file, the global thumbnail database, the file history and the
// history lists, without a trailing separator: the one given to SetDataFolder, else the environment
// variable FOTOMILL_DATA, else "Brantwick" in the user's application data. Empty if the system has
// no such folder. It may not exist yet.
const std::string& DataFolder();

// Sets the data folder, once at start-up; empty leaves the choice to the environment and the
// system. A relative path is relative to the current folder.
void SetDataFolder(const std::string& folder);

// The path of a file in the data folder; empty without a data folder, or if the path would exceed
// 260 bytes, which nothing could open.
std::string DataFile(std::string_view name);

}  // namespace fotomill
