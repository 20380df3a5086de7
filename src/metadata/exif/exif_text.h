#pragma once

#include <cstdint>
#include <string_view>

#include "metadata/exif/exif_walk.h"
#include "platform/memory.h"

namespace fotomill {

// How values are written out as text.
struct ExifTextOptions {
  bool showTypes = false;  // the type of each value behind its name
};

// The lines of a walk as one text, to be printed or copied: "DIRECTORY EXIF", and for each value
// four blanks, the name, a tab, the value; with `showTypes` a blank and the type's label behind the
// name. Every line ends in "\n". Control characters and bytes that are not UTF-8 are escaped, so
// that a value never makes two lines.
class ExifText : public ExifSink {
 public:
  explicit ExifText(const ExifTextOptions& options) : options_(options) {}
  void Directory(int32_t number, std::string_view label) override;
  void Line(const ExifLine& line) override;

  // The lines so far; valid until the next one.
  std::string_view Text() const;
  // False when there was no memory for a line; it and those after it are missing.
  bool Complete() const { return complete_; }
  // Starts anew, and keeps the memory.
  void Clear();

 private:
  // The place of the next `size` characters, all of which the caller writes; null without memory.
  char* Room(uint64_t size);

  const ExifTextOptions options_;
  platform::MemoryBlock block_;
  uint64_t used_ = 0;
  bool complete_ = true;
};

}  // namespace fotomill
