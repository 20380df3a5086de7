#pragma once

#include <sys/wait.h>
#include <unistd.h>

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

}  // namespace fotomill::test
