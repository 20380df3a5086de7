#pragma once

#include <string>
#include <string_view>

namespace fotomill {

// The folder of the configuration file, the global thumbnail database, the file history and the
// history lists, without a closing separator: the folder given to SetDataFolder, else the
// environment variable FOTOMILL_DATA, else "Brantwick" in the user's application data. Empty when
// the system has no such place. It need not exist yet.
const std::string& DataFolder();

// Chooses the data folder once at start-up; an empty text leaves the choice to environment and
// system. A relative folder counts from the current one.
void SetDataFolder(const std::string& folder);

// The path of a file in the data folder; empty without one, or when the path would be longer than
// 260 bytes, which nothing can open then.
std::string DataFile(std::string_view name);

}  // namespace fotomill
