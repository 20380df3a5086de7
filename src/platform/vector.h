#pragma once

// Functions for processors beyond the build's baseline. Code between VECTOR_AVX2_BEGIN and
// VECTOR_AVX2_END is compiled for AVX2 if the compiler supports it (VECTOR_HAS_AVX2 is 1), and may
// be called if HasAvx2() is true. Nothing that baseline code uses as well, such as standard
// headers, may be included there.

// Before a loop that writes an element and
// reads only later ones: it may be vectorized.
#if defined(__clang__)
#define VECTOR_READS_AHEAD _Pragma("clang loop vectorize(assume_safety)")
#else
#define VECTOR_READS_AHEAD _Pragma("GCC ivdep")
#endif

#if defined(__x86_64__)
#include <immintrin.h>
#define VECTOR_HAS_AVX2 1
#if defined(__clang__)
#define VECTOR_AVX2_BEGIN \
  _Pragma("clang attribute push(__attribute__((target(\"avx2\"))), apply_to = function)")
#define VECTOR_AVX2_END _Pragma("clang attribute pop")
#else
#define VECTOR_AVX2_BEGIN _Pragma("GCC push_options") _Pragma("GCC target(\"avx2\")")
#define VECTOR_AVX2_END _Pragma("GCC pop_options")
#endif
#else
#define VECTOR_HAS_AVX2 0
#endif

namespace fotomill::platform {

// Whether this processor and operating system support AVX2.
inline bool HasAvx2() {
#if VECTOR_HAS_AVX2
  static const bool has = __builtin_cpu_supports("avx2");
  return has;
#else
  return false;
#endif
}

}  // namespace fotomill::platform
