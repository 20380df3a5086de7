#pragma once

#include <cstdint>
#include <functional>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "core/workers/worker_pool.h"

namespace fotomill {

// Does parts 0 to `parts` - 1 of a computation, in any order, on the calling thread and on those of
// the pool that have nothing else to do: on all cores where the program is about one picture, on
// one where it is about many. The status of a part that is not Ok ends it; MemoryAllocationError
// when a part ran out of memory, FunctionCancelled when `stop` was asked before the last part
// began.
Status ShareOut(int32_t parts, const std::function<Status(int32_t part)>& work,
                const StopToken& stop = {}, WorkerPool& pool = WorkerPool::Shared());

}  // namespace fotomill
