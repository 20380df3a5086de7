#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "core/choice_lists.h"
#include "core/status.h"
#include "desktop/models/drawing/rgb_image.h"
#include "desktop/models/view/photo_facts.h"
#include "metadata/exif/exif_places.h"
#include "metadata/exif/exif_text.h"
#include "metadata/tags/picture_tags.h"

namespace fotomill::desktop {

// A line of the EXIF viewer: a directory heading, or a value.
struct ExifRow {
  bool heading = false;
  uint16_t tag = 0;
  std::string name;  // "DIRECTORY EXIF", or the tag's name, optionally with type
  std::string text;
};

// Options of a report.
struct ExifReportOptions {
  ExifTextOptions text = {};
  std::optional<ExifPosition> home = {};  // start of distances; none: no distances
  choice::DistanceUnit unit = choice::kMiles;
  TagSources tags = {.exif = false};
};
// From the keys ExifShowTypes, ExifDefaultLocation, ExifDistinceUnits, FileCommentPath and
// TextCommentExtension. Main thread only.
ExifReportOptions ExifReportOptionsFromSettings();

// The name of a directory for people: "Camera settings" for "DIRECTORY EXIF"; with `raw` unchanged,
// as are other headings.
std::string ShownHeading(const std::string& heading, bool raw);

// The EXIF of a file, for the viewer.
struct ExifReport {
  Status status = Status::Ok;
  // an error message if not everything can be shown; else empty
  std::string problem;
  // the entries, places and distances from the GPS directory, titles and keywords
  std::vector<ExifRow> rows;
  // all lines as text, for copying, saving and printing
  std::string text;
  std::vector<PhotoFact> photo;         // the main facts, as photographers write them
  std::string link;                     // of a map with the place of the picture; empty: no place
  RgbImage thumbnail;                   // decoded; empty if missing or damaged
  std::vector<uint8_t> thumbnailBytes;  // as stored: a JPEG stream
};

// The rows with the main facts first and headings for people; with `raw` (ExifShowTypes) only the
// rows as they are.
std::vector<ExifRow> RowsForPeople(const ExifReport& report, bool raw);

// Reads a file's EXIF block. May take long; any thread.
ExifReport ReadExifReport(const std::string& path, const ExifReportOptions& options);

}  // namespace fotomill::desktop
