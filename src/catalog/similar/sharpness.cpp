#include "catalog/similar/sharpness.h"

#include <vector>

#include "processing/geometry/scale.h"

namespace fotomill {

namespace {

// The luma of a row of 24-bit pixels.
void LumaOf(const uint8_t* pixel, std::vector<float>& row) {
  for (float& level : row) {
    level = 0.114F * pixel[0] + 0.587F * pixel[1] + 0.299F * pixel[2];
    pixel += 3;
  }
}

}  // namespace

Status MeasureSharpness(const PictureRecord& picture, float& sharpness) {
  sharpness = 0;
  if (picture.image.Empty()) return Status::EmptyImage;
  const Size full = FullSizeOf(picture);
  PackedImage scaled, alpha;
  RETURN_IF_BAD(ScaleFiltered(picture.image, {}, ReachOf(picture),
                              FitSize(full.width, full.height, kSideForSharpness),
                              ScaleOptions{.filter = ScaleFilter::Bilinear}, scaled, alpha));
  const int32_t height = scaled.Height();
  const auto width = static_cast<size_t>(scaled.Width());
  std::vector<float> above(width), here(width), below(width);
  double sum = 0, squares = 0;
  for (int32_t y = 0; y < height; ++y) {
    above.swap(here);
    here.swap(below);
    LumaOf(scaled.Row(y).data(), below);
    if (y < 2) continue;
    for (size_t x = 1; x + 1 < width; ++x) {
      const double edge = above[x] + below[x] + here[x - 1] + here[x + 1] - 4 * here[x];
      sum += edge;
      squares += edge * edge;
    }
  }
  if (width < 3 || height < 3) return Status::Ok;
  const double count = static_cast<double>(width - 2) * (height - 2);
  sharpness = static_cast<float>(squares / count - sum / count * (sum / count));
  return Status::Ok;
}

}  // namespace fotomill
