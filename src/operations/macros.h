#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>

#include "picture/picture_record.h"
#include "texts/texts.h"

namespace fotomill {

// A macro in texts and output names. Date and time are those when the picture was taken, or else
// the modification time of its file. "%D{...}" formats the date with fields such as %Y and %m.
struct MacroRow {
  char letter;
  bool early;           // known before opening the picture
  const char* written;  // syntax: "%E{Tag}"
  const char* help;     // what it expands to, in English
};
std::span<const MacroRow> Macros();

// What macros need besides the picture itself.
struct MacroFacts {
  std::string fileName;         // of the source, with folder and extension
  std::string copyrightHolder;  // key ExifCopyrightHolder; empty: use the user's full name
  int64_t modified = 0;         // modification time of the source: seconds since 1970 UTC
};

// Expands the macros in `text`; unknown ones are kept.
std::string ExpandMacros(std::string_view text, const MacroFacts& facts,
                         const PictureRecord& picture);
// The same for file names: "/", "\" and ":" in expansions become "-", control characters are
// dropped.
std::string ExpandNameMacros(std::string_view text, const MacroFacts& facts,
                             const PictureRecord& picture);

// What is wrong with the macros in a text, as the end of a sentence: "has an unknown macro %Q".
// Empty if all are valid.
RecordedText MacroProblem(std::string_view text);

// Replaces the counter, "%c" or with leading zeros "%03c", by a number, in texts for several files.
// Everything else is unchanged.
std::string ExpandCounter(std::string_view text, int64_t number);

// Whether the macros in a text need more of a picture than its EXIF block and its file: its size,
// or its page.
bool NeedsPictureSize(std::string_view text);

// Whether a text can be expanded before the picture is decoded and processed, as it has no macros
// about the picture.
bool IsKnownEarly(std::string_view text);

}  // namespace fotomill
