#pragma once

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstring>
#include <string_view>

namespace fotomill {

// A zero-terminated text of at most `capacity` characters in place: the fixed buffers of records
// and settings.
template <size_t capacity>
class FixedText {
 public:
  constexpr FixedText() = default;
  // NOLINT: a literal is a fixed text
  constexpr FixedText(std::string_view text) { AssignCut(text); }

  // Takes `text` when it fits; otherwise returns false and changes nothing.
  [[nodiscard]] constexpr bool Assign(std::string_view text) {
    if (text.size() > capacity) return false;
    AssignCut(text);
    return true;
  }
  // Takes the first `capacity` characters, up to a zero byte if there is one. For texts that are
  // shown, never for paths.
  constexpr void AssignCut(std::string_view text) {
    text = text.substr(0, std::min(text.find('\0'), capacity));
    std::copy(text.begin(), text.end(), characters_.begin());
    std::fill(characters_.begin() + static_cast<std::ptrdiff_t>(text.size()), characters_.end(),
              '\0');
  }
  // Makes it empty and its bytes all zero, as records on disk have them.
  constexpr void Clear() { characters_.fill('\0'); }

  // The text up to its zero byte. Who writes through `data` keeps within Capacity() and the zero
  // behind it.
  constexpr std::string_view view() const { return {characters_.data(), Length()}; }
  constexpr const char* c_str() const { return characters_.data(); }  // ends with a zero
  // `capacity` characters and the closing zero.
  constexpr char* data() { return characters_.data(); }
  constexpr bool empty() const { return characters_[0] == '\0'; }
  static constexpr size_t Capacity() { return capacity; }  // characters, without the closing zero
  // NOLINT: reads as the text it holds
  constexpr operator std::string_view() const { return view(); }

 private:
  constexpr size_t Length() const {
    size_t length = 0;
    while (length < capacity && characters_[length] != '\0') ++length;
    return length;
  }
  std::array<char, capacity + 1> characters_{};
};

// Paths and names of the records: 260 characters and a terminator.
using PathText = FixedText<260>;

}  // namespace fotomill
