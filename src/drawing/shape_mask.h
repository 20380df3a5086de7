#pragma once

#include <cstdint>

#include "picture/packed_image.h"
#include "processing/bands.h"

namespace fotomill {

// A rectangle, rotated about its center, with rounded corners.
struct Shape {
  double x = 0, y = 0;  // its center, in pixels from the mask's top left corner
  double width = 0, height = 0;
  double angle = 0;     // degrees, clockwise
  double radius = 0;    // corner radius; limited to half the shorter edge
};

// Coverage of each pixel by a shape. Edges along pixel boundaries are sharp, others anti-aliased
// over one pixel. Source: the signed distance of a rounded box, I. Quilez, "2D distance functions".
class ShapeCoverage {
 public:
  explicit ShapeCoverage(const Shape& shape);
  uint8_t At(int32_t x, int32_t y) const;  // column and row; 0 to 255

 private:
  const Shape shape_;
  const double cosine_, sine_, radius_;
};

// Adds a shape to an alpha plane: each pixel becomes the maximum of its value and its coverage.
// Statuses as ForBands.
Status DrawShape(const Shape& shape, PackedImage& mask, const Work& work = {});
// Removes a shape from an alpha plane. Statuses as ForBands.
Status CutShape(const Shape& shape, PackedImage& mask, const Work& work = {});

}  // namespace fotomill
