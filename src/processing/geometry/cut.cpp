#include "processing/geometry/cut.h"

#include <algorithm>
#include <cstring>

namespace fotomill {

namespace {

// Copies `bits` bits, from bit `from` of a row to the start of another, most significant bit first.
// The last byte is padded with zeros.
void CopyBits(std::span<const uint8_t> row, size_t from, size_t bits, uint8_t* copy) {
  const size_t shift = from % 8;
  const size_t bytes = (bits + 7) / 8;
  for (size_t i = 0; i < bytes; ++i) {
    const size_t place = from / 8 + i;
    const uint32_t next = place + 1 < row.size() ? row[place + 1] : 0;
    copy[i] = static_cast<uint8_t>((row[place] << 8 | next) >> (8 - shift));
  }
  if (bits % 8 != 0) copy[bytes - 1] &= static_cast<uint8_t>(0xff00 >> bits % 8);
}

}  // namespace

Rectangle Clipped(const Rectangle& area, int32_t width, int32_t height) {
  const int64_t left = std::max(area.x, 0), top = std::max(area.y, 0);
  const int64_t right = std::min<int64_t>(static_cast<int64_t>(area.x) + area.width, width);
  const int64_t bottom = std::min<int64_t>(static_cast<int64_t>(area.y) + area.height, height);
  if (right <= left || bottom <= top) return {};
  return {static_cast<int32_t>(left), static_cast<int32_t>(top), static_cast<int32_t>(right - left),
          static_cast<int32_t>(bottom - top)};
}

Status CutImage(const PackedImage& image, const Rectangle& area, PackedImage& cut) {
  PackedImage made;
  RETURN_IF_BAD(NewPackedImage(area.width, area.height, nullptr, image.Bits(), made));
  std::ranges::copy(image.ColorTable(), made.ColorTable().begin());
  const auto bits = static_cast<size_t>(image.Bits());
  const size_t from = static_cast<size_t>(area.x) * bits,
               length = static_cast<size_t>(area.width) * bits;
  for (int32_t y = 0; y < area.height; ++y) {
    const auto row = image.Row(area.y + y);
    if (bits >= 8) {
      std::memcpy(made.Row(y).data(), row.data() + from / 8, length / 8);
    } else {
      CopyBits(row, from, length, made.Row(y).data());
    }
  }
  cut = std::move(made);
  return Status::Ok;
}

Status CutPicture(PictureRecord& picture, const Rectangle& area) {
  if (picture.image.Empty()) return Status::EmptyImage;
  const Rectangle inside = Clipped(area, picture.image.Width(), picture.image.Height());
  if (inside.width == 0) return Status::EmptyImage;
  if (inside == Rectangle{0, 0, picture.image.Width(), picture.image.Height()}) return Status::Ok;
  PackedImage image, alpha;
  RETURN_IF_BAD(CutImage(picture.image, inside, image));
  if (!picture.alpha.Empty()) RETURN_IF_BAD(CutImage(picture.alpha, inside, alpha));
  picture.image = std::move(image);
  picture.alpha = std::move(alpha);
  picture.width = inside.width;
  picture.height = inside.height;
  return Status::Ok;
}

}  // namespace fotomill
