#pragma once

#include <span>
#include <string>
#include <string_view>

namespace fotomill {

// The name that someone who typed `typed` surely meant: one with a single wrong, missing, extra or
// swapped character, case ignored, or the only one that begins with what was typed. Empty when
// there is none; the first of equals.
std::string_view NearestName(std::string_view typed, std::span<const std::string_view> names);

// The one with the fewest such characters, or one that begins with what was typed, however far it
// is; empty only if there are no names.
std::string_view NearestOfAll(std::string_view typed, std::span<const std::string_view> names);

}  // namespace fotomill
