#pragma once

#include <cstdint>

#include "desktop/models/drawing/rgb_image.h"
#include "desktop/models/view/view_transform.h"

namespace fotomill::desktop {

// Pixels to draw, of 24 bits, and their alpha plane of the same size; that is empty where all are
// opaque.
struct ViewSource {
  const PackedImage& image;
  const PackedImage& alpha;
};

// What shows through a picture, and what surrounds it. Colors are 0x00BBGGRR.
struct Backdrop {
  Color around = 0;
  bool squares = false;  // a checkerboard behind the picture instead of `around`
  Color square[2] = {0, 0};
  int32_t side = 1;  // of a square, device pixels
};

// Draws what a window shows of a picture into `canvas`, whose size is the window's in device
// pixels: `source`, the picture at any size, in the place that `transform` gives it. A source of
// just the shown size is copied; others are sampled at the nearest pixel, or with `smooth` between
// pixels. The squares of the backdrop keep their places in the window.
void DrawView(const ViewSource& source, const ViewTransform& transform, const Backdrop& backdrop,
              bool smooth, RgbImage& canvas);

}  // namespace fotomill::desktop
