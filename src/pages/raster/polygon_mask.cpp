#include "pages/raster/polygon_mask.h"

#include <algorithm>
#include <cmath>

#include "pages/model/placing.h"

namespace fotomill {

namespace {

// Sums, for each pixel of a row, the signed area to the right of the edges that cross it. Running
// sums along the rows then give the coverage.
class AreaSums {
 public:
  AreaSums(int32_t width, int32_t height)
      : width_(width),
        height_(height),
        sums_(static_cast<size_t>(width + 2) * static_cast<size_t>(height)) {}

  // An edge in pixels of the area; parts left and right of it are clamped to its sides.
  void AddEdge(Point from, Point to) {
    if (from.y == to.y) return;
    const double sign = from.y < to.y ? 1 : -1;
    if (sign < 0) std::swap(from, to);
    const double slope = (to.x - from.x) / (to.y - from.y);
    const double last = std::min<double>(to.y, height_);
    for (double y = std::max(from.y, 0.0); y < last;) {
      const double row = std::floor(y), end = std::min(row + 1, last);
      AddPart(static_cast<int32_t>(row), end - y, from.x + (y - from.y) * slope,
              from.x + (end - from.y) * slope, sign);
      y = end;
    }
  }

  uint8_t* Row(int32_t y, std::vector<uint8_t>& cover) const {
    const float* const sums = sums_.data() + static_cast<ptrdiff_t>(y) * (width_ + 2);
    float area = 0;
    for (int32_t x = 0; x < width_; ++x) {
      area += sums[x];
      cover[static_cast<size_t>(x)] =
          static_cast<uint8_t>(std::min(std::abs(area), 1.0F) * 255 + 0.5F);
    }
    return cover.data();
  }

 private:
  // The part of an edge within one row: `height` of it, from column x0 to x1.
  void AddPart(int32_t y, double height, double x0, double x1, double sign) {
    float* const sums = sums_.data() + static_cast<ptrdiff_t>(y) * (width_ + 2);
    double left = std::clamp<double>(std::min(x0, x1), 0, width_),
           right = std::clamp<double>(std::max(x0, x1), 0, width_);
    const double area = height * sign;
    if (right - left < 1e-9) return AddColumn(sums, left, left, area);
    const double share = area / (right - left);
    while (left < right) {
      const double end = std::min(std::floor(left) + 1, right);
      AddColumn(sums, left, end, share * (end - left));
      left = end;
    }
  }
  // An edge within one column: the mean of its ends divides the pixel.
  static void AddColumn(float* sums, double x0, double x1, double area) {
    const double column = std::floor(x0), middle = (x0 + x1) / 2 - column;
    const auto x = static_cast<ptrdiff_t>(column);
    sums[x] += static_cast<float>(area * (1 - middle));
    sums[x + 1] += static_cast<float>(area * middle);
  }

  const int32_t width_, height_;
  std::vector<float> sums_;
};

}  // namespace

Status FillPolygon(const std::vector<Point>& corners, int32_t width, int32_t height,
                   PolygonMask& mask) {
  mask = {};
  if (corners.size() < 3) return Status::Ok;
  const Box bounds = BoundsOf(corners);
  const auto left = static_cast<int32_t>(std::clamp<double>(std::floor(bounds.x), 0, width)),
             top = static_cast<int32_t>(std::clamp<double>(std::floor(bounds.y), 0, height)),
             right = static_cast<int32_t>(std::clamp<double>(std::ceil(bounds.Right()), 0, width)),
             bottom =
                 static_cast<int32_t>(std::clamp<double>(std::ceil(bounds.Bottom()), 0, height));
  if (left >= right || top >= bottom) return Status::Ok;
  mask.area = {left, top, right - left, bottom - top};
  RETURN_IF_BAD(NewAlphaPlane(mask.area.width, mask.area.height, mask.cover));
  AreaSums sums(mask.area.width, mask.area.height);
  const Point origin{static_cast<double>(left), static_cast<double>(top)};
  for (size_t i = 0; i < corners.size(); ++i)
    sums.AddEdge(corners[i] - origin, corners[(i + 1) % corners.size()] - origin);
  std::vector<uint8_t> row(static_cast<size_t>(mask.area.width));
  for (int32_t y = 0; y < mask.area.height; ++y)
    std::copy_n(sums.Row(y, row), mask.area.width, mask.cover.Row(y).data());
  return Status::Ok;
}

}  // namespace fotomill
