#include "formats/photocd/pcd.h"

#include <gtest/gtest.h>

#include "formats/photocd/pcd_deltas.h"
#include "formats/photocd/pcd_file.h"
#include "processing/color/photo_ycc.h"
#include "support/codecs.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/pictures.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

// Bytes from binary digits in any grouping.
Bytes Bits(std::string_view digits) {
  Bytes bytes;
  size_t count = 0;
  for (const char digit : digits) {
    if (digit != '0' && digit != '1') continue;
    if (count++ % 8 == 0) bytes.push_back(0);
    bytes.back() = static_cast<uint8_t>(bytes.back() | (digit - '0') << (7 - (count - 1) % 8));
  }
  return bytes;
}

const std::string kMark = "11111111 11111111 11111110 ";
// The start of a row of deltas.
std::string Row(const char* plane, int32_t row) {
  std::string digits = kMark + plane;
  for (int bit = 12; bit >= 0; --bit) digits += (row >> bit & 1) != 0 ? '1' : '0';
  return digits + "0 ";
}

// 0: no change, 10: plus 1, 110: minus 100, 1110 0000 0000 1: plus 5
const char* const kCode = "03  00 0000 00  01 8000 01  02 C000 9C  0C E008 05";

TEST(PcdCode, Tables) {
  struct Case {
    const char* name;
    const char* table;
    bool valid;
  };
  const Case cases[] = {
      {"four words", kCode, true},
      {"in any order", "01  00 8000 01  00 0000 00", true},
      {"one word only, as in an empty sector", "00 00 0000 00", false},
      {"a word that another one begins with", "02  00 0000 00  01 8000 01  02 A000 02", false},
      {"the same word twice", "01  00 0000 00  00 0000 01", false},
      {"a word of 17 bits", "01  10 0000 00  00 8000 01", false},
      {"a word of 256 bits", "01  FF 0000 00  00 8000 01", false},
      {"bits behind a word's end", "01  00 0001 00  00 8000 01", false},
      {"cut short", "02  00 0000 00  01 8000 01  02 C0", false},
      {"nothing", "", false},
  };
  for (const Case& row : cases) {
    SCOPED_TRACE(row.name);
    uint64_t position = 0;
    PcdCode code;
    const Bytes table = Hex(row.table);
    EXPECT_EQ(code.Parse(table, position), row.valid);
    if (row.valid) {
      EXPECT_EQ(position, table.size());
    }
  }
}

TEST(PcdDeltas, Rows) {
  const std::string end = Row("00", 2);
  struct Case {
    const char* name;
    std::string digits;
    bool lumaOnly;
    Status status;
    const char* luma;  // two rows of four
    const char* chroma;
    bool damaged;
  };
  const Case cases[] = {
      {"a word of each kind", Row("00", 0) + "0 10 110 1110000000001" + end, true, Status::Ok, "64 65 00 69 64 64 64 64", "64 64", false},
      {"the last row first", Row("00", 1) + "10 0 0 0" + Row("00", 0) + "0 0 0 10" + end, true, Status::Ok,
       "64 64 64 65 65 64 64 64", "64 64", false},
      {"bits between rows", "0101 1" + Row("00", 0) + "10 0 0 0 0001" + end, true, Status::Ok, "65 64 64 64 64 64 64 64", "64 64", false},
      {"added twice, not below 0", Row("00", 0) + "110 0 0 0" + Row("00", 0) + "110 0 0 10" + end, true, Status::Ok,
       "00 64 64 65 64 64 64 64", "64 64", false},
      {"second chroma", Row("00", 0) + "10 0 0 0" + Row("11", 0) + "0 10" + end, false, Status::Ok, "65 64 64 64 64 64 64 64", "64 65", false},
      {"chroma where only luma is told", Row("00", 0) + "10 0 0 0" + Row("11", 0) + "0 10" + end, true, Status::Ok,
       "65 64 64 64 64 64 64 64", "64 64", true},
      {"a plane that does not exist", Row("00", 0) + "10 0 0 0" + Row("01", 0) + "0 10" + end, false, Status::Ok,
       "65 64 64 64 64 64 64 64", "64 64", true},
      {"a row behind the last", Row("00", 9) + "10 10" + Row("00", 0) + "10 0 0 0" + end, true, Status::Ok,
       "65 64 64 64 64 64 64 64", "64 64", true},
      {"a word that is none", Row("00", 0) + "10 1111 0000" + Row("00", 1) + "10 0 0 0" + end, true, Status::Ok,
       "65 64 64 64 65 64 64 64", "64 64", true},
      {"no end", Row("00", 0) + "10 0 0 0", true, Status::FileReadError, "65 64 64 64 64 64 64 64", "64 64", false},
      {"an end alone", end, true, Status::DamagedFile, "64 64 64 64 64 64 64 64", "64 64", false},
      {"nothing", "", true, Status::FileReadError, "64 64 64 64 64 64 64 64", "64 64", false},
  };
  for (const Case& row : cases) {
    SCOPED_TRACE(row.name);
    PcdCodes codes;
    ASSERT_TRUE(codes.Parse(Hex(std::string(kCode) + kCode + kCode), 3));
    PcdPlanes planes;
    planes.luma.Make(4, 2);
    for (PcdPlane& chroma : planes.chroma) chroma.Make(2, 1);
    for (PcdPlane* plane : {&planes.luma, &planes.chroma[0], &planes.chroma[1]})
      std::ranges::fill(plane->samples, uint8_t{0x64});
    bool damaged = false;
    EXPECT_EQ(AddPcdDeltas(Bits(row.digits), codes, row.lumaOnly, planes, [](int32_t) { return Status::Ok; }, damaged), row.status);
    EXPECT_EQ(planes.luma.samples, Hex(row.luma));
    EXPECT_EQ(planes.chroma[0].samples, Hex("64 64"));
    EXPECT_EQ(planes.chroma[1].samples, Hex(row.chroma));
    EXPECT_EQ(damaged, row.damaged);
  }
}

TEST(PcdPlane, Doubled) {
  PcdPlane plane;
  plane.Make(2, 2);
  plane.samples = {10, 21, 40, 60};
  EXPECT_EQ(DoublePcdPlane(plane).samples,
            Bytes({10, 16, 21, 21, 25, 33, 41, 41, 40, 50, 60, 60, 40, 50, 60, 60}));
}

TEST(PhotoYcc, Colors) {
  struct Case {
    const char* name;
    uint8_t luma, chroma1, chroma2;
    const char* bgr;
  };
  const Case cases[] = {
      {"black", 0, 156, 137, "000000"},
      {"gray, as it is", 128, 156, 137, "AEAEAE"},
      {"the brightest light", 255, 156, 137, "FFFFFF"},
      {"white", 182, 156, 137, "EBEBEB"},
      {"blue: 1.3584 * 70 + 2.2179 * 24", 70, 180, 137, "94555F"},
      {"red: 1.3584 * 70 + 1.8215 * 30", 70, 156, 167, "5F4396"},
      {"below black", 0, 0, 0, "00C200"},
  };
  for (const Case& row : cases) {
    SCOPED_TRACE(row.name);
    Bytes bgr(3);
    PhotoYccToColors(&row.luma, &row.chroma1, &row.chroma2, 1, bgr.data());
    EXPECT_EQ(bgr, Hex(row.bgr));
  }
}

// A file with the smallest resolutions: gray, with white in the first two pixels of the first row.
Bytes PlainFile(int32_t sizes, uint8_t turns = 0) {
  constexpr uint64_t kBegins[] = {0x2000, 0xB800, 0x30000};
  const auto last = static_cast<size_t>(sizes - 1);
  Bytes file(kBegins[last] + PcdPlainBytes(sizes - 1));
  std::ranges::copy(std::string_view("PCD_IPI"), file.begin() + 0x800);
  file[0x800 + 1538] = turns;
  for (int32_t size = 0; size < sizes; ++size) {
    const auto width = static_cast<size_t>(PcdWidth(size));
    uint8_t* const begin = &file[kBegins[size]];
    for (int32_t pair = 0; pair < PcdHeight(size) / 2; ++pair) {
      uint8_t* const rows = begin + 3 * width * static_cast<size_t>(pair);
      std::fill_n(rows, 2 * width, uint8_t{100});
      std::fill_n(rows + 2 * width, width / 2, uint8_t{156});
      std::fill_n(rows + 5 * width / 2, width / 2, uint8_t{137});
    }
    begin[0] = begin[1] = 255;
  }
  return file;
}

TEST(PcdRead, RotatesUpright) {
  struct Case {
    uint8_t turns;
    int32_t width, x, y, secondX, secondY;
  };
  const Case cases[] = {{0, 192, 0, 0, 1, 0},
                        {1, 128, 0, 191, 0, 190},
                        {2, 192, 191, 127, 190, 127},
                        {3, 128, 127, 0, 127, 1}};
  for (const Case& row : cases) {
    SCOPED_TRACE(int{row.turns});
    const Decoded decoded = Decode(PcdRead, PlainFile(1, row.turns));
    ASSERT_EQ(decoded.status, Status::Ok);
    const PackedImage& image = decoded.picture->image;
    EXPECT_EQ(image.Width(), row.width);
    EXPECT_EQ(image.Width() + image.Height(), 320);
    int32_t white = 0;
    for (int32_t y = 0; y < image.Height(); ++y) {
      for (int32_t x = 0; x < image.Width(); ++x) white += image.PixelAt(x, y) == 0xFFFFFF ? 1 : 0;
    }
    EXPECT_EQ(white, 2);
    EXPECT_EQ(image.PixelAt(row.x, row.y), 0xFFFFFF);
    EXPECT_EQ(image.PixelAt(row.secondX, row.secondY), 0xFFFFFF);
  }
}

TEST(PcdRead, RequestedSizes) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("a.pcd");
  WriteBytes(path, PlainFile(3));
  struct Case {
    int32_t largest, side, width, shown, reduction;
  };
  const Case cases[] = {
      {4, 0, 768, 768, 1}, {1, 0, 384, 384, 1}, {0, 0, 192, 192, 1}, {-5, 0, 192, 192, 1}, {99, 0, 768, 768, 1},
      {4, 96, 768, 192, 4}, {4, 97, 768, 384, 2}, {4, 193, 768, 768, 1}, {4, 5000, 768, 768, 1}, {1, 10, 384, 192, 2},
  };
  for (const Case& row : cases) {
    SCOPED_TRACE(row.largest);
    SCOPED_TRACE(row.side);
    ReadRequest request = RequestFor(path);
    request.options.photoCdSize = row.largest;
    request.thumbnailSide = row.side;
    const PicturePointer picture = NewPictureRecord();
    ASSERT_EQ(PcdRead(*picture, request), Status::Ok);
    EXPECT_EQ(picture->width, row.width);
    EXPECT_EQ(picture->image.Width(), row.shown);
    EXPECT_EQ(picture->reduction, row.reduction);
  }
}

TEST(PcdRead, RejectsInvalidFiles) {
  Bytes overview(41 * 2048);
  std::ranges::copy(std::string_view("PCD_OPA"), overview.begin());
  const Bytes empty = overview;
  overview[11] = 200;
  const Bytes whole = PlainFile(1);
  Bytes nameless = whole;
  nameless[0x800] = 'p';
  EXPECT_EQ(Decode(PcdRead, whole).status, Status::Ok);
  EXPECT_EQ(Decode(PcdRead, std::span(whole).first(whole.size() - 1)).status, Status::FileReadError);
  EXPECT_EQ(Decode(PcdRead, nameless).status, Status::DamagedFile);
  EXPECT_EQ(Decode(PcdRead, empty).status, Status::NoImages);
  EXPECT_EQ(Decode(PcdRead, std::span(overview).first(20000)).status, Status::FileReadError);
  const Decoded pages = Decode(PcdRead, overview);
  EXPECT_EQ(pages.status, Status::Ok);
  EXPECT_EQ(pages.picture->pageCount, 2);  // there are no more than two
}

// A complete file up to 1536 x 1024, with one row of deltas.
Bytes LargerFile() {
  Bytes file = PlainFile(3);
  file.resize(388 * 2048);
  Bytes table = Hex(kCode);
  table.resize(2048);
  file.insert(file.end(), table.begin(), table.end());
  std::string digits = Row("00", 8);
  for (int x = 0; x < 1536; ++x) digits += x == 3 ? "110" : "0";
  const Bytes data = Bits(digits + Row("00", 1024));
  file.insert(file.end(), data.begin(), data.end());
  return file;
}

TEST(PcdRead, DeltasOfALargerSize) {
  Bytes file = LargerFile();
  const Decoded decoded = Decode(PcdRead, file);
  ASSERT_EQ(decoded.status, Status::Ok);
  EXPECT_EQ(decoded.picture->image.Width(), 1536);
  EXPECT_EQ(decoded.picture->image.PixelAt(2, 8), 0x888888);
  EXPECT_EQ(decoded.picture->image.PixelAt(3, 8), 0x000000);
  EXPECT_EQ(decoded.picture->image.PixelAt(4, 8), 0x888888);
  file.resize(file.size() - 8);
  EXPECT_EQ(Decode(PcdRead, file).status, Status::FileReadError);
  file[388 * 2048] = 0;  // without a code table the resolution does not exist
  EXPECT_EQ(Decode(PcdRead, file).picture->image.Width(), 768);
}

}  // namespace
}  // namespace fotomill::test
