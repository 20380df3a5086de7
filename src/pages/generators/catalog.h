#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "pages/model/page.h"
#include "pages/model/paper.h"

namespace fotomill {

// Options for a graphical catalog: framed pictures with details, a footer on each page, and links
// to the files. Lengths in millimeters.
struct CatalogOptions {
  PaperSize paper{210, 297};
  double margin = 10;
  int32_t columns = 3, rows = 4;
  Color background = 0xFFFFFF;
  bool frameTitles = false;  // names in a bar above the pictures, else below them
  bool links = true;
  std::string font = "Arial";
  std::string footer = {};  // may contain macros; %P is the page's number
};

// The pages of a catalog. PagePicture::texts has a line of details for each picture.
std::vector<Page> CatalogPages(const CatalogOptions& options,
                               std::span<const PagePicture> pictures);

}  // namespace fotomill
