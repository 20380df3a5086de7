#include "formats/drhalo/cut.h"

#include <gtest/gtest.h>

#include <filesystem>

#include "formats/drhalo/halo_palette.h"
#include "support/codecs.h"
#include "support/faults.h"
#include "support/files.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;
using Names = std::vector<std::string>;

TEST(Cut, ReadsIncompleteRows) {
  const struct {
    const char* name;
    const char* file;
    Status status;
    const char* pixels;
  } rows[] = {
      {"a run, bytes and the end", "0500 0200 0000  0600 82 09 02 01 02 00  0100 00", Status::Ok,
       "9 9 1 2 0 / 0 0 0 0 0"},
      {"more than the row", "0300 0100 0000  0300 84 07 00", Status::Ok, "7 7 7"},
      {"more bytes than the row", "0200 0100 0000  0500 04 01 02 03 04", Status::Ok, "1 2"},
      {"bytes behind the end", "0200 0100 0000  0500 00 02 01 02 00", Status::Ok, "0 0"},
      {"bytes that the code lacks", "0200 0100 0000  0200 02 01", Status::FileReadError, ""},
      {"a run without value", "0200 0100 0000  0100 82", Status::FileReadError, ""},
      {"a code cut short", "0200 0100 0000  0900 02 01 02 00", Status::FileReadError, ""},
      {"fewer rows", "0200 0300 0000  0000 0000", Status::FileReadError, ""},
      {"no width", "0000 0100 0000  0000", Status::DamagedFile, ""},
      {"another reserved field", "0200 0100 0001  0000", Status::DamagedFile, ""},
      {"a short header", "0200 0100 00", Status::FileReadError, ""},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded decoded = Decode(CutRead, Hex(row.file));
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(PixelText(decoded.picture->image), row.pixels);
    if (row.status == Status::Ok) {
      EXPECT_EQ(decoded.picture->palette, GrayRamp());
    }
  }
}

TEST(Cut, WritesRunsFromThreePixels) {
  const PicturePointer picture = PatternPicture(7, 1, 8);
  const int32_t pixels[] = {1, 1, 2, 3, 3, 3, 4};
  for (int32_t x = 0; x < 7; ++x) SetPixel(picture->image, x, 0, pixels[x]);
  EXPECT_EQ(Encode(CutWrite, *picture), Hex("0700 0100 0000  0900 03 01 01 02  83 03  01 04  00"));
  const PicturePointer wide = PatternPicture(300, 1, 1);
  for (int32_t x = 0; x < 300; ++x) SetPixel(wide->image, x, 0, 1);
  EXPECT_EQ(Encode(CutWrite, *wide), Hex("2C01 0100 0000  0700 FF 01 FF 01 AE 01 00"));
  Status status = Status::Ok;
  const PicturePointer widest = PatternPicture(65535, 1, 8);
  for (int32_t x = 0; x < 65535; ++x) SetPixel(widest->image, x, 0, x % 2);
  EXPECT_TRUE(Encode(CutWrite, *widest, &status).empty());  // its packed row exceeds 65535 bytes
  EXPECT_EQ(status, Status::UnsuitableImage);
  EXPECT_TRUE(Encode(CutWrite, *PatternPicture(3, 1, 24), &status).empty());
  EXPECT_EQ(status, Status::TooManyColors);
}

// A palette of two colors with given maximum values.
Bytes SmallPalette(const std::string& index, const std::string& highest) {
  return Hex("4148 E300 0C00 0A00 0000 0000 " + index + highest +
             "44722E2048616C6F 00000000 00000000 00000000  0100 0200 0300  3F00 1F00 FF00");
}

TEST(Cut, ReadsThePaletteFile) {
  const Bytes file = Hex("0100 0100 0000  0300 01 01 00");
  const struct {
    const char* name;
    const char* picture;
    const char* palette;
    Bytes bytes;
    HaloPaletteResult result;
    int color;
  } rows[] = {
      {"6 bits", "a.cut", "a.pal", SmallPalette("0100", "3F00 3F00 3F00"), HaloPaletteResult::Read, 0xFF7DFF},
      {"8 bits", "A.CUT", "A.PAL", SmallPalette("0100", "FF00 FF00 FF00"), HaloPaletteResult::Read, 0x3F1FFF},
      {"another case", "a.CUT", "a.pal", SmallPalette("0100", "FF00 FF00 FF00"), HaloPaletteResult::Read, 0x3F1FFF},
      {"none", "a.cut", "b.pal", {}, HaloPaletteResult::Missing, 0x010101},
      {"cut short", "a.cut", "a.pal", SmallPalette("0200", "FF00 FF00 FF00"), HaloPaletteResult::Damaged, 0x010101},
      {"too many", "a.cut", "a.pal", SmallPalette("0001", "FF00 FF00 FF00"), HaloPaletteResult::Damaged, 0x010101},
      {"nothing but black", "a.cut", "a.pal", SmallPalette("0100", "FF00 0000 FF00"), HaloPaletteResult::Damaged, 0x010101},
      {"another kind", "a.cut", "a.pal", Hex("52494646"), HaloPaletteResult::Damaged, 0x010101},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const TemporaryFolder folder;
    WriteBytes(folder.Path(row.picture), file);
    WriteBytes(folder.Path(row.palette), row.bytes);
    const PicturePointer picture = NewPictureRecord();
    ASSERT_EQ(CutInfo(*picture, RequestFor(folder.Path(row.picture))), Status::Ok);
    const Palette& palette = picture->palette;
    EXPECT_EQ(palette[3] << 16 | palette[4] << 8 | palette[5], row.color);
    EXPECT_EQ(picture->warning.empty(), row.result != HaloPaletteResult::Damaged);
    Palette read{};
    EXPECT_EQ(ReadHaloPalette(folder.Path(row.picture), read), row.result);
  }
}

// 78 colors fill the first block except for 4 bytes, 85 each of the others except for 2.
TEST(Cut, ColorsDoNotCrossBlocks) {
  const TemporaryFolder folder;
  const PicturePointer picture = PatternPicture(4, 4, 8);
  for (size_t i = 0; i < 768; ++i) picture->palette[i] = static_cast<uint8_t>(i * 7 + 1);
  picture->fileName.AssignCut(folder.Path("A.CUT"));
  ASSERT_EQ(CutWrite(*picture, {}), Status::Ok);
  EXPECT_EQ(folder.Names(), (Names{"A.CUT", "A.PAL"}));
  const Bytes palette = ReadBytes(folder.Path("A.PAL"));
  ASSERT_EQ(palette.size(), 2048u);
  for (const auto& [color, offset] : {std::pair<size_t, size_t>{0, 40},
                                      {77, 502},
                                      {78, 512},
                                      {162, 1016},
                                      {163, 1024},
                                      {255, 1578}}) {
    EXPECT_EQ(palette[offset], picture->palette[3 * color]) << color;
    EXPECT_EQ(palette[offset + 4], picture->palette[3 * color + 2]) << color;
  }
  Palette back{};
  EXPECT_EQ(ReadHaloPalette(folder.Path("A.CUT"), back), HaloPaletteResult::Read);
  EXPECT_EQ(back, picture->palette);
}

TEST(Cut, BothFilesAppearOrNeither) {
  const TemporaryFolder folder;
  const PicturePointer picture = PatternPicture(4, 4, 8);
  picture->fileName.AssignCut(folder.Path("a.cut"));
  const auto write = [&](platform::Existing existing) {
    return CutWrite(*picture, {.existing = existing});
  };

  WriteText(folder.Path("a.pal"), "somebody's own");  // another program's palette
  EXPECT_EQ(write(platform::Existing::Replace), Status::ErrorCreatingFile);
  EXPECT_EQ(ReadText(folder.Path("a.pal")), "somebody's own");
  EXPECT_EQ(folder.Names(), Names{"a.pal"});

  std::filesystem::remove(folder.Path("a.pal"));
  WriteText(folder.Path("a.cut"), "old");  // a picture that must stay
  EXPECT_EQ(write(platform::Existing::Refuse), Status::ErrorCreatingFile);
  EXPECT_EQ(folder.Names(), Names{"a.cut"});

  const Bytes palette = SmallPalette("0100", "3F00 3F00 3F00");
  WriteBytes(folder.Path("a.pal"), palette);
  EXPECT_EQ(write(platform::Existing::Refuse), Status::ErrorCreatingFile);
  const int64_t faults = ForEachFault([&] {
    WriteText(folder.Path("a.cut"), "old");
    WriteBytes(folder.Path("a.pal"), palette);
    const Status status = write(platform::Existing::Replace);
    EXPECT_EQ(ReadText(folder.Path("a.cut")) == "old", status != Status::Ok);
    EXPECT_EQ(ReadBytes(folder.Path("a.pal")) == palette, status != Status::Ok);
    EXPECT_EQ(folder.Names(), (Names{"a.cut", "a.pal"}));
  });
  EXPECT_GT(faults, 4);
}

}  // namespace
}  // namespace fotomill::test
