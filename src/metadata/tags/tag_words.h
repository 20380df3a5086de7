#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "metadata/xmp/xmp_tags.h"

namespace fotomill {

// Ratings, labels and keywords of a packet, also where only another program's own properties say
// them.

// -1 to 5, rounded; none if there is no valid rating.
std::optional<int32_t> RatingOf(const XmpTags& tags);
std::string LabelOf(const XmpTags& tags);
std::vector<std::string> KeywordsOf(const XmpTags& tags);

// The last part of a keyword with its parents: "Paris" of "Places/France/Paris".
std::string_view LeafOf(std::string_view keyword, char separator);

// digiKam's number for a label, 0 for none; -1 if it has no number.
int32_t DigiKamLabel(std::string_view label);
// The percentage that Microsoft's programs store for a rating.
int32_t MicrosoftRating(int32_t rating);

}  // namespace fotomill
