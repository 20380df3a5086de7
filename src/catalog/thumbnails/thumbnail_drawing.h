#pragma once

#include <cstdint>
#include <variant>

#include "catalog/thumbnails/thumbnail_record.h"
#include "picture/packed_image.h"

namespace fotomill {

// Thumbnail records as a browser shows them.

// A thumbnail of either size.
using AnyThumbnailRecord = std::variant<ThumbnailRecord, LargeThumbnailRecord>;

// Bits of `flags`. The large view wins over the half size.
inline constexpr uint32_t kDrawHalfSize = 2;   // 48 x 48
inline constexpr uint32_t kDrawLargeView = 4;  // 176 x 176
inline constexpr uint32_t kDrawGray = 8;

// Edge of the square that a record fills when it is drawn.
int32_t DrawnThumbnailSide(const AnyThumbnailRecord& record, uint32_t flags);

// Draws a record into a 24-bit bitmap, the square's top left corner at column x, row y from the
// top; what is outside the bitmap is left out. A small record is enlarged for the large view with
// the filter of the options, or by spreading its pixels. False without memory, or when the bitmap
// has another depth; it is then as before.
bool DrawThumbnailRecord(PackedImage& bitmap, const AnyThumbnailRecord& record, int32_t x,
                         int32_t y, uint32_t flags, const ThumbnailOptions& options);

// The same square without the margins of the matte around the picture, as far as they are even:
// what a browser shows, on a background of its own. Statuses as NewPackedImage.
Status DrawThumbnailPicture(const AnyThumbnailRecord& record, uint32_t flags,
                            const ThumbnailOptions& options, PackedImage& picture);

// Fills a record with one of the two pictures that stand for a thumbnail that is not there: 9501,
// one can still be made; 9502, none can. False for another number.
inline constexpr int32_t kPlaceholderNotMade = 9501;
inline constexpr int32_t kPlaceholderUnreadable = 9502;  // none can be made
// `which`: one of the two numbers above.
bool MakePlaceholderRecord(ThumbnailRecord& record, int32_t which, Color matte);

}  // namespace fotomill
