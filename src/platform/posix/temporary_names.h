#pragma once

#include <string>

namespace fotomill::platform {

// Names of files to delete when a second Ctrl-C ends the program without running destructors.
// The table has a fixed size and is safe to read in a signal handler; names that do not fit
// are not listed.

// Lists a file that this process has just created. Returns the number for LeaveTemporaryName; -1 if
// the table is full.
int EnterTemporaryName(const std::string& path);
void LeaveTemporaryName(int number);
// Deletes all listed files. For signal handlers only.
void DeleteListedTemporaries();

}  // namespace fotomill::platform
