#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace fotomill {

// Case of ASCII letters only: extensions and keywords, whatever the user's language.
constexpr char LowerCase(char c) {
  return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}
constexpr char UpperCase(char c) {
  return c >= 'a' && c <= 'z' ? static_cast<char>(c - 'a' + 'A') : c;
}
// A to Z and a to z only.
constexpr bool IsLetter(char c) { return LowerCase(c) >= 'a' && LowerCase(c) <= 'z'; }
std::string LowerCase(std::string_view text);  // other bytes stay
std::string UpperCase(std::string_view text);  // other bytes stay

// Compares with the case of A to Z ignored; other letters and bytes have to be the same.
constexpr bool EqualIgnoringCase(std::string_view a, std::string_view b) {
  if (a.size() != b.size()) return false;
  for (size_t i = 0; i < a.size(); ++i) {
    if (LowerCase(a[i]) != LowerCase(b[i])) return false;
  }
  return true;
}

// The whole number that a text begins with: white space, a sign, decimal digits; whatever follows
// is ignored. 0 without a digit; a number beyond 64 bits gives the nearest one that fits.
int64_t LeadingInteger(std::string_view text);

// Item `index`, from 0, of a list whose items are separated by ";"; "Unknown" for an index that the
// list does not have.
std::string_view ListItem(std::string_view list, int64_t index);

// A number in decimal with a comma between every group of three digits.
std::string WithThousands(uint64_t number);

}  // namespace fotomill
