#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace fotomill {

// Metadata of formats that only plug-ins can take apart, such as HEIC and AVIF.
struct ForeignMetadata {
  std::vector<uint8_t> exif;  // a TIFF structure
  std::vector<uint8_t> xmp;   // a packet
};

// Reads them from a file. False if no plug-in has the file name's extension, or it fails. On any
// thread.
using ForeignReader = bool (*)(const std::string& path, ForeignMetadata& metadata);

void InstallForeignReader(ForeignReader reader);  // null removes it
// By the installed reader; false without one, or if there are no metadata.
bool ReadForeignMetadata(const std::string& path, ForeignMetadata& metadata);

}  // namespace fotomill
