#include "processing/color/overlay.h"

#include <algorithm>

#include "processing/color/blend.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

// The part of an image within an area; right and bottom are exclusive.
struct Covered {
  int32_t left, right, top, bottom;
};
Covered CoveredBy(const PackedImage& image, const Rectangle& area) {
  const auto end = [](int32_t start, int32_t length, int32_t most) {
    return static_cast<int32_t>(std::clamp<int64_t>(int64_t{start} + length, 0, most));
  };
  return {std::clamp(area.x, 0, image.Width()), end(area.x, area.width, image.Width()),
          std::clamp(area.y, 0, image.Height()), end(area.y, area.height, image.Height())};
}

// Composites a pixel over one with alpha: colors are weighted by visibility.
void Over(uint8_t* bgr, uint8_t& alpha, const uint8_t* above, uint8_t cover) {
  const int32_t below = alpha * (255 - cover);  // in units of 255 x 255
  const int32_t whole = cover * 255 + below;
  if (whole == 0) return;
  for (int32_t channel = 0; channel < 3; ++channel) {
    bgr[channel] = static_cast<uint8_t>(
        (above[channel] * cover * 255 + bgr[channel] * below + whole / 2) / whole);
  }
  alpha = static_cast<uint8_t>((whole + 127) / 255);
}

// A row of a 24-bit picture, with its alpha if it has any.
struct TargetRow {
  uint8_t* bgr;
  uint8_t* alpha;
  TargetRow(PackedImage& image, PackedImage* plane, int32_t y)
      : bgr(image.Row(y).data()), alpha(plane == nullptr ? nullptr : plane->Row(y).data()) {}
  TargetRow(PictureRecord& picture, int32_t y)
      : TargetRow(picture.image, picture.alpha.Empty() ? nullptr : &picture.alpha, y) {}

  void Paint(int32_t x, const uint8_t* above, uint8_t cover) const {
    uint8_t* const pixel = bgr + static_cast<ptrdiff_t>(x) * 3;
    if (cover == 0) return;
    if (alpha != nullptr) return Over(pixel, alpha[x], above, cover);
    for (int32_t channel = 0; channel < 3; ++channel)
      pixel[channel] = Blend(pixel[channel], above[channel], cover);
  }
};

void PaintMask(PackedImage& image, PackedImage* alpha, const PackedImage& mask, int32_t left,
               int32_t top, const Backdrop& color) {
  const Covered covered = CoveredBy(image, {left, top, mask.Width(), mask.Height()});
  const uint8_t bgr[] = {color.blue, color.green, color.red};
  for (int32_t y = covered.top; y < covered.bottom; ++y) {
    const uint8_t* const cover = mask.Row(y - top).data();
    const TargetRow row(image, alpha, y);
    for (int32_t x = covered.left; x < covered.right; ++x)
      row.Paint(x, bgr, Blend(0, cover[x - left], color.alpha));
  }
}

}  // namespace

Status PaintThroughMask(PictureRecord& picture, const PackedImage& mask, int32_t left, int32_t top,
                        const Backdrop& color) {
  RETURN_IF_BAD(PromotePicture(picture));
  PaintMask(picture.image, picture.alpha.Empty() ? nullptr : &picture.alpha, mask, left, top,
            color);
  return Status::Ok;
}

void PaintThroughMask(PackedImage& image, const PackedImage& mask, int32_t left, int32_t top,
                      const Backdrop& color) {
  PaintMask(image, nullptr, mask, left, top, color);
}

Status PaintRectangle(PictureRecord& picture, const Rectangle& area, const Backdrop& color) {
  RETURN_IF_BAD(PromotePicture(picture));
  const Covered covered = CoveredBy(picture.image, area);
  const uint8_t bgr[] = {color.blue, color.green, color.red};
  for (int32_t y = covered.top; y < covered.bottom; ++y) {
    const TargetRow row(picture, y);
    for (int32_t x = covered.left; x < covered.right; ++x) row.Paint(x, bgr, color.alpha);
  }
  return Status::Ok;
}

Status PaintPicture(PictureRecord& picture, const PictureRecord& above, int32_t left, int32_t top,
                    uint8_t opacity) {
  RETURN_IF_BAD(PromotePicture(picture));
  const Covered covered =
      CoveredBy(picture.image, {left, top, above.image.Width(), above.image.Height()});
  for (int32_t y = covered.top; y < covered.bottom; ++y) {
    const uint8_t* const bgr = above.image.Row(y - top).data();
    const uint8_t* const alpha =
        above.alpha.Empty() ? nullptr : above.alpha.Row(y - top).data();
    const TargetRow row(picture, y);
    for (int32_t x = covered.left; x < covered.right; ++x) {
      const int32_t own = x - left;
      row.Paint(x, bgr + static_cast<ptrdiff_t>(own) * 3,
                alpha == nullptr ? opacity : Blend(0, alpha[own], opacity));
    }
  }
  return Status::Ok;
}

Status PaintTiles(PictureRecord& picture, const PictureRecord& tile, const Rectangle& area) {
  RETURN_IF_BAD(PromotePicture(picture));
  const Covered covered = CoveredBy(picture.image, area);
  for (int32_t y = covered.top; y < covered.bottom; ++y) {
    const uint8_t* const bgr = tile.image.Row((y - area.y) % tile.image.Height()).data();
    const TargetRow row(picture, y);
    for (int32_t x = covered.left; x < covered.right; ++x)
      row.Paint(x, bgr + static_cast<ptrdiff_t>((x - area.x) % tile.image.Width()) * 3, 255);
  }
  return Status::Ok;
}

}  // namespace fotomill
