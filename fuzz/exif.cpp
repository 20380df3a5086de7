// An EXIF block: walking it with all texts, raw copies of values, and the edits made by writers.

#include <cstdlib>
#include <string>
#include <vector>

#include "core/limits.h"
#include "metadata/exif/exif_edit.h"
#include "metadata/exif/exif_walk.h"
#include "metadata/gps.h"

namespace {

using namespace fotomill;

// Small limits: they are all reached occasionally, and hostile inputs are not slower than others.
[[maybe_unused]] const bool limitsSet = [] {
  limits.exifDirectories = 16;
  limits.exifEntries = 512;
  limits.exifValueCharacters = 64;
  limits.exifTextBytes = 8192;
  return true;
}();

// Reads every byte it receives, so that the sanitizers check each of them.
class Reader : public ExifSink {
 public:
  void Directory(int32_t, std::string_view label) override { Read(label); }
  void Line(const ExifLine& line) override {
    Read(line.name);
    Read(line.text);
    ExifRawValue copy;
    if (!CopyExifValue(line.value, copy)) return;
    NormalizeExifValue(copy);
    for (const uint8_t byte : copy.data.Bytes()) sum_ = sum_ + byte;
  }
  bool WithinLimit() const { return size_ <= limits.exifTextBytes + 16 * limits.exifDirectories; }

 private:
  void Read(std::string_view text) {
    for (const char c : text) sum_ = sum_ + static_cast<unsigned char>(c);
    size_ += text.size();
  }
  uint64_t size_ = 0;
  volatile unsigned sum_ = 0;
};

void Expect(bool holds) {
  if (!holds) std::abort();
}

void Walk(std::span<const uint8_t> block) {
  Reader reader;
  ExifFindings findings;
  WalkExif(block, &reader, &findings);
  Expect(reader.WithinLimit());
  volatile unsigned sum = 0;
  for (const uint8_t byte : ExifThumbnail(block, findings)) sum = sum + byte;
}

void Edit(std::vector<uint8_t> block, uint8_t choice) {
  const int32_t orientation = 1 + choice % 8;
  SetExifPictureFacts(block, {choice * 300, 1 + choice, orientation});
  const int32_t found = ExifOrientation(block);
  Expect(found == orientation || found == 1);
  Walk(block);
  const size_t size = block.size();
  DropExifThumbnail(block);
  Expect(block.size() <= size);
  std::vector<uint8_t> again = block;
  DropExifThumbnail(again);
  Expect(again == block);
  const std::vector<uint8_t> thumbnail(choice, 0xEE);
  if (ReplaceExifThumbnail(block, thumbnail, 65527)) Expect(block.size() <= 65527);
  Walk(block);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const std::span<const uint8_t> block(data, size);
  Walk(block);
  Edit({data, data + size}, size > 0 ? data[size - 1] : uint8_t{0});
  std::string_view comment;
  (void)DecodeUserComment(block, static_cast<uint32_t>(size), 16, comment);
  GpsLocation location;
  if (ParseGpsLocation({reinterpret_cast<const char*>(data), size}, location)) {
    (void)GpsDistance(GpsDegrees(location.latitude), GpsDegrees(location.longitude), 0, 0, choice::kMiles);
  }
  return 0;
}
