#pragma once

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "batch/rewrite/rewrite_run.h"

namespace fotomill::desktop {

class Shell;

// Rewrites files in the frame's batch runner; they can be undone. In place, or in `folder`, which
// is not empty then. `done` is called on the window's thread with whether there were errors, unless
// `alive` has expired.
void RunRewriteBatch(Shell& shell, const std::vector<std::string>& files, RewriteFunction function,
                     const std::string& folder, const std::weak_ptr<bool>& alive,
                     std::function<void(bool errors)> done);

}  // namespace fotomill::desktop
