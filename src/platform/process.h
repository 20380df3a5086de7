#pragma once

#include <optional>
#include <string>
#include <vector>

namespace fotomill::platform {

// The default program for a file, as an argument vector to open it; empty if there is none.
std::vector<std::string> ProgramFor(const std::string& file);
// Starts a program without a shell. A name without separator is looked up
// in the absolute folders of PATH, never in the current folder. `wait`
// blocks until it exits; otherwise it is detached from this program's
// terminal input, output and Ctrl-C. False if it cannot be started.
[[nodiscard]] bool RunProgram(const std::vector<std::string>& arguments, bool wait);

// Starts a program as above, waits for it, and returns its exit status; nullopt if it could not be
// started or was killed.
[[nodiscard]] std::optional<int> RunAndWait(const std::vector<std::string>& arguments);

// Opens the null device for closed standard streams;
// otherwise a file opened later would take the place of one
// and receive its messages. Call before opening anything.
void FillStandardStreams();
bool IsTerminal(int stream);  // 0 standard input, 1 output, 2 error
// Whether writing to a stream is pointless: a pipe with its read end closed.
bool IsReaderGone(int stream);
bool IsStored(int stream);    // redirected to a regular file, so no one is waiting for output
// Waits until standard input has data or has ended. False if the program was asked
// to end meanwhile.
bool WaitForInput();
// Switches terminal echo for standard input.
// False if it is not a terminal.
bool ShowTyping(bool show);
// Sets an environment variable for this program and its child processes. Call
// before starting threads.
void SetVariable(const char* name, const std::string& value);
int TerminalWidth();   // columns, 80 when unknown
unsigned CoreCount();  // cores this process may use, at least 1

// From now on, Ctrl-C and termination requests are recorded instead of ending the program, and
// `PendingExit` returns the exit status for them: 130 or 143, 0 without a request. A second
// request ends the program at once, still deleting temporary files. A request that was ignored at
// start (nohup) stays ignored. Writing to a pipe without a reader fails from now on instead of
// ending the program.
void CatchTermination();
int PendingExit();  // 130 or 143; 0 without a request

}  // namespace fotomill::platform
