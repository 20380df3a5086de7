#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "pages/model/page.h"
#include "pages/model/paper.h"
#include "pages/model/placing.h"

namespace fotomill {

// A size of prints on photo pages.
struct PhotoSize {
  PaperSize size;
  bool upright =
      false;  // keep it upright, as for identity cards; else it is turned like the picture
  int32_t copies = 1;
};

// Options for photo pages. Lengths in millimeters.
struct PhotoOptions {
  PaperSize paper{210, 297};
  double margin = 5;
  double gap = 0;                     // between prints
  std::vector<PhotoSize> sizes = {};  // each picture is printed in each size
  PictureFit fit = PictureFit::Cover;
  bool cutLines = true;
  Color cutLineColor = 0;
};

// A place for a print.
struct PackedPlace {
  size_t sheet = 0;
  Box box;
  bool turned = false;  // rotated by 90 degrees: width and height are exchanged
};

// Packs rectangles on sheets of `room`, rotated where that helps, with `gap` between them, on as
// few sheets as found by several strategies. Empty if one of them does not fit on a sheet. Places
// are relative to the room, in the order of `sizes`.
// Source: J. Jylanki, "A Thousand Ways to Pack the Bin" (2010), maximal rectangles.
std::vector<PackedPlace> PackSheets(std::span<const PaperSize> sizes, const PaperSize& room,
                                    double gap);

// Whether all sizes fit on the paper.
bool PhotosFit(const PhotoOptions& options);
// The sheets with all prints of a selection. Empty if a size does not fit.
std::vector<Page> PhotoPages(const PhotoOptions& options, std::span<const PagePicture> pictures);

}  // namespace fotomill
