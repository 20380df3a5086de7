#pragma once

#include <cstdint>
#include <span>
#include <string>

#include "batch/job.h"
#include "batch/run.h"
#include "pages/catalog_drawing.h"

namespace fotomill {

// No page gets this number; the page that would have to fails.
inline constexpr uint32_t kLastCatalogPage = 10000000;

// "Catalog_00001.jpg": the prefix, the number with at least five digits, the extension in lower
// case.
std::string CatalogPageName(std::string_view prefix, uint32_t number, std::string_view extension);

// How a page is written.
struct CatalogPageOptions {
  bool reduce = false;  // the page's colors are reduced where the format takes fewer
  bool dryRun = false;
};

// Writes a page under the first free name in the job's destination folder and stores its path. Ok;
// ErrorWritingFile when no number is left, FunctionCancelled when the user skipped the name,
// UnsupportedFunction when the format cannot be written, else the writer's own status. A page that
// was written sets the job's files-changed flag and goes to job.uses.
Status WriteCatalogPage(PictureRecord& page, const CatalogPageOptions& options, BatchJob& job,
                        std::string& path);

// How a selection is drawn.
struct ContactSheetOptions {
  CatalogLook look;
  CatalogPageOptions page;
  std::string fontName = "Arial";  // of the names
  bool upright = true;             // pictures are turned as their EXIF says
  bool onFaces = false;            // cells show the faces of their pictures
  std::string reduceHint = {};     // goes behind "Too many colors."
  uint32_t jobs = 0;               // pictures in progress at a time; 0: one per core
};

// Draws a selection on catalogue pages: opens the job's progress box, decodes and scales on several
// threads, draws and writes in the order of the selection, reports every file with its page once
// that is written, finishes the box. A file that cannot be drawn gets no cell. After Abort the page
// that is not full is not written. Ok; before anything is begun ResourceError when the system has
// no font for the names, FunctionCancelled when it is not wanted.
Status RunContactSheet(std::span<const BatchFile> files, const ContactSheetOptions& options,
                       BatchJob& job);

}  // namespace fotomill
