#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "pages/model/page.h"

namespace fotomill {

// The border of a cell: none, a bevel lit from the top left, or a line.
enum class CellFrame { None, Raised, Flat };

// The layout of a contact sheet: a grid of pictures with their names. Lengths in millimeters.
struct ContactLayout {
  double pageWidth = 210, pageHeight = 297;
  int32_t columns = 4, rows = 5;
  double left = 10, top = 10;              // of the first cell
  double cellWidth = 40, cellHeight = 40;  // area of a picture
  double stepX = 45, stepY = 50;           // from cell to cell
  double inset = 0;                        // of the picture's area in its cell
  double frameReach = 0;                   // of the frame beyond the picture's area, right and down
  double frameWidth = 0.2;                 // of its lines
  double captionGap = 1;                   // from the picture's area to the name
  double captionHeight = 4.5;              // area of the name
  double lineHeight = 4;                   // of its font
  CellFrame frame = CellFrame::None;
  Color light = 0xA0A0A0, dark = 0xA0A0A0;  // top and left, bottom and right lines of frames
  Color text = 0;
  Color background = 0xFFFFFF;
  bool names = true;
  bool onBaseline = false;  // pictures are at the bottom of their cells, next to the names
  std::string font = "Arial";
};

// The area of the picture in cell `index`, in row order.
Box ContactArea(const ContactLayout& layout, int32_t index);
// Adds a cell: frame, picture and name.
void AddContactCell(const ContactLayout& layout, int32_t index, const PagePicture& picture,
                    std::vector<PageItem>& items);
// Divides a page into cells: sets positions and sizes from page, columns, rows and names.
void FitContactGrid(double margin, ContactLayout& layout);
// The pages for a selection, each picture with a bookmark.
std::vector<Page> ContactPages(const ContactLayout& layout, std::span<const PagePicture> pictures);

}  // namespace fotomill
