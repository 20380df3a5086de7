#pragma once

#include <cstdint>
#include <variant>

#include "catalog/thumbnails/thumbnail_record.h"
#include "picture/packed_image.h"

namespace fotomill {

// Draws thumbnail records for a browser.

// A small or large record.
using AnyThumbnailRecord = std::variant<ThumbnailRecord, LargeThumbnailRecord>;

// Bits of `flags`. The large view takes precedence over half size.
inline constexpr uint32_t kDrawHalfSize = 2;   // 48 x 48
inline constexpr uint32_t kDrawLargeView = 4;  // 176 x 176
inline constexpr uint32_t kDrawGray = 8;

// Edge of the square in which a record is drawn.
int32_t DrawnThumbnailSide(const AnyThumbnailRecord& record, uint32_t flags);

// Draws a record into a 24-bit bitmap, with the square's top left corner at (x, y), clipped to the
// bitmap. In the large view, a small record is enlarged with the filter of the options, or by
// repeating pixels. False, with the bitmap unchanged, if memory runs out or the bitmap has another
// depth.
bool DrawThumbnailRecord(PackedImage& bitmap, const AnyThumbnailRecord& record, int32_t x,
                         int32_t y, uint32_t flags, const ThumbnailOptions& options);

// The same square, but without the matte margins around the picture, as far as they are symmetric;
// browsers show it on their own background. Statuses of NewPackedImage.
Status DrawThumbnailPicture(const AnyThumbnailRecord& record, uint32_t flags,
                            const ThumbnailOptions& options, PackedImage& picture);

// Fills a record with a placeholder: 9501, the thumbnail is not made yet; 9502, it cannot be made.
// False for any other number.
inline constexpr int32_t kPlaceholderNotMade = 9501;
inline constexpr int32_t kPlaceholderUnreadable = 9502;  // cannot be made
// `which`: one of these two numbers.
bool MakePlaceholderRecord(ThumbnailRecord& record, int32_t which, Color matte);

}  // namespace fotomill
