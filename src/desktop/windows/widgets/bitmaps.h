#pragma once

#include <wx/bitmap.h>
#include <wx/bmpbndl.h>

#include <string_view>

#include "desktop/models/drawing/rgb_image.h"

namespace fotomill::desktop {

// Pixels as a bitmap for drawing; `scale` device pixels make one of the window's. Not ok for an
// empty image.
wxBitmap BitmapOf(const RgbImage& image, double scale = 1);

// A symbol by its name in the color of the system's texts, 16 by 16 and any multiple. An unknown
// name gives an empty one.
wxBitmapBundle Symbol(std::string_view name, int side = 16);

}  // namespace fotomill::desktop
