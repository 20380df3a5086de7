#pragma once

#include <string>
#include <string_view>

namespace fotomill {

// A UTF-8 text without letter case, for comparison: the capital letters of Latin, Greek, Cyrillic
// and Armenian alphabets become small ones. Other characters and invalid bytes are unchanged.
std::string FoldCase(std::string_view text);

// Whether `text` contains `part`, ignoring letter case. Every text contains the empty one.
bool ContainsText(std::string_view text, std::string_view part);

// Whether a whole text matches a pattern of "*" and "?", or without them is the same, ignoring
// letter case.
bool IsTextLike(std::string_view text, std::string_view pattern);

}  // namespace fotomill
