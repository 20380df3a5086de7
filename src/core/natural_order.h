#pragma once

#include <string_view>

namespace fotomill {

// Order of names as people read them: runs of digits count as numbers (2 before 10), the case of
// ASCII letters does not count; names equal that way are ordered by their bytes. Negative, 0 or
// positive.
int CompareNatural(std::string_view a, std::string_view b);

// Whether `text` matches a pattern of "*" and "?", ASCII case ignored. A pattern without either
// matches any part of the text; an empty one matches everything.
bool MatchesFilter(std::string_view text, std::string_view pattern);

}  // namespace fotomill
