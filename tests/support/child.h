#pragma once

#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>

namespace fotomill::test {

// Runs `body` in a child process and returns its wait status: exit
// status 0 if it returns, SIGABRT if it throws. GoogleTest failures
// in the child are not reported, so it must use its exit status.
template <typename Body>
int InChild(Body body) noexcept {
  const pid_t child = fork();
  if (child == 0) {
    body();
    _exit(0);
  }
  int status = -1;
  waitpid(child, &status, 0);
  return status;
}

// Whether this process has children, running or not yet reaped.
inline bool HasChildren() { return waitpid(-1, nullptr, WNOHANG) >= 0 || errno != ECHILD; }

}  // namespace fotomill::test
