#pragma once

#include <cstdint>
#include <string_view>

#include "core/status.h"
#include "drawing/text_font.h"
#include "picture/packed_image.h"
#include "picture/picture_record.h"
#include "picture/rectangle.h"

namespace fotomill {

// What surrounds a cell: nothing, a border lit from the top left, or a line.
enum class CellFrame { None, Raised, Flat };

// How catalogue pages look. Color values are 0x00BBGGRR.
struct CatalogLook {
  int32_t columns = 5, rows = 4;
  int32_t cellWidth = 96, cellHeight = 96;  // the room of a picture
  int32_t pageWidth = 0, pageHeight = 0;    // 0: as large as the grid needs
  CellFrame frame = CellFrame::Raised;
  bool blackText = false;  // names and flat frames are black, not white and gray
  bool names = true;
  Color background = 0x606060;
};

// One cell takes this more than its picture's room.
inline constexpr int32_t kCellExtraWidth = 12, kCellExtraHeight = 21;

// The whole page in pixels, at 0, 0.
Rectangle PageSize(const CatalogLook& look);
// The corner of cell `index`, counted row by row, and its picture's room.
Rectangle CellPlace(const CatalogLook& look, int32_t index);
// Where a picture of a size is in a cell: scaled by one percentage, centered in the room 2 pixels
// in from the corner.
Rectangle PicturePlace(const CatalogLook& look, const Rectangle& cell, int32_t width,
                       int32_t height);

// Scales a picture to a cell's room: 24 bits, on the page's background. Statuses as ScaleFiltered.
Status MakeCellImage(PictureRecord& picture, const CatalogLook& look, PackedImage& image);

// A page of nothing but background. Statuses as NewPackedImage.
Status NewCatalogPage(const CatalogLook& look, PackedImage& page);
// Draws one cell: frame, picture and name (without folder). `font` may be null for a look without
// names. MemoryAllocationError.
Status DrawCell(const CatalogLook& look, int32_t index, const PackedImage& image,
                std::string_view name, TextFont* font, PackedImage& page);

// Pixels from line to line of the names' font.
inline constexpr int32_t kCaptionHeight = 14;

}  // namespace fotomill
