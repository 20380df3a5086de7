#include "processing/geometry/canvas.h"

#include <algorithm>
#include <array>
#include <bitset>
#include <cstdlib>
#include <cstring>
#include <optional>

#include "processing/geometry/cut.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

// Creates an image of `size` from one of the same depth, row by row: `fill(y, row)` writes row y.
// Both have whole bytes per pixel; images of less than 8 bits are unpacked and packed again.
template <typename Fill>
Status RemakeImage(PackedImage& image, Size size, Fill fill) {
  const int32_t bits = image.Bits();
  PackedImage deep, made;
  RETURN_IF_BAD(NewPackedImage(size.width, size.height, nullptr, bits, made));
  std::ranges::copy(image.ColorTable(), made.ColorTable().begin());
  if (bits >= 8) {
    for (int32_t y = 0; y < size.height; ++y) fill(image, y, made.Row(y).data());
  } else {
    RETURN_IF_BAD(PromoteImage(image, 8, deep));
    platform::MemoryBlock row;
    if (!row.Allocate(static_cast<uint64_t>(size.width))) return Status::MemoryAllocationError;
    for (int32_t y = 0; y < size.height; ++y) {
      fill(deep, y, row.Data());
      PackIndices(row.Data(), size.width, bits, made.Row(y).data());
    }
  }
  image = std::move(made);
  return Status::Ok;
}

Status PlaceImage(PackedImage& image, Size size, int32_t x, int32_t y,
                  std::array<uint8_t, 3> pixel) {
  const Rectangle seen = Clipped({x, y, image.Width(), image.Height()}, size.width, size.height);
  return RemakeImage(image, size, [&](const PackedImage& source, int32_t line, uint8_t* row) {
    const size_t bytes = source.Bits() == 24 ? 3 : 1;
    if (bytes == 1) {
      std::memset(row, pixel[0], static_cast<size_t>(size.width));
    } else {
      for (int32_t i = 0; i < size.width; ++i)
        std::memcpy(row + 3 * static_cast<size_t>(i), pixel.data(), 3);
    }
    if (seen.width == 0 || line < seen.y || line >= seen.y + seen.height) return;
    std::memcpy(row + static_cast<size_t>(seen.x) * bytes,
                source.Row(line - y).data() + static_cast<size_t>(seen.x - x) * bytes,
                static_cast<size_t>(seen.width) * bytes);
  });
}

// A palette entry for a color: an equal one, else an unused one.
std::optional<int32_t> EntryFor(PictureRecord& picture, const Backdrop& backdrop) {
  PackedImage& image = picture.image;
  const auto table = image.ColorTable();
  const std::array<uint8_t, 3> bgr{backdrop.blue, backdrop.green, backdrop.red};
  for (int32_t i = 0; i < image.Colors(); ++i) {
    if (std::memcmp(table.data() + 4 * i, bgr.data(), 3) == 0) return i;
  }
  if (backdrop.alpha == 0) return 0;  // invisible, so any color will do
  std::bitset<256> used;
  for (int32_t y = 0; y < image.Height(); ++y) {
    for (int32_t x = 0; x < image.Width(); ++x) used.set(static_cast<size_t>(image.PixelAt(x, y)));
  }
  for (int32_t i = 0; i < image.Colors(); ++i) {
    if (used.test(static_cast<size_t>(i))) continue;
    std::memcpy(table.data() + 4 * i, bgr.data(), 3);
    uint8_t* rgb = picture.palette.data() + 3 * i;
    rgb[0] = backdrop.red;
    rgb[1] = backdrop.green;
    rgb[2] = backdrop.blue;
    return i;
  }
  return std::nullopt;
}

void TakeSize(PictureRecord& picture) {
  picture.width = picture.image.Width();
  picture.height = picture.image.Height();
  picture.bitsPerPixel = picture.image.Bits();
}

// The first column before `end` that is not background; `end` if there is none.
template <typename IsOther>
int32_t FirstOther(int32_t end, IsOther isOther) {
  for (int32_t x = 0; x < end; ++x) {
    if (isOther(x)) return x;
  }
  return end;
}

}  // namespace

Status PlaceOnCanvas(PictureRecord& picture, Size size, int32_t x, int32_t y,
                     const Backdrop& backdrop) {
  if (picture.image.Empty()) return Status::EmptyImage;
  RETURN_IF_BAD(CheckPackedSize(size.width, size.height, picture.image.Bits()));
  const Rectangle own{0, 0, picture.image.Width(), picture.image.Height()};
  const bool covered = x <= 0 && y <= 0 && static_cast<int64_t>(x) + own.width >= size.width &&
                       static_cast<int64_t>(y) + own.height >= size.height;
  if (covered) return CutPicture(picture, {-x, -y, size.width, size.height});
  std::array<uint8_t, 3> pixel{backdrop.blue, backdrop.green, backdrop.red};
  if (picture.image.Bits() < 24) {
    if (const auto entry = EntryFor(picture, backdrop)) {
      pixel[0] = static_cast<uint8_t>(*entry);
    } else {
      RETURN_IF_BAD(PromotePicture(picture));
    }
  }
  PackedImage alpha;
  const bool hasAlpha = !picture.alpha.Empty() || backdrop.alpha < 255;
  if (!picture.alpha.Empty()) {
    RETURN_IF_BAD(CutImage(picture.alpha, own, alpha));
  } else if (hasAlpha) {
    RETURN_IF_BAD(NewAlphaPlane(own.width, own.height, alpha));
    std::ranges::fill(alpha.Rows(), uint8_t{255});
  }
  if (hasAlpha) RETURN_IF_BAD(PlaceImage(alpha, size, x, y, {backdrop.alpha, 0, 0}));
  RETURN_IF_BAD(PlaceImage(picture.image, size, x, y, pixel));
  picture.alpha = std::move(alpha);
  if (hasAlpha) picture.alphaFlags |= kHasAlpha;
  TakeSize(picture);
  return Status::Ok;
}

Status WrapPicture(PictureRecord& picture, int64_t right, int64_t down) {
  if (picture.image.Empty()) return Status::EmptyImage;
  const Size size{picture.image.Width(), picture.image.Height()};
  const auto within = [](int64_t way, int32_t length) {
    return static_cast<int32_t>((way % length + length) % length);
  };
  const int32_t x = within(right, size.width), y = within(down, size.height);
  if (x == 0 && y == 0) return Status::Ok;
  const auto wrap = [&](const PackedImage& source, int32_t line, uint8_t* row) {
    const size_t bytes = source.Bits() == 24 ? 3 : 1,
                 length = static_cast<size_t>(size.width) * bytes;
    const size_t way = static_cast<size_t>(x) * bytes;
    const uint8_t* from = source.Row(within(static_cast<int64_t>(line) - y, size.height)).data();
    std::memcpy(row + way, from, length - way);
    std::memcpy(row, from + (length - way), way);
  };
  PackedImage alpha;
  if (!picture.alpha.Empty()) {
    RETURN_IF_BAD(CutImage(picture.alpha, {0, 0, size.width, size.height}, alpha));
    RETURN_IF_BAD(RemakeImage(alpha, size, wrap));
  }
  RETURN_IF_BAD(RemakeImage(picture.image, size, wrap));
  picture.alpha = std::move(alpha);
  return Status::Ok;
}

Status FindContent(const PictureRecord& picture, int32_t fuzz, Rectangle& content) {
  const int32_t width = picture.image.Width(), height = picture.image.Height();
  BgrRows rows;
  RETURN_IF_BAD(rows.Open(picture.image));
  std::array<uint8_t, 3> corner;
  std::memcpy(corner.data(), rows.Row(0), 3);
  const bool hasAlpha = !picture.alpha.Empty();
  const int32_t cornerAlpha = hasAlpha ? picture.alpha.Row(0)[0] : 255;
  int32_t left = width, right = -1, top = height, bottom = -1;
  for (int32_t y = 0; y < height; ++y) {
    const uint8_t* bgr = rows.Row(y);
    const uint8_t* alpha = hasAlpha ? picture.alpha.Row(y).data() : nullptr;
    const auto isOther = [&](int32_t x) {
      if (alpha != nullptr) {
        if (std::abs(alpha[x] - cornerAlpha) > fuzz) return true;
        if (alpha[x] == 0 && cornerAlpha == 0) return false;
      }
      const uint8_t* pixel = bgr + 3 * static_cast<size_t>(x);
      return std::abs(pixel[0] - corner[0]) > fuzz || std::abs(pixel[1] - corner[1]) > fuzz ||
             std::abs(pixel[2] - corner[2]) > fuzz;
    };
    const int32_t first = FirstOther(width, isOther);
    if (first == width) continue;
    left = std::min(left, first);
    const int32_t behind = width - 1 - right;
    right = width - 1 -
            std::min(behind, FirstOther(behind, [&](int32_t x) { return isOther(width - 1 - x); }));
    top = std::min(top, y);
    bottom = y;
  }
  content = bottom < 0 ? Rectangle{0, 0, width, height}
                       : Rectangle{left, top, right - left + 1, bottom - top + 1};
  return Status::Ok;
}

}  // namespace fotomill
