#include <gmock/gmock.h>
#include <sys/stat.h>

#include <cmath>
#include <nlohmann/json.hpp>

#include "catalog/thumbnails/thumbnail_file.h"
#include "formats/jpeg/jpeg.h"
#include "support/bitmaps.h"
#include "support/codecs.h"
#include "support/command_line.h"
#include "support/faults.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/pictures.h"

namespace fotomill::test {
namespace {

using nlohmann::json;
using testing::ElementsAre;

constexpr Color kMatte = 0x332211;  // red 0x11, green 0x22, blue 0x33

// A single-color picture.
PicturePointer Plain(int32_t width, int32_t height, uint8_t blue, uint8_t green, uint8_t red) {
  PicturePointer picture = MakePicture(width, height, 24);
  for (int32_t y = 0; y < height; ++y) {
    for (int32_t x = 0; x < width; ++x)
      SetPixel(picture->image, x, y, red << 16 | green << 8 | blue);
  }
  return picture;
}

std::vector<uint8_t> PixelOf(const ThumbnailRecord& record, int32_t x, int32_t storedRow) {
  const auto pixel = record.StoredRow(storedRow).subspan(static_cast<size_t>(x) * 3, 3);
  return {pixel.begin(), pixel.end()};
}

std::vector<uint8_t> Head(const ThumbnailRecord& record, size_t count) {
  return {record.bytes.begin(), record.bytes.begin() + static_cast<ptrdiff_t>(count)};
}

TEST(ThumbnailRecord, HasTheDocumentedLayout) {
  ThumbnailRecord record;
  ASSERT_TRUE(MakeThumbnailRecord(record, *Plain(10, 20, 1, 2, 3), {.matte = kMatte}));
  std::vector<uint8_t> wanted = Hex("54 48 4E 4C   # THNL\n 00 02  # version 512");
  wanted.resize(264);                                                            // reserved
  // blue, green, red of the matte
  for (int i = 0; i < 24; ++i) wanted.insert(wanted.end(), {0x33, 0x22, 0x11});
  // the picture, 48 x 96, starting at column 24
  wanted.insert(wanted.end(), {1, 2, 3});
  EXPECT_EQ(Head(record, wanted.size()), wanted);
}

TEST(ThumbnailRecord, CentersPictures) {
  const struct {
    const char* name;
    int32_t width, height;
    int32_t quick;
    // first and last pixel of the picture in the square, rows from the bottom
    int32_t left, bottom, right, top;
  } rows[] = {
      {"the quick scaler's percentage", 48, 200, 1, 36, 0, 58, 95},
      {"filtered", 48, 200, 0, 36, 0, 58, 95},
      {"enlarged", 3, 2, 0, 0, 16, 95, 79},
      {"wide", 960, 10, 0, 0, 47, 95, 47},
      {"too large for a percentage", 9601, 20, 1, 47, 47, 47, 47},
      {"odd offset", 96, 95, 1, 0, 0, 95, 94},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    ThumbnailRecord record;
    ASSERT_TRUE(MakeThumbnailRecord(record, *Plain(row.width, row.height, 200, 100, 50), {.quick = row.quick != 0, .matte = kMatte}));
    for (int32_t r = 0; r < 96; ++r) {
      for (int32_t x = 0; x < 96; ++x) {
        const bool inside = x >= row.left && x <= row.right && r >= row.bottom && r <= row.top;
        const std::vector<uint8_t> wanted =
            inside ? std::vector<uint8_t>{200, 100, 50} : std::vector<uint8_t>{0x33, 0x22, 0x11};
        ASSERT_EQ(PixelOf(record, x, r), wanted) << x << ", " << r;
      }
    }
  }
}

TEST(ThumbnailRecord, KeepsRowsUpright) {
  PicturePointer picture = Plain(96, 96, 0, 0, 0);
  SetPixel(picture->image, 0, 0, 0xffffff);  // top left
  ThumbnailRecord record;
  ASSERT_TRUE(MakeThumbnailRecord(record, *picture, {}));
  EXPECT_EQ(PixelOf(record, 0, 95), Hex("FF FF FF"));
  EXPECT_EQ(PixelOf(record, 0, 0), Hex("00 00 00"));
  PackedImage bitmap;
  ASSERT_EQ(ThumbnailRecordToBitmap(record, bitmap), Status::Ok);
  EXPECT_TRUE(SamePixels(bitmap, picture->image));
}

// A reduced decode of 1,601 pixels has 201, the last of which stands for a single pixel.
TEST(ThumbnailRecord, IsTheSameFromAReducedDecode) {
  PicturePointer picture = MakePicture(1601, 1603, 24);
  for (int32_t y = 0; y < 1603; ++y) {
    for (int32_t x = 0; x < 1601; ++x) {
      const auto wave = [](int32_t at) {
        return static_cast<int32_t>(128 + 100 * std::sin(at * 0.06));
      };
      SetPixel(picture->image, x, y, wave(x) << 16 | wave(y) << 8);
    }
  }
  const TemporaryFolder folder;
  WriteBytes(folder.Path("a.jpg"), Encode(JpegWrite, *picture));
  ThumbnailRecord reduced, full;
  ASSERT_EQ(MakeThumbnailOfFile(folder.Path("a.jpg"), {}, reduced), Status::Ok);
  ASSERT_TRUE(MakeThumbnailRecord(full, *picture, {}));
  int largest = 0;
  for (size_t i = kThumbnailHeaderSize; i < full.bytes.size(); ++i)
    largest = std::max(largest, std::abs(full.bytes[i] - reduced.bytes[i]));
  EXPECT_LE(largest, 8);
}

TEST(ThumbnailRecord, BlendsAlpha) {
  PicturePointer picture = Plain(96, 96, 255, 101, 0);
  ASSERT_EQ(NewAlphaPlane(96, 96, picture->alpha), Status::Ok);
  std::ranges::fill(picture->alpha.Rows(), 128);
  ThumbnailRecord record;
  ASSERT_TRUE(MakeThumbnailRecord(record, *picture, {.matte = 0x0000ff}));  // red
  EXPECT_EQ(PixelOf(record, 50, 50), (std::vector<uint8_t>{128, 51, 127}));
  ASSERT_TRUE(MakeBlendedThumbnailRecord(record, *picture, 0x00ff65));  // blue 0, green 255, red 101
  // 255 x 128 / 255; 255 x 127 / 255 + 101 x 128 / 255; 101 x 127 / 255, each rounded down
  EXPECT_EQ(PixelOf(record, 50, 50), (std::vector<uint8_t>{128, 127 + 50, 50}));
}

TEST(ThumbnailFile, ReplacesTheExtension) {
  EXPECT_EQ(ThumbnailPathFor("/d.x/name.ext"), "/d.x/name.THN");
  EXPECT_EQ(ThumbnailPathFor("/d.x/name"), "/d.x/name.THN");
  EXPECT_EQ(ThumbnailPathFor("a.tar.gz"), "a.tar.THN");
}

TEST(ThumbnailFile, ReadsNewAndOldRecords) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("a.THN");
  std::vector<uint8_t> record = RandomBytes(27912, 1);
  const auto head = [&](std::string_view magic, int version) {
    std::copy(magic.begin(), magic.end(), record.begin());
    record[4] = static_cast<uint8_t>(version);
    record[5] = static_cast<uint8_t>(version >> 8);
  };
  record[264] = 0xE3;  // index: red 7, green 0, blue 3
  record[265] = 0x25;  // red 1, green 1, blue 1
  const std::vector<uint8_t> expanded = Hex("FF 00 FF  55 24 24");
  const std::vector<uint8_t> asItStands(record.begin() + 264, record.begin() + 270);
  const struct {
    const char* name;
    const char* magic;
    int version;
    size_t size;
    bool reads, old;
  } rows[] = {
      {"new", "THNL", 512, 27912, true, false},         {"version 2", "THNL", 2, 27912, true, false},
      {"version 1", "THNL", 1, 27912, true, true},      {"negative version", "THNL", -1, 27912, true, true},
      {"old", "THNL", 1, 264 + 9216, true, true},       {"short", "THNL", 512, 27911, true, true},
      {"longer", "THNL", 512, 30000, true, false},      {"large", "tHNL", 512, 27912, false, false},
      {"foreign", "\x89PNG", 512, 27912, false, false}, {"three bytes", "THNL", 512, 3, false, false},
      {"empty", "THNL", 512, 0, false, false},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    head(row.magic, row.version);
    std::vector<uint8_t> bytes = record;
    bytes.resize(row.size);
    WriteBytes(path, bytes);
    ThumbnailRecord read;
    read.bytes.fill(7);
    const ThumbnailRecord before = read;
    ASSERT_EQ(ReadThumbnailFile(read, path), row.reads);
    ThumbnailRecord plain;
    EXPECT_EQ(ReadThumbnailForPicture(folder.Path("a.bmp"), plain), row.reads && row.size >= 27912);
    if (!row.reads) {
      EXPECT_EQ(read.bytes, before.bytes);
      continue;
    }
    EXPECT_EQ(read.Version(), row.version);
    EXPECT_EQ(std::vector<uint8_t>(read.bytes.begin() + 264, read.bytes.begin() + 270), row.old ? expanded : asItStands);
  }
  ThumbnailRecord read;
  EXPECT_FALSE(ReadThumbnailFile(read, folder.Path("missing.THN")));
  ASSERT_EQ(mkfifo(folder.Path("pipe.THN").c_str(), 0600), 0);
  EXPECT_FALSE(ReadThumbnailFile(read, folder.Path("pipe.THN")));
}

TEST(ThumbnailFile, IsWrittenAtomically) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("a.THN");
  ThumbnailRecord old, record;
  ASSERT_TRUE(WriteThumbnailFile(old, path, true));
  ASSERT_TRUE(MakeThumbnailRecord(record, *Plain(5, 5, 1, 2, 3), {}));
  const int64_t faults = ForEachFault([&] {
    WriteBytes(path, old.bytes);
    const bool written = WriteThumbnailFile(record, path, true);
    const std::vector<uint8_t> bytes = ReadBytes(path);
    const auto& wanted = written ? record.bytes : old.bytes;
    EXPECT_EQ(bytes, std::vector<uint8_t>(wanted.begin(), wanted.end()));
    EXPECT_THAT(folder.Names(), ElementsAre("a.THN"));
  });
  EXPECT_GT(faults, 2);
  // A read-only file is replaced, and so is a link, but not its target.
  ASSERT_EQ(chmod(path.c_str(), 0400), 0);
  EXPECT_TRUE(WriteThumbnailFile(record, path, true));
  WriteText(folder.Path("precious"), "precious");
  std::filesystem::create_symlink(folder.Path("precious"), folder.Path("b.THN"));
  EXPECT_TRUE(WriteThumbnailFile(record, folder.Path("b.THN"), true));
  EXPECT_EQ(ReadText(folder.Path("precious")), "precious");
  EXPECT_FALSE(WriteThumbnailFile(record, folder.Path("none/a.THN"), true));
  EXPECT_FALSE(WriteThumbnailFile(record, folder.Path(), true));
}

class ThumbsCommand : public testing::Test {
 protected:
  std::string In(const std::string& name) const { return folder_.Path(name); }
  void Put(const std::string& name) const { WriteBytes(In(name), BitmapFile(5, 3, 24)); }
  // "STATUS NAME" for each element of `thumbs list`.
  std::vector<std::string> List() const {
    std::vector<std::string> list;
    for (const json& element : json::parse(RunCommand({"thumbs", "list", In(""), "--json"}).out)) {
      const std::string file = element["file"];
      const std::string name = file.empty() ? element["thumbnail"] : element["file"];
      list.push_back(element["status"].get<std::string>() + " " +
                     std::filesystem::path(name).filename().string());
    }
    return list;
  }
  TemporaryFolder folder_;
};

TEST_F(ThumbsCommand, CreatesMissingAndRemovesOrphanedThumbnails) {
  for (const char* name : {"a.bmp", "b.bmp", "c.bmp"}) Put(name);
  WriteText(In("bad.bmp"), "BM");
  WriteText(In("b.THN"), "broken");
  WriteText(In("gone.thn"), "");
  WriteText(In(".dot.THN"), "");
  std::filesystem::create_directory(In("folder.THN"));
  std::filesystem::create_symlink(In("a.bmp"), In("link.THN"));
  EXPECT_EQ(RunCommand({"thumbs", "make", In("c.bmp")}).status, 0);
  std::filesystem::last_write_time(
      In("c.bmp"), std::filesystem::last_write_time(In("c.THN")) + std::chrono::seconds(5));
  EXPECT_THAT(List(), ElementsAre("missing a.bmp", "broken b.bmp", "missing bad.bmp", "stale c.bmp", "orphan gone.thn"));
  EXPECT_THAT(RunCommand({"thumbs", "make", In(""), "--dry-run"}).out, testing::HasSubstr("a.bmp -> "));
  EXPECT_FALSE(std::filesystem::exists(In("a.THN")));

  const CommandResult made = RunCommand({"thumbs", "make", In(""), "--jobs", "3"});
  EXPECT_EQ(made.status, 1);
  EXPECT_EQ(made.out, In("a.bmp") + " -> " + In("a.THN") + "\n" + In("b.bmp") + " -> " + In("b.THN") + "\n" + In("c.bmp") +
                          " -> " + In("c.THN") + "\n");
  std::filesystem::last_write_time(In("c.bmp"), std::filesystem::last_write_time(In("a.bmp")));
  EXPECT_THAT(List(), ElementsAre("current a.bmp", "current b.bmp", "missing bad.bmp", "current c.bmp", "orphan gone.thn"));
  EXPECT_EQ(RunCommand({"thumbs", "make", In("a.bmp")}).out, "") << "it is there";
  EXPECT_NE(RunCommand({"thumbs", "make", In("a.bmp"), "--force"}).out, "");
  const json elements = json::parse(RunCommand({"thumbs", "make", In(""), "--json"}).out);
  ASSERT_EQ(elements.size(), 4u);
  EXPECT_EQ(elements[0]["made"], false);
  EXPECT_EQ(elements[0]["status"], 0);
  EXPECT_EQ(
      elements[2],
      (json{
          {"file", In("bad.bmp")}, {"thumbnail", In("bad.THN")}, {"made", false}, {"status", 2}, {"message", "Damaged file."}}));

  EXPECT_EQ(RunCommand({"thumbs", "clean", In(""), "-n"}).out, In("gone.thn") + "\n");
  EXPECT_EQ(RunCommand({"thumbs", "clean", In("")}).status, 0);
  EXPECT_THAT(folder_.Names(), ElementsAre(".dot.THN", "a.THN", "a.bmp", "b.THN", "b.bmp",
                                           "bad.bmp", "c.THN", "c.bmp", "folder.THN", "link.THN"));
  EXPECT_EQ(RunCommand({"thumbs", "clean", In("nothere")}).status, 1);
}

TEST_F(ThumbsCommand, PicturesWithTheSameNameShareAThumbnail) {
  Put("a.bmp");
  WriteBytes(In("a.dib"), BitmapFile(3, 5, 1));
  ASSERT_EQ(RunCommand({"thumbs", "make", In("a.dib")}).status, 0);
  const std::vector<uint8_t> last = ReadBytes(In("a.THN"));
  for (int i = 0; i < 5; ++i) {
    ASSERT_EQ(RunCommand({"thumbs", "make", In(""), "--force", "-j", "2"}).status, 0);
    ASSERT_EQ(ReadBytes(In("a.THN")), last);
  }
}

TEST_F(ThumbsCommand, DrawsPictures) {
  WriteBytes(In("a.bmp"), BitmapFile(300, 100, 24));
  WriteText(In("t.bmp"), "");
  EXPECT_EQ(RunCommand({"thumbs", "draw", In("a.bmp"), "--out", In("t.bmp"), "--side", "90"}).status, 1);
  EXPECT_EQ(RunCommand({"thumbs", "draw", In("a.bmp"), "--out", In("t.bmp"), "--side", "90", "--overwrite", "replace"}).status, 0);
  EXPECT_EQ(std::filesystem::file_size(In("t.bmp")), 54u + (90 * 3 + 2) * 30);
  EXPECT_EQ(RunCommand({"thumbs", "draw", In("a.bmp"), "--out", In("whole.bmp"), "--side", "300"}).status, 0);
  EXPECT_EQ(std::filesystem::file_size(In("whole.bmp")), 54u + 300 * 3 * 100);
  EXPECT_TRUE(RunCommand({"thumbs", "draw", In("x.bmp"), "--out", In("u.bmp")}).Says(In("x.bmp") + ": File open error."));
}

TEST_F(ThumbsCommand, ExportsThumbnails) {
  Put("a.bmp");
  ASSERT_EQ(RunCommand({"thumbs", "make", In("a.bmp")}).status, 0);
  EXPECT_EQ(RunCommand({"thumbs", "show", In("a.THN"), "--out", In("t.bmp")}).status, 0);
  EXPECT_EQ(std::filesystem::file_size(In("t.bmp")), 54u + 96 * 96 * 3);
  const std::vector<uint8_t> picture = ReadBytes(In("t.bmp")), record = ReadBytes(In("a.THN"));
  EXPECT_TRUE(std::equal(picture.begin() + 54, picture.end(), record.begin() + 264, record.end()));
  EXPECT_EQ(RunCommand({"thumbs", "show", In("a.THN"), "--out", In("t.bmp")}).status, 1);
  EXPECT_EQ(RunCommand({"thumbs", "show", In("a.THN"), "--out", In("t.bmp"), "--overwrite", "replace"}).status, 0);
  EXPECT_TRUE(RunCommand({"thumbs", "show", In("a.bmp"), "--out", In("u.bmp")})
                  .Says(In("a.bmp") + ": Damaged file. Not a thumbnail file."));
  EXPECT_TRUE(RunCommand({"thumbs", "show", In("x.THN"), "--out", In("u.bmp")}).Says(In("x.THN") + ": File open error."));
}

}  // namespace
}  // namespace fotomill::test
