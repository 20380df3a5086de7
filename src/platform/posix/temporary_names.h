#pragma once

#include <string>

namespace fotomill::platform {

// Names of files that must not outlive the program, for the moment when a second Ctrl-C ends it
// without the owners being asked. The table is fixed and may be walked inside a signal handler;
// what does not fit into it is simply not listed.

// Lists a file that this process has just created. The number is for LeaveTemporaryName; -1 when
// the table is full.
int EnterTemporaryName(const std::string& path);
void LeaveTemporaryName(int number);
// Deletes what is listed. For signal handlers and nothing else.
void DeleteListedTemporaries();

}  // namespace fotomill::platform
