#include "formats/fits.h"

#include <gtest/gtest.h>

#include "support/files.h"
#include "support/hex.h"
#include "support/peers.h"
#include "support/pictures.h"

namespace fotomill {
namespace {

using namespace test;
using Bytes = std::vector<uint8_t>;

// Cards, filled with blanks to 80 characters.
std::string Cards(std::initializer_list<std::string_view> lines) {
  std::string text;
  for (const std::string_view line : lines) text.append(line).append(80 - line.size(), ' ');
  return text;
}

// A header of those cards, END behind them and blanks up to the data.
std::string Header(std::initializer_list<std::string_view> lines) {
  std::string text = Cards(lines) + Cards({"END"});
  return text.append((2880 - text.size() % 2880) % 2880, ' ');
}

TEST(Fits, WritesHeaderRowsAndPadding) {
  const TemporaryFolder folder;
  const PicturePointer picture = MakePicture(100, 50, 8, std::vector<Bytes>(50, Bytes(100, 200)));
  ASSERT_TRUE(picture->fileName.Assign(folder.Path("a.fits")));
  ASSERT_EQ(FitsWrite(*picture, {}), Status::Ok);
  const std::string written = ReadText(folder.Path("a.fits"));
  ASSERT_EQ(written.size(), 8640u);
  EXPECT_EQ(written.substr(0, 2880), Header({
                                         // column 10 begins the value's 21 characters
                                         "SIMPLE  =                    T",
                                         "BITPIX  =                    8",
                                         "NAXIS   =                    2",
                                         "NAXIS1  =                  100",
                                         "NAXIS2  =                   50",
                                         "ORIGIN  =FotomillProfessional ",
                                         "BSCALE  =        1.0000000E+00",
                                         "BZERO   =        0.0000000E+00",
                                         "DATAMIN =        0.0000000E+00",
                                         "DATAMAX =      255.0000000E+00",
                                     }));
  EXPECT_EQ(written.substr(2880, 5000), std::string(5000, '\xC8'));  // 60 + 118 + 22
  EXPECT_EQ(written.substr(7880), std::string(760, '\0'));
}

TEST(Fits, WritesGreyOfEveryDepth) {
  const struct {
    const char* name;
    int32_t width, bitsPerPixel;
    Bytes row;
    Bytes grey;
  } rows[] = {
      {"1 bit: white and black whatever the palette", 10, 1, Hex("A5 7F"), Hex("FF 00 FF 00 00 FF 00 FF 00 FF")},
      {"4 bits, high half first", 3, 4, Hex("1F 20"), Hex("0F 0C 1E")},
      {"2 bits name four colours", 4, 2, Hex("12 34"), Hex("0F 1E 0B 00")},
      {"8 bits", 3, 8, Hex("00 01 03"), Hex("63 0F 0B")},
      {"6 bits name 64 colours", 2, 6, Hex("01 40"), Hex("0F 00")},
      {"24 bits: each product is rounded down", 3, 24, Hex("09 09 09  FF FF FF  05 5A C8"), Hex("07 FE 71")},
  };
  const Bytes palette =
      Hex("FF 28 00   # 76 + 23 + 0 = 99; one division would give 100\n"
          "10 13 05   # 4 + 11 + 0 = 15\n"
          "20 22 0B   # 9 + 20 + 1 = 30\n"
          "06 0B 25   # 1 + 6 + 4 = 11\n");
  const TemporaryFolder folder;
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const PicturePointer picture = MakePicture(row.width, 1, row.bitsPerPixel, {row.row});
    picture->palette.fill(0);
    std::copy(palette.begin(), palette.end(), picture->palette.begin());
    picture->palette[3 * 15] = picture->palette[3 * 64] = 42;  // 12
    ASSERT_TRUE(picture->fileName.Assign(folder.Path("grey.fits")));
    ASSERT_EQ(FitsWrite(*picture, {}), Status::Ok);
    const Bytes written = ReadBytes(folder.Path("grey.fits"));
    EXPECT_EQ(Bytes(written.begin() + 2880, written.begin() + 2880 + row.width), row.grey);
  }
}

TEST(Fits, GreyOfEveryLevelFollowsTheFormula) {
  Bytes row, expected;
  for (unsigned channel = 0; channel < 3; ++channel) {
    for (unsigned level = 0; level < 256; ++level) {
      const unsigned others = level * 7 % 256;
      const unsigned blue = channel == 0 ? level : others, green = channel == 1 ? level : 255 - others,
                     red = channel == 2 ? level : others / 2;
      for (const unsigned value : {blue, green, red}) row.push_back(static_cast<uint8_t>(value));
      expected.push_back(static_cast<uint8_t>(red * 30 / 100 + green * 59 / 100 + blue * 11 / 100));
    }
  }
  const TemporaryFolder folder;
  const PicturePointer picture = MakePicture(768, 1, 24, {row});
  ASSERT_TRUE(picture->fileName.Assign(folder.Path("grey.fits")));
  ASSERT_EQ(FitsWrite(*picture, {}), Status::Ok);
  const Bytes written = ReadBytes(folder.Path("grey.fits"));
  EXPECT_EQ(Bytes(written.begin() + 2880, written.begin() + 2880 + 768), expected);
}

TEST(Fits, ReadsHeaders) {
  const std::string plain = Header({"SIMPLE  = T", "BITPIX  = 8", "NAXIS   = 2", "NAXIS1  = 2", "NAXIS2  = 3"});
  const struct {
    const char* name;
    std::string file;
    Status info, read;
    const char* typeName;
    int32_t width, height;
  } rows[] = {
      {"plain", plain + "abcdef", Status::Ok, Status::Ok, "2 axis - 8 bits of grey", 2, 3},
      {"one byte short", plain + "abcde", Status::Ok, Status::FileReadError, "2 axis - 8 bits of grey", 2, 3},
      {"text behind numbers, blanks in front of them, no blank at all",
       Header({"SIMPLE", "BITPIX=16 / bits", "NAXIS = = 3/axes", "NAXIS1 2.9", "NAXIS2 +1"}) + "abcd", Status::Ok,
       Status::Ok, "3 axis - 16 bits of grey", 2, 1},
      {"sign of BITPIX dropped", Header({"SIMPLE", "BITPIX= -32", "NAXIS1= 1", "NAXIS2= 1"}) + "abcd", Status::Ok,
       Status::Ok, "0 axis - 32 bits of grey", 1, 1},
      {"bits that fill no byte", Header({"SIMPLE", "BITPIX= 15", "NAXIS1= 2", "NAXIS2= 1"}) + "ab", Status::Ok,
       Status::Ok, "0 axis - 15 bits of grey", 2, 1},
      {"the last of equal keywords", Header({"SIMPLE", "BITPIX= 8", "NAXIS1= 9", "NAXIS2= 1", "NAXIS1= 1"}) + "a",
       Status::Ok, Status::Ok, "0 axis - 8 bits of grey", 1, 1},
      {"keywords begin in column 1", Header({"SIMPLE", "BITPIX= 8", " NAXIS1= 9", "NAXIS2= 1"}) + "a", Status::NoImages,
       Status::NoImages, "", 0, 0},
      {"no signature", Header({"simple", "BITPIX= 8", "NAXIS1= 1", "NAXIS2= 1"}) + "a", Status::DamagedFile, Status::Ok,
       "", 1, 1},
      {"five bytes", "SIMPL", Status::FileReadError, Status::NoImages, "", 0, 0},
      {"six bytes", "SIMPLE", Status::NoImages, Status::NoImages, "", 0, 0},
      {"no END", Cards({"SIMPLE", "BITPIX= 8", "NAXIS1= 1", "NAXIS2= 1"}) + std::string(9999, ' '), Status::Ok,
       Status::FileReadError, "0 axis - 8 bits of grey", 1, 1},
      {"a card cut short", Cards({"SIMPLE", "BITPIX= 8", "NAXIS1= 1"}) + "NAXIS2= 1", Status::NoImages,
       Status::NoImages, "", 0, 0},
      {"no picture", Header({"SIMPLE", "BITPIX= 8", "NAXIS= 0"}), Status::NoImages, Status::NoImages, "", 0, 0},
      {"zero height", Header({"SIMPLE", "BITPIX= 8", "NAXIS1= 1", "NAXIS2= 0"}) + "a", Status::NoImages,
       Status::NoImages, "", 0, 0},
      {"negative width", Header({"SIMPLE", "BITPIX= 8", "NAXIS1= -1", "NAXIS2= 1"}) + "a", Status::DamagedFile,
       Status::DamagedFile, "", 0, 0},
      {"negative axes", Header({"SIMPLE", "BITPIX= 8", "NAXIS= -2", "NAXIS1= 1", "NAXIS2= 1"}) + "a",
       Status::DamagedFile, Status::DamagedFile, "", 0, 0},
      {"width over 31 bits", Header({"SIMPLE", "BITPIX= 8", "NAXIS1= 2147483648", "NAXIS2= 1"}) + "a",
       Status::DamagedFile, Status::DamagedFile, "", 0, 0},
      {"height over 64 bits", Header({"SIMPLE", "BITPIX= 8", "NAXIS1= 1", "NAXIS2= 99999999999999999999"}) + "a",
       Status::DamagedFile, Status::DamagedFile, "", 0, 0},
      {"the largest numbers", Header({"SIMPLE", "BITPIX=2147483647", "NAXIS1=2147483647", "NAXIS2=2147483647"}) + "a",
       Status::Ok, Status::FileReadError, "0 axis - 2147483647 bits of grey", INT32_MAX, INT32_MAX},
      {"BITPIX missing", Header({"SIMPLE", "NAXIS1= 1", "NAXIS2= 1"}) + "a", Status::DamagedFile, Status::DamagedFile,
       "", 0, 0},
      {"BITPIX 0", Header({"SIMPLE", "BITPIX= 0", "NAXIS1= 1", "NAXIS2= 1"}) + "a", Status::DamagedFile,
       Status::DamagedFile, "", 0, 0},
      {"BITPIX 7", Header({"SIMPLE", "BITPIX= 7", "NAXIS1= 1", "NAXIS2= 1"}) + "a", Status::DamagedFile,
       Status::DamagedFile, "", 0, 0},
      {"BITPIX below 64 bits", Header({"SIMPLE", "BITPIX= -99999999999999999999", "NAXIS1= 1", "NAXIS2= 1"}) + "a",
       Status::DamagedFile, Status::DamagedFile, "", 0, 0},
  };
  const TemporaryFolder folder;
  const std::string path = folder.Path("header.fits");
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    WriteText(path, row.file);
    PicturePointer picture = NewPictureRecord();
    EXPECT_EQ(FitsInfo(*picture, path.c_str(), 0), row.info);
    if (row.info == Status::Ok) {
      EXPECT_EQ(picture->typeName.view(), row.typeName);
      EXPECT_EQ(picture->imageBytes, (uint64_t(row.width) + 7) / 8 * 8 * uint64_t(row.height));
      EXPECT_EQ(picture->fileSize, row.file.size());
    }
    EXPECT_EQ(FitsRead(*picture, path.c_str()), row.read);
    EXPECT_EQ(picture->image.Empty(), row.read != Status::Ok);
    if (row.read == Status::Ok || row.info == Status::Ok) {
      EXPECT_EQ(picture->width, row.width);
      EXPECT_EQ(picture->height, row.height);
    }
  }
}

TEST(Fits, AHeaderHasAtMost65536Cards) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("cards.fits");
  const std::string start = Cards({"SIMPLE", "BITPIX= 8", "NAXIS1= 1", "NAXIS2= 1"});
  const struct {
    size_t cards;  // before END
    Status read;
  } rows[] = {{65535, Status::Ok}, {65536, Status::FileReadError}, {131072, Status::FileReadError}};
  for (const auto& row : rows) {
    SCOPED_TRACE(row.cards);
    std::string file = start + std::string((row.cards - 4) * 80, ' ') + Cards({"END"});
    file.resize((file.size() + 2879) / 2880 * 2880, ' ');
    WriteText(path, file + "a");
    const PicturePointer picture = NewPictureRecord();
    EXPECT_EQ(FitsInfo(*picture, path.c_str(), 0), Status::Ok);
    EXPECT_EQ(FitsRead(*picture, path.c_str()), row.read);
  }
}

TEST(Fits, ShowsTheBytesOfEachRowAsTheyAre) {
  const struct {
    const char* name;
    std::string bits, width;
    std::string data;
    std::vector<Bytes> rows;  // with their padding
  } rows[] = {
      {"8 bits, padding is zero", "8", "3", "abcdef", {Hex("61 62 63 00"), Hex("64 65 66 00")}},
      {"16 bits: high and low bytes of the left half",
       "16",
       "5",
       "abcdefghijABCDEFGHIJ",
       {Hex("61 62 63 64 65  66 67 68"), Hex("41 42 43 44 45  46 47 48")}},
      {"64 bits", "-64", "1", "abcdefghABCDEFGH", {Hex("61 62 63 64"), Hex("41 42 43 44")}},
      {"16 bits, one pixel", "16", "1", "abAB", {Hex("61 62 00 00"), Hex("41 42 00 00")}},
  };
  const TemporaryFolder folder;
  const std::string path = folder.Path("rows.fits");
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    WriteText(path, Header({"SIMPLE", "BITPIX= " + row.bits, "NAXIS1= " + row.width, "NAXIS2= 2", "BZERO= 100",
                            "BSCALE= 3"}) +
                        row.data);
    const PicturePointer picture = NewPictureRecord();
    ASSERT_EQ(FitsRead(*picture, path.c_str()), Status::Ok);
    EXPECT_EQ(picture->palette, GreyRamp());
    for (int32_t y = 0; y < 2; ++y) {
      const auto shown = picture->image.Row(y);
      EXPECT_EQ(Bytes(shown.begin(), shown.end()), row.rows[static_cast<size_t>(y)]);
    }
  }
}

TEST(Fits, DataBeginAtABlock) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("block.fits");
  for (const size_t cards : {35u, 36u}) {  // before END; 35 let it end the first block
    SCOPED_TRACE(cards);
    std::string file =
        Cards({"SIMPLE", "BITPIX= 8", "NAXIS1= 1", "NAXIS2= 1"}) + std::string((cards - 4) * 80, ' ') + Cards({"END"});
    file.resize(cards == 35 ? 2880 : 5760, ' ');
    WriteText(path, file + "a");
    const PicturePointer picture = NewPictureRecord();
    ASSERT_EQ(FitsRead(*picture, path.c_str()), Status::Ok);
    EXPECT_EQ(picture->image.PixelAt(0, 0), 'a');
  }
}

TEST(Fits, DetailsListTheCards) {
  const TemporaryFolder folder;
  const PicturePointer picture = NewPictureRecord();
  ASSERT_TRUE(picture->fileName.Assign(folder.Path("details.fits")));
  EXPECT_EQ(FitsDetails(*picture), Status::FileOpenError);
  WriteText(folder.Path("details.fits"), Cards({"SIMPLE  =                    T / a comment that goes on and on",
                                                "NAXIS1  = 5", "", "=x", "END", "AFTER = 1"}));
  ASSERT_EQ(FitsDetails(*picture), Status::Ok);
  const std::string_view expected[] = {"SIMPLE = T / a comment that goes on ", "NAXIS1 = 5                          ",
                                       " = ", " = x                                 ", "END = "};
  ASSERT_EQ(picture->detailLines.Count(), std::size(expected));
  for (size_t i = 0; i < std::size(expected); ++i) EXPECT_EQ(picture->detailLines.Line(i), expected[i].substr(0, 36));

  WriteText(folder.Path("details.fits"), std::string(40 * 80, 'K'));
  ASSERT_EQ(FitsDetails(*picture), Status::Ok);
  ASSERT_EQ(picture->detailLines.Count(), 32u);
  EXPECT_EQ(picture->detailLines.Line(31), std::string(36, 'K'));
}

TEST(Fits, AgreesWithNetpbm) {
  if (!HasProgram("fitstopnm") || !HasProgram("pamtofits")) GTEST_SKIP() << "netpbm is not installed";
  const TemporaryFolder folder;
  const std::string ours = folder.Path("ours.fits"), theirs = folder.Path("theirs.fits"),
                    seen = folder.Path("seen.pgm");
  std::vector<Bytes> rows;
  for (uint32_t y = 0; y < 29; ++y) rows.push_back(RandomBytes(37, y));
  rows[0][0] = 0, rows[0][1] = 255;  // both ends, so that nobody stretches the range
  const PicturePointer picture = MakePicture(37, 29, 24);
  for (int32_t y = 0; y < 29; ++y) {
    for (size_t x = 0; x < 37; ++x) {
      for (size_t c = 0; c < 3; ++c) picture->image.Row(y)[3 * x + c] = rows[static_cast<size_t>(y)][x];
    }
  }
  ASSERT_TRUE(picture->fileName.Assign(ours));
  ASSERT_EQ(FitsWrite(*picture, {}), Status::Ok);
  const PicturePointer own = NewPictureRecord();
  ASSERT_EQ(FitsRead(*own, ours.c_str()), Status::Ok);

  ASSERT_TRUE(RunShell("fitstopnm -min 0 -max 255 " + ours + " > " + seen));
  const PnmPicture pnm = ReadPnm(seen);
  EXPECT_EQ(pnm.width, 37);
  EXPECT_EQ(pnm.values, RowsOf(own->image));

  WriteText(seen, PnmText({37, 29, RowsOf(own->image)}, false));
  ASSERT_TRUE(RunShell("pamtofits " + seen + " > " + theirs));
  const PicturePointer again = NewPictureRecord();
  ASSERT_EQ(FitsInfo(*again, theirs.c_str(), 0), Status::Ok);
  ASSERT_EQ(FitsRead(*again, theirs.c_str()), Status::Ok);
  EXPECT_EQ(RowsOf(again->image), RowsOf(own->image));
}

}  // namespace
}  // namespace fotomill
