#include "catalog/thumbnails/thumbnail_drawing.h"

#include <algorithm>
#include <cstring>

#include "processing/geometry/scale.h"

namespace fotomill {

namespace {

constexpr int32_t kHalfSide = kSmallThumbnailSide / 2;

// Rounds down each of the three terms.
void TurnGray(PackedImage& bitmap) {
  for (int32_t r = 0; r < bitmap.Height(); ++r) {
    uint8_t* pixel = bitmap.StoredRow(r).data();
    for (int32_t i = 0; i < bitmap.Width(); ++i, pixel += 3) {
      std::memset(pixel, pixel[2] * 30 / 100 + pixel[1] * 59 / 100 + pixel[0] * 11 / 100, 3);
    }
  }
}

// The overlap of old pixels (`from` per side) with new ones (`to` per side), in units in which an
// old pixel is `to` and a new one `from` wide.
struct Covered {
  int32_t first, count;
  int32_t Weight(int32_t old, int32_t to, int32_t from, int32_t made) const {
    return std::min((old + 1) * to, (made + 1) * from) - std::max(old * to, made * from);
  }
};
Covered CoveredBy(int32_t made, int32_t from, int32_t to) {
  const int32_t first = made * from / to, last = ((made + 1) * from - 1) / to;
  return {first, last - first + 1};
}

// Scales a square bitmap; each new pixel is the mean of the area it covers.
Status Stretch(const PackedImage& bitmap, int32_t side, PackedImage& stretched) {
  const int32_t from = bitmap.Width();
  RETURN_IF_BAD(NewPackedImage(side, side, nullptr, 24, stretched));
  for (int32_t r = 0; r < side; ++r) {
    const Covered rows = CoveredBy(r, from, side);
    for (int32_t c = 0; c < side; ++c) {
      const Covered columns = CoveredBy(c, from, side);
      int32_t sums[3] = {};
      for (int32_t y = rows.first; y < rows.first + rows.count; ++y) {
        const int32_t rowWeight = rows.Weight(y, side, from, r);
        const uint8_t* const row = bitmap.StoredRow(y).data();
        for (int32_t x = columns.first; x < columns.first + columns.count; ++x) {
          const int32_t weight = rowWeight * columns.Weight(x, side, from, c);
          for (int32_t i = 0; i < 3; ++i) sums[i] += weight * row[3 * x + i];
        }
      }
      uint8_t* const pixel = &stretched.StoredRow(r)[static_cast<size_t>(c) * 3];
      for (int32_t i = 0; i < 3; ++i)
        pixel[i] = static_cast<uint8_t>((sums[i] + from * from / 2) / (from * from));
    }
  }
  return Status::Ok;
}

Status Resample(const PackedImage& bitmap, int32_t side, int32_t filter, PackedImage& scaled) {
  PackedImage noAlpha;
  return ScaleFiltered(bitmap, {}, {side, side}, ScaleFilterFromKey(filter), scaled, noAlpha);
}

Status MakeDrawnBitmap(const AnyThumbnailRecord& record, uint32_t flags,
                       const ThumbnailOptions& options, PackedImage& bitmap) {
  RETURN_IF_BAD(std::visit([&](const auto& held) { return ThumbnailRecordToBitmap(held, bitmap); }, record));
  if ((flags & kDrawGray) != 0) TurnGray(bitmap);
  const int32_t side = DrawnThumbnailSide(record, flags);
  if (side == bitmap.Width()) return Status::Ok;
  const bool filtered = (flags & kDrawLargeView) != 0 && !options.fastZoom;
  PackedImage made;
  RETURN_IF_BAD(filtered ? Resample(bitmap, side, options.zoomFilter, made) : Stretch(bitmap, side, made));
  bitmap = std::move(made);
  return Status::Ok;
}

void CopyClipped(const PackedImage& from, PackedImage& to, int32_t x, int32_t y) {
  const int64_t left = std::max<int64_t>(x, 0),
                right = std::min<int64_t>(int64_t{x} + from.Width(), to.Width());
  const int64_t top = std::max<int64_t>(y, 0),
                bottom = std::min<int64_t>(int64_t{y} + from.Height(), to.Height());
  if (left >= right) return;
  for (int64_t row = top; row < bottom; ++row) {
    const uint8_t* const source = from.Row(static_cast<int32_t>(row - y)).data() + 3 * (left - x);
    std::memcpy(to.Row(static_cast<int32_t>(row)).data() + 3 * left, source,
                static_cast<size_t>(3 * (right - left)));
  }
}

bool IsMatte(const PackedImage& bitmap, int32_t x, int32_t y, Color matte) {
  const uint8_t* const pixel = bitmap.Row(y).data() + 3 * static_cast<size_t>(x);
  return pixel[0] == static_cast<uint8_t>(matte >> 16) &&
         pixel[1] == static_cast<uint8_t>(matte >> 8) && pixel[2] == static_cast<uint8_t>(matte);
}

// Number of matte rows on both the top and bottom, or of columns on both sides. They differ by at
// most one, as pictures are centered.
template <typename IsMatteAt>
int32_t EvenMargin(int32_t side, IsMatteAt isMatteAt) {
  for (int32_t margin = 0; 2 * (margin + 1) < side; ++margin) {
    for (int32_t i = 0; i < side; ++i) {
      if (!isMatteAt(margin, i) || !isMatteAt(side - 1 - margin, i)) return margin;
    }
  }
  return (side - 1) / 2;
}

// The margin after scaling. Pixels that are partly matte belong to the margin.
int32_t DrawnMargin(int32_t margin, int32_t side, int32_t drawn) {
  return std::min((margin * drawn + side - 1) / side, (drawn - 1) / 2);
}

}  // namespace

int32_t DrawnThumbnailSide(const AnyThumbnailRecord& record, uint32_t flags) {
  if ((flags & kDrawLargeView) != 0) return kLargeThumbnailSide;
  if ((flags & kDrawHalfSize) != 0) return kHalfSide;
  return std::holds_alternative<LargeThumbnailRecord>(record) ? kLargeThumbnailSide
                                                              : kSmallThumbnailSide;
}

bool DrawThumbnailRecord(PackedImage& bitmap, const AnyThumbnailRecord& record, int32_t x,
                         int32_t y, uint32_t flags, const ThumbnailOptions& options) {
  PackedImage drawn;
  if (bitmap.Bits() != 24 || MakeDrawnBitmap(record, flags, options, drawn) != Status::Ok)
    return false;
  CopyClipped(drawn, bitmap, x, y);
  return true;
}

Status DrawThumbnailPicture(const AnyThumbnailRecord& record, uint32_t flags,
                            const ThumbnailOptions& options, PackedImage& picture) {
  PackedImage bitmap;
  RETURN_IF_BAD(
      std::visit([&](const auto& held) { return ThumbnailRecordToBitmap(held, bitmap); }, record));
  const int32_t side = bitmap.Width(), drawn = DrawnThumbnailSide(record, flags);
  const int32_t top = EvenMargin(
      side, [&](int32_t line, int32_t i) { return IsMatte(bitmap, i, line, options.matte); });
  const int32_t left = EvenMargin(
      side, [&](int32_t line, int32_t i) { return IsMatte(bitmap, line, i, options.matte); });
  const int32_t x = DrawnMargin(left, side, drawn), y = DrawnMargin(top, side, drawn);
  RETURN_IF_BAD(NewPackedImage(drawn - 2 * x, drawn - 2 * y, nullptr, 24, picture));
  return DrawThumbnailRecord(picture, record, -x, -y, flags, options)
             ? Status::Ok
             : Status::MemoryAllocationError;
}

}  // namespace fotomill
