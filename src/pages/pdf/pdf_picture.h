#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include "core/status.h"
#include "pages/model/page.h"
#include "pages/pdf/pdf_file.h"
#include "pages/picture_reading.h"
#include "platform/file_view.h"
#include "processing/geometry/orient.h"

namespace fotomill {

// A picture ready to be embedded in a document.
struct PdfPicture {
  Orientation orientation = Orientation::Upright;  // how to turn the embedded pixels upright
  int32_t width = 0, height = 0;                   // pixels, as embedded
  std::string colors;            // color space in PDF syntax, for pictures without profile
  int32_t components = 3;        // of the color space
  std::string entries;           // further entries of the dictionary
  platform::FileView file;       // a JPEG file to embed as it is, if open
  std::vector<uint8_t> bytes;    // else the encoded pixels
  std::vector<uint8_t> opacity;  // encoded alpha plane; empty: opaque
  std::vector<uint8_t> profile;  // ICC profile of its colors; empty: none that can be embedded

  std::span<const uint8_t> Bytes() const { return bytes.empty() ? file.Bytes() : bytes; }
};

// How to embed pictures.
struct PdfPictureOptions {
  PagePictureOptions reading;
  int32_t quality = 90;  // of reduced JPEG pictures
};

// Prepares a file for a place of `width` x `height` pixels; 0: full size. A JPEG file that is not
// larger is embedded as it is. Thread-safe. Statuses of LoadPictureInfo and ReadPicture.
Status PreparePdfPicture(const std::string& file, int32_t width, int32_t height,
                         const PdfPictureOptions& options, PdfPicture& picture);

// Writes pictures; each color profile is written once.
class PdfPictureWriter {
 public:
  // Writes a picture as `object`. MemoryAllocationError.
  Status Write(PdfFile& file, const PdfPicture& picture, int32_t object);

 private:
  std::map<std::string, int32_t> profiles_;  // objects, by digest
};

}  // namespace fotomill
