#pragma once

#include <vector>

#include "core/status.h"
#include "pages/model/page.h"
#include "picture/packed_image.h"
#include "picture/rectangle.h"

namespace fotomill {

// The coverage of pixels by a polygon.
struct PolygonMask {
  Rectangle area;     // the pixels it may touch, within the page
  PackedImage cover;  // an alpha plane of that size
};

// Fills a polygon with corners in pixels on a page of `width` x `height`. Edges are anti-aliased by
// the exact area of each pixel that is covered; edges on pixel boundaries are sharp. `mask` is
// empty if the polygon is outside of the page. MemoryAllocationError.
Status FillPolygon(const std::vector<Point>& corners, int32_t width, int32_t height,
                   PolygonMask& mask);

}  // namespace fotomill
