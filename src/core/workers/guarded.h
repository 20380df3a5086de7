#pragma once

#include <type_traits>

#include "core/status.h"

namespace fotomill {

// Runs `work`, turning exceptions into a status; the only place that does. The status is
// MemoryAllocationError, because libraries and containers throw only for lack of memory. Otherwise
// returns the result of `work`, or Ok if it returns void.
template <typename Work>
Status Guarded(Work&& work) noexcept {
  try {
    if constexpr (std::is_void_v<std::invoke_result_t<Work&>>) {
      work();
      return Status::Ok;
    } else {
      return work();
    }
  } catch (...) {
    return Status::MemoryAllocationError;
  }
}

}  // namespace fotomill
