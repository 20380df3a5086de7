#pragma once

#include <string>

namespace fotomill {

// Modules that ended the program while they were loaded, so that this happens once and not at every
// start. They are in a text file of the data folder, one line for each: size and time of the module
// file, its path. A module whose file has changed since is tried again.

// The file; empty without a data folder.
std::string BadModuleFile();
// A module's line, without its end; empty for a path that no line can hold.
std::string BadModuleLine(const std::string& path);
// Whether the module as it is now is in the file.
bool IsBadModule(const std::string& path);
// Takes a module out of the file, by its file name: it is tried again. False when the file cannot
// be written.
[[nodiscard]] bool ForgiveModule(const std::string& name);

}  // namespace fotomill
