#pragma once

#include <string>
#include <string_view>

#include "drawing/text_block.h"
#include "operations/parameter.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// A text with its decorations. Lengths are in pixels.
struct Lettering {
  std::string font;
  double em = 24;
  TextLayout layout;
  AlphaColor color;
  double rotation = 0;            // degrees, clockwise
  double outline = 0;             // line around letters
  AlphaColor outlineColor;
  double shadow = 0;              // offset of the shadow, down and to the right
  bool box = false;               // draw a box behind the text
  AlphaColor boxColor;
  double padding = 0;             // from the text to the edge of the box or the frame
  double frame = 0;               // line around the box
};

// A lettering with its text laid out, ready to draw.
class LetteringDrawing {
 public:
  // Lays out a text; line feeds start new lines. ResourceError if the font is missing.
  Status Open(const Lettering& lettering, const std::string& text);

  // Bounding box after rotation, including box and frame, in whole pixels.
  Size Bounds() const;
  // How far shadow and outline may extend beyond that.
  int32_t Reach() const;
  // Draws it centered at (x, y) on a layer: a 24-bit picture with alpha. Statuses of
  // NewPackedImage.
  Status Draw(double x, double y, const Work& work, PictureRecord& layer) const;

 private:
  Size Flat() const;  // before rotation

  Lettering lettering_;
  TextFont font_;
  TextBlock block_;
};

// An empty, transparent layer. Statuses of NewPackedImage.
Status NewLayer(Size size, PictureRecord& layer);

// Replaces "\n" in a text with line feeds.
std::string WithLineFeeds(std::string_view text);

}  // namespace fotomill
