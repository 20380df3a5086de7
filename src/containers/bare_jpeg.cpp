#include <algorithm>
#include <cstring>

#include "containers/bare_file.h"
#include "containers/jpeg_segments.h"

namespace fotomill {

namespace {

constexpr uint8_t kApp0 = 0xE0, kApp2 = 0xE2, kApp14 = 0xEE, kApp15 = 0xEF, kComment = 0xFE;
constexpr uint8_t kEnd = 0xD9, kFirstRestart = 0xD0, kLastRestart = 0xD7, kPrefix = 0xFF;
constexpr std::string_view kJfif("JFIF\0", 5), kProfile("ICC_PROFILE\0", 12), kAdobe("Adobe", 5);
constexpr size_t kJfifSize = 14;  // without a thumbnail, whose size is in the last two bytes

void Append(std::vector<uint8_t>& bytes, std::span<const uint8_t> more) {
  bytes.insert(bytes.end(), more.begin(), more.end());
}

bool IsApplication(uint8_t marker) {
  return (marker >= kApp0 && marker <= kApp15) || marker == kComment;
}

// The JFIF segment, which implies the color space; without its thumbnail.
void AppendJfif(std::span<const uint8_t> data, std::vector<uint8_t>& bare) {
  Append(bare, std::initializer_list<uint8_t>{kPrefix, kApp0, 0, kJfifSize + 2});
  Append(bare, data.first(kJfifSize - 2));
  Append(bare, std::initializer_list<uint8_t>{0, 0});
}

void AppendSegment(const JpegSegment& segment, std::vector<uint8_t>& bare) {
  const bool jfif =
      segment.marker == kApp0 && segment.Starts(kJfif) && segment.data.size() >= kJfifSize;
  const bool belongs = !IsApplication(segment.marker) ||
                       (segment.marker == kApp2 && segment.Starts(kProfile)) ||
                       (segment.marker == kApp14 && segment.Starts(kAdobe));
  if (jfif) AppendJfif(segment.data, bare);
  if (belongs && !jfif) Append(bare, segment.whole);
}

// Copies from the first scan to the end of the picture, without the comments between scans.
Status AppendScans(std::span<const uint8_t> file, size_t scan, std::vector<uint8_t>& bare) {
  size_t copied = scan, at = scan;
  while (true) {
    const void* found =
        at < file.size() ? std::memchr(&file[at], kPrefix, file.size() - at) : nullptr;
    if (found == nullptr) break;
    at = static_cast<size_t>(static_cast<const uint8_t*>(found) - file.data());
    if (at + 1 >= file.size()) break;
    const uint8_t marker = file[at + 1];
    if (marker == kEnd) {
      Append(bare, file.subspan(copied, at + 2 - copied));
      return Status::Ok;
    }
    const bool data = marker == 0 || (marker >= kFirstRestart && marker <= kLastRestart);
    if (data || marker == kPrefix) {
      at += marker == kPrefix ? 1 : 2;
      continue;
    }
    if (at + 4 > file.size()) break;
    const size_t length = size_t{file[at + 2]} << 8 | file[at + 3];
    if (length < 2 || length > file.size() - at - 2) return Status::DamagedFile;
    if (IsApplication(marker)) {
      Append(bare, file.subspan(copied, at - copied));
      copied = at + 2 + length;
    }
    at += 2 + length;
  }
  return Status::FileReadError;
}

}  // namespace

Status MakeBareJpeg(std::span<const uint8_t> file, std::vector<uint8_t>& bare) {
  bare.clear();
  JpegHead head;
  RETURN_IF_BAD(ParseJpegHead(file, head));
  bare.reserve(file.size());
  Append(bare, file.first(2));
  for (const JpegSegment& segment : head.segments) AppendSegment(segment, bare);
  return AppendScans(file, head.scan, bare);
}

}  // namespace fotomill
