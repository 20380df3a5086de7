#pragma once

#include <cstdint>
#include <span>

#include "core/status.h"
#include "platform/file_view.h"
#include "platform/memory.h"

namespace fotomill {

// The EXIF block of a picture file:
//
//   JPEG      the first APP1 segment that begins with "Exif" and two bytes; the block follows them
//   TIFF      the whole file, or a bare block: "II", "MM", or any mark before a big-endian 42
//   PNG       the eXIf chunk
//   WebP      the EXIF chunk
//   HD Photo  the EXIF and GPS directories among the file's own, gathered into a block
//
// "Exif" and two zero bytes before a block are skipped in other containers as well. Only the start
// of the file and the segment or chunk headers are read. Sources: CIPA DC-008-2012, section 4.7;
// PNG, third edition, section 11.3.3.6; RFC 9649, section 2.7.1.5.
class ExifSource {
 public:
  // Finds the block of a file. Ok with an empty block if there is none or the format is unknown;
  // FileOpenError (1) if the file cannot be opened, FileReadError (3) if reading fails,
  // MemoryAllocationError (6) for a block beyond the limit.
  Status Open(const char* path);
  // Starts with the byte order; valid as long as the source.
  std::span<const uint8_t> Block() const { return block_; }
  // False if another program truncated the file
  // meanwhile; the block may contain zeros then.
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

  platform::FileView file_;     // the start of the file, or a whole TIFF file
  platform::MemoryBlock copy_;  // a block outside of that, or a gathered one
  std::span<const uint8_t> block_;
};

}  // namespace fotomill
