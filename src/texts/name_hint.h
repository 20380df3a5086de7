#pragma once

#include <span>
#include <string>
#include <string_view>

namespace fotomill {

// " Did you mean "NAME"?" in the user's language, for messages about an unknown name; empty if no
// name is close.
std::string NearestNameHint(std::string_view typed, std::span<const std::string_view> names);

}  // namespace fotomill
