#pragma once

#include <cstdint>
#include <span>

#include "core/status.h"
#include "platform/file_view.h"
#include "platform/memory.h"

namespace fotomill {

// The EXIF block of a picture file:
//
//   JPEG  the first APP1 segment that begins with "Exif" and two bytes; the block follows them
//   TIFF  the whole file, as well as any bare block: "II" or "MM", or any mark before a big-endian
//   42 PNG   the eXIf chunk WebP  the EXIF chunk HD Photo: the EXIF and GPS directories among the
//   file's own, gathered into a block
//
// "Exif" and two zero bytes in front of a block are also taken off where the container does not ask
// for them. Only the head of the file is read, and beyond it the places where segments and chunks
// begin. Sources: CIPA DC-008-2012, section 4.7; PNG, third edition, section 11.3.3.6; RFC 9649,
// section 2.7.1.5.
class ExifSource {
 public:
  // Finds the block of a file. Ok with an empty block when the file has none or is of another kind;
  // FileOpenError (1) when it cannot be opened, FileReadError (3) when reading fails,
  // MemoryAllocationError (6) for a block beyond the limit.
  Status Open(const char* path);
  // From the byte order on; lives as long as the source.
  std::span<const uint8_t> Block() const { return block_; }
  // False when the file was cut short by another program meanwhile, so that the block may have read
  // as zeros.
  bool Intact() const { return file_.Intact(); }

 private:
  struct Place {
    uint64_t offset = 0, size = 0;  // in the file; size 0: no block
  };
  Status Find(Place& place) const;
  Status FindInJpeg(Place& place) const;
  Status FindInPng(Place& place) const;
  Status FindInWebp(Place& place) const;
  Status GatherFromHdp(const char* path);
  Status Take(const char* path, const Place& place);

  platform::FileView file_;     // the head, or the whole of a TIFF file
  platform::MemoryBlock copy_;  // a block that is not in the head, or was gathered
  std::span<const uint8_t> block_;
};

}  // namespace fotomill
