#include "desktop/models/thumbnails/placeholder.h"

#include <memory>

#include "catalog/thumbnails/thumbnail_drawing.h"
#include "processing/geometry/scale.h"

namespace fotomill::desktop {

namespace {

// The smallest view that is at least as large.
uint32_t FlagsFor(int32_t side) {
  if (side > kSmallThumbnailSide) return kDrawLargeView;
  return side <= kSmallThumbnailSide / 2 ? kDrawHalfSize : 0;
}

Status Draw(bool unreadable, int32_t side, Color background, RgbImage& pixels) {
  ThumbnailRecord small;
  if (!MakePlaceholderRecord(small, unreadable ? kPlaceholderUnreadable : kPlaceholderNotMade,
                             background))
    return Status::MemoryAllocationError;
  const auto record = std::make_unique<AnyThumbnailRecord>(small);
  const uint32_t flags = FlagsFor(side);
  const int32_t drawn = DrawnThumbnailSide(*record, flags);
  PackedImage square, noAlpha, scaled, noScaledAlpha;
  RETURN_IF_BAD(NewPackedImage(drawn, drawn, nullptr, 24, square));
  if (!DrawThumbnailRecord(square, *record, 0, 0, flags, {})) return Status::MemoryAllocationError;
  if (drawn == side) return ToRgb(square, pixels);
  RETURN_IF_BAD(
      ScaleFiltered(square, noAlpha, {side, side}, ScaleFilter::Bicubic, scaled, noScaledAlpha));
  return ToRgb(scaled, pixels);
}

}  // namespace

RgbImage PlaceholderPixels(bool unreadable, int32_t side, Color background) {
  RgbImage pixels;
  return Draw(unreadable, side, background, pixels) == Status::Ok ? pixels : RgbImage();
}

}  // namespace fotomill::desktop
