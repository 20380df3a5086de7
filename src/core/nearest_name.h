#pragma once

#include <span>
#include <string>
#include <string_view>

namespace fotomill {

// The name most likely meant by `typed`: one with a single wrong, missing, extra or swapped
// character, ignoring case, or the only one it is a prefix of. Empty if there is none; ties go to
// the first.
std::string_view NearestName(std::string_view typed, std::span<const std::string_view> names);

// The name with the smallest edit distance, or one that `typed` is a prefix of, however far off;
// empty only if there are no names.
std::string_view NearestOfAll(std::string_view typed, std::span<const std::string_view> names);

}  // namespace fotomill
