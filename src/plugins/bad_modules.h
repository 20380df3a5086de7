#pragma once

#include <string>

namespace fotomill {

// Modules that crashed or exited their process while loading, so that they do not do so at every
// start. Stored in a text file in the data folder, one line each: size, time and path of the module
// file. A module whose file has changed is tried again.

// Path of the list; empty without a data folder.
std::string BadModuleFile();
// A module's line, without line ending; empty if the path cannot be stored in a line.
std::string BadModuleLine(const std::string& path);
// Whether the module, in its current state, is listed.
bool IsBadModule(const std::string& path);
// Adds a module, in its current state, to the list. It is no loss if the list cannot be written.
void RecordBadModule(const std::string& path);
// Removes a module from the list by file name, so that it is tried again. False if the list cannot
// be written.
[[nodiscard]] bool ForgiveModule(const std::string& name);

}  // namespace fotomill
