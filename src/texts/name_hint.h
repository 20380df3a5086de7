#pragma once

#include <span>
#include <string>
#include <string_view>

#include "texts/texts.h"

namespace fotomill {

// " Did you mean "NAME"?" in the user's language, for messages about an unknown name: one that
// differs by a single character, or what the program calls a thing that is known by the name typed.
// Empty if there is none.
std::string NearestNameHint(std::string_view typed, std::span<const std::string_view> names);

// The question alone, to be recorded behind a sentence; empty if no name is close.
RecordedText NearestNameQuestion(std::string_view typed, std::span<const std::string_view> names);

}  // namespace fotomill
