#pragma once

#include <wx/bitmap.h>
#include <wx/bmpbndl.h>

#include <string_view>

#include "desktop/models/drawing/rgb_image.h"

namespace fotomill::desktop {

// Converts pixels to a bitmap; `scale` is device pixels per window pixel. Not ok for an empty
// image.
wxBitmap BitmapOf(const RgbImage& image, double scale = 1);

// A symbol by name, in the system's text color,
// 16 by 16 or any multiple. Empty if unknown.
wxBitmapBundle Symbol(std::string_view name, int side = 16);
wxBitmapBundle Symbol(std::string_view name, int side, const wxColour& color);  // in another color

}  // namespace fotomill::desktop
