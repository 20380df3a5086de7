#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "core/status.h"
#include "desktop/models/info/exif_report.h"

namespace fotomill::desktop {

// A line of the report: a label with its value.
struct InfoLine {
  std::string label;  // empty for a line that is a text of its own
  std::string value;
};

// A group of lines: "General", "Details", "EXIF".
struct InfoSection {
  std::string title;
  std::vector<InfoLine> lines;
};

// How "Get info" tells it.
struct InfoOptions {
  int32_t resolution = 96;  // dots per inch of pictures whose file names none
  int32_t units = 0;        // choice::LengthUnit of the print size
  int32_t dateMode = 0;     // choice::DateMode
  ExifReportOptions exif;
};
InfoOptions InfoOptionsFromSettings();

// What "Get info" tells of one file.
struct FileInfo {
  std::string path;
  Status status = Status::Ok;
  std::string problem;  // a sentence, empty when all went well
  std::string format;   // the row's description
  int32_t width = 0, height = 0;
  uint64_t size = 0, imageBytes = 0;
  std::vector<InfoSection> sections;
};

// Opens a file's header and gathers its facts; any thread may call it.
FileInfo ReadFileInfo(const std::string& path, const InfoOptions& options);

// What several files have together: totals, what is the same in all of them, and what differs with
// its values.
std::vector<InfoSection> SummaryOf(std::span<const FileInfo> files);

// Sections as a text: titles, and lines "label: value" set in beneath them.
std::string TextOf(std::span<const InfoSection> sections);
// One file's, under its path.
std::string TextOf(const FileInfo& file);

}  // namespace fotomill::desktop
