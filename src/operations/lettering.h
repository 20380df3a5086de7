#pragma once

#include <string>
#include <string_view>

#include "drawing/text_block.h"
#include "operations/parameter.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// A text with everything around it, as operations draw it. All lengths are in pixels.
struct Lettering {
  std::string font;
  double em = 24;
  TextLayout layout;
  AlphaColor color;
  double rotation = 0;            // degrees, clockwise
  double outline = 0;             // a line around letters
  AlphaColor outlineColor;
  double shadow = 0;              // how far behind and below the letters their shadow is
  bool box = false;               // a box behind the text
  AlphaColor boxColor;
  double padding = 0;             // from the text to the edge of the box or the frame
  double frame = 0;               // a line around the box
};

// A lettering that is set and can be drawn.
class LetteringDrawing {
 public:
  // Sets a text, in which a line feed begins a new line. ResourceError without a font.
  Status Open(const Lettering& lettering, const std::string& text);

  // What it covers, box and frame included, turned: whole pixels.
  Size Bounds() const;
  // How far shadow and outline may be outside of that.
  int32_t Reach() const;
  // Draws it with its center at (x, y) of a layer: a picture of 24 bits with alpha. Statuses as
  // NewPackedImage.
  Status Draw(double x, double y, const Work& work, PictureRecord& layer) const;

 private:
  Size Flat() const;  // before it is turned

  Lettering lettering_;
  TextFont font_;
  TextBlock block_;
};

// A layer of that size on which nothing is drawn. Statuses as NewPackedImage.
Status NewLayer(Size size, PictureRecord& layer);

// "\n" in a text as line feeds.
std::string WithLineFeeds(std::string_view text);

}  // namespace fotomill
