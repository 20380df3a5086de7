#include "formats/cameraraw/raw_preview.h"

#include <algorithm>
#include <string_view>
#include <vector>

#include "core/byte_reader.h"
#include "core/limits.h"

namespace fotomill {

namespace {

constexpr uint64_t kEntrySize = 12;
constexpr uint16_t kShort = 3;
constexpr uint32_t kUncompressed = 1, kOldJpeg = 6, kJpeg = 7;  // compression
constexpr uint32_t kRgb = 2;                                    // photometric interpretation

enum Tag : uint16_t {
  kWidth = 256,
  kHeight = 257,
  kCompression = 259,
  kPhotometric = 262,
  kStripOffsets = 273,
  kSamples = 277,
  kStripBytes = 279,
  kSubdirectories = 330,
  kJpegOffset = 513,
  kJpegBytes = 514,
};

// The relevant fields of a directory; for tags with several values, the first.
struct Directory {
  uint32_t width = 0, height = 0;
  uint32_t compression = 0, photometric = 0, samples = 0;
  uint32_t stripOffset = 0, stripBytes = 0, strips = 0;
  uint32_t jpegOffset = 0, jpegBytes = 0;
};

class DirectoryWalk {
 public:
  explicit DirectoryWalk(std::span<const uint8_t> file) : file_(file) {
    big_ = file.size() > 1 && file[0] == 'M';
    ByteReader bytes(file_);
    bytes.Seek(4);
    Add(Long(bytes));
  }

  // The next directory; false at the end. Each is visited once, even if it is linked repeatedly.
  bool Next(Directory& directory) {
    if (visited_ >= places_.size()) return false;
    ByteReader bytes(file_);
    bytes.Seek(places_[visited_++]);
    directory = {};
    const uint16_t count = Short(bytes);
    for (uint16_t i = 0; i < count && bytes.Left() >= kEntrySize; ++i) TakeEntry(bytes, directory);
    if (bytes.Left() >= 4) Add(Long(bytes));
    return true;
  }

 private:
  uint16_t Short(ByteReader& bytes) const { return big_ ? bytes.Be16() : bytes.Le16(); }
  uint32_t Long(ByteReader& bytes) const { return big_ ? bytes.Be32() : bytes.Le32(); }

  void Add(uint32_t place) {
    if (place < 8 || place >= file_.size() || places_.size() >= limits.exifDirectories) return;
    if (std::ranges::find(places_, place) == places_.end()) places_.push_back(place);
  }

  void TakeEntry(ByteReader& bytes, Directory& directory) {
    const uint16_t tag = Short(bytes), type = Short(bytes);
    const uint32_t count = Long(bytes);
    const uint64_t place = bytes.Position();
    const uint32_t value = type == kShort ? Short(bytes) : Long(bytes);
    bytes.Seek(place + 4);
    switch (tag) {
      case kWidth: directory.width = value; break;
      case kHeight: directory.height = value; break;
      case kCompression: directory.compression = value; break;
      case kPhotometric: directory.photometric = value; break;
      case kSamples: directory.samples = value; break;
      case kStripOffsets:
        directory.stripOffset = value;
        directory.strips = count;
        break;
      case kStripBytes: directory.stripBytes = value; break;
      case kJpegOffset: directory.jpegOffset = value; break;
      case kJpegBytes: directory.jpegBytes = value; break;
      case kSubdirectories: AddAll(value, count); break;
      default: break;
    }
  }

  void AddAll(uint32_t value, uint32_t count) {
    if (count == 1) return Add(value);
    ByteReader bytes(file_);
    bytes.Seek(value);
    for (uint32_t i = 0; i < count && bytes.Left() >= 4; ++i) Add(Long(bytes));
  }

  std::span<const uint8_t> file_;
  bool big_ = false;
  std::vector<uint32_t> places_;
  size_t visited_ = 0;
};

std::span<const uint8_t> PartOf(std::span<const uint8_t> file, uint64_t offset, uint64_t size) {
  ByteReader bytes(file);
  bytes.Seek(offset);
  return bytes.Take(size);
}

bool IsJpeg(std::span<const uint8_t> bytes) {
  return bytes.size() > 3 && bytes[0] == 0xFF && bytes[1] == 0xD8 && bytes[2] == 0xFF;
}

// The preview described by a directory, if any.
RawPreview PreviewIn(std::span<const uint8_t> file, const Directory& directory) {
  RawPreview preview;
  preview.jpeg = PartOf(file, directory.jpegOffset, directory.jpegBytes);
  if (IsJpeg(preview.jpeg)) return preview;
  preview.jpeg = {};
  const bool oneStrip = directory.strips == 1;
  const bool jpeg = directory.compression == kOldJpeg || directory.compression == kJpeg;
  if (oneStrip && jpeg) preview.jpeg = PartOf(file, directory.stripOffset, directory.stripBytes);
  if (!IsJpeg(preview.jpeg)) preview.jpeg = {};
  const bool rgb = directory.compression == kUncompressed && directory.photometric == kRgb &&
                   directory.samples == 3;
  constexpr uint32_t kMostSide = UINT16_MAX;
  const bool sized = directory.width > 0 && directory.width <= kMostSide && directory.height > 0 &&
                     directory.height <= kMostSide;
  if (oneStrip && rgb && sized) {
    preview.width = static_cast<int32_t>(directory.width);
    preview.height = static_cast<int32_t>(directory.height);
    preview.rows =
        PartOf(file, directory.stripOffset, uint64_t{3} * directory.width * directory.height);
  }
  return preview;
}

}  // namespace

bool IsRawFile(std::span<const uint8_t> file) {
  using namespace std::string_view_literals;
  ByteReader bytes(file);
  return bytes.Match("II\x2a\0"sv) || bytes.Match("MM\0\x2a"sv);
}

bool FindRawPreview(std::span<const uint8_t> file, RawPreview& preview) {
  DirectoryWalk walk(file);
  Directory directory;
  size_t most = 0;
  while (walk.Next(directory)) {
    const RawPreview found = PreviewIn(file, directory);
    // JPEG data count more, as they are compressed.
    const size_t size = std::max(8 * found.jpeg.size(), found.rows.size());
    if (size <= most) continue;
    most = size;
    preview = found;
  }
  return most > 0;
}

}  // namespace fotomill
