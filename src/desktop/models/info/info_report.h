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
  std::string label;  // empty for a line of plain text
  std::string value;
  std::string link = {};  // a web page about it; may be empty
};

// A group of lines: "General", "Photo", "Details", "EXIF: Camera settings".
struct InfoSection {
  std::string title;
  std::vector<InfoLine> lines;
  bool folded = false;  // closed at first in windows
};

// Options of "Get info".
struct InfoOptions {
  int32_t resolution = 96;  // dots per inch, for pictures without resolution
  int32_t units = 0;        // choice::LengthUnit of the print size
  int32_t dateMode = 0;     // choice::DateMode
  ExifReportOptions exif;
};
InfoOptions InfoOptionsFromSettings();

// Information about one file.
struct FileInfo {
  std::string path;
  Status status = Status::Ok;
  std::string problem;  // a sentence; empty on success
  std::string format;   // the format's description
  int32_t width = 0, height = 0;
  uint64_t size = 0, imageBytes = 0;
  std::vector<InfoSection> sections;
};

// Reads a file's header and collects its facts; any thread.
FileInfo ReadFileInfo(const std::string& path, const InfoOptions& options);

// A summary of several files: totals,
// common values, and differing ones.
std::vector<InfoSection> SummaryOf(std::span<const FileInfo> files);

// Formats sections as text: titles, with indented lines "label: value".
std::string TextOf(std::span<const InfoSection> sections);
// The same for one file, below its path.
std::string TextOf(const FileInfo& file);

}  // namespace fotomill::desktop
