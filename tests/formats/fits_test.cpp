#include "formats/fits/fits.h"

#include <gtest/gtest.h>

#include "support/files.h"
#include "support/hex.h"
#include "support/peers.h"
#include "support/pictures.h"

namespace fotomill {
namespace {

using namespace test;
using Bytes = std::vector<uint8_t>;

// 80-character cards from texts separated by "|".
std::string Cards(std::string_view texts) {
  std::string cards;
  while (!texts.empty()) {
    const std::string_view text = texts.substr(0, texts.find('|'));
    cards.append(text).append(80 - text.size(), ' ');
    texts.remove_prefix(std::min(text.size() + 1, texts.size()));
  }
  return cards;
}

// A header with those cards between SIMPLE and END, blank-padded to the data.
std::string Header(const std::string& texts) {
  std::string header =
      Cards(std::string("SIMPLE  =                    T|").append(texts).append("|END"));
  return header.append((2880 - header.size() % 2880) % 2880, ' ');
}

// The file FitsWrite creates, and its data without header and padding.
std::string Written(PictureRecord& picture) {
  const TemporaryFolder folder;
  picture.fileName.AssignCut(folder.Path("a.fits"));
  EXPECT_EQ(FitsWrite(picture, {}), Status::Ok);
  return ReadText(folder.Path("a.fits"));
}
Bytes WrittenRow(PictureRecord& picture) {
  const std::string file = Written(picture);
  return {file.begin() + 2880, file.begin() + 2880 + picture.width};
}

TEST(Fits, WritesHeaderRowsAndPadding) {
  const PicturePointer picture = MakePicture(100, 50, 8, std::vector<Bytes>(50, Bytes(100, 200)));
  const std::string written = Written(*picture);
  ASSERT_EQ(written.size(), 8640u);
  EXPECT_EQ(written.substr(0, 2880), Header("BITPIX  =                    8|"
                                            "NAXIS   =                    2|"
                                            "NAXIS1  =                  100|"
                                            "NAXIS2  =                   50|"
                                            "ORIGIN  =FotomillProfessional |"
                                            "BSCALE  =        1.0000000E+00|"
                                            "BZERO   =        0.0000000E+00|"
                                            "DATAMIN =        0.0000000E+00|"
                                            "DATAMAX =      255.0000000E+00"));
  EXPECT_EQ(written.substr(2880, 5000), std::string(5000, '\xC8'));  // 60 + 118 + 22
  EXPECT_EQ(written.substr(7880), std::string(760, '\0'));
}

TEST(Fits, WritesGrayOfEveryDepth) {
  const struct {
    const char* name;
    int32_t width, bitsPerPixel;
    Bytes row, gray;
  } rows[] = {
      {"1 bit: white and black whatever the palette", 10, 1, Hex("A5 7F"), Hex("FF 00 FF 00 00 FF 00 FF 00 FF")},
      {"4 bits, high half first", 3, 4, Hex("1F 20"), Hex("0F 0C 1E")},
      {"2 bits name four colors", 4, 2, Hex("12 34"), Hex("0F 1E 0B 00")},
      {"8 bits", 3, 8, Hex("00 01 03"), Hex("63 0F 0B")},
      {"6 bits name 64 colors", 2, 6, Hex("01 40"), Hex("0F 00")},
      {"24 bits: each product is rounded down", 3, 24, Hex("09 09 09  FF FF FF  05 5A C8"), Hex("07 FE 71")},
  };
  const Bytes palette =
      Hex("FF 28 00   # 76 + 23 + 0 = 99; one division would give 100\n"
          "10 13 05   # 4 + 11 + 0 = 15\n"
          "20 22 0B   # 9 + 20 + 1 = 30\n"
          "06 0B 25   # 1 + 6 + 4 = 11\n");
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const PicturePointer picture = MakePicture(row.width, 1, row.bitsPerPixel, {row.row});
    picture->palette.fill(0);
    std::copy(palette.begin(), palette.end(), picture->palette.begin());
    picture->palette[3 * 15] = picture->palette[3 * 64] = 42;  // 12
    EXPECT_EQ(WrittenRow(*picture), row.gray);
  }
}

// Rows long enough for all code paths, of odd length.
TEST(Fits, ConvertsEveryLevelToGray) {
  Bytes row, expected;
  for (unsigned i = 0; i < 3 * 1024 + 13; ++i) {
    const unsigned level = i % 256, others = i * 7 / 3 % 256, blue = i < 256 ? level : others,
                   green = i / 256 == 1 ? level : 255 - others,
                   red = i / 256 == 2 ? level : others / 2;
    for (const unsigned value : {blue, green, red}) row.push_back(static_cast<uint8_t>(value));
    expected.push_back(static_cast<uint8_t>(red * 30 / 100 + green * 59 / 100 + blue * 11 / 100));
  }
  const PicturePointer picture = MakePicture(static_cast<int32_t>(expected.size()), 1, 24, {row});
  EXPECT_EQ(WrittenRow(*picture), expected);
}

TEST(Fits, ReadsHeaders) {
  constexpr Status kOk = Status::Ok, kDamaged = Status::DamagedFile, kShort = Status::FileReadError,
                   kNone = Status::NoImages;
  const std::string plain = Header("BITPIX  = 8|NAXIS   = 2|NAXIS1  = 2|NAXIS2  = 3");
  const std::string size1 = "|NAXIS1=1|NAXIS2=1", huge = "2147483647";
  // clang-format off
  const struct {
    const char* name;
    std::string file;
    Status info, read;
    const char* typeName;  // of a picture that info accepts
    int32_t width, height;
  } rows[] = {
      {"plain", plain + "abcdef", kOk, kOk, "2 axis - 8 bits of grey", 2, 3},
      {"one byte short", plain + "abcde", kOk, kShort, "2 axis - 8 bits of grey", 2, 3},
      {"text behind numbers, all kinds of separators", Header("BITPIX=16 / bits|NAXIS = = 3/axes|NAXIS1 2.9|NAXIS2 +1") + "abcd",
       kOk, kOk, "3 axis - 16 bits of grey", 2, 1},
      {"sign of BITPIX dropped", Header("BITPIX= -32" + size1) + "abcd", kOk, kOk, "0 axis - 32 bits of grey", 1, 1},
      {"bits that fill no byte", Header("BITPIX=15" + size1) + "a", kOk, kOk, "0 axis - 15 bits of grey", 1, 1},
      {"the last of equal keywords", Header("NAXIS1=9|BITPIX=8" + size1) + "a", kOk, kOk, "0 axis - 8 bits of grey", 1, 1},
      {"the largest numbers", Header("BITPIX=" + huge + "|NAXIS1=" + huge + "|NAXIS2=" + huge) + "a",
       kOk, kShort, "0 axis - 2147483647 bits of grey", INT32_MAX, INT32_MAX},
      {"no END", Cards("SIMPLE|BITPIX=8" + size1) + std::string(9999, ' '), kOk, kShort, "0 axis - 8 bits of grey", 1, 1},
      {"no signature", Header("BITPIX=8" + size1).replace(0, 6, "simple") + "a", kDamaged, kOk, "", 1, 1},
      {"five bytes", "SIMPL", kShort, kNone, "", 0, 0},
      {"six bytes", "SIMPLE", kNone, kNone, "", 0, 0},
      {"a card cut short", Cards("SIMPLE|BITPIX=8|NAXIS1=1") + "NAXIS2=1", kNone, kNone, "", 0, 0},
      {"keyword not in column 1", Header("BITPIX=8| NAXIS1=1|NAXIS2=1") + "a", kNone, kNone, "", 0, 0},
      {"no picture", Header("BITPIX=8|NAXIS=0"), kNone, kNone, "", 0, 0},
      {"zero height", Header("BITPIX=8|NAXIS1=1|NAXIS2=0") + "a", kNone, kNone, "", 0, 0},
      {"negative width", Header("BITPIX=8|NAXIS1=-1|NAXIS2=1") + "a", kDamaged, kDamaged, "", 0, 0},
      {"negative axes", Header("BITPIX=8|NAXIS=-2" + size1) + "a", kDamaged, kDamaged, "", 0, 0},
      {"width over 31 bits", Header("BITPIX=8|NAXIS1=2147483648|NAXIS2=1") + "a", kDamaged, kDamaged, "", 0, 0},
      {"height over 64 bits", Header("BITPIX=8|NAXIS1=1|NAXIS2=99999999999999999999") + "a", kDamaged, kDamaged, "", 0, 0},
      {"BITPIX missing", Header(size1.substr(1)) + "a", kDamaged, kDamaged, "", 0, 0},
      {"BITPIX 0", Header("BITPIX=0" + size1) + "a", kDamaged, kDamaged, "", 0, 0},
      {"BITPIX 7", Header("BITPIX=7" + size1) + "a", kDamaged, kDamaged, "", 0, 0},
      {"BITPIX below 64 bits", Header("BITPIX=-99999999999999999999" + size1) + "a", kDamaged, kDamaged, "", 0, 0},
  };
  // clang-format on
  const TemporaryFolder folder;
  const std::string path = folder.Path("header.fits");
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    WriteText(path, row.file);
    const PicturePointer picture = NewPictureRecord();
    EXPECT_EQ(FitsInfo(*picture, {.fileName = path}), row.info);
    if (row.info == kOk) {
      EXPECT_EQ(picture->typeName.view(), row.typeName);
      EXPECT_EQ(picture->imageBytes, (uint64_t(row.width) + 7) / 8 * 8 * uint64_t(row.height));
      EXPECT_EQ(picture->fileSize, row.file.size());
    }
    EXPECT_EQ(FitsRead(*picture, {.fileName = path}), row.read);
    EXPECT_EQ(picture->image.Empty(), row.read != kOk);
    EXPECT_EQ(row.width == 0 ? 0 : picture->width, row.width);
    EXPECT_EQ(row.height == 0 ? 0 : picture->height, row.height);
  }
}

// The data start at the next block, and a header of more than 65536 cards has no end.
TEST(Fits, FindsTheEndOfTheHeader) {
  const struct {
    size_t cards;  // before END; with 35 of them it ends the first block
    Status read;
  } rows[] = {
      {35, Status::Ok}, {36, Status::Ok}, {65535, Status::Ok}, {65536, Status::FileReadError}, {131072, Status::FileReadError}};
  const TemporaryFolder folder;
  const std::string path = folder.Path("cards.fits");
  for (const auto& row : rows) {
    SCOPED_TRACE(row.cards);
    std::string file = Cards("SIMPLE|BITPIX=8|NAXIS1=1|NAXIS2=1") +
                       std::string((row.cards - 4) * 80, ' ') + Cards("END");
    file.resize((file.size() + 2879) / 2880 * 2880, ' ');
    WriteText(path, file + "a");
    const PicturePointer picture = NewPictureRecord();
    EXPECT_EQ(FitsInfo(*picture, {.fileName = path}), Status::Ok);
    ASSERT_EQ(FitsRead(*picture, {.fileName = path}), row.read);
    EXPECT_EQ(picture->image.PixelAt(0, 0), row.read == Status::Ok ? 'a' : -1);
  }
}

TEST(Fits, ShowsTheRawBytesOfEachRow) {
  const struct {
    const char* name;
    const char* cards;
    const char* data;
    Bytes top, bottom;  // including padding
  } rows[] = {
      {"8 bits, padding is zero", "BITPIX=8|NAXIS1=3", "abcdef", Hex("61 62 63 00"), Hex("64 65 66 00")},
      {"16 bits: the left half, high and low bytes", "BITPIX=16|NAXIS1=5", "abcdefghijABCDEFGHIJ",
       Hex("61 62 63 64 65  66 67 68"), Hex("41 42 43 44 45  46 47 48")},
      {"64 bits", "BITPIX=-64|NAXIS1=1", "abcdefghABCDEFGH", Hex("61 62 63 64"), Hex("41 42 43 44")},
      {"16 bits, one pixel", "BITPIX=16|NAXIS1=1", "abAB", Hex("61 62 00 00"), Hex("41 42 00 00")},
  };
  const TemporaryFolder folder;
  const std::string path = folder.Path("rows.fits");
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    WriteText(path, Header(std::string(row.cards) + "|NAXIS2=2|BZERO=100|BSCALE=3") + row.data);
    const PicturePointer picture = NewPictureRecord();
    ASSERT_EQ(FitsRead(*picture, {.fileName = path}), Status::Ok);
    EXPECT_EQ(picture->palette, GrayRamp());
    const auto top = picture->image.Row(0), bottom = picture->image.Row(1);
    EXPECT_EQ(Bytes(top.begin(), top.end()), row.top);
    EXPECT_EQ(Bytes(bottom.begin(), bottom.end()), row.bottom);
  }
}

TEST(Fits, ListsTheCardsInDetails) {
  const TemporaryFolder folder;
  const PicturePointer picture = NewPictureRecord();
  const std::string path = folder.Path("details.fits");
  picture->fileName.AssignCut(path);
  EXPECT_EQ(FitsDetails(*picture), Status::FileOpenError);
  WriteText(path, Cards("SIMPLE  =                    T / a comment that goes on and on|NAXIS1  = "
                        "5||=x|END|AFTER = 1"));
  ASSERT_EQ(FitsDetails(*picture), Status::Ok);
  const std::string_view expected[] = {"SIMPLE = T / a comment that goes on ",
                                       "NAXIS1 = 5                          ", " = ",
                                       " = x                                ", "END = "};
  ASSERT_EQ(picture->detailLines.Count(), std::size(expected));
  for (size_t i = 0; i < std::size(expected); ++i)
    EXPECT_EQ(picture->detailLines.Line(i), expected[i]);

  WriteText(path, std::string(40 * 80, 'K'));
  ASSERT_EQ(FitsDetails(*picture), Status::Ok);
  ASSERT_EQ(picture->detailLines.Count(), 32u);
  EXPECT_EQ(picture->detailLines.Line(31), std::string(36, 'K'));
}

TEST(Fits, AgreesWithNetpbm) {
  if (!HasProgram("fitstopnm") || !HasProgram("pamtofits"))
    GTEST_SKIP() << "netpbm is not installed";
  const TemporaryFolder folder;
  const std::string ours = folder.Path("ours.fits"), theirs = folder.Path("theirs.fits"),
                    seen = folder.Path("seen.pgm");
  std::vector<Bytes> rows;
  for (uint32_t y = 0; y < 29; ++y) rows.push_back(RandomBytes(3 * 37, y));
  const PicturePointer picture = MakePicture(37, 29, 24, rows), own = NewPictureRecord(),
                       again = NewPictureRecord();
  picture->fileName.AssignCut(ours);
  ASSERT_EQ(FitsWrite(*picture, {}), Status::Ok);
  ASSERT_EQ(FitsRead(*own, {.fileName = ours}), Status::Ok);
  ASSERT_TRUE(RunShell("fitstopnm -min 0 -max 255 " + ours + " > " + seen));
  EXPECT_EQ(ReadPnm(seen).values, RowsOf(own->image));
  ASSERT_TRUE(RunShell("pamtofits " + seen + " > " + theirs));
  ASSERT_EQ(FitsInfo(*again, {.fileName = theirs}), Status::Ok);
  ASSERT_EQ(FitsRead(*again, {.fileName = theirs}), Status::Ok);
  EXPECT_EQ(RowsOf(again->image), RowsOf(own->image));
}

}  // namespace
}  // namespace fotomill
