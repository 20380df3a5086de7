#pragma once

// Sixteen bytes at a time on x86 processors that can pick bytes by a table of indices (SSSE3, in
// all since 2008). Functions that use it are marked BYTE_SHUFFLE, are between `#ifdef BYTE_SHUFFLE`
// lines, and run only where CanShuffleBytes() says so; a plain loop beside them does the same work
// everywhere.
#if defined(__x86_64__) || defined(__i386__)
#include <tmmintrin.h>

#define BYTE_SHUFFLE __attribute__((target("ssse3,popcnt")))

namespace fotomill {

// Whether functions marked BYTE_SHUFFLE may be called on this processor.
inline bool CanShuffleBytes() {
  static const bool can = __builtin_cpu_supports("ssse3") && __builtin_cpu_supports("popcnt");
  return can;
}

}  // namespace fotomill
#endif
