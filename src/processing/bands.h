#pragma once

#include <cstdint>
#include <functional>

#include "core/status.h"

namespace fotomill {

// Threading and cancellation for an operation.
struct Work {
  // 1: run on the calling thread; 0: on all free cores. Does not affect the result
  uint32_t threads = 1;
  std::function<bool()> goesOn = {};  // polled between bands; false: stop. Empty: never stop

  bool GoesOn() const { return !goesOn || goesOn(); }  // false if the caller has canceled
};

// Computes rows first to end - 1 of a result.
using BandFunction = std::function<Status(int32_t first, int32_t end)>;

// Splits `rows` rows into bands of at least `least` rows and calls `band` for
// each. Bands may run concurrently and in any order, so a band must write only
// its own rows and read nothing another band writes. Band boundaries depend on
// the number of cores, so the contents of a row must not depend on its band.
// FunctionCancelled (4) if the work was stopped, MemoryAllocationError (6) if
// a band ran out of memory, else the first status of a band that is not Ok.
Status ForBands(int32_t rows, int32_t least, const Work& work, const BandFunction& band);

}  // namespace fotomill
