#pragma once

#include <string>
#include <vector>

#include "metadata/tags/picture_tags.h"
#include "texts/texts.h"

namespace fotomill {

// The tags of a picture for people: labels, to be translated with Tr, and texts. Empty ones are
// left out, as are date and camera, which EXIF shows.
struct TagLine {
  const char* label;
  std::string text;
};
std::vector<TagLine> TagLines(const PictureTags& tags);

// Heading for the lines in lists of all metadata.
inline constexpr const char* kTagsHeading = TrLater("Titles and keywords");

// The keywords separated by commas; and those of such a text, without blanks around them.
std::string KeywordText(const PictureTags& tags);
std::vector<std::string> ListedKeywords(std::string_view text);
// The narrowest part of the place first.
std::string PlaceText(const PictureTags& tags);

}  // namespace fotomill
