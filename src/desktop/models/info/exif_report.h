#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "core/choice_lists.h"
#include "core/status.h"
#include "desktop/models/drawing/rgb_image.h"
#include "metadata/exif/exif_places.h"
#include "metadata/exif/exif_text.h"

namespace fotomill::desktop {

// A line of the EXIF viewer: a directory heading, or a value.
struct ExifRow {
  bool heading = false;
  uint16_t tag = 0;
  std::string name;  // "DIRECTORY EXIF", or the tag's name, optionally with type
  std::string text;
};

// How a report is written.
struct ExifReportOptions {
  ExifTextOptions text = {};
  std::optional<ExifPlace> home = {};  // distances are from here; none: they are not told
  choice::DistanceUnit unit = choice::kMiles;
};
// The keys ExifShowTypes, ExifDefaultLocation and ExifDistinceUnits. For the main thread.
ExifReportOptions ExifReportOptionsFromSettings();

// The EXIF of one picture file as the viewer shows it.
struct ExifReport {
  Status status = Status::Ok;
  // an error message if not everything can be shown; else empty
  std::string problem;
  // those of the block, then what its GPS directory means: places, and how far they are
  std::vector<ExifRow> rows;
  // all lines as text, for copying, saving and printing
  std::string text;
  RgbImage thumbnail;                   // decoded; empty if missing or damaged
  std::vector<uint8_t> thumbnailBytes;  // as stored: a JPEG stream
};

// Reads and walks a file's EXIF block. Takes as long as the disk takes; any thread may call it.
ExifReport ReadExifReport(const std::string& path, const ExifReportOptions& options);

}  // namespace fotomill::desktop
