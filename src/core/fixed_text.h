#pragma once

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstring>
#include <string_view>

namespace fotomill {

// A NUL-terminated text of at most `capacity` characters, stored in place: the fixed buffers of
// records and settings.
template <size_t capacity>
class FixedText {
 public:
  constexpr FixedText() = default;
  // NOLINT: a literal is a fixed text
  constexpr FixedText(std::string_view text) { AssignCut(text); }

  // Assigns `text` if it fits; otherwise returns false and changes nothing.
  [[nodiscard]] constexpr bool Assign(std::string_view text) {
    if (text.size() > capacity) return false;
    AssignCut(text);
    return true;
  }
  // Assigns the first `capacity` characters, up to a NUL if there is one. For texts to display,
  // never for paths.
  constexpr void AssignCut(std::string_view text) {
    text = text.substr(0, std::min(text.find('\0'), capacity));
    std::copy(text.begin(), text.end(), characters_.begin());
    std::fill(characters_.begin() + static_cast<std::ptrdiff_t>(text.size()), characters_.end(),
              '\0');
  }
  // Sets all bytes to zero, as records on disk expect.
  constexpr void Clear() { characters_.fill('\0'); }

  // The text up to its NUL. Writes through `data`
  // must stay within Capacity() plus the terminator.
  constexpr std::string_view view() const { return {characters_.data(), Length()}; }
  constexpr const char* c_str() const { return characters_.data(); }  // NUL-terminated
  // `capacity` characters and the terminating NUL.
  constexpr char* data() { return characters_.data(); }
  constexpr bool empty() const { return characters_[0] == '\0'; }
  static constexpr size_t Capacity() { return capacity; }  // characters, without the closing NUL
  // NOLINT: converts implicitly to the text it holds
  constexpr operator std::string_view() const { return view(); }

 private:
  constexpr size_t Length() const {
    size_t length = 0;
    while (length < capacity && characters_[length] != '\0') ++length;
    return length;
  }
  std::array<char, capacity + 1> characters_{};
};

// Paths and names in records: 260 characters and a terminator.
using PathText = FixedText<260>;

}  // namespace fotomill
