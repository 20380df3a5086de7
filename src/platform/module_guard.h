#pragma once

#include <string>

namespace fotomill::platform {

// What happens when the code of a module ends the program, by a crash or by calling exit().
struct ModuleRisk {
  std::string message;     // for the standard error
  std::string recordFile;  // gets `record` as a line of its own; empty: nothing is recorded
  std::string record;
};

// Marks this thread as running the code of a module, from here to the end of the guard's life. If
// the module crashes or calls exit() meanwhile, the message is printed, temporary files are
// deleted, and the program ends with the signal's status or 1, never with success. A module that
// calls _exit() gets away. Guards of one thread may be nested: the last one counts.
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

// Takes the mark from this thread while a module has called back into the program.
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
