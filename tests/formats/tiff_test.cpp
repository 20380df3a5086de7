#include "formats/tiff/tiff.h"

#include <gtest/gtest.h>

#include <sstream>

#include "core/choice_lists.h"
#include "settings/settings.h"
#include "support/codecs.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/peers.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

// A little-endian page with one uncompressed strip: its entries, 12 bytes each, then their values
// and the pixels.
constexpr size_t kPageEnd = 8 + 2 + 8 * 12 + 4;
std::vector<uint8_t> Page(uint32_t width, uint32_t height, uint16_t bits, uint16_t photometric,
                          uint16_t samples, uint16_t lastTag, uint32_t lastValue,
                          const std::vector<uint8_t>& pixels) {
  std::vector<uint8_t> file = Hex("49 49 2A 00  08 00 00 00  08 00");
  const auto put = [&file](uint32_t value, int count) {
    for (int i = 0; i < count; ++i) file.push_back(static_cast<uint8_t>(value >> 8 * i));
  };
  const auto entry = [&put](uint16_t tag, uint32_t value) {
    put(tag, 2);
    put(4, 2);
    put(1, 4);
    put(value, 4);
  };
  entry(256, width);
  entry(257, height);
  entry(258, bits);
  entry(262, photometric);
  entry(273, kPageEnd);
  entry(277, samples);
  entry(279, static_cast<uint32_t>(pixels.size()));
  entry(lastTag, lastValue);
  put(0, 4);
  file.insert(file.end(), pixels.begin(), pixels.end());
  return file;
}

TEST(Tiff, SamplesBecomePixels) {
  constexpr uint16_t kExtra = 338, kFormat = 339, kPlanes = 284;
  struct Row {
    const char* name;
    uint32_t width;
    uint16_t bits, photometric, samples, lastTag;
    uint32_t lastValue;
    const char *pixels, *expected, *alpha;
  };
  // clang-format off
  const Row rows[] = {
      {"two bits",                 5,  2, 1, 1, kFormat, 1, "1B 40",                   "0 1 2 3 1", ""},
      {"white is zero",            3,  8, 0, 1, kFormat, 1, "00 01 FF",                "0 1 255", ""},
      {"16 bits, rounded",         3, 16, 1, 1, kFormat, 1, "7F 80  80 80  FF FF",     "128 128 255", ""},
      {"16 bits, signed",          3, 16, 1, 1, kFormat, 2, "00 80  00 00  FF 7F",     "0 128 255", ""},
      {"8 bits, signed, as are",   3,  8, 1, 1, kFormat, 2, "00 80 FF",                "0 128 255", ""},
      {"12 bits",                  2, 12, 1, 1, kFormat, 1, "FF F0 00",                "255 0", ""},
      {"real",                     3, 32, 1, 1, kFormat, 3, "00 00 00 3F  00 00 00 40  00 00 C0 7F", "128 255 0", ""},
      {"half real",                2, 16, 1, 1, kFormat, 3, "00 38  00 BC",            "128 0", ""},
      {"planes apart",             2,  8, 2, 3, kPlanes, 1, "01 02 03 04 05 06",       "010203 040506", ""},
      {"CMYK",                     2,  8, 5, 4, kFormat, 1, "FF 00 00 00  00 00 00 80","00FFFF 7F7F7F", ""},
      {"alpha multiplied in",      2,  8, 2, 4, kExtra,  1, "40 20 00 80  01 01 01 00","804000 000000", "128 0"},
      {"alpha beside",             1,  8, 2, 4, kExtra,  2, "40 20 00 80",             "402000", "128"},
      {"alpha that nobody told",   1,  8, 2, 4, kFormat, 1, "40 20 00 80",             "402000", "128"},
      {"an extra that is not it",  1,  8, 2, 4, kExtra,  0, "40 20 00 80",             "402000", ""},
      {"gray and alpha",           1,  8, 1, 2, kExtra,  2, "40 80",                   "404040", "128"},
  };
  // clang-format on
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const auto file = Page(row.width, 1, row.bits, row.photometric, row.samples, row.lastTag,
                           row.lastValue, Hex(row.pixels));
    const Decoded decoded = Decode(TiffRead, file);
    ASSERT_EQ(decoded.status, Status::Ok);
    EXPECT_EQ(PixelText(decoded.picture->image), row.expected);
    EXPECT_EQ(PixelText(decoded.picture->alpha), row.alpha);
  }
}

TEST(Tiff, ColorMapsHoldSixteenBitsOrEight) {
  constexpr uint16_t kColorMap = 320, kPalette = 3;
  const std::vector<uint8_t> pixels = Hex("1B");  // 0 1 2 3
  const struct {
    const char *name, *map, *expected;  // reds, greens, blues
  } rows[] = {
      {"16 bits", "0000 00FF 0080 FFFF  0000 0001 0080 FFFF  0000 00FE 0080 FFFF", "0 0 0  255 1 254  128 128 128  255 255 255"},
      {"8 bits", "0000 FF00 8000 0C00  0000 0100 8000 2200  0000 FE00 8000 3800", "0 0 0  255 1 254  128 128 128  12 34 56"},
      {"8 bits but for one", "0000 FF00 8000 0001  0000 0100 8000 0000  0000 FE00 8000 0000", "0 0 0  0 0 0  0 0 0  1 0 0"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    std::vector<uint8_t> file = Page(4, 1, 2, kPalette, 1, kColorMap, kPageEnd + 1, pixels);
    file[kPageEnd - 14] = 3;   // shorts
    file[kPageEnd - 12] = 12;  // count
    const std::vector<uint8_t> map = Hex(row.map);
    file.insert(file.end(), map.begin(), map.end());
    const Decoded decoded = Decode(TiffRead, file);
    ASSERT_EQ(decoded.status, Status::Ok);
    EXPECT_EQ(PixelText(decoded.picture->image), "0 1 2 3");
    std::istringstream expected(row.expected);
    for (size_t i = 0; i < 12; ++i) {
      int level = -1;
      expected >> level;
      EXPECT_EQ(decoded.picture->palette[i], level) << i;
    }
  }
}

TEST(Tiff, InvalidFilesFail) {
  const std::vector<uint8_t> pixels(64, 7);
  struct Row {
    const char* name;
    std::vector<uint8_t> file;
    Status status;
  };
  std::vector<uint8_t> cut = Page(8, 8, 8, 1, 1, 339, 1, pixels), foreign = cut, loop = cut;
  cut.pop_back();
  foreign[2] = 41;
  // links back to itself
  loop[kPageEnd - 4] = 8;
  // a row of 240 GB, run-length coded
  std::vector<uint8_t> bomb = Page(4000000, 1, 8, 1, 60000, 259, 32773, pixels);
  const Row rows[] = {
      {"last pixel missing", cut, Status::FileReadError},
      {"another magic number", foreign, Status::DamagedFile},
      {"only a header", Hex("49 49 2A 00"), Status::FileReadError},
      {"directory beyond the end", Hex("49 49 2A 00 00 01 00 00"), Status::FileReadError},
      {"more rows than the file has", Page(60000, 60000, 8, 1, 1, 339, 1, pixels), Status::FileReadError},
      {"no width", Page(0, 8, 8, 1, 1, 339, 1, pixels), Status::DamagedFile},
      {"a row that no memory holds", bomb, Status::MemoryAllocationError},
      {"directories in a circle", loop, Status::Ok},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    EXPECT_EQ(Decode(TiffRead, row.file).status, row.status);
  }
}

TEST(Tiff, TruncatedFilesFailCleanly) {
  const std::vector<uint8_t> bare = Page(8, 8, 8, 1, 1, 339, 1, std::vector<uint8_t>(64, 7));
  const std::vector<uint8_t> packed = Encode(TiffWrite, *PatternPicture(30, 20, 24));
  for (size_t length = 0; length < bare.size(); ++length) {
    EXPECT_NE(Decode(TiffRead, std::span(bare).first(length)).status, Status::Ok) << length;
  }
  // the directory is last: the file may end with a text
  for (size_t length = 0; length < packed.size(); ++length) {
    const Decoded decoded = Decode(TiffRead, std::span(packed).first(length));
    EXPECT_EQ(decoded.picture->image.Empty(), decoded.status != Status::Ok) << length;
  }
}

TEST(Tiff, MetadataRoundTrips) {
  const ScopedSettings scoped;
  const PicturePointer picture = PatternPicture(5, 3, 24);
  picture->metadata.icc.assign(200, 9);
  picture->metadata.xmp = {'<', 'x', '/', '>'};
  picture->metadata.dpiX = 300;
  picture->metadata.dpiY = 150;
  picture->comment = {'h', 'i'};
  // orientation 6
  picture->metadata.exif = Hex("4D4D 002A 00000008  0001  0112 0003 00000001 0006 0000  00000000");
  const Decoded back = Decode(TiffRead, Encode(TiffWrite, *picture));
  ASSERT_EQ(back.status, Status::Ok);
  EXPECT_EQ(back.picture->metadata.icc, picture->metadata.icc);
  EXPECT_EQ(back.picture->metadata.xmp, picture->metadata.xmp);
  EXPECT_EQ(back.picture->metadata.dpiX, 300);
  EXPECT_EQ(back.picture->metadata.dpiY, 150);
  EXPECT_EQ(back.picture->comment, picture->comment);
  EXPECT_EQ(back.picture->metadata.exif, Hex("4949 2A00 08000000  0100  1201 0300 01000000 0600 0000  00000000"));

  settings.PreserveEXIF = 0;
  const Decoded bare = Decode(TiffRead, Encode(TiffWrite, *picture));
  EXPECT_TRUE(bare.picture->metadata.exif.empty() && bare.picture->metadata.xmp.empty());
  EXPECT_EQ(bare.picture->metadata.icc, picture->metadata.icc);  // belongs to the colors
}

// Large enough for several strips and for patching a header that was already flushed.
TEST(Tiff, EveryCompressionIsLossless) {
  const ScopedSettings scoped;
  for (int32_t option = choice::kTiffNone; option < choice::kTiffJpeg; ++option) {
    settings.TiffOptions = option;
    for (const int32_t bits : {1, 4, 8, 24}) {
      SCOPED_TRACE(std::to_string(option) + ", " + std::to_string(bits) + " bits");
      const PicturePointer picture = PatternPicture(700, 900, bits);
      const Decoded back = Decode(TiffRead, Encode(TiffWrite, *picture));
      ASSERT_EQ(back.status, Status::Ok);
      if (bits > 1 || option != choice::kTiffCcitt) {
        EXPECT_TRUE(SamePixels(picture->image, back.picture->image));
      } else {  // white is 0
        EXPECT_EQ(back.picture->image.ColorTable()[0], 255);
        EXPECT_EQ(picture->image.Row(5)[3] ^ 0xFF, back.picture->image.Row(5)[3]);
      }
    }
  }
}

TEST(Tiff, WrittenFilesAreCompatible) {
  if (!HasProgram("tifftopnm")) GTEST_SKIP() << "netpbm is not installed";
  const ScopedSettings scoped;
  const TemporaryFolder folder;
  for (int32_t option = choice::kTiffNone; option < choice::kTiffJpeg; ++option) {
    SCOPED_TRACE(option);
    settings.TiffOptions = option;
    const PicturePointer picture = PatternPicture(100, 70, 1);
    WriteBytes(folder.Path("a.tif"), Encode(TiffWrite, *picture));
    ASSERT_TRUE(RunShell("tifftopnm " + folder.Path("a.tif") + " > " + folder.Path("a.pbm") + " 2>/dev/null"));
    const PnmPicture seen = ReadPnm(folder.Path("a.pbm"));
    ASSERT_EQ(seen.values.size(), 7000u);
    for (size_t i = 0; i < seen.values.size(); ++i) {
      const int32_t black =
          1 - picture->image.PixelAt(static_cast<int32_t>(i % 100), static_cast<int32_t>(i / 100));
      ASSERT_EQ(seen.values[i], black) << i;
    }
  }
}

}  // namespace
}  // namespace fotomill::test
