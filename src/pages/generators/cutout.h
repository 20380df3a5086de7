#pragma once

#include <span>
#include <string>
#include <vector>

#include "pages/generators/cutout_net.h"
#include "pages/model/page.h"
#include "pages/model/paper.h"

namespace fotomill {

// Options for solids to cut out, fold and glue, with a picture on each face. Lengths in
// millimeters.
struct CutoutOptions {
  PaperSize paper{210, 297};
  double margin = 10;
  double edge = 0;       // of the solid; 0: as large as the paper allows
  Color foreground = 0;  // of lines
  Color background = 0xFFFFFF;
  bool dashed = true;  // lines to fold along
  std::string font = "Arial";
  std::string note = {};  // at the bottom of each page
};

// The largest edge for which all nets fit on the paper, at most 1000.
double LargestEdge(const CutoutOptions& options, std::span<const CutoutNet> nets);
// A page for each net. Faces get the pictures in turn, repeated if there are fewer; pictures are
// cropped to the faces. Empty if a net does not fit.
std::vector<Page> CutoutPages(const CutoutOptions& options, std::span<const CutoutNet> nets,
                              std::span<const PagePicture> pictures);

}  // namespace fotomill
