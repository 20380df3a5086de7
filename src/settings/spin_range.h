#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "settings/key_table.h"

namespace fotomill {

// What a spin control offers.
struct SpinRange {
  int32_t minimum = 0, maximum = 0, step = 1;
};

// The limits of a number; nullopt for a key that takes any.
std::optional<SpinRange> LimitsOf(const KeyRow& row);
// The range of a KEY_SPIN row. Setup dialogs put its text into the control numbered `control` +
// kSpinRangeControl, from where the binding reads it, so that a dialog may offer less.
SpinRange SpinRangeOf(const KeyRow& row);
// Added to a control's number: the text with its range.
inline constexpr uint32_t kSpinRangeControl = 10000;

// "minimum,maximum,step" and back; nullopt when the text does not hold three numbers.
std::string SpinRangeText(const SpinRange& range);
// Nullopt where the text is no range.
std::optional<SpinRange> ParseSpinRange(std::string_view text);

}  // namespace fotomill
