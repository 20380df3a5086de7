#pragma once

#include <cstdint>
#include <span>
#include <string>

#include "batch/job.h"
#include "batch/run.h"
#include "pages/catalog_look.h"

namespace fotomill {

// Page numbers are below this; no further page can be written.
inline constexpr uint32_t kLastCatalogPage = 10000000;

// "Catalog_00001.jpg": prefix, number with at
// least five digits, extension in lowercase.
std::string CatalogPageName(std::string_view prefix, uint32_t number, std::string_view extension);

// Options for writing a page.
struct CatalogPageOptions {
  bool reduce = false;  // reduce the colors of the page if the format supports fewer
  bool dryRun = false;
  std::string prefix = {};  // of the name; empty: the job's for catalogs
};

// Writes a page under the first free name in the job's destination folder and stores its path. Ok;
// ErrorWritingFile if there is no number left, FunctionCancelled if the user skipped the name,
// UnsupportedFunction if the format cannot be written, else the writer's status. Sets the job's
// files-changed flag and adds the page to job.uses.
Status WriteCatalogPage(PictureRecord& page, const CatalogPageOptions& options, BatchJob& job,
                        std::string& path);

// Options for drawing a selection.
struct ContactSheetOptions {
  CatalogLook look;
  CatalogPageOptions page;
  std::string fontName = "Arial";  // for the names
  bool upright = true;             // rotate by EXIF orientation
  bool onFaces = false;            // crop pictures to their faces
  std::string reduceHint = {};     // appended to "Too many colors."
  uint32_t jobs = 0;               // pictures processed in parallel; 0: one per core
};

// Draws a selection on catalog pages: opens the job's progress box, decodes and scales on several
// threads, draws and writes in selection order, reports each file with its page once the page is
// written, closes the box. Failed files get no cell. After Abort, the unfinished page is not
// written. Ok; before starting, ResourceError if there is no font for the names, FunctionCancelled
// if the user declines.
Status RunContactSheet(std::span<const BatchFile> files, const ContactSheetOptions& options,
                       BatchJob& job);

}  // namespace fotomill
