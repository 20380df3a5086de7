#pragma once

#include <span>
#include <string>
#include <string_view>

namespace fotomill {

// The name that someone who typed `typed` most likely meant: the one with the fewest wrong,
// missing, extra or swapped characters, case ignored, or one that begins with what was typed. Empty
// when none is close; the first of equals.
std::string_view NearestName(std::string_view typed, std::span<const std::string_view> names);

// The nearest by the same measure, however far it is; empty only if there are no names.
std::string_view NearestOfAll(std::string_view typed, std::span<const std::string_view> names);

}  // namespace fotomill
