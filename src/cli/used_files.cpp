#include "cli/used_files.h"

#include "core/settings.h"
#include "platform/clock.h"
#include "platform/folders.h"

namespace fotomill::cli {

void UsedFiles::Add(const std::string& name) {
  if ((settings.FileHistoryFunctions >> static_cast<int32_t>(function_) & 1) == 0) return;
  uses_.push_back({platform::AbsolutePath(name), function_, kOwnTime, static_cast<int32_t>(platform::Now()), false});
}

}  // namespace fotomill::cli
