#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "core/status.h"
#include "drawing/font_files.h"

namespace fotomill {

// A font for embedding in a document.
struct FontProgram {
  bool compact = false;  // a Compact Font Format table; else a TrueType font
  std::vector<uint8_t> bytes;
};

// Reduces a font to some of its glyphs, which keep their indices. ResourceError if the font cannot
// be read, or HarfBuzz's library for that is not installed.
Status SubsetFont(const FontFile& font, std::span<const uint32_t> glyphs, FontProgram& program);

}  // namespace fotomill
