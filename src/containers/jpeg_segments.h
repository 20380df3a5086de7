#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

#include "containers/walked_bytes.h"
#include "core/status.h"

namespace fotomill {

// Signatures of the APP1 segments for EXIF and
// XMP, and the maximum payload after them.
inline constexpr std::string_view kExifHead("Exif\0\0", 6);
// XMP specification part 3, section 1.1.3; with its NUL.
inline constexpr std::string_view kXmpHead("http://ns.adobe.com/xap/1.0/\0", 29);
inline constexpr size_t kMostSegment = 65533;  // data of one segment
// Maximum size of a block in one segment.
inline constexpr size_t kMostExif = kMostSegment - 6, kMostXmp = kMostSegment - 29;

// Position of a segment in its file; its length may exceed the file.
struct JpegPlace {
  uint8_t marker = 0;
  uint64_t start = 0, data = 0, end = 0;  // `start` includes fill bytes before the marker
  // up to 12 bytes from `data` on; valid until the next segment
  std::span<const uint8_t> first;
};

// Iterates over the segments of a file up to its first scan.
class JpegWalk {
 public:
  // Strict by default; with `mostGarbage` as lenient as decoders: skips up to that many bytes
  // outside of segments, including fill bytes, and treats lengths that are too short as 2.
  explicit JpegWalk(WalkedBytes file, uint64_t mostGarbage = 0);
  // The next segment; false at the end.
  bool Next(JpegPlace& segment);
  // The current offset, and why the walk ended: Ok at a scan; DamagedFile (2) at an invalid
  // segment; FileReadError (3) at the end of the file.
  uint64_t Position() const { return next_; }
  Status Outcome() const { return outcome_; }
  // Whether it ended because of a read error.
  bool ReadFailed() const { return file_.Failed(); }

 private:
  bool FindMarker(uint64_t& at, std::span<const uint8_t>& bytes);
  bool End(Status outcome);

  WalkedBytes file_;
  uint64_t next_ = 2;
  uint64_t garbage_ = 0;  // garbage bytes that may still be skipped
  bool lenient_ = false;
  bool ended_ = false;
  Status outcome_ = Status::Ok;
};

// The offset of the next marker at or after `at` in scan data, past coded bytes, restart markers
// and fill bytes; the size of the file if there is none. T.81, section B.1.1.
size_t NextScanMarker(std::span<const uint8_t> file, size_t at);

// The header of a JPEG file: the segments before the first scan. All spans point into the file.
struct JpegSegment {
  uint8_t marker = 0;
  std::span<const uint8_t> data;   // after the length
  std::span<const uint8_t> whole;  // including marker and length
  bool Starts(std::string_view head) const;  // the data begin with `head`
};
// The segment at a place, which must be within the file.
JpegSegment SegmentAt(std::span<const uint8_t> file, const JpegPlace& place);
// The segments in file order, up to the first scan.
struct JpegHead {
  std::vector<JpegSegment> segments;
  size_t scan = 0;  // offset of the first scan

  // The payload of the first EXIF and XMP segments; empty if there is none.
  std::span<const uint8_t> Exif() const;
  std::span<const uint8_t> Xmp() const;  // as above
  // Whether EXIF continues in further segments: then the data it points to must not move.
  bool HasSplitExif() const;
  // Whether further pictures follow the first,
  // with an index (CIPA DC-007, "MPF").
  bool HasMorePictures() const;
};
// DamagedFile (2) if it is not a JPEG file, FileReadError (3) if it ends before the first scan.
Status ParseJpegHead(std::span<const uint8_t> file, JpegHead& head);

// Parts for a new file that combines segments of an old one with other pixels.
struct JpegParts {
  // replace those of the old file, or are added; empty: keep the old ones
  std::span<const uint8_t> exif = {}, xmp = {};
  // a JPEG file without such segments; empty: keep everything else
  std::span<const uint8_t> pixels = {};
  std::span<const uint8_t> rest = {};            // bytes after the end of the picture
  bool swapSides = false;                        // exchange horizontal and vertical resolution
};
// UnsuitableImage (13) if EXIF or XMP does not fit into a segment. With `pixels`, JFIF thumbnails
// are removed, as they show the old pixels.
Status AssembleJpeg(std::span<const uint8_t> file, const JpegHead& head, const JpegParts& parts,
                    std::vector<uint8_t>& made);

}  // namespace fotomill
