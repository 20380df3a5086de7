#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

#include "core/status.h"
#include "drawing/text_line.h"
#include "picture/packed_image.h"
#include "picture/rectangle.h"

namespace fotomill {

class FontFaces;

// The door to text in pictures: a font of the system at one size. Letters that it lacks come from
// other fonts, and what no font has is shown as a box. Belongs to one thread.
class TextFont {
 public:
  TextFont();  // has no font until one is opened
  ~TextFont();
  TextFont(const TextFont&) = delete;
  TextFont& operator=(const TextFont&) = delete;

  // Opens the font of a family ("Arial", "DejaVu Sans Bold") with an em of so many pixels. Where
  // the system has no such family, another one takes its place. ResourceError if there is no font,
  // or what shapes text is not installed.
  Status Open(std::string_view family, double em);
  // The same so that its lines are `height` pixels high, from the top of the tallest letters to the
  // bottom of the deepest.
  Status OpenForLine(std::string_view family, double height);

  double Ascent() const;      // pixels above the baseline
  double LineHeight() const;  // pixels from the top of the tallest letters to the deepest bottom

  // A line of text, see ShapeLine.
  TextLine Shape(std::string_view text, double spacing = 0);
  // Pixels that a text is wide.
  int32_t WidthOf(std::string_view text);
  // The text, with an ellipsis in place of its end where it would be wider than `width`.
  std::string Fitted(std::string_view text, int32_t width);

  // Adds a line to a mask, see DrawLine.
  Status Draw(const TextLine& line, const LinePlace& place, PackedImage& mask) const;
  // Draws one line onto an image of 24 bits: centered between the sides of `band`, its top at the
  // band's, smoothed against what is there, and nothing outside the band. MemoryAllocationError.
  Status DrawCentered(PackedImage& image, const Rectangle& band, std::string_view text,
                      Color color);

 private:
  std::unique_ptr<FontFaces> fonts_;
};

}  // namespace fotomill
