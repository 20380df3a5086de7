#pragma once

#include <string>
#include <vector>

namespace fotomill::platform {

// The program registered for a file, as an argument vector that opens it; empty if there is none.
std::vector<std::string> ProgramFor(const std::string& file);
// Starts a program with its arguments, without a shell. A name without separator is looked up in
// the absolute folders of PATH, never in the current one. `wait` blocks until it has ended; without
// it the program lives on its own, away from this one's terminal input, output and Ctrl-C. False
// when it cannot start.
[[nodiscard]] bool RunProgram(const std::vector<std::string>& arguments, bool wait);

// Gives the standard streams that the program was started without a place that holds nothing and
// takes nothing; a file that is opened later would else stand in for one of them, and get its
// messages. Before anything is opened.
void FillStandardStreams();
bool IsTerminal(int stream);  // 0 standard input, 1 output, 2 error
// Whether no one reads what is written to a stream any more: a pipe whose other end is closed.
bool IsReaderGone(int stream);
bool IsStored(int stream);    // goes to a regular file: no one waits for what is written
// Waits until the standard input has something to read, or has ended. False when the program was
// asked to end meanwhile.
bool WaitForInput();
// Whether what is typed on the terminal of the standard input shows up there. False if there is no
// such terminal.
bool ShowTyping(bool show);
// Gives an environment variable a value, for this program and those that it starts. Before other
// threads run.
void SetVariable(const char* name, const std::string& value);
int TerminalWidth();   // columns, 80 when unknown
unsigned CoreCount();  // cores this process may use, at least 1

// From here on Ctrl-C and the system's request to end are remembered instead of ending the program
// at once, and `PendingExit` returns the exit status that belongs to them: 130 or 143, 0 while
// nothing was asked. A second request ends the program at once; temporary files go anyway. A
// request that was ignored when the program started (nohup) stays ignored. Writing to a pipe that
// no one reads any more fails from here on, instead of ending the program.
void CatchTermination();
int PendingExit();  // 130 or 143; 0 while nothing was asked

}  // namespace fotomill::platform
