// A JPEG file's segments: FF, a marker byte, a length of two bytes that includes itself, data. Any
// number of FF may precede a marker; markers 01 and D0 to D8 have neither length nor data.
//
//   E0 "JFIF\0" version (2 bytes), unit, horizontal and vertical resolution (2 bytes each), width
//      and height of a thumbnail (1 byte each), the thumbnail
//   E0 "JFXX\0" a thumbnail in another form
// Source: ITU-T T.81 (1992), annex B; T.871 (2011).
#include "containers/jpeg_segments.h"

#include <algorithm>
#include <cstring>

#include "core/byte_reader.h"

namespace fotomill {

namespace {

constexpr uint8_t kApp0 = 0xE0, kApp1 = 0xE1, kApp2 = 0xE2, kApp15 = 0xEF, kComment = 0xFE;
constexpr uint8_t kBegin = 0xD8, kEnd = 0xD9, kScan = 0xDA;
constexpr std::string_view kJfifHead("JFIF\0", 5), kJfxxHead("JFXX\0", 5), kMpfHead("MPF\0", 4);
constexpr size_t kJfifSize = 14, kJfifAcross = 8, kJfifThumbnail = 12;

bool StandsAlone(uint8_t marker) { return marker == 0x01 || (marker >= 0xD0 && marker <= 0xD8); }
bool IsExif(const JpegSegment& segment) {
  return segment.marker == kApp1 && segment.Starts(kExifHead);
}
bool IsApplication(uint8_t marker) {
  return (marker >= kApp0 && marker <= kApp15) || marker == kComment;
}

void Append(std::vector<uint8_t>& bytes, std::span<const uint8_t> more) {
  bytes.insert(bytes.end(), more.begin(), more.end());
}

void AppendSegment(std::vector<uint8_t>& bytes, uint8_t marker, std::string_view heading,
                   std::span<const uint8_t> data) {
  const size_t length = 2 + heading.size() + data.size();
  Append(bytes, std::initializer_list<uint8_t>{0xFF, marker, static_cast<uint8_t>(length >> 8),
                                               static_cast<uint8_t>(length)});
  bytes.insert(bytes.end(), heading.begin(), heading.end());
  Append(bytes, data);
}

// The JFIF segment for rotated pixels.
void AppendJfif(std::vector<uint8_t>& bytes, std::span<const uint8_t> data, bool swapSides) {
  std::vector<uint8_t> jfif(data.begin(), data.begin() + kJfifSize);
  if (swapSides)
    std::swap_ranges(jfif.begin() + kJfifAcross, jfif.begin() + kJfifAcross + 2,
                     jfif.begin() + kJfifAcross + 2);
  jfif[kJfifThumbnail] = jfif[kJfifThumbnail + 1] = 0;
  AppendSegment(bytes, kApp0, {}, jfif);
}

// Assembles the segments of the new file, in the order of the old one.
class Assembly {
 public:
  Assembly(const JpegParts& parts, std::vector<uint8_t>& made) : parts_(parts), made_(made) {}

  void Add(const JpegSegment& segment) {
    const bool jfif = segment.marker == kApp0 && segment.Starts(kJfifHead);
    if (!jfif) AddNew();  // after JFIF, before everything else
    if (IsExif(segment) && !parts_.exif.empty() && !exifDone_) {
      Once(exifDone_, kExifHead, parts_.exif);
    } else if (segment.marker == kApp1 && segment.Starts(kXmpHead) && !parts_.xmp.empty() &&
               !xmpDone_) {
      Once(xmpDone_, kXmpHead, parts_.xmp);
    } else if (!parts_.pixels.empty() && jfif && segment.data.size() >= kJfifSize) {
      AppendJfif(made_, segment.data, parts_.swapSides);
    } else if (parts_.pixels.empty() ||
               (IsApplication(segment.marker) && !IsOldThumbnail(segment))) {
      Append(made_, segment.whole);
    }
  }
  // Adds EXIF and XMP that the old file does not have.
  void ExpectNone(bool exif, bool xmp) {
    exifNew_ = exif;
    xmpNew_ = xmp;
  }
  void AddNew() {
    if (exifNew_) Once(exifDone_, kExifHead, parts_.exif);
    if (xmpNew_) Once(xmpDone_, kXmpHead, parts_.xmp);
    exifNew_ = xmpNew_ = false;
  }

 private:
  static bool IsOldThumbnail(const JpegSegment& segment) {
    return segment.marker == kApp0 && segment.Starts(kJfxxHead);
  }
  // Later segments, which may hold what does not fit into the first, are kept.
  void Once(bool& done, std::string_view heading, std::span<const uint8_t> data) {
    if (!done) AppendSegment(made_, kApp1, heading, data);
    done = true;
  }

  const JpegParts& parts_;
  std::vector<uint8_t>& made_;
  bool exifNew_ = false, xmpNew_ = false, exifDone_ = false, xmpDone_ = false;
};

}  // namespace

JpegWalk::JpegWalk(WalkedBytes file, uint64_t mostGarbage)
    : file_(file), garbage_(mostGarbage), lenient_(mostGarbage > 0) {
  if (!ByteReader(file_.At(0, 2)).Match("\xFF\xD8")) End(Status::DamagedFile);
}

// Advances to the FF of the next marker. False if there is too much garbage before it.
bool JpegWalk::FindMarker(uint64_t& at, std::span<const uint8_t>& bytes) {
  for (;; ++at) {
    bytes = file_.At(at, WalkedBytes::kMost);
    const uint8_t next = bytes.size() > 1 ? bytes[1] : kEnd;
    if (bytes.empty() || (bytes[0] == 0xFF && next != 0 && next != 0xFF)) return true;
    const bool fill = bytes[0] == 0xFF && next == 0xFF;
    if ((lenient_ || !fill) && garbage_-- == 0) return false;
  }
}

bool JpegWalk::Next(JpegPlace& segment) {
  if (ended_) return false;
  uint64_t at = next_;
  std::span<const uint8_t> bytes;
  if (!FindMarker(at, bytes)) return End(Status::DamagedFile);
  ByteReader head(bytes);
  head.Skip(1);
  const uint8_t marker = head.U8();
  if (!head.Ok()) return End(Status::FileReadError);
  if (marker == kEnd) return End(Status::DamagedFile);
  if (marker == kScan) return End(Status::Ok);
  const uint16_t length = StandsAlone(marker) ? 0 : head.Be16();
  if (!head.Ok()) return End(Status::FileReadError);
  if (!StandsAlone(marker) && length < 2 && !lenient_) return End(Status::DamagedFile);
  segment = {marker, next_, at + head.Position(), 0, head.Peek(head.Left())};
  segment.end = std::max(segment.data, at + 2 + length);
  next_ = segment.end;
  return true;
}

bool JpegWalk::End(Status outcome) {
  ended_ = true;
  outcome_ = outcome;
  return false;
}

size_t NextScanMarker(std::span<const uint8_t> file, size_t at) {
  constexpr uint8_t kPrefix = 0xFF, kFirstRestart = 0xD0, kLastRestart = 0xD7;
  while (at < file.size()) {
    const void* const found = std::memchr(&file[at], kPrefix, file.size() - at);
    if (found == nullptr) break;
    at = static_cast<size_t>(static_cast<const uint8_t*>(found) - file.data());
    if (at + 1 >= file.size()) break;
    const uint8_t marker = file[at + 1];
    const bool data = marker == 0 || (marker >= kFirstRestart && marker <= kLastRestart);
    if (!data && marker != kPrefix) return at;
    at += data ? 2 : 1;
  }
  return file.size();
}

JpegSegment SegmentAt(std::span<const uint8_t> file, const JpegPlace& place) {
  const auto from = [&](uint64_t begin) { return file.subspan(begin, place.end - begin); };
  return {place.marker, from(place.data), from(place.start)};
}

bool JpegSegment::Starts(std::string_view head) const { return ByteReader(data).Match(head); }

std::span<const uint8_t> JpegHead::Exif() const {
  for (const JpegSegment& segment : segments) {
    if (IsExif(segment)) return segment.data.subspan(kExifHead.size());
  }
  return {};
}

std::span<const uint8_t> JpegHead::Xmp() const {
  for (const JpegSegment& segment : segments) {
    if (segment.marker == kApp1 && segment.Starts(kXmpHead))
      return segment.data.subspan(kXmpHead.size());
  }
  return {};
}

bool JpegHead::HasSplitExif() const { return std::ranges::count_if(segments, IsExif) > 1; }

bool JpegHead::HasMorePictures() const {
  return std::ranges::any_of(
      segments, [](const JpegSegment& s) { return s.marker == kApp2 && s.Starts(kMpfHead); });
}

Status ParseJpegHead(std::span<const uint8_t> file, JpegHead& head) {
  head = {};
  JpegWalk walk(file);
  for (JpegPlace place; walk.Next(place);) {
    if (place.end > file.size()) return Status::FileReadError;
    head.segments.push_back(SegmentAt(file, place));
  }
  head.scan = walk.Position();
  return walk.Outcome();
}

Status AssembleJpeg(std::span<const uint8_t> file, const JpegHead& head, const JpegParts& parts,
                    std::vector<uint8_t>& made) {
  if (parts.exif.size() > kMostExif || parts.xmp.size() > kMostXmp) return Status::UnsuitableImage;
  made.clear();
  made.reserve(file.size() + kMostSegment);
  made.push_back(0xFF);
  made.push_back(kBegin);
  Assembly assembly(parts, made);
  assembly.ExpectNone(!parts.exif.empty() && head.Exif().empty(),
                      !parts.xmp.empty() && head.Xmp().empty());
  for (const JpegSegment& segment : head.segments) assembly.Add(segment);
  assembly.AddNew();
  if (parts.pixels.empty()) {
    Append(made, file.subspan(head.scan));
  } else {
    Append(made, parts.pixels.subspan(2));
    Append(made, parts.rest);
  }
  return Status::Ok;
}

}  // namespace fotomill
