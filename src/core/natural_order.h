#pragma once

#include <string_view>

namespace fotomill {

// Natural sort order of names: runs of digits compare
// as numbers (2 before 10), ASCII case is ignored; ties
// are broken by the bytes. Negative, 0 or positive.
int CompareNatural(std::string_view a, std::string_view b);

// Whether `text` matches a pattern of "*" and "?", ignoring ASCII case. A pattern without wildcards
// matches any substring; an empty one matches everything.
bool MatchesFilter(std::string_view text, std::string_view pattern);

}  // namespace fotomill
