#pragma once

#include <string>
#include <vector>

namespace fotomill::platform {

// The program registered for a file, as an argument vector that opens it; empty when there is none.
std::vector<std::string> ProgramFor(const std::string& file);
// Starts a program with its arguments, without a shell. `wait` blocks until it has ended. False when it cannot start.
[[nodiscard]] bool RunProgram(const std::vector<std::string>& arguments, bool wait);

bool IsTerminal(int stream);  // 0 standard input, 1 output, 2 error
int TerminalWidth();          // columns, 80 when unknown
unsigned CoreCount();
// Sets a flag when the user (Ctrl-C) or the system asks the program to end; returns the exit status that belongs to it
// through `PendingExit`: 130 or 143, 0 while nothing was asked.
void CatchTermination();
int PendingExit();

}  // namespace fotomill::platform
