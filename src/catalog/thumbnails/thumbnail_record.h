#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>

#include "catalog/thumbnails/thumbnail_options.h"
#include "picture/packed_image.h"
#include "picture/palette.h"

namespace fotomill {

struct PictureRecord;

// A square thumbnail of a picture, as stored in thumbnail files and the thumbnail database.
// Little-endian:
//
//   offset size            field
//        0    4            magic: "THNL" for small records, "tHNL" for large ones
//        4    2            version, signed: 512
//        6  258            0
// ~     264    3 x side^2   pixels: blue, green, red, bottom row first, no padding; side 96 or
// 176
//
// The picture is centered, with offsets rounded down, on the
// background color. Small records with versions below 2 contain 96 x
// 96 indices into ThumbnailPalette() instead, in the same row order.
inline constexpr size_t kThumbnailHeaderSize = 264;
inline constexpr int16_t kThumbnailVersion = 512;  // of new records
inline constexpr int32_t kSmallThumbnailSide = 96;  // pixels
inline constexpr int32_t kLargeThumbnailSide = 176;  // pixels
inline constexpr std::string_view kSmallThumbnailMagic = "THNL";  // with kSmallThumbnailSide
inline constexpr std::string_view kLargeThumbnailMagic = "tHNL";  // with kLargeThumbnailSide

// A record of either size, stored as in a file.
template <int32_t side>
struct SquareThumbnailRecord {
  static constexpr int32_t kSide = side;
  static constexpr size_t kStride = size_t{3} * side;
  std::array<uint8_t, kThumbnailHeaderSize + kStride * side> bytes{};

  // Header fields; an unsigned record has version 0 and no magic.
  int16_t Version() const { return static_cast<int16_t>(bytes[4] | bytes[5] << 8); }
  // `magic` has four characters.
  bool HasMagic(std::string_view magic) const {
    for (size_t i = 0; i < magic.size(); ++i) {
      if (bytes[i] != static_cast<uint8_t>(magic[i])) return false;
    }
    return true;
  }
  // Sets magic and version.
  void Sign() {
    const std::string_view magic =
        side == kLargeThumbnailSide ? kLargeThumbnailMagic : kSmallThumbnailMagic;
    for (size_t i = 0; i < magic.size(); ++i) bytes[i] = static_cast<uint8_t>(magic[i]);
    bytes[4] = kThumbnailVersion & 0xff;
    bytes[5] = kThumbnailVersion >> 8;
  }
  // Fills all pixels with one color.
  void Fill(Color color) {
    for (size_t i = kThumbnailHeaderSize; i < bytes.size(); ++i) {
      bytes[i] = static_cast<uint8_t>(color >> (16 - 8 * ((i - kThumbnailHeaderSize) % 3)));
    }
  }
  // Row r from the bottom.
  std::span<uint8_t> StoredRow(int32_t r) {
    return std::span(bytes).subspan(kThumbnailHeaderSize + static_cast<size_t>(r) * kStride,
                                    kStride);
  }
  // Row r from the bottom: blue, green, red.
  std::span<const uint8_t> StoredRow(int32_t r) const {
    return std::span(bytes).subspan(kThumbnailHeaderSize + static_cast<size_t>(r) * kStride,
                                    kStride);
  }
};
// The small record, for files and the database, and the large one, for the large view.
using ThumbnailRecord = SquareThumbnailRecord<kSmallThumbnailSide>;
using LargeThumbnailRecord = SquareThumbnailRecord<kLargeThumbnailSide>;
// The size in files.
static_assert(sizeof(ThumbnailRecord) == 27912 && sizeof(LargeThumbnailRecord) == 93192);

// The palette of old records: 3 bits red, 3 green, 2 blue.
const Palette& ThumbnailPalette();
// Converts the indices of an old record, which are at the start of the pixels.
void ExpandOldRecord(ThumbnailRecord& record);

// Makes a record from a decoded picture: scaled to fit with the filtered scaler, or with `quick`
// the quick one, alpha flattened onto the matte. For the filtered scaler, the image may be a
// reduced decode, smaller than `width` and `height`. False, with `record` unchanged, if there are
// no pixels or memory runs out.
bool MakeThumbnailRecord(ThumbnailRecord& record, const PictureRecord& picture,
                         const ThumbnailOptions& options);
// The same with the quick scaler; alpha is blended
// with `background`, rounding down each product.
bool MakeBlendedThumbnailRecord(ThumbnailRecord& record, const PictureRecord& picture,
                                Color background);
// A large record: larger pictures are scaled down with the filtered scaler, smaller ones keep their
// size; alpha is flattened onto the matte.
bool MakeLargeThumbnailRecord(LargeThumbnailRecord& record, const PictureRecord& picture,
                              Color matte);

// Converts a record to a new 24-bit bitmap. Statuses of NewPackedImage.
Status ThumbnailRecordToBitmap(const ThumbnailRecord& record, PackedImage& bitmap);
// The same for a large record.
Status ThumbnailRecordToBitmap(const LargeThumbnailRecord& record, PackedImage& bitmap);

}  // namespace fotomill
