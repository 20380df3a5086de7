#pragma once

#include <sys/wait.h>
#include <unistd.h>

namespace fotomill::test {

// Runs `body` in a process of its own and returns its wait status; a body that returns has exit
// status 0, one that throws ends by the signal of abort. Checks of GoogleTest inside it reach
// nobody: it tells by its exit status.
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
