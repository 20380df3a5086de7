#pragma once

#include <cstdint>
#include <functional>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "core/workers/worker_pool.h"

namespace fotomill {

// Runs parts 0 to `parts` - 1 of a computation, in any order, on the calling
// thread and on idle threads of the pool: on all cores when the program
// works on one picture, on one when it works on many. The first status other
// than Ok ends it; MemoryAllocationError if a part ran out of memory,
// FunctionCancelled if `stop` was requested before the last part began.
Status ShareOut(int32_t parts, const std::function<Status(int32_t part)>& work,
                const StopToken& stop = {}, WorkerPool& pool = WorkerPool::Shared());

}  // namespace fotomill
