#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "pages/model/page.h"
#include "pages/model/paper.h"

namespace fotomill {

// How large a print is.
enum class PrintSizing {
  Fit,      // as large as the page allows
  Fill,     // fills the page between the margins, cropped
  Actual,   // by the picture's resolution
  Percent,  // of that
  Given,    // fits into a given size
};

// Options for prints, one picture a page. Lengths in millimeters.
struct PrintOptions {
  PaperSize paper{210, 297};
  double margin = 10;
  PrintSizing sizing = PrintSizing::Fit;
  double percent = 100;
  PaperSize size{100, 150};      // for PrintSizing::Given
  double dpi = 300;              // of pictures without resolution, and of the printer's dots
  int32_t across = 0, down = 0;  // position: -1 left or top, 0 centered, 1 right or bottom
  bool turnPage = true;          // the page lies for wide pictures
  bool wholeDots = false;        // pixels are a whole number of dots wide
  bool expandHalftones = false;  // the same for black and white pictures only
  std::string font = "Arial";
  double lineHeight = 4.2;
  bool names = false;  // below the pictures
  // PagePicture::texts has a title, above the picture, and a comment, below it; empty: none
  bool texts = false;
  double rule = 0;  // width of a line around pictures; 0: none
  Color ruleColor = 0;
  bool ruleShadow = false;
  bool cropMarks = false;
  bool registerMarks = false;  // crosses in the middle of the edges, for presses
  Color background = 0xFFFFFF;
  double matte = 0;  // width of a border of one color around pictures
  Color matteColor = 0xFFFFFF;
};

// A page for each picture.
std::vector<Page> PrintPages(const PrintOptions& options, std::span<const PagePicture> pictures);

}  // namespace fotomill
