#include "formats/cameraraw/kdc.h"

#include <gtest/gtest.h>

#include "formats/cameraraw/raw_library.h"
#include "formats/cameraraw/raw_preview.h"
#include "formats/jpeg/jpeg.h"
#include "support/codecs.h"
#include "support/files.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

// A TIFF file of either byte order; values follow their directories.
class TiffFile {
 public:
  explicit TiffFile(bool big) : big_(big) {
    bytes_ = big ? Bytes{'M', 'M', 0, 42} : Bytes{'I', 'I', 42, 0};
    Put(bytes_, 8, 4);
  }
  // Appends data; returns their offset.
  uint32_t Data(const Bytes& data) {
    const auto place = static_cast<uint32_t>(bytes_.size());
    bytes_.insert(bytes_.end(), data.begin(), data.end());
    if (bytes_.size() % 2 != 0) bytes_.push_back(0);
    return place;
  }
  struct Entry {
    uint16_t tag, type;
    std::vector<uint32_t> values;
  };
  // Appends a directory; returns its offset.
  uint32_t Directory(const std::vector<Entry>& entries, uint32_t next = 0) {
    std::vector<uint32_t> values;
    for (const Entry& entry : entries) values.push_back(Values(entry));
    const auto place = static_cast<uint32_t>(bytes_.size());
    Put(bytes_, static_cast<uint32_t>(entries.size()), 2);
    for (size_t i = 0; i < entries.size(); ++i) {
      const Entry& entry = entries[i];
      const uint32_t width = Width(entry.type);
      Put(bytes_, entry.tag, 2);
      Put(bytes_, entry.type, 2);
      Put(bytes_, static_cast<uint32_t>(entry.values.size()) / (entry.type >= 5 ? 2 : 1), 4);
      if (entry.values.size() * width > 4) {
        Put(bytes_, values[i], 4);
        continue;
      }
      for (const uint32_t value : entry.values) Put(bytes_, value, width);
      for (size_t left = 4 - entry.values.size() * width; left > 0; --left) bytes_.push_back(0);
    }
    Put(bytes_, next, 4);
    return place;
  }
  Bytes Finish(uint32_t first) {
    Bytes start;
    Put(start, first, 4);
    std::copy(start.begin(), start.end(), bytes_.begin() + 4);
    return bytes_;
  }

 private:
  static uint32_t Width(uint16_t type) { return type == 1 || type == 2 ? 1 : type == 3 ? 2 : 4; }
  void Put(Bytes& bytes, uint32_t value, uint32_t width) const {
    for (uint32_t i = 0; i < width; ++i)
      bytes.push_back(static_cast<uint8_t>(value >> 8 * (big_ ? width - 1 - i : i)));
  }
  uint32_t Values(const Entry& entry) {
    const uint32_t width = Width(entry.type);
    if (entry.values.size() * width <= 4) return 0;
    Bytes bytes;
    for (const uint32_t value : entry.values) Put(bytes, value, width);
    return Data(bytes);
  }

  const bool big_;
  Bytes bytes_;
};

std::vector<uint32_t> Letters(const char* text) {
  std::vector<uint32_t> letters;
  for (; *text != 0; ++text) letters.push_back(static_cast<uint8_t>(*text));
  letters.push_back(0);
  return letters;
}

constexpr uint32_t kSide = 64;

// A DNG of 64 x 48 pixels: a red, green, green, blue sensor with its left half lit.
Bytes SensorFile(uint32_t rows = 48) {
  TiffFile file(false);
  Bytes sensor;
  for (uint32_t i = 0; i < kSide * rows; ++i) {
    const uint32_t value = i % kSide < kSide / 2 ? 40000 : 2000;
    sensor.push_back(static_cast<uint8_t>(value));
    sensor.push_back(static_cast<uint8_t>(value >> 8));
  }
  const uint32_t data = file.Data(sensor);
  const std::vector<uint32_t> unity = {1, 1, 0, 1, 0, 1, 0, 1, 1, 1, 0, 1, 0, 1, 0, 1, 1, 1};
  return file.Finish(file.Directory({{254, 4, {0}},
                                     {256, 4, {kSide}},
                                     {257, 4, {48}},
                                     {258, 3, {16}},
                                     {259, 3, {1}},
                                     {262, 3, {32803}},
                                     {271, 2, Letters("Kodak")},
                                     {272, 2, Letters("DC120 TEST")},
                                     {273, 4, {data}},
                                     {277, 3, {1}},
                                     {278, 4, {48}},
                                     {279, 4, {2 * kSide * 48}},
                                     {33421, 3, {2, 2}},
                                     {33422, 1, {0, 1, 1, 2}},
                                     {50706, 1, {1, 4, 0, 0}},
                                     {50708, 2, Letters("Kodak DC120 TEST")},
                                     {50717, 4, {65535}},
                                     {50721, 10, unity},
                                     {50728, 5, {1, 1, 1, 1, 1, 1}}}));
}

Bytes Jpeg(int32_t width) { return Encode(JpegWrite, *PatternPicture(width, 20, 24)); }

// A file of an unknown camera with a preview of 2 x 1 pixels, red and green, and JPEG previews in
// other directories.
Bytes PreviewFile(bool big, bool jpeg) {
  TiffFile file(big);
  const uint32_t rgb = file.Data({255, 0, 0, 0, 255, 0});
  uint32_t next = 0, below = 0;
  if (jpeg) {
    const Bytes small = Jpeg(24), large = Jpeg(40);
    const uint32_t first = file.Data(small), second = file.Data(large);
    next = file.Directory(
        {{259, 3, {6}}, {513, 4, {first}}, {514, 4, {static_cast<uint32_t>(small.size())}}});
    const uint32_t best = file.Directory(
        {{259, 3, {7}}, {273, 4, {second}}, {279, 4, {static_cast<uint32_t>(large.size())}}});
    below = best;
  }
  std::vector<TiffFile::Entry> entries = {{256, 4, {2}}, {257, 3, {1}}, {258, 3, {8}},
                                          {259, 3, {1}}, {262, 3, {2}}, {273, 4, {rgb}},
                                          {277, 3, {3}}, {279, 4, {6}}};
  if (below != 0) entries.push_back({330, 4, {below, 8}});
  return file.Finish(file.Directory(entries, next));
}

TEST(Kdc, DecodesSensorData) {
  if (!HasRawLibrary()) GTEST_SKIP() << "LibRaw is not installed";
  const Decoded described = Describe(KdcInfo, SensorFile()),
                decoded = Decode(KdcRead, SensorFile());
  ASSERT_EQ(described.status, Status::Ok);
  ASSERT_EQ(decoded.status, Status::Ok);
  EXPECT_TRUE(described.picture->typeName.view().starts_with("Kodak "));
  const PackedImage& image = decoded.picture->image;
  EXPECT_EQ(image.Width(), 64);
  EXPECT_EQ(image.Height(), 48);
  EXPECT_EQ(described.picture->width, 64);
  EXPECT_EQ(described.picture->height, 48);
  const int32_t lit = image.PixelAt(8, 24), dark = image.PixelAt(56, 24);
  EXPECT_GT(lit & 255, (dark & 255) + 100);
  EXPECT_NEAR(lit & 255, lit >> 16 & 255, 12);  // neutral gray
  EXPECT_TRUE(decoded.picture->note.empty());
}

TEST(Kdc, FallsBackToPreviews) {
  for (const bool big : {false, true}) {
    SCOPED_TRACE(big ? "big-endian" : "little-endian");
    const Decoded rgb = Decode(KdcRead, PreviewFile(big, false));
    ASSERT_EQ(rgb.status, Status::Ok);
    EXPECT_EQ(PixelText(rgb.picture->image), "FF0000 00FF00");
    EXPECT_EQ(rgb.picture->note.view(), "Only the embedded preview is shown.");
    const Decoded jpeg = Decode(KdcRead, PreviewFile(big, true)),
                  facts = Describe(KdcInfo, PreviewFile(big, true));
    ASSERT_EQ(jpeg.status, Status::Ok);
    EXPECT_EQ(jpeg.picture->image.Width(), 40);  // the largest
    EXPECT_EQ(facts.picture->width, 40);
    EXPECT_EQ(facts.picture->fileSize, PreviewFile(big, true).size());
  }
}

TEST(Kdc, RejectsOtherFiles) {
  TiffFile empty(false), loop(true);
  constexpr uint32_t next = 8;
  (void)empty.Data(Bytes(200));  // the library rejects shorter files
  (void)loop.Data(Bytes(200));
  const Bytes nothing = empty.Finish(empty.Directory({{256, 4, {2}}}));
  const Bytes looped = loop.Finish(loop.Directory({{330, 4, {8, 8, 9, 0xFFFFFFFF}}}, next));
  const Status neither = HasRawLibrary() ? Status::UnsupportedFormat : Status::FeatureDisabled;
  EXPECT_EQ(Decode(KdcRead, nothing).status, neither);
  EXPECT_EQ(Decode(KdcRead, looped).status, neither);
  EXPECT_EQ(Decode(KdcRead, {}).status, Status::DamagedFile);
  EXPECT_EQ(Decode(KdcRead, Jpeg(9)).status, Status::DamagedFile);
}

TEST(RawPreview, ValidatesTheFilesClaims) {
  Bytes file = PreviewFile(false, false);
  RawPreview preview;
  ASSERT_TRUE(FindRawPreview(file, preview));
  EXPECT_EQ(preview.rows.size(), 6u);
  for (size_t length = 0; length < file.size(); ++length) {
    RawPreview cut;
    const std::span<const uint8_t> part(file.data(), length);
    if (!FindRawPreview(part, cut)) continue;
    EXPECT_EQ(cut.rows.size(), 6u) << length;
  }
}

}  // namespace
}  // namespace fotomill::test
