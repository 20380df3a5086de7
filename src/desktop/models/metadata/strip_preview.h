#pragma once

#include <string>
#include <vector>

#include "batch/rewrite/exif_file.h"

namespace fotomill::desktop {

// What removing metadata does to a file, as translated lists of names; computed without writing.
struct StripPreview {
  std::string problem;  // why it is not possible, a sentence; else empty
  std::string removed;
  std::string left;
};
// May take long; any thread.
StripPreview PreviewStrip(const std::string& path, const StripRequest& strip);

// The names of the metadata that are in a file now; a message if it cannot be read.
std::string MetadataInFile(const std::string& path);

}  // namespace fotomill::desktop
