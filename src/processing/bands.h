#pragma once

#include <cstdint>
#include <functional>

#include "core/status.h"

namespace fotomill {

// What an operation needs to know about the work around it.
struct Work {
  // 1: on the calling thread; 0: on all cores that are free. Results never depend on it
  uint32_t threads = 1;
  std::function<bool()> goesOn = {};  // asked between bands; false: stop. Empty: never stop

  bool GoesOn() const { return !goesOn || goesOn(); }  // false once the caller has given up
};

// Rows first to end - 1 of a result.
using BandFunction = std::function<Status(int32_t first, int32_t end)>;

// Cuts `rows` rows into bands of at least `least` rows and calls `band` for each. Bands may run at
// the same time on several threads and in any order, so a band writes its own rows only and reads
// nothing that another band writes. Where bands begin depends on the number of cores: what a row
// becomes must not depend on the band it is in. FunctionCancelled (4) when the work was stopped,
// MemoryAllocationError (6) when a band ran out of memory, else the first status of a band that is
// not Ok.
Status ForBands(int32_t rows, int32_t least, const Work& work, const BandFunction& band);

}  // namespace fotomill
