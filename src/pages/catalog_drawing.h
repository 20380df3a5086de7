#pragma once

#include <cstdint>
#include <string_view>

#include "core/status.h"
#include "drawing/text_font.h"
#include "picture/packed_image.h"
#include "picture/picture_record.h"
#include "picture/rectangle.h"

namespace fotomill {

// The border of a cell: none, a bevel lit from the top left, or a line.
enum class CellFrame { None, Raised, Flat };

// Appearance of catalog pages. Colors are 0x00BBGGRR.
struct CatalogLook {
  int32_t columns = 5, rows = 4;
  int32_t cellWidth = 96, cellHeight = 96;  // picture area
  int32_t pageWidth = 0, pageHeight = 0;    // 0: fit the grid
  CellFrame frame = CellFrame::Raised;
  bool blackText = false;  // names and flat frames in black instead of white and gray
  bool names = true;
  Color background = 0x606060;
};

// A cell is larger than its picture area by these.
inline constexpr int32_t kCellExtraWidth = 12, kCellExtraHeight = 21;

// The page rectangle in pixels, at 0, 0.
Rectangle PageSize(const CatalogLook& look);
// The top left corner of cell `index` (in row order) and the size of its picture area.
Rectangle CellPlace(const CatalogLook& look, int32_t index);
// Where a picture of the given size is drawn in a cell: scaled proportionally and centered in the
// picture area, which begins 2 pixels from the corner.
Rectangle PicturePlace(const CatalogLook& look, const Rectangle& cell, int32_t width,
                       int32_t height);

// Scales a picture to fit a cell: 24 bits, on the page background. Statuses of ScaleFiltered.
Status MakeCellImage(PictureRecord& picture, const CatalogLook& look, PackedImage& image);

// An empty page. Statuses of NewPackedImage.
Status NewCatalogPage(const CatalogLook& look, PackedImage& page);
// Draws a cell: frame, picture and file name (without folder). `font` may be null if `look` shows
// no names. MemoryAllocationError.
Status DrawCell(const CatalogLook& look, int32_t index, const PackedImage& image,
                std::string_view name, TextFont* font, PackedImage& page);

// Line height of the name font, in pixels.
inline constexpr int32_t kCaptionHeight = 14;

}  // namespace fotomill
