#pragma once

#include <cstdint>

#include "pages/generators/contact.h"
#include "picture/rectangle.h"

namespace fotomill {

// Appearance of catalog pages, which are measured in pixels.
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
// The resolution at which the layout of catalog pages has whole pixels.
inline constexpr double kCatalogDpi = 96;

// The page rectangle in pixels, at 0, 0.
Rectangle PageSize(const CatalogLook& look);
// The top left corner of cell `index` (in row order) and the size of its picture area.
Rectangle CellPlace(const CatalogLook& look, int32_t index);
// The same as a contact sheet.
ContactLayout LayoutOf(const CatalogLook& look, const std::string& font);

// Line height of the name font, in pixels.
inline constexpr int32_t kCaptionHeight = 14;

}  // namespace fotomill
