#pragma once

#include <mutex>
#include <string>

#include "platform/module_guard.h"

namespace fotomill {

// Phase of a module call. A module that ends the program while loading would do so at every start,
// so it is recorded (bad_modules.h).
enum class ModuleStage { Loading, Working };

// Held during every call into a module: modules need not be reentrant, so calls are serialized, and
// a module that ends the program is reported by name (platform/module_guard.h).
class ModuleCall {
 public:
  ModuleCall(const std::string& modulePath, ModuleStage stage);

 private:
  std::lock_guard<std::recursive_mutex> lock_;
  platform::ModuleGuard guard_;
};

}  // namespace fotomill
