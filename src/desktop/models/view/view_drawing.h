#pragma once

#include <cstdint>

#include "desktop/models/drawing/rgb_image.h"
#include "desktop/models/view/view_transform.h"
#include "picture/rectangle.h"

namespace fotomill::desktop {

// Pixels to draw, 24 bits, and their
// alpha plane, empty if all are opaque.
struct ViewSource {
  const PackedImage& image;
  const PackedImage& alpha;
};

// The background behind and around a picture. Colors are 0x00BBGGRR.
struct Backdrop {
  Color around = 0;
  bool squares = false;  // draw a checkerboard behind the picture
  Color square[2] = {0, 0};
  int32_t side = 1;  // of a square, in device pixels
};

// Draws a picture into `canvas`, which has the size of the window in device pixels: `source` is the
// picture at any size, drawn at the position given by `transform`. A source of exactly the shown
// size is copied; others are sampled at the nearest pixel, or with `smooth` interpolated. The
// checkerboard does not move with the picture.
void DrawView(const ViewSource& source, const ViewTransform& transform, const Backdrop& backdrop,
              bool smooth, RgbImage& canvas);
// Draws a picture, or part of one, into the rectangle `shown` of the canvas; the rest is unchanged.
void DrawPart(const ViewSource& source, const Rectangle& shown, const Backdrop& backdrop,
              bool smooth, RgbImage& canvas);

}  // namespace fotomill::desktop
