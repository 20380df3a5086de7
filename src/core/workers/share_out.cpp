#include "core/workers/share_out.h"

#include <algorithm>
#include <atomic>

#include "core/workers/guarded.h"

namespace fotomill {

Status ShareOut(int32_t parts, const std::function<Status(int32_t part)>& work,
                const StopToken& stop, WorkerPool& pool) {
  std::atomic<int32_t> next{0};
  std::atomic<Status> result{Status::Ok};
  const auto step = [&] {
    if (result != Status::Ok) return false;
    const int32_t part = next++;
    if (part >= parts) return false;
    const Status status =
        stop.Asked() ? Status::FunctionCancelled : Guarded([&] { return work(part); });
    Status none = Status::Ok;
    if (status != Status::Ok) result.compare_exchange_strong(none, status);
    return status == Status::Ok;
  };
  const auto most =
      static_cast<unsigned>(std::clamp<int64_t>(int64_t{parts} - 1, 0, pool.Cores() - 1));
  {
    const Helpers helpers(pool, most, step);
    while (step()) {
    }
  }
  return result;
}

}  // namespace fotomill
