#pragma once

#include <optional>
#include <string>

#include "core/workers/worker_pool.h"

namespace fotomill {

// Marks a task as working with a file for its lifetime. On a network folder or a disc, which may
// hang for minutes, the task releases its core of the pool. Finding out where the file is may hang
// as well, and is also done without a core.
class FolderScope {
 public:
  explicit FolderScope(const std::string& path);  // `path` decides whether the core is released

 private:
  std::optional<CoreRelease> release_;
};

}  // namespace fotomill
