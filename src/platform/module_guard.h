#pragma once

#include <string>

namespace fotomill::platform {

// What to do if a module's code ends the program, by a crash or by calling exit().
struct ModuleRisk {
  std::string message;     // for standard error
  std::string recordFile;  // gets `record` as a new line; empty: not recorded
  std::string record;
};

// Marks this thread as running a module's code, for the lifetime of the guard. If the module
// crashes or calls exit() meanwhile, the message is printed, temporary files are deleted, and the
// program exits with the signal's status or 1, never with success. _exit() is not caught. Guards of
// one thread may be nested: the innermost applies.
class ModuleGuard {
 public:
  explicit ModuleGuard(ModuleRisk risk);
  ~ModuleGuard();
  ModuleGuard(const ModuleGuard&) = delete;
  ModuleGuard& operator=(const ModuleGuard&) = delete;

 private:
  const ModuleRisk risk_;
  const ModuleRisk* before_;
};

// Suspends the guard of this thread while a module calls back into the program.
class OwnCode {
 public:
  OwnCode();
  ~OwnCode();
  OwnCode(const OwnCode&) = delete;
  OwnCode& operator=(const OwnCode&) = delete;

 private:
  const ModuleRisk* before_;
};

}  // namespace fotomill::platform
