#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "settings/key_table.h"

namespace fotomill {

// The range of a spin control.
struct SpinRange {
  int32_t minimum = 0, maximum = 0, step = 1;
};

// The limits of a number; nullopt if the key has none.
std::optional<SpinRange> LimitsOf(const KeyRow& row);
// The range of a KEY_SPIN row. Setup dialogs put it as text into the control numbered `control` +
// kSpinRangeControl, and it is read back from there, so that a dialog may narrow it.
SpinRange SpinRangeOf(const KeyRow& row);
// Offset from a spin control's number to the control with its range text.
inline constexpr uint32_t kSpinRangeControl = 10000;

// Formats and parses "minimum,maximum,step"; nullopt if the text is not three numbers.
std::string SpinRangeText(const SpinRange& range);
// nullopt if the text is not a range.
std::optional<SpinRange> ParseSpinRange(std::string_view text);

}  // namespace fotomill
