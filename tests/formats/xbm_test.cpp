#include "formats/xbm/xbm.h"

#include <gtest/gtest.h>

#include <filesystem>

#include "platform/paths.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/peers.h"
#include "support/pictures.h"

namespace fotomill {
namespace {

using namespace test;
using Bytes = std::vector<uint8_t>;

Status ReadFile(const std::string& path, PictureRecord& picture) {
  RETURN_IF_BAD(XbmInfo(picture, {.fileName = path}));
  return XbmRead(picture, {.fileName = path});
}

std::string WithLineEnds(std::string_view text) {
  std::string result;
  for (const char c : text) c == '\n' ? result.append(platform::kLineEnd) : result.append(1, c);
  return result;
}

TEST(Xbm, WritesText) {
  const struct {
    const char* name;
    const char* file;
    int32_t width, height;
    std::vector<Bytes> rows;
    const char* text;
  } rows[] = {
      {"two values share a line with the brace",
       "Arrow.xbm",
       8,
       2,
       {Hex("7F"), Hex("FE")},
       "#define arrow_width 8\n#define arrow_height 2\nstatic char arrow_text_bits[] = {\n0x01, 0x80}\n"},
      {"twelve values leave the brace alone",
       "a_1.xbm",
       96,
       1,
       {Hex("00 01 02 03 04 05 06 07 08 09 0A 0B")},
       "#define a_1_width 96\n#define a_1_height 1\nstatic char a_1_text_bits[] = {\n"
       "0xff, 0x7f, 0xbf, 0x3f, 0xdf, 0x5f, 0x9f, 0x1f, 0xef, 0x6f, 0xaf, 0x2f\n}\n"},
      {"lines of twelve go on across rows",
       "9lives.v2.xbm",
       40,
       3,
       {Hex("FFFFFFFFFF"), Hex("0000000000"), Hex("FFFFFFFFFF")},
       "#define 9lives_v2_width 40\n#define 9lives_v2_height 3\nstatic char 9lives_v2_text_bits[] = {\n"
       "0x00, 0x00, 0x00, 0x00, 0x00, 0xff, 0xff, 0xff, 0xff, 0xff, 0x00, 0x00, \n0x00, 0x00, 0x00}\n"},
      {"padding stands in front and is black",
       "ten.xbm",
       10,
       2,
       {Hex("FF FF"), Hex("00 00")},
       "#define ten_width 10\n#define ten_height 2\nstatic char ten_text_bits[] = {\n0x3f, 0x00, 0xff, 0xff}\n"},
      {"what lies in the picture's padding does not show",
       "ten.xbm",
       10,
       2,
       {Hex("FF C0 55"), Hex("00 3F AA")},
       "#define ten_width 10\n#define ten_height 2\nstatic char ten_text_bits[] = {\n0x3f, 0x00, 0xff, 0xff}\n"},
      {"names become identifiers",
       "My \"new\" pic-ture\n\xC3\xA9'.xbm",
       8,
       1,
       {Hex("00")},
       "#define my__new__pic_ture_____width 8\n#define my__new__pic_ture_____height 1\n"
       "static char my__new__pic_ture_____text_bits[] = {\n0xff}\n"},
  };
  const TemporaryFolder folder;
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const PicturePointer picture = MakePicture(row.width, row.height, 1, row.rows);
    ASSERT_TRUE(picture->fileName.Assign(folder.Path(row.file)));
    ASSERT_EQ(XbmWrite(*picture, {}), Status::Ok);
    EXPECT_EQ(ReadText(folder.Path(row.file)), WithLineEnds(row.text));
  }
}

TEST(Xbm, ReadsText) {
  const std::string size8 = "#define a_width 8\n#define a_height 1\n",
                    size16 = "#define a_width 16\n#define a_height 1\n";
  const std::string bits = "static char a_bits[] = {\n";
  const std::string pad(300, ' ');
  const struct {
    const char* name;
    std::string text;
    int32_t width, height;
    Bytes rows;  // empty: DamagedFile from read
  } rows[] = {
      {"lowest bit leftmost, set is black", size16 + bits + "0x01, 0x80 };", 16, 1, Hex("7F FE")},
      {"capital digits", size16 + bits + "0xAF, 0xfA };", 16, 1, Hex("0A A0")},
      {"one digit counts as the high one", size16 + bits + "0x1, 0x8};", 16, 1, Hex("F7 FE")},
      {"capital X is no value", size8 + bits + "0X01, 0x80 };", 8, 1, Hex("FE")},
      {"characters that are no digits count as 0", size16 + bits + "0xg1 xx.", 16, 1, Hex("7F FF")},
      {"the character behind x is never a next x", size16 + bits + "0xx1 0x80", 16, 1, Hex("7F FE")},
      {"values in a comment count", size8 + bits + "/* max */ 0x80", 8, 1, Hex("FF")},
      {"values in the line of the bits are lost", size8 + "static char a_bits[] = { 0x01,\n0x80};", 8, 1, Hex("FE")},
      {"line ends of other systems", "#define a_width 8\r\n#define a_height 1\r\nchar a_bits[] = {\r\n0x80};\r\n", 8, 1,
       Hex("FE")},
      {"tabs, text in front, order", "/* x */ #define  a_height\t\t1\n#define a_width \t8\n" + bits + "0x80", 8, 1, Hex("FE")},
      {"sizes may stand behind the values", bits + "0x80\n" + size8, 8, 1, Hex("FE")},
      {"a line with the word alone is no size", "width 3 height 4\n" + size8 + bits + "0x80", 8, 1, Hex("FE")},
      {"a size may be told again until both are known", "#define b_width 9\n" + size8 + bits + "0x80", 8, 1, Hex("FE")},
      {"and not after", size8 + "#define b_width 9\n" + bits + "0x80", 8, 1, Hex("FE")},
      {"text behind the number", "#define a_width 8pixels\n#define a_height +1 /* x */\n" + bits + "0x80", 8, 1, Hex("FE")},
      {"the file's padding shows, its first pixels do not", "#define a_width 10\n#define a_height 1\n" + bits + "0x3f, 0xe0", 10,
       1, Hex("FE 00")},
      {"a picture called rabbits", "#define rabbits_width 8\n#define rabbits_height 1\nstatic char rabbits_bits[] = {\n0x80}", 8,
       1, Hex("FE")},
      {"a picture called lineheight", "#define lineheight_width 8\n#define lineheight_height 1\n" + bits + "0x80", 8, 1,
       Hex("FE")},
      {"a picture called heightwidth", "#define heightwidth_width 8\n#define heightwidth_height 1\n" + bits + "0x80", 8, 1,
       Hex("FE")},
      {"lines end after 260 characters: the word is cut in two", size8 + std::string(257, ' ') + "bits\n0x01\n" + bits + "0x80",
       8, 1, Hex("FE")},
      {"and is whole when it ends with the piece", size8 + std::string(256, ' ') + "bits 0x01\n" + bits + "0x80", 8, 1,
       Hex("7F")},
      {"values behind the first 260 characters of the line of the bits count",
       size8 + "char a_bits[] = {" + std::string(243, ' ') + "0x80", 8, 1, Hex("FE")},
      {"one value is missing", size16 + bits + "0x01, 0x", 16, 1, {}},
      {"half a value at the end", size8 + bits + "0x8", 8, 1, {}},
      {"no line of bits", size8 + "static char a_data[] = {\n0x80};", 8, 1, {}},
      {"more rows than the file can hold", "#define a_width 8\n#define a_height 2147483647\n" + bits + "0x80", 8, INT32_MAX, {}},
  };
  const TemporaryFolder folder;
  const std::string path = folder.Path("text.xbm");
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    WriteText(path, row.text);
    const PicturePointer picture = NewPictureRecord();
    picture->typeName.AssignCut("stale");
    ASSERT_EQ(XbmInfo(*picture, {.fileName = path}), Status::Ok);
    EXPECT_EQ(picture->width, row.width);
    EXPECT_EQ(picture->height, row.height);
    EXPECT_EQ(picture->bitsPerPixel, 1);
    EXPECT_EQ(picture->imageBytes, (uint64_t(row.width) + 7) / 8 * uint64_t(row.height));
    EXPECT_EQ(picture->fileSize, row.text.size());
    EXPECT_TRUE(picture->typeName.empty());
    ASSERT_EQ(XbmRead(*picture, {.fileName = path}), row.rows.empty() ? Status::DamagedFile : Status::Ok);
    EXPECT_EQ(picture->image.Empty() ? Bytes() : RowsOf(picture->image), row.rows);
  }
}

TEST(Xbm, RejectsInvalidSizes) {
  const struct {
    const char* name;
    std::string text;
  } rows[] = {
      {"empty file", ""},
      {"no height", "#define a_width 8\n"},
      {"zero", "#define a_width 0\n#define a_height 1\n"},
      {"no number", "#define a_width eight\n#define a_height 1\n"},
      {"number in the next line", "#define a_width\n8\n#define a_height 1\n"},
      {"negative", "#define a_width 8\n#define a_height -1\n"},
      {"over 31 bits", "#define a_width 2147483648\n#define a_height 1\n"},
      {"over 64 bits", "#define a_width 99999999999999999999\n#define a_height 1\n"},
      {"the later word counts", "#define width_height 8\n#define a_height 1\n"},
      {"behind the limit of a scan", std::string((16 << 20) + 1, '\n') + "#define a_width 8\n#define a_height 1\n"},
  };
  const TemporaryFolder folder;
  const std::string path = folder.Path("size.xbm");
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    WriteText(path, row.text + "static char a_bits[] = {\n0x80\n");
    const PicturePointer picture = NewPictureRecord();
    EXPECT_EQ(XbmInfo(*picture, {.fileName = path}), Status::DamagedFile);
    EXPECT_EQ(XbmRead(*picture, {.fileName = path}), Status::DamagedFile);
    EXPECT_TRUE(picture->image.Empty());
  }
  const PicturePointer picture = MakePicture(8, 8, 4);
  EXPECT_EQ(XbmInfo(*picture, {.fileName = folder.Path("none.xbm"), .signedOnly = true}), Status::UnsupportedFormat);
  EXPECT_EQ(XbmInfo(*picture, {.fileName = folder.Path("none.xbm")}), Status::FileOpenError);
  ASSERT_TRUE(picture->fileName.Assign(folder.Path("deep.xbm")));
  EXPECT_EQ(XbmWrite(*picture, {}), Status::TooManyColors);
  EXPECT_EQ(folder.Names(), std::vector<std::string>{"size.xbm"});
}

// 20 MB texts in which every search fails take no longer than one pass; one with occasional values
// is read to the end, one without any is rejected early.
TEST(Xbm, ReadsLongTextsInOnePass) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("long.xbm");
  const std::string start = "#define a_width 8\n#define a_height 3\nstatic char a_bits[] = {\n";
  const std::string megabytes(10 << 20, '0');
  const struct {
    const char* name;
    std::string text;
    Status status;
  } rows[] = {
      {"values far apart", start + "0x01" + megabytes + "0x02" + megabytes + "0x03", Status::Ok},
      {"no further value", start + "0x01 0x02" + megabytes + megabytes + "0x03", Status::DamagedFile},
      {"one line before the sizes", megabytes + "\n" + start + "0x01 0x02 0x03", Status::Ok},
      {"almost a size, again and again", megabytes + "#define widt heigh bit" + megabytes, Status::DamagedFile},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    WriteText(path, row.text);
    const PicturePointer picture = NewPictureRecord();
    EXPECT_EQ(ReadFile(path, *picture), row.status);
  }
}

// If the width is not a multiple of 8, others have the padding at the end of a row, and we at its
// start, which is intentional: they read our files shifted to the right by that many pixels, we
// read theirs shifted to the left.
TEST(Xbm, AgreesWithNetpbmAtWholeBytes) {
  if (!HasProgram("xbmtopbm") || !HasProgram("pbmtoxbm")) GTEST_SKIP() << "netpbm is not installed";
  const TemporaryFolder folder;
  const std::string ours = folder.Path("ours.xbm"), theirs = folder.Path("theirs.xbm"),
                    seen = folder.Path("seen.pbm");
  for (const int32_t width : {8, 10, 64, 67}) {
    SCOPED_TRACE(width);
    const int32_t moved = (8 - width % 8) % 8;
    const PicturePointer picture =
        MakePicture(width, 5, 1, std::vector<Bytes>(5, RandomBytes(9, uint32_t(width))));
    ASSERT_TRUE(picture->fileName.Assign(ours));
    ASSERT_EQ(XbmWrite(*picture, {}), Status::Ok);
    ASSERT_TRUE(RunShell("xbmtopbm " + ours + " > " + seen));
    const PnmPicture pnm = ReadPnm(seen);
    ASSERT_EQ(pnm.width, width);
    for (int32_t x = 0; x < width; ++x) {
      const int32_t black = x < moved ? 1 : 1 - picture->image.PixelAt(x - moved, 2);
      ASSERT_EQ(pnm.values[static_cast<size_t>(2 * width + x)], black) << x;
    }
    ASSERT_TRUE(RunShell("pbmtoxbm -name=a " + seen + " > " + theirs));
    const PicturePointer again = NewPictureRecord();
    ASSERT_EQ(ReadFile(theirs, *again), Status::Ok);
    for (int32_t x = 0; x < width; ++x) {
      const int32_t white =
          x + moved < width ? 1 - pnm.values[static_cast<size_t>(2 * width + x + moved)] : 1;
      ASSERT_EQ(again->image.PixelAt(x, 2), white) << x;
    }
  }
}

TEST(Xbm, ReadsXBitmapsLikeNetpbm) {
  const char* const bitmaps = "/usr/include/X11/bitmaps";
  if (!HasProgram("xbmtopbm") || !std::filesystem::is_directory(bitmaps))
    GTEST_SKIP() << "netpbm or xbitmaps is missing";
  const TemporaryFolder folder;
  const std::string seen = folder.Path("seen.pbm");
  int compared = 0;
  for (const auto& entry : std::filesystem::directory_iterator(bitmaps)) {
    SCOPED_TRACE(entry.path());
    const PicturePointer picture = NewPictureRecord();
    if (XbmInfo(*picture, {.fileName = entry.path().string()}) != Status::Ok ||
        picture->width % 8 != 0)
      continue;
    if (!RunShell("xbmtopbm " + entry.path().string() + " > " + seen)) continue;
    ASSERT_EQ(XbmRead(*picture, {.fileName = entry.path().string()}), Status::Ok);
    const PnmPicture pnm = ReadPnm(seen);
    ASSERT_EQ(pnm.width, picture->width);
    ASSERT_EQ(pnm.height, picture->height);
    for (size_t i = 0; i < pnm.values.size(); ++i) {
      const auto x = static_cast<int32_t>(i) % pnm.width, y = static_cast<int32_t>(i) / pnm.width;
      ASSERT_EQ(pnm.values[i], 1 - picture->image.PixelAt(x, y)) << x << ", " << y;
    }
    ++compared;
  }
  EXPECT_GT(compared, 10);
}

}  // namespace
}  // namespace fotomill
