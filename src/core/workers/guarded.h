#pragma once

#include <type_traits>

#include "core/status.h"

namespace fotomill {

// Runs a piece of work, and is the one place where an exception becomes a status:
// MemoryAllocationError, since a lack of memory is what libraries and containers throw for.
// Otherwise what the work returns, Ok where it returns nothing.
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
