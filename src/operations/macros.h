#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>

#include "picture/picture_record.h"
#include "texts/texts.h"

namespace fotomill {

// A macro in texts and output names. Date and time are when the picture was taken, else when its
// file was changed.
struct MacroRow {
  char letter;
  bool early;           // known before the picture is opened
  const char* written;  // as people write it
  const char* help;     // what it becomes, in English
};
std::span<const MacroRow> Macros();

// What a run knows beside the picture itself.
struct MacroFacts {
  std::string fileName;         // of the source, with folder and extension
  std::string copyrightHolder;  // the key ExifCopyrightHolder; empty: the user's full name
  int64_t modified = 0;         // of the source: seconds since 1970 UTC
};

// `text` with its macros expanded; unknown ones stay as they are.
std::string ExpandMacros(std::string_view text, const MacroFacts& facts,
                         const PictureRecord& picture);
// The same for a file name: "/", "\" and ":" of what macros bring in become "-", control characters
// are left out.
std::string ExpandNameMacros(std::string_view text, const MacroFacts& facts,
                             const PictureRecord& picture);

// What is wrong with the macros of a text, as the end of a sentence: "has an unknown macro %Q".
// Empty when nothing is.
RecordedText MacroProblem(std::string_view text);

// Whether a text can be expanded before the picture is decoded and worked on: it has no macro about
// the picture.
bool IsKnownEarly(std::string_view text);

}  // namespace fotomill
