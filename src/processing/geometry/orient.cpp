#include "processing/geometry/orient.h"

#include <algorithm>
#include <cstring>

#include "picture/picture_record.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

// Tile edge in pixels: the source and destination tiles fit in the L2 cache during transposition.
// Smaller tiles for the L1 cache take 50 % longer.
constexpr int32_t kTile = 128;

// Source and destination as arrays of pixels of `bytes` each, top row first.
template <int bytes>
void TurnTile(const PackedImage& from, PackedImage& to, Turn turn, int32_t left, int32_t top) {
  const int32_t right = std::min(left + kTile, to.Width()),
                bottom = std::min(top + kTile, to.Height());
  for (int32_t y = top; y < bottom; ++y) {
    uint8_t* pixel = to.Row(y).data() + static_cast<size_t>(left) * bytes;
    const int32_t column = turn.flipX ? from.Width() - 1 - y : y;
    const int32_t firstRow = turn.flipY ? from.Height() - 1 - left : left;
    const uint8_t* source = from.Row(firstRow).data() + static_cast<size_t>(column) * bytes;
    // Rows are stored bottom-up, so the next row down is at a lower address.
    const auto stride = static_cast<std::ptrdiff_t>(from.Stride());
    const std::ptrdiff_t step = turn.flipY ? stride : -stride;
    for (int32_t x = left; x < right; ++x, pixel += bytes) {
      std::memcpy(pixel, source, bytes);
      if (x + 1 < right) source += step;
    }
  }
}

template <int bytes>
void TurnRows(const PackedImage& from, PackedImage& to, Turn turn) {
  if (turn.swap) {
    for (int32_t top = 0; top < to.Height(); top += kTile) {
      for (int32_t left = 0; left < to.Width(); left += kTile)
        TurnTile<bytes>(from, to, turn, left, top);
    }
    return;
  }
  for (int32_t y = 0; y < to.Height(); ++y) {
    const uint8_t* source = from.Row(turn.flipY ? from.Height() - 1 - y : y).data();
    uint8_t* pixel = to.Row(y).data();
    if (!turn.flipX) {
      std::memcpy(pixel, source, from.Stride());
      continue;
    }
    source += static_cast<size_t>(from.Width()) * bytes;
    for (int32_t x = 0; x < to.Width(); ++x, pixel += bytes)
      std::memcpy(pixel, source -= bytes, bytes);
  }
}

}  // namespace

Status OrientImage(const PackedImage& image, Orientation orientation, PackedImage& turned) {
  const Turn turn = TurnOf(orientation);
  const int32_t width = turn.swap ? image.Height() : image.Width();
  const int32_t height = turn.swap ? image.Width() : image.Height();
  PackedImage made;
  RETURN_IF_BAD(NewPackedImage(width, height, nullptr, image.Bits(), made));
  std::copy(image.ColorTable().begin(), image.ColorTable().end(), made.ColorTable().begin());
  if (image.Bits() >= 8) {
    const auto turnRows = image.Bits() == 24 ? TurnRows<3> : TurnRows<1>;
    turnRows(image, made, turn);
  } else {
    // Several pixels per byte: unpacked to bytes, rotated, and packed again.
    PackedImage deep, deepTurned;
    RETURN_IF_BAD(PromoteImage(image, 8, deep));
    RETURN_IF_BAD(NewPackedImage(width, height, nullptr, 8, deepTurned));
    TurnRows<1>(deep, deepTurned, turn);
    for (int32_t r = 0; r < height; ++r) {
      PackIndices(deepTurned.StoredRow(r).data(), width, image.Bits(), made.StoredRow(r).data());
    }
  }
  turned = std::move(made);
  return Status::Ok;
}

Status OrientPicture(PictureRecord& picture, Orientation orientation) {
  const Turn turn = TurnOf(orientation);
  if (turn == Turn{} || picture.image.Empty()) return Status::Ok;
  PackedImage image, alpha;
  RETURN_IF_BAD(OrientImage(picture.image, orientation, image));
  if (!picture.alpha.Empty()) RETURN_IF_BAD(OrientImage(picture.alpha, orientation, alpha));
  picture.image = std::move(image);
  picture.alpha = std::move(alpha);
  if (turn.swap) {
    std::swap(picture.width, picture.height);
    std::swap(picture.metadata.dpiX, picture.metadata.dpiY);
  }
  return Status::Ok;
}

}  // namespace fotomill
