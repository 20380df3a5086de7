#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "pages/model/page.h"
#include "pages/model/paper.h"

namespace fotomill {

// Options for posters, one picture over many sheets. Lengths in millimeters.
struct PosterOptions {
  PaperSize paper{210, 297};
  bool turnPaper = true;  // use the paper's orientation that needs fewer sheets
  double margin = 10;
  double overlap = 10;            // of neighboring sheets
  PaperSize size{};                 // the poster fits into it; zero: by columns and rows
  int32_t columns = 2, rows = 0;  // sheets; rows 0: as many as the picture needs
  bool cutLines = true;
  Color cutLineColor = 0;
  bool labels = true;  // number of each sheet
  bool sketch = true;  // a last page that shows how the sheets fit together
  std::string font = "Arial";
  // texts with placeholders: %1 sheet, %2 sheets, %3 row, %4 column
  std::string label = "%1/%2";
  // %1 name, %2 and %3 size in centimeters, %4 sheets
  std::string sketchTitle = "%1";
};

// How a poster is divided.
struct PosterPlan {
  PaperSize paper;              // turned if that needs fewer sheets
  PaperSize size;               // of the picture
  PaperSize room;               // of a sheet without margins
  double stepX = 0, stepY = 0;  // from sheet to sheet
  int32_t columns = 0, rows = 0;

  // The part of the poster on a sheet, relative to the poster.
  Box Part(int32_t column, int32_t row) const;
};

// Divides a picture. The overlap must be smaller than the room of a sheet.
PosterPlan PlanPoster(const PosterOptions& options, const PagePicture& picture);

// The sheets of each picture in rows, each followed by its sketch.
std::vector<Page> PosterPages(const PosterOptions& options, std::span<const PagePicture> pictures);

}  // namespace fotomill
