#pragma once

// SIMD on 16 bytes at a time for x86 processors with byte shuffles (SSSE3,
// in all of them since 2008). Functions that use it are marked BYTE_SHUFFLE,
// enclosed in `#ifdef BYTE_SHUFFLE`, and called only if CanShuffleBytes(); a
// scalar loop with the same result covers all other processors.
#if defined(__x86_64__) || defined(__i386__)
#include <tmmintrin.h>

#define BYTE_SHUFFLE __attribute__((target("ssse3,popcnt")))

namespace fotomill {

// Whether this processor can run functions marked BYTE_SHUFFLE.
inline bool CanShuffleBytes() {
  static const bool can = __builtin_cpu_supports("ssse3") && __builtin_cpu_supports("popcnt");
  return can;
}

}  // namespace fotomill
#endif
