#pragma once

#include <span>
#include <string>
#include <string_view>

#include "texts/texts.h"

namespace fotomill {

// " Did you mean "NAME"?" in the user's language, for messages
// about an unknown name: a name that differs by one character,
// or our name for a known synonym. Empty if there is none.
std::string NearestNameHint(std::string_view typed, std::span<const std::string_view> names);

// Only the question, to be appended to a recorded sentence; empty if no name is close.
RecordedText NearestNameQuestion(std::string_view typed, std::span<const std::string_view> names);

}  // namespace fotomill
