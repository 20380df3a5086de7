#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

#include "core/status.h"
#include "drawing/text_line.h"
#include "picture/packed_image.h"
#include "picture/rectangle.h"
#include "processing/bands.h"

namespace fotomill {

class FontFaces;

// Text drawing with one system font at one size. Missing characters are taken from fallback fonts,
// or drawn as a box if no font has them. Not thread-safe.
class TextFont {
 public:
  TextFont();  // has no font until one is opened
  ~TextFont();
  TextFont(const TextFont&) = delete;
  TextFont& operator=(const TextFont&) = delete;

  // Opens the font of a family ("Arial", "DejaVu Sans Bold") with the given em size in pixels. If
  // the family is not installed, a substitute is used. ResourceError if there is no font, or the
  // shaping libraries are not installed.
  Status Open(std::string_view family, double em);
  // As above, with lines `height` pixels high, from the top of the tallest letters to the bottom of
  // the deepest.
  Status OpenForLine(std::string_view family, double height);

  double Ascent() const;      // pixels above the baseline
  double LineHeight() const;  // from the top of the tallest letters to the deepest bottom

  // A text as one line, see ShapeLine. `spacing` pixels are added after each character.
  TextLine Shape(std::string_view text, double spacing = 0);
  // `count` characters of a paragraph from `start` on as a line.
  TextLine Shape(const TextParagraph& paragraph, size_t start, size_t count, double spacing);
  // Width of a text in pixels.
  int32_t WidthOf(std::string_view text);
  // The text, with an ellipsis replacing its end if it is wider than `width`.
  std::string Fitted(std::string_view text, int32_t width);

  // Adds a line to a mask, see DrawLine.
  Status Draw(const TextLine& line, const LinePlace& place, PackedImage& mask,
              const Work& work = {}) const;
  // Draws one line onto a 24-bit image: at the top of `band`, anti-aliased and clipped to it.
  // MemoryAllocationError.
  Status DrawIn(PackedImage& image, const Rectangle& band, TextAlign align, std::string_view text,
                Color color);
  // The fonts behind it, for outputs that embed them.
  FontFaces& Faces() { return *fonts_; }

 private:
  std::unique_ptr<FontFaces> fonts_;
};

}  // namespace fotomill
