#pragma once

#include <optional>
#include <string>

#include "core/workers/worker_pool.h"

namespace fotomill {

// For its lifetime, a task works with a file: where that is on a network folder or a disc, which
// may hang for minutes, the task keeps no core of the pool busy. Asking where it is may hang as
// well, and keeps none busy either.
class FolderScope {
 public:
  explicit FolderScope(const std::string& path);  // the place of `path` decides

 private:
  std::optional<CoreRelease> release_;
};

}  // namespace fotomill
