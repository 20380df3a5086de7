#pragma once

#include <mutex>
#include <string>

#include "platform/module_guard.h"

namespace fotomill {

// When the code of a module runs. What ends the program while a module is loaded would end it at
// every start, so it is remembered (bad_modules.h).
enum class ModuleStage { Loading, Working };

// Held during every call into a module: modules need not be re-entrant, so there is one call at a
// time, and a module that ends the program is named (platform/module_guard.h).
class ModuleCall {
 public:
  ModuleCall(const std::string& modulePath, ModuleStage stage);

 private:
  std::lock_guard<std::recursive_mutex> lock_;
  platform::ModuleGuard guard_;
};

}  // namespace fotomill
