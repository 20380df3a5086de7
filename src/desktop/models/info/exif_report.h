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

// One line of the EXIF viewer: the head of a directory, or a value below it.
struct ExifRow {
  bool heading = false;
  uint16_t tag = 0;
  std::string name;  // "DIRECTORY EXIF", or the tag's name, with its type where that is wanted
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
  // a sentence for people if there is nothing to show, or not all; empty otherwise
  std::string problem;
  // those of the block, then what its GPS directory means: places, and how far they are
  std::vector<ExifRow> rows;
  // the same lines as one text, to be copied, saved or printed
  std::string text;
  RgbImage thumbnail;                   // decoded; empty if there is none that can be
  std::vector<uint8_t> thumbnailBytes;  // as it is in the block: a JPEG stream
};

// Reads and walks a file's EXIF block. Takes as long as the disk takes; any thread may call it.
ExifReport ReadExifReport(const std::string& path, const ExifReportOptions& options);

}  // namespace fotomill::desktop
