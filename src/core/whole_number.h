#pragma once

#include <algorithm>
#include <charconv>
#include <concepts>
#include <cstdint>
#include <optional>
#include <string_view>

namespace fotomill {

// Parses and removes the decimal number at the start of a text, with optional blanks and a sign.
// nullopt, with the text unchanged, if there is no number or it overflows.
template <std::integral T = int32_t>
std::optional<T> TakeNumber(std::string_view& text) {
  std::string_view rest = text.substr(std::min(text.find_first_not_of(" \t"), text.size()));
  if (rest.starts_with('+') && rest.size() > 1 && rest[1] >= '0' && rest[1] <= '9')
    rest.remove_prefix(1);
  T number = 0;
  const auto [end, error] = std::from_chars(rest.data(), rest.data() + rest.size(), number);
  if (error != std::errc()) return std::nullopt;
  text = rest.substr(static_cast<size_t>(end - rest.data()));
  return number;
}

// A text that is exactly one decimal number, optionally surrounded by blanks; else nullopt.
template <std::integral T = int32_t>
std::optional<T> ParseNumber(std::string_view text) {
  const std::optional<T> number = TakeNumber<T>(text);
  return text.find_first_not_of(" \t") == std::string_view::npos ? number : std::nullopt;
}

}  // namespace fotomill
