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

// A picture's thumbnail in a square, as thumbnail files and the thumbnail database hold it.
// Little-endian:
//
//   offset size            field
//        0    4            magic: "THNL" of a small record, "tHNL" of a large one
//        4    2            version, signed: 512
//        6  258            0
//      264    3 x side^2   pixels: blue, green, red, bottom row first, rows without padding; side
//      96, or 176
//
// The picture is in the middle, offsets rounded down; the rest has the background's color. Small
// records of versions below 2 hold 96 x 96 indices into ThumbnailPalette() instead, in the same
// order of rows.
inline constexpr size_t kThumbnailHeaderSize = 264;
inline constexpr int16_t kThumbnailVersion = 512;  // of records written now
inline constexpr int32_t kSmallThumbnailSide = 96;  // pixels
inline constexpr int32_t kLargeThumbnailSide = 176;  // pixels
inline constexpr std::string_view kSmallThumbnailMagic = "THNL";  // with kSmallThumbnailSide
inline constexpr std::string_view kLargeThumbnailMagic = "tHNL";  // with kLargeThumbnailSide

// A record of either size. It holds its bytes as they are in a file.
template <int32_t side>
struct SquareThumbnailRecord {
  static constexpr int32_t kSide = side;
  static constexpr size_t kStride = size_t{3} * side;
  std::array<uint8_t, kThumbnailHeaderSize + kStride * side> bytes{};

  // The header's fields; a record that was never signed has version 0 and no magic.
  int16_t Version() const { return static_cast<int16_t>(bytes[4] | bytes[5] << 8); }
  // Of four characters.
  bool HasMagic(std::string_view magic) const {
    for (size_t i = 0; i < magic.size(); ++i) {
      if (bytes[i] != static_cast<uint8_t>(magic[i])) return false;
    }
    return true;
  }
  // Sets the magic of this size and the version.
  void Sign() {
    const std::string_view magic =
        side == kLargeThumbnailSide ? kLargeThumbnailMagic : kSmallThumbnailMagic;
    for (size_t i = 0; i < magic.size(); ++i) bytes[i] = static_cast<uint8_t>(magic[i]);
    bytes[4] = kThumbnailVersion & 0xff;
    bytes[5] = kThumbnailVersion >> 8;
  }
  // Gives all pixels one color.
  void Fill(Color color) {
    for (size_t i = kThumbnailHeaderSize; i < bytes.size(); ++i) {
      bytes[i] = static_cast<uint8_t>(color >> (16 - 8 * ((i - kThumbnailHeaderSize) % 3)));
    }
  }
  // Row r in stored order, from the bottom.
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
// The small record, of files and the database, and the large one, of the large view.
using ThumbnailRecord = SquareThumbnailRecord<kSmallThumbnailSide>;
using LargeThumbnailRecord = SquareThumbnailRecord<kLargeThumbnailSide>;
// As in files.
static_assert(sizeof(ThumbnailRecord) == 27912 && sizeof(LargeThumbnailRecord) == 93192);

// The palette of old records: 3 bits of red, 3 of green, 2 of blue.
const Palette& ThumbnailPalette();
// Makes the pixels of an old record, whose indices stand where pixels begin.
void ExpandOldRecord(ThumbnailRecord& record);

// Makes a record from a picture that was read: scaled to fit by the filtered scaler, or by the
// quick one with `quick`, alpha flattened onto the matte. An image that is smaller than the
// picture's `width` and `height` (a reduced decode) will do for the filtered scaler. False without
// pixels or memory; `record` is then as before.
bool MakeThumbnailRecord(ThumbnailRecord& record, const PictureRecord& picture,
                         const ThumbnailOptions& options);
// The same by the quick scaler only, alpha blended with `background`, each product rounded down by
// itself.
bool MakeBlendedThumbnailRecord(ThumbnailRecord& record, const PictureRecord& picture,
                                Color background);
// A large record: a picture that does not fit is scaled down by the filtered scaler, a smaller one
// stays as large as it is; alpha is flattened onto the matte.
bool MakeLargeThumbnailRecord(LargeThumbnailRecord& record, const PictureRecord& picture,
                              Color matte);

// A new 24-bit bitmap with the record's pixels. Statuses as NewPackedImage.
Status ThumbnailRecordToBitmap(const ThumbnailRecord& record, PackedImage& bitmap);
// The same for a large record.
Status ThumbnailRecordToBitmap(const LargeThumbnailRecord& record, PackedImage& bitmap);

}  // namespace fotomill
