#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

#include "containers/walked_bytes.h"
#include "core/status.h"

namespace fotomill {

// What the APP1 segments of EXIF and XMP begin with, and how much of each fits into one segment
// behind it.
inline constexpr std::string_view kExifHead("Exif\0\0", 6);
// XMP specification part 3, section 1.1.3; with its zero.
inline constexpr std::string_view kXmpHead("http://ns.adobe.com/xap/1.0/\0", 29);
inline constexpr size_t kMostSegment = 65533;  // data of one segment
// Bytes of a block in one segment.
inline constexpr size_t kMostExif = kMostSegment - 6, kMostXmp = kMostSegment - 29;

// Where a segment is in its file; it may claim more than there is.
struct JpegPlace {
  uint8_t marker = 0;
  uint64_t start = 0, data = 0, end = 0;  // fill bytes in front belong to it
  // 12 bytes from `data` on or what there is; until the next segment
  std::span<const uint8_t> first;
};

// Walks the segments of a file up to its first scan.
class JpegWalk {
 public:
  // As strict as the format; with `mostGarbage` as lenient as decoders: skips up to that many bytes
  // that belong to no segment, fill bytes included, and takes lengths that are too short as 2.
  explicit JpegWalk(WalkedBytes file, uint64_t mostGarbage = 0);
  // The next segment; false at the end.
  bool Next(JpegPlace& segment);
  // Where the walk is, and why it ended: Ok at a scan; DamagedFile (2) at what is no segment;
  // FileReadError (3) where the file ends.
  uint64_t Position() const { return next_; }
  Status Outcome() const { return outcome_; }
  // Whether it ended because reading failed.
  bool ReadFailed() const { return file_.Failed(); }

 private:
  bool FindMarker(uint64_t& at, std::span<const uint8_t>& bytes);
  bool End(Status outcome);

  WalkedBytes file_;
  uint64_t next_ = 2;
  uint64_t garbage_ = 0;  // bytes that may still come
  bool lenient_ = false;
  bool ended_ = false;
  Status outcome_ = Status::Ok;
};

// The head of a JPEG file: the segments in front of the first scan. All spans are into the file.
struct JpegSegment {
  uint8_t marker = 0;
  std::span<const uint8_t> data;   // behind the length
  std::span<const uint8_t> whole;  // with marker and length
  bool Starts(std::string_view head) const;  // the payload begins with `head`
};
// The one at a place, which must lie within the file.
JpegSegment SegmentAt(std::span<const uint8_t> file, const JpegPlace& place);
// The segments in the order of the file, up to the first scan.
struct JpegHead {
  std::vector<JpegSegment> segments;
  size_t scan = 0;  // where the first scan begins

  // What the first EXIF and XMP segments hold behind their headings; empty if there is none.
  std::span<const uint8_t> Exif() const;
  std::span<const uint8_t> Xmp() const;  // empty where the file has none
  // Whether EXIF continues in further segments: then what it points to there must stay where it is.
  bool HasSplitExif() const;
  // Whether further pictures are behind the first, with an index of their places (CIPA DC-007,
  // "MPF").
  bool HasMorePictures() const;
};
// DamagedFile (2) if it is not a JPEG file, FileReadError (3) when it ends before its first scan.
Status ParseJpegHead(std::span<const uint8_t> file, JpegHead& head);

// A new file from the application segments and comments of an old one and from other pixels.
struct JpegParts {
  // replace those of the old file, or are added; empty: these stay as they are
  std::span<const uint8_t> exif = {}, xmp = {};
  // a JPEG file without such segments; empty: everything else stays as it is
  std::span<const uint8_t> pixels = {};
  std::span<const uint8_t> rest = {};            // bytes behind the end of the picture
  bool swapSides = false;                        // the resolutions change places
};
// UnsuitableImage (13) when EXIF or XMP are too long for a segment. With pixels the thumbnails of
// JFIF, which show the old ones, are left out.
Status AssembleJpeg(std::span<const uint8_t> file, const JpegHead& head, const JpegParts& parts,
                    std::vector<uint8_t>& made);

}  // namespace fotomill
