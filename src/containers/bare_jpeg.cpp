#include <algorithm>

#include "containers/bare_file.h"
#include "containers/jpeg_extended_xmp.h"
#include "containers/jpeg_segments.h"
#include "core/byte_reader.h"

namespace fotomill {

namespace {

constexpr uint8_t kApp0 = 0xE0, kApp1 = 0xE1, kApp2 = 0xE2, kApp13 = 0xED, kApp14 = 0xEE,
                  kApp15 = 0xEF, kComment = 0xFE;
constexpr uint8_t kEnd = 0xD9, kPrefix = 0xFF;
constexpr std::string_view kJfif("JFIF\0", 5), kProfile("ICC_PROFILE\0", 12), kAdobe("Adobe", 5),
    kPhotoshop("Photoshop 3.0\0", 14);
constexpr size_t kJfifSize = 14;  // without a thumbnail, whose size is in the last two bytes

void Append(std::vector<uint8_t>& bytes, std::span<const uint8_t> more) {
  bytes.insert(bytes.end(), more.begin(), more.end());
}

bool IsApplication(uint8_t marker) {
  return (marker >= kApp0 && marker <= kApp15) || marker == kComment;
}

// The JFIF segment, which implies the color space; without its thumbnail.
void AppendJfif(const JpegSegment& segment, FilePieces& bare) {
  const bool thumbnail = segment.data[kJfifSize - 2] != 0 || segment.data[kJfifSize - 1] != 0;
  if (segment.data.size() == kJfifSize && !thumbnail) return bare.Keep(segment.whole);
  std::vector<uint8_t> jfif = {kPrefix, kApp0, 0, kJfifSize + 2};
  Append(jfif, segment.data.first(kJfifSize - 2));
  jfif.resize(jfif.size() + 2);
  bare.Add(std::move(jfif));
}

bool IsJfif(const JpegSegment& segment) {
  return segment.marker == kApp0 && segment.Starts(kJfif) && segment.data.size() >= kJfifSize;
}

bool Belongs(const JpegSegment& segment, const BareOptions& options) {
  return !IsApplication(segment.marker) ||
         (options.profile && segment.marker == kApp2 && segment.Starts(kProfile)) ||
         (segment.marker == kApp14 && segment.Starts(kAdobe)) ||
         (options.texts && segment.marker == kComment) ||
         (!options.newXmp.empty() && segment.Starts(kExtendedXmpHead));  // its second part
}

void AppendBlock(std::string_view head, std::span<const uint8_t> block, FilePieces& bare) {
  if (block.empty()) return;
  const size_t length = 2 + head.size() + block.size();
  std::vector<uint8_t> bytes = {kPrefix, kApp1, static_cast<uint8_t>(length >> 8),
                                static_cast<uint8_t>(length)};
  bytes.resize(4 + head.size());
  std::ranges::copy(head, bytes.begin() + 4);
  Append(bytes, block);
  bare.Add(std::move(bytes));
}

// A Photoshop segment with only the IPTC resource: "8BIM", a number, a length-prefixed name of even
// size, and data with a 4-byte length.
// Source: Adobe, "Photoshop File Formats Specification" (2019), "Image Resource Blocks".
void AppendIptc(const JpegSegment& segment, FilePieces& bare) {
  constexpr uint16_t kIptc = 0x0404;
  ByteReader bytes(segment.data);
  bytes.Skip(kPhotoshop.size());
  std::vector<uint8_t> kept;
  while (bytes.Left() > 0) {
    const uint64_t start = bytes.Position();
    if (!bytes.Match("8BIM")) break;
    const uint16_t number = bytes.Be16();
    bytes.Skip(bytes.U8() | 1u);
    const uint32_t size = bytes.Be32();
    bytes.Skip(uint64_t{size} + size % 2);
    if (!bytes.Ok()) break;
    if (number == kIptc) Append(kept, segment.data.subspan(start, bytes.Position() - start));
  }
  if (kept.empty()) return;
  const size_t length = 2 + kPhotoshop.size() + kept.size();
  std::vector<uint8_t> made(4 + kPhotoshop.size());
  made[0] = kPrefix;
  made[1] = kApp13;
  made[2] = static_cast<uint8_t>(length >> 8);
  made[3] = static_cast<uint8_t>(length);
  std::ranges::copy(kPhotoshop, made.begin() + 4);
  Append(made, kept);
  bare.Add(std::move(made));
}

// Copies from the first scan to the end of the picture, without the comments between scans unless
// texts are kept.
Status AppendScans(std::span<const uint8_t> file, size_t scan, bool texts, FilePieces& bare) {
  size_t copied = scan;
  for (size_t at = scan; (at = NextScanMarker(file, at)) < file.size();) {
    const uint8_t marker = file[at + 1];
    if (marker == kEnd) {
      bare.Keep(file.subspan(copied, at + 2 - copied));
      return Status::Ok;
    }
    if (at + 4 > file.size()) break;
    const size_t length = size_t{file[at + 2]} << 8 | file[at + 3];
    if (length < 2 || length > file.size() - at - 2) return Status::DamagedFile;
    if (IsApplication(marker) && !(texts && marker == kComment)) {
      bare.Keep(file.subspan(copied, at - copied));
      copied = at + 2 + length;
    }
    at += 2 + length;
  }
  return Status::FileReadError;
}

}  // namespace

Status MakeBareJpeg(std::span<const uint8_t> file, std::vector<uint8_t>& bare) {
  FilePieces pieces;
  bare.clear();
  RETURN_IF_BAD(MakeBareJpeg(file, {}, pieces));
  bare = pieces.Joined();
  return Status::Ok;
}

Status MakeBareJpeg(std::span<const uint8_t> file, const BareOptions& options, FilePieces& bare) {
  bare.Clear();
  JpegHead head;
  RETURN_IF_BAD(ParseJpegHead(file, head));
  if (options.newExif.size() > kMostExif || options.newXmp.size() > kMostXmp)
    return Status::UnsuitableImage;
  bare.Keep(file.first(2));
  bool added = false;  // the new blocks, after JFIF and before everything else
  const auto addBlocks = [&] {
    if (added) return;
    AppendBlock(kExifHead, options.newExif, bare);
    AppendBlock(kXmpHead, options.newXmp, bare);
    added = true;
  };
  for (const JpegSegment& segment : head.segments) {
    if (IsJfif(segment)) {
      AppendJfif(segment, bare);
      continue;
    }
    if (segment.marker != kApp0) addBlocks();
    if (Belongs(segment, options)) bare.Keep(segment.whole);
    if (options.iptc && segment.marker == kApp13 && segment.Starts(kPhotoshop))
      AppendIptc(segment, bare);
  }
  addBlocks();
  return AppendScans(file, head.scan, options.texts, bare);
}

}  // namespace fotomill
