#pragma once

#include <concepts>
#include <cstdint>

namespace fotomill {

// Arithmetic on numbers that a file claims: false when the result does not fit, and then `result`
// is unspecified.
template <std::integral T>
[[nodiscard]] constexpr bool CheckedAdd(T a, T b, T& result) {
  return !__builtin_add_overflow(a, b, &result);
}
// False when the product overflows.
template <std::integral T>
[[nodiscard]] constexpr bool CheckedMultiply(T a, T b, T& result) {
  return !__builtin_mul_overflow(a, b, &result);
}

}  // namespace fotomill
