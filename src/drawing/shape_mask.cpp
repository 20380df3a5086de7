#include "drawing/shape_mask.h"

#include <algorithm>
#include <cmath>
#include <numbers>

namespace fotomill {

namespace {

constexpr int32_t kLeastRows = 16;  // of a band

// Replaces each pixel of a mask by a function of it and its coverage.
template <typename Combine>
Status ForCoverage(const Shape& shape, PackedImage& mask, const Work& work, Combine combine) {
  const ShapeCoverage coverage(shape);
  return ForBands(mask.Height(), kLeastRows, work, [&](int32_t first, int32_t end) {
    for (int32_t y = first; y < end; ++y) {
      const auto row = mask.Row(y);
      for (int32_t x = 0; x < mask.Width(); ++x) {
        uint8_t& pixel = row[static_cast<size_t>(x)];
        pixel = combine(pixel, coverage.At(x, y));
      }
    }
    return Status::Ok;
  });
}

}  // namespace

ShapeCoverage::ShapeCoverage(const Shape& shape)
    : shape_(shape),
      cosine_(std::cos(shape.angle * std::numbers::pi / 180)),
      sine_(std::sin(shape.angle * std::numbers::pi / 180)),
      radius_(
          std::clamp(shape.radius, 0.0, std::max(std::min(shape.width, shape.height), 0.0) / 2)) {}

uint8_t ShapeCoverage::At(int32_t x, int32_t y) const {
  const double dx = x + 0.5 - shape_.x, dy = y + 0.5 - shape_.y;
  const double across = std::abs(dx * cosine_ + dy * sine_) - shape_.width / 2 + radius_;
  const double down = std::abs(dy * cosine_ - dx * sine_) - shape_.height / 2 + radius_;
  const double outside = std::hypot(std::max(across, 0.0), std::max(down, 0.0));
  const double distance = outside + std::min(std::max(across, down), 0.0) - radius_;
  return static_cast<uint8_t>(std::floor(std::clamp(0.5 - distance, 0.0, 1.0) * 255 + 0.5));
}

Status DrawShape(const Shape& shape, PackedImage& mask, const Work& work) {
  return ForCoverage(shape, mask, work,
                     [](uint8_t pixel, uint8_t cover) { return std::max(pixel, cover); });
}

Status CutShape(const Shape& shape, PackedImage& mask, const Work& work) {
  return ForCoverage(shape, mask, work, [](uint8_t pixel, uint8_t cover) {
    return std::min(pixel, static_cast<uint8_t>(255 - cover));
  });
}

}  // namespace fotomill
