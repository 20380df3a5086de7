#include "processing/filters/surface_blur.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "processing/filters/rank.h"
#include "processing/filters/tap_rows.h"
#include "processing/geometry/cut.h"
#include "processing/promote.h"

namespace fotomill {

Status SurfaceBlurPicture(PictureRecord& picture, int32_t radius, int32_t threshold,
                          const Work& work) {
  const size_t samples = 3 * static_cast<size_t>(picture.image.Width());
  return FilterRows(picture, radius, work, [&](TapRows& taps, uint8_t* out) {
    std::vector<int32_t> sums(samples), counts(samples);
    for (int32_t dy = -radius; dy <= radius; ++dy) {
      for (int32_t dx = -radius; dx <= radius; ++dx) {
        const uint8_t *levels = taps.At(dx, dy), *own = taps.Own();
        for (size_t i = 0; i < samples; ++i) {
          const int32_t weight = std::max(threshold + 1 - std::abs(levels[i] - own[i]), 0);
          sums[i] += weight * levels[i];
          counts[i] += weight;
        }
      }
    }
    for (size_t i = 0; i < samples; ++i)
      out[i] = static_cast<uint8_t>((sums[i] + counts[i] / 2) / counts[i]);
  });
}

Status DespecklePicture(PictureRecord& picture, int32_t radius, int32_t threshold,
                        const Work& work) {
  if (picture.image.Empty()) return Status::EmptyImage;
  RETURN_IF_BAD(PromotePicture(picture));
  const int32_t width = picture.image.Width(), height = picture.image.Height();
  const Rectangle all{0, 0, width, height};
  PictureRecord median;
  RETURN_IF_BAD(CutImage(picture.image, all, median.image));
  if (!picture.alpha.Empty()) RETURN_IF_BAD(CutImage(picture.alpha, all, median.alpha));
  median.bitsPerPixel = 24;
  RETURN_IF_BAD(RankPicture(median, Rank::Median, radius, work));
  const bool hasAlpha = !picture.alpha.Empty();
  for (int32_t y = 0; y < height; ++y) {
    uint8_t* bgr = picture.image.Row(y).data();
    const uint8_t* middle = median.image.Row(y).data();
    for (int32_t x = 0; x < width; ++x, bgr += 3, middle += 3) {
      // the color of transparent pixels is undefined
      if (hasAlpha && median.alpha.Row(y)[static_cast<size_t>(x)] == 0) continue;
      const int32_t far = std::max({std::abs(bgr[0] - middle[0]), std::abs(bgr[1] - middle[1]),
                                    std::abs(bgr[2] - middle[2])});
      if (far > threshold) std::memcpy(bgr, middle, 3);
    }
  }
  return Status::Ok;
}

}  // namespace fotomill
