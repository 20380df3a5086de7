#pragma once

#include <concepts>
#include <cstdint>

namespace fotomill {

// Checked arithmetic for values read from files:
// false on overflow; `result` is then unspecified.
template <std::integral T>
[[nodiscard]] constexpr bool CheckedAdd(T a, T b, T& result) {
  return !__builtin_add_overflow(a, b, &result);
}
// False if the product overflows.
template <std::integral T>
[[nodiscard]] constexpr bool CheckedMultiply(T a, T b, T& result) {
  return !__builtin_mul_overflow(a, b, &result);
}

}  // namespace fotomill
