#include "processing/color/vignette.h"

#include "processing/color/vignette_row.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr int32_t kLeastRows = 16;  // per band

// The squared distance of a pixel from the center along one axis, 1/2 at the border.
double SquareAcross(int32_t place, int32_t length) {
  const double across = (place + 0.5 - length / 2.0) / (length / 2.0);
  return across * across / 2;
}

}  // namespace

Status ApplyVignette(PictureRecord& picture, const Vignette& vignette, const Work& work) {
  if (picture.image.Empty()) return Status::EmptyImage;
  RETURN_IF_BAD(PromotePicture(picture));
  const int32_t width = picture.image.Width();
  platform::MemoryBlock block;
  if (!block.Allocate(static_cast<uint64_t>(width) * sizeof(double)))
    return Status::MemoryAllocationError;
  double* const across = block.Items<double>().data();
  for (int32_t x = 0; x < width; ++x)
    across[x] = SquareAcross(vignette.left + x, vignette.whole.width);
  const ShadeRow shade = ShadeRowHere();
  return ForBands(picture.image.Height(), kLeastRows, work, [&](int32_t first, int32_t end) {
    for (int32_t y = first; y < end; ++y) {
      const VignetteRow row{across,
                            SquareAcross(vignette.top + y, vignette.whole.height),
                            vignette.size,
                            vignette.amount,
                            {vignette.color[0], vignette.color[1], vignette.color[2]}};
      shade(row, picture.image.Row(y).data(), static_cast<size_t>(width));
    }
    return Status::Ok;
  });
}

}  // namespace fotomill
