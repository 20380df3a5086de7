#include "formats/casio/cam.h"

#include <gtest/gtest.h>

#include "support/codecs.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/pictures.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

// Entropy-coded bytes from binary digits, padded with ones.
Bytes Coded(const std::string& digits) {
  Bytes bytes;
  for (size_t i = 0; i < digits.size(); i += 8) {
    uint8_t byte = 0;
    for (size_t bit = 0; bit < 8; ++bit)
      byte =
          static_cast<uint8_t>(byte << 1 | (i + bit < digits.size() ? digits[i + bit] - '0' : 1));
    bytes.push_back(byte);
    if (byte == 0xFF) bytes.push_back(0);
  }
  return bytes;
}

// Flat blocks: the first differs from 128 by `difference` (of 3 bits) quantizers / 8, the others by
// the same again. Codes are those of T.81, K.3.
std::string Luma(const char* difference, int blocks) {
  std::string digits = std::string("100") + difference + "1010";
  for (int i = 1; i < blocks; ++i) digits += "001010";
  return digits;
}
std::string Chroma(const char* difference, int blocks) {
  std::string digits = std::string("110") + difference + "00";
  for (int i = 1; i < blocks; ++i) digits += "0000";
  return digits;
}

void Append16(Bytes& bytes, size_t value) {
  bytes.push_back(static_cast<uint8_t>(value >> 8));
  bytes.push_back(static_cast<uint8_t>(value));
}

// Luma quantizers of 16, chroma quantizers of 24.
Bytes Quantizers() {
  Bytes bytes(64, 16);
  bytes.resize(128, 24);
  return bytes;
}

Bytes NormalArea() {
  const Bytes y = Coded(Luma("100", 60 * 30)), cb = Coded(Chroma("100", 20 * 15)),
              cr = Coded(Chroma("011", 20 * 15));
  Bytes area = Hex("0003");
  for (const Bytes* scan : {&y, &cb, &cr}) Append16(area, scan->size());
  const Bytes quantizers = Quantizers();
  for (const Bytes* part : {&quantizers, &y, &cb, &cr})
    area.insert(area.end(), part->begin(), part->end());
  return area;
}

Bytes FineArea() {
  std::string digits;
  for (int i = 0; i < 40 * 30; ++i) {
    digits += i == 0 ? Luma("100", 4) : Luma("", 0).substr(0, 0) + "001010001010001010001010";
    digits += i == 0 ? Chroma("100", 1) + Chroma("011", 1) : "00000000";
  }
  const Bytes data = Coded(digits);
  Bytes area = Hex("0003 0000 0000");
  Append16(area, data.size());
  const Bytes quantizers = Quantizers();
  area.insert(area.end(), quantizers.begin(), quantizers.end());
  area.insert(area.end(), data.begin(), data.end());
  return area;
}

struct Area {
  uint16_t number;
  Bytes data;
};

Bytes File(const std::vector<Area>& areas) {
  Bytes file = Hex("07204D4D");
  Append16(file, areas.size());
  for (const Area& area : areas) {
    Append16(file, area.number);
    Append16(file, area.data.size() >> 16);
    Append16(file, area.data.size() & 0xFFFF);
    file.resize(file.size() + 10);
  }
  for (const Area& area : areas) file.insert(file.end(), area.data.begin(), area.data.end());
  return file;
}

// Y 136, Cb 140, Cr 116, converted as in T.871
constexpr int32_t kColor = 119 << 16 | 140 << 8 | 157;

TEST(CamRead, Pictures) {
  const Bytes comment = Hex("51562D3130 00"), thumbnail(2808);
  const Bytes normal = NormalArea(), fine = FineArea();
  Bytes whole = File({{1, comment}, {2, thumbnail}, {3, normal}});
  Bytes cutNormal = whole;
  cutNormal.resize(cutNormal.size() - 2000);
  const Bytes jpeg =
      Hex("FFD8 FFDB 0043 00 "
          "4040404040404040404040404040404040404040404040404040404040404040404040404040404040404040"
          "4040404040"
          "404040404040404040404040404040 FFC0 000B 08 0008 0008 01 01 11 00 FFDA 0008 01 01 00 00 "
          "3F 00 92BF FFD9");
  struct Row {
    const char* name;
    Bytes file;
    Status status;
    int32_t width, height, color;
  };
  const Row rows[] = {
      {"480 x 240", whole, Status::Ok, 480, 240, kColor},
      {"640 x 480", File({{1, comment}, {2, thumbnail}, {3, fine}}), Status::Ok, 640, 480, kColor},
      {"the picture alone", File({{3, normal}}), Status::Ok, 480, 240, kColor},
      {"a JPEG file in area 12", File({{1, comment}, {12, jpeg}}), Status::Ok, 8, 8, 160},
      {"a JPEG file in area 3", File({{3, jpeg}}), Status::Ok, 8, 8, 160},
      {"no picture", File({{1, comment}, {2, thumbnail}}), Status::NoImages, 0, 0, 0},
      {"cut before the picture", cutNormal, Status::FileReadError, 0, 0, 0},
      {"cut in the last scan", std::vector(whole.begin(), whole.end() - 1), Status::FileReadError, 0, 0, 0},
      {"another file", Hex("0720 4D4E 0001"), Status::DamagedFile, 0, 0, 0},
      {"no areas", Hex("0720 4D4D 0000"), Status::DamagedFile, 0, 0, 0},
      {"thousands of areas", Hex("0720 4D4D FFFF"), Status::DamagedFile, 0, 0, 0},
      {"a table cut short", Hex("0720 4D4D 0003 0001"), Status::FileReadError, 0, 0, 0},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded decoded = Decode(CamRead, row.file);
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(decoded.picture->image.Width(), row.width);
    EXPECT_EQ(decoded.picture->image.Height(), row.height);
    if (row.status != Status::Ok) continue;
    EXPECT_EQ(decoded.picture->image.PixelAt(0, 0), row.color);
    EXPECT_EQ(decoded.picture->image.PixelAt(row.width - 1, row.height - 1), row.color);
  }
}

TEST(CamDetails, Lines) {
  const TemporaryFolder folder;
  WriteBytes(folder.Path("a.cam"), File({{1, Hex("51562D3130 00 FF")}, {3, NormalArea()}}));
  const PicturePointer picture = NewPictureRecord();
  picture->fileName.AssignCut(folder.Path("a.cam"));
  ASSERT_EQ(CamDetails(*picture), Status::Ok);
  EXPECT_EQ(picture->detailLines.Line(0), "        Areas: 2");
  EXPECT_EQ(picture->detailLines.Line(1), " Pixel aspect: 2:3");
  EXPECT_EQ(picture->detailLines.Line(2), "      Comment: QV-10");
}

}  // namespace
}  // namespace fotomill::test
