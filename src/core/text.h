#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace fotomill {

// ASCII-only case, for extensions and keywords, independent of the locale.
constexpr char LowerCase(char c) {
  return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}
constexpr char UpperCase(char c) {
  return c >= 'a' && c <= 'z' ? static_cast<char>(c - 'a' + 'A') : c;
}
// A to Z and a to z only.
constexpr bool IsLetter(char c) { return LowerCase(c) >= 'a' && LowerCase(c) <= 'z'; }
constexpr bool IsDigit(char c) { return c >= '0' && c <= '9'; }
std::string LowerCase(std::string_view text);  // ASCII only
std::string UpperCase(std::string_view text);  // ASCII only

// Compares ignoring the case of A to Z; all other bytes must be equal.
constexpr bool EqualIgnoringCase(std::string_view a, std::string_view b) {
  if (a.size() != b.size()) return false;
  for (size_t i = 0; i < a.size(); ++i) {
    if (LowerCase(a[i]) != LowerCase(b[i])) return false;
  }
  return true;
}

// The integer at the start of a text: white space, a sign, decimal digits; anything after it is
// ignored. 0 without a digit; clamped to 64 bits.
int64_t LeadingInteger(std::string_view text);

// Item `index`, from 0, of a ";"-separated
// list; "Unknown" if the index is out of range.
std::string_view ListItem(std::string_view list, int64_t index);

// A decimal number with commas as thousands separators.
std::string WithThousands(uint64_t number);

}  // namespace fotomill
