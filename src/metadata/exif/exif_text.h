#pragma once

#include <cstdint>
#include <string_view>

#include "metadata/exif/exif_walk.h"
#include "platform/memory.h"

namespace fotomill {

// Options for text output.
struct ExifTextOptions {
  bool showTypes = false;  // show the type after the name
};

// Formats a walk as text for printing or copying: "DIRECTORY EXIF", then for each value four
// spaces, the name, a tab, the value; with `showTypes` a space and the type's label after the name.
// Lines end with "\n". Control characters and invalid UTF-8 are escaped, so each value is exactly
// one line.
class ExifText : public ExifSink {
 public:
  explicit ExifText(const ExifTextOptions& options) : options_(options) {}
  void Directory(int32_t number, std::string_view label) override;
  void Line(const ExifLine& line) override;

  // The lines so far; valid until the next line is added.
  std::string_view Text() const;
  // False if memory ran out; that line and all later ones are missing.
  bool Complete() const { return complete_; }
  // Starts over; keeps the allocated memory.
  void Clear();

 private:
  // Space for the next `size` characters, to be filled by the caller; null if out of memory.
  char* Room(uint64_t size);

  const ExifTextOptions options_;
  platform::MemoryBlock block_;
  uint64_t used_ = 0;
  bool complete_ = true;
};

}  // namespace fotomill
