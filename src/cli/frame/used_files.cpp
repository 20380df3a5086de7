#include "cli/frame/used_files.h"

#include "platform/clock.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "settings/settings.h"

namespace fotomill::cli {

void UsedFiles::Add(const std::string& name) {
  const auto function = static_cast<uint32_t>(function_);
  const bool recorded = (static_cast<uint32_t>(settings.FileHistoryFunctions) >> function & 1) != 0;
  if (!on_ || !recorded) return;
  const std::string_view fileName = platform::FileNameOf(name);
  const std::string folder = name.substr(0, name.size() - fileName.size());
  if (uses_.empty() || folder != folder_) {  // batches have many files per folder
    folder_ = folder;
    absoluteFolder_ = platform::AbsolutePath(folder.empty() ? "." : folder);
  }
  uses_.push_back({platform::JoinFolder(absoluteFolder_, fileName), function_, kOwnTime,
                   static_cast<int32_t>(platform::Now()), false});
}

}  // namespace fotomill::cli
