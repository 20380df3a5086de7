#include "catalog/thumbnails/thumbnail_lookup.h"

#include <gmock/gmock.h>
#include <sys/stat.h>
#include <zlib.h>

#include <memory>

#include "catalog/thumbnails/listed_thumbnails.h"
#include "catalog/thumbnails/system_thumbnail.h"
#include "catalog/thumbnails/thumbnail_database.h"
#include "catalog/thumbnails/thumbnail_file.h"
#include "catalog/thumbnails/thumbnail_store.h"
#include "core/data_folder.h"
#include "core/md5.h"
#include "formats/png/png.h"
#include "platform/files.h"
#include "support/bitmaps.h"
#include "support/codecs.h"
#include "support/files.h"
#include "support/pictures.h"
#include "support/scoped_environment.h"

namespace fotomill::test {
namespace {

// A small record with all pixels equal to `value`.
ThumbnailRecord Flat(uint8_t value) {
  ThumbnailRecord record;
  record.Sign();
  record.Fill(value * 0x010101u);
  return record;
}

PackedImage Canvas(int32_t side) {
  PackedImage canvas;
  EXPECT_EQ(NewPackedImage(side, side, nullptr, 24, canvas), Status::Ok);
  return canvas;
}

TEST(DrawThumbnail, FillsTheSquareOfItsFlags) {
  ThumbnailRecord record = Flat(0);
  // two white pixels in the top left corner, one in the bottom right
  for (int32_t i = 0; i < 3; ++i) {
    record.StoredRow(95)[i] = record.StoredRow(94)[3 + i] = record.StoredRow(0)[95 * 3 + i] = 255;
  }
  LargeThumbnailRecord large;
  large.Sign();
  large.Fill(0);
  large.StoredRow(175)[0] = large.StoredRow(175)[1] = large.StoredRow(175)[2] = 255;
  const struct {
    const char* name;
    AnyThumbnailRecord record;
    uint32_t flags;
    int32_t fast;
    int32_t side, topLeft, bottomRight;
  } rows[] = {
      {"own size", record, 0, 0, 96, 255, 255},
      {"half size takes means", record, 2, 0, 48, 128, 64},
      {"large view, nearest pixels", record, 4, 0, 176, 255, 255},
      {"large view, spread", record, 4, 1, 176, 255, 255},
      {"the large view wins", record, 6, 1, 176, 255, 255},
      {"large record", large, 0, 0, 176, 255, 0},
      {"large record, large view", large, 4, 0, 176, 255, 0},
      // 48 from 176: a new pixel covers 3 2/3 old ones, the white one is 9 of 121
      {"large record, half size", large, 2, 0, 48, 19, 0},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const ThumbnailOptions options{.fastZoom = row.fast != 0, .zoomFilter = choice::kNearest};
    EXPECT_EQ(DrawnThumbnailSide(row.record, row.flags), row.side);
    PackedImage canvas = Canvas(180);
    std::ranges::fill(canvas.Rows(), uint8_t{7});
    ASSERT_TRUE(DrawThumbnailRecord(canvas, row.record, 1, 2, row.flags, options));
    EXPECT_EQ(canvas.PixelAt(1, 2), row.topLeft * 0x010101);
    EXPECT_EQ(canvas.PixelAt(row.side, row.side + 1), row.bottomRight * 0x010101);
    EXPECT_EQ(canvas.PixelAt(row.side + 1, 2), 0x070707);
    EXPECT_EQ(canvas.PixelAt(1, row.side + 2), 0x070707);
    EXPECT_EQ(canvas.PixelAt(0, 2), 0x070707);
  }
  // 176 from 96: the second pixel covers the first old one by 11 - 6 parts of 6.
  PackedImage canvas = Canvas(176);
  ASSERT_TRUE(DrawThumbnailRecord(canvas, record, 0, 0, kDrawLargeView, {.fastZoom = true}));
  EXPECT_EQ(canvas.PixelAt(1, 0), (255 * 5 + 3) / 6 * 0x010101);
}

TEST(DrawThumbnail, ConvertsToGrayTermByTermAndClips) {
  ThumbnailRecord record;
  record.Fill(0x3264ff);  // blue 50, green 100, red 255
  PackedImage canvas = Canvas(10);
  ASSERT_TRUE(DrawThumbnailRecord(canvas, record, -90, 5, kDrawGray, {}));
  EXPECT_EQ(canvas.PixelAt(5, 5), (76 + 59 + 5) * 0x010101);
  EXPECT_EQ(canvas.PixelAt(6, 5), 0);
  EXPECT_EQ(canvas.PixelAt(5, 4), 0);
  for (const int32_t far : {INT32_MIN, -96, 10, INT32_MAX}) {
    ASSERT_TRUE(DrawThumbnailRecord(canvas, Flat(9), far, far, 0, {}));
    EXPECT_EQ(canvas.PixelAt(0, 0) + canvas.PixelAt(9, 0) + canvas.PixelAt(9, 9), 0);
  }
  PackedImage indexed;
  ASSERT_EQ(NewPackedImage(96, 96, nullptr, 8, indexed), Status::Ok);
  EXPECT_FALSE(DrawThumbnailRecord(indexed, record, 0, 0, 0, {}));
}

TEST(DrawThumbnail, PlaceholdersAreTwoPicturesOnTheMatte) {
  ThumbnailRecord notMade, unreadable, other = Flat(1);
  ASSERT_TRUE(MakePlaceholderRecord(notMade, 9501, 0x332211) && MakePlaceholderRecord(unreadable, 9502, 0x332211));
  EXPECT_FALSE(MakePlaceholderRecord(other, 9503, 0x332211));
  EXPECT_EQ(other.bytes, Flat(1).bytes);
  EXPECT_NE(notMade.bytes, unreadable.bytes);
  for (const ThumbnailRecord& record : {notMade, unreadable}) {
    EXPECT_TRUE(record.HasMagic("THNL"));
    EXPECT_THAT(record.StoredRow(95).first(3), testing::ElementsAre(0x33, 0x22, 0x11));
    EXPECT_THAT(record.StoredRow(30).subspan(90, 3), testing::Not(testing::ElementsAre(0x33, 0x22, 0x11)));
  }
}

TEST(SystemThumbnail, IsNamedAfterThePicture) {
  // The example in the standard.
  const std::string uri = FileUri("/home/jens/photos/me.png");
  EXPECT_EQ(uri, "file:///home/jens/photos/me.png");
  EXPECT_EQ(Md5Text(std::span(reinterpret_cast<const uint8_t*>(uri.data()), uri.size())), "c6ee772d9e49320e97ec29a7eb5b1697");
  EXPECT_EQ(FileUri("/a b#%\xc3\xa4[;]!~(1)'&.j"), "file:///a%20b%23%25%C3%A4%5B%3B%5D!~(1)'&.j");
  std::string digits;
  for (int i = 0; i < 8; ++i) digits += "1234567890";
  EXPECT_EQ(Md5Text(std::span(reinterpret_cast<const uint8_t*>(digits.data()), digits.size())),
            "57edf4a22be3c955ac49da2e2107b67a");
  EXPECT_EQ(Md5Text({}), "d41d8cd98f00b204e9800998ecf8427e");
}

// A picture, and possible sources of its thumbnail.
class Lookup : public testing::Test {
 protected:
  Lookup() : cache_("XDG_CACHE_HOME", folder_.Path("cache")) {
    WriteBytes(picture_, BitmapFile(3, 3, 24));
    std::filesystem::create_directories(folder_.Path("cache/thumbnails/large"));
  }

  // Stores a PNG of 200 x 100 (or as given) with its texts as the system's thumbnail.
  void PutSystemThumbnail(int64_t late, const std::string& uri, int32_t width = 200,
                          int32_t height = 100) const {
    std::vector<uint8_t> file = Encode(PngWrite, *PatternPicture(width, height, 24));
    struct stat facts;
    ASSERT_EQ(stat(picture_.c_str(), &facts), 0);
    InsertText(file, std::string("Thumb::URI") + '\0' + uri);
    InsertText(file, std::string("Thumb::MTime") + '\0' + std::to_string(facts.st_mtime + late));
    const std::string name = FileUri(picture_);
    WriteBytes(folder_.Path("cache/thumbnails/large/" +
                            Md5Text({reinterpret_cast<const uint8_t*>(name.data()), name.size()}) +
                            ".png"),
               file);
  }
  static void InsertText(std::vector<uint8_t>& file, const std::string& text) {
    std::string chunk = "tEXt" + text;
    const auto number = [](uint32_t value) {
      return std::vector<uint8_t>{static_cast<uint8_t>(value >> 24),
                                  static_cast<uint8_t>(value >> 16),
                                  static_cast<uint8_t>(value >> 8), static_cast<uint8_t>(value)};
    };
    std::vector<uint8_t> bytes = number(static_cast<uint32_t>(text.size()));
    bytes.insert(bytes.end(), chunk.begin(), chunk.end());
    const std::vector<uint8_t> crc = number(static_cast<uint32_t>(
        crc32(0, reinterpret_cast<const Bytef*>(chunk.data()), static_cast<uInt>(chunk.size()))));
    bytes.insert(bytes.end(), crc.begin(), crc.end());
    file.insert(file.begin() + 33, bytes.begin(), bytes.end());  // after the header chunk
  }

  TemporaryFolder folder_;
  ScopedEnvironment cache_;
  std::string picture_ = folder_.Path("a b.bmp");
};

TEST_F(Lookup, UsesTheSystemsThumbnailWhileValid) {
  LargeThumbnailRecord record;
  EXPECT_FALSE(ReadSystemThumbnail(picture_, 0xabcdef, record));
  const struct {
    const char* name;
    int64_t late;
    std::string uri;
    int32_t width;
    bool valid;
  } rows[] = {{"older", -1, FileUri(picture_), 200, false},
              {"newer", 1, FileUri(picture_), 200, false},
              {"another picture's", 0, FileUri(folder_.Path("b.bmp")), 200, false},
              {"too large for one", 0, FileUri(picture_), 257, false},
              {"valid", 0, FileUri(picture_), 200, true}};
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    PutSystemThumbnail(row.late, row.uri, row.width);
    EXPECT_EQ(ReadSystemThumbnail(picture_, 0xabcdef, record), row.valid);
  }
  EXPECT_TRUE(record.HasMagic("tHNL"));
  // 176 x 88, centered: rows 44 to 131.
  EXPECT_THAT(record.StoredRow(43).first(3), testing::ElementsAre(0xab, 0xcd, 0xef));
  EXPECT_THAT(record.StoredRow(44).first(3), testing::Not(testing::ElementsAre(0xab, 0xcd, 0xef)));
  // High-resolution screens request larger ones.
  EXPECT_NE(ReadSystemPicture(picture_, 256), nullptr);
  EXPECT_EQ(ReadSystemPicture(picture_, 257), nullptr);
  std::filesystem::copy(folder_.Path("cache/thumbnails/large"),
                        folder_.Path("cache/thumbnails/x-large"));
  EXPECT_NE(ReadSystemPicture(picture_, 257), nullptr);
  PutSystemThumbnail(0, FileUri(picture_), 100);
  std::filesystem::rename(folder_.Path("cache/thumbnails/large"),
                          folder_.Path("cache/thumbnails/normal"));
  EXPECT_EQ(ReadSystemPicture(picture_, 128)->width, 100);
  EXPECT_EQ(ReadSystemPicture(picture_, 129)->width, 200) << "the next larger one";
  std::filesystem::rename(folder_.Path("cache/thumbnails/normal"),
                          folder_.Path("cache/thumbnails/large"));
  PutSystemThumbnail(0, FileUri(picture_), 100);
  ASSERT_TRUE(ReadSystemThumbnail(picture_, 0xabcdef, record));
  EXPECT_THAT(record.StoredRow(38).subspan(37 * 3, 3), testing::ElementsAre(0xab, 0xcd, 0xef));
  EXPECT_THAT(record.StoredRow(38).subspan(38 * 3, 3), testing::Not(testing::ElementsAre(0xab, 0xcd, 0xef)));
}

TEST_F(Lookup, SearchesAccordingToMode) {
  SetDataFolder(folder_.Path("data"));
  std::filesystem::create_directory(folder_.Path("data"));
  ThumbnailStore databases;
  ListedThumbnails listed;
  listed.Attach(picture_, {}, Flat(2));
  for (const auto mode : {choice::kGlobalDatabase, choice::kLocalDatabase}) {
    databases.Add(DatabaseForMode(mode, picture_),
                  {Flat(mode == choice::kLocalDatabase ? 3 : 5), picture_, VolumeKeyFor(picture_)},
                  true);
  }
  databases.Flush();
  PutSystemThumbnail(0, FileUri(picture_));
  constexpr int kNone = 0, kFile = 1, kList = 2, kLocal = 3, kSystem = 4, kGlobal = 5;
  const struct {
    const char* name;
    choice::ThumbnailMode mode;
    bool hasFile, large;
    int32_t alwaysFile, useCache;
    int found;
  } rows[] = {
      {"disk", choice::kDiskBased, true, false, 0, 1, kFile},
      {"disk, none", choice::kDiskBased, false, false, 0, 1, kNone},
      {"disk, large", choice::kDiskBased, true, true, 0, 1, kSystem},
      {"disk, large, no cache", choice::kDiskBased, true, true, 0, 0, kFile},
      {"virtual, file first", choice::kVirtual, true, true, 1, 1, kFile},
      {"virtual, list only", choice::kVirtual, true, false, 0, 1, kList},
      {"virtual, no file", choice::kVirtual, false, false, 1, 1, kList},
      {"database, file first", choice::kLocalDatabase, true, false, 1, 1, kFile},
      {"database, no file", choice::kGlobalDatabase, false, true, 1, 1, kGlobal},
      {"database only", choice::kLocalDatabase, true, false, 0, 1, kLocal},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    std::filesystem::remove(ThumbnailPathFor(picture_));
    ThumbnailRecord file = Flat(1);
    ASSERT_TRUE(!row.hasFile || WriteThumbnailFile(file, ThumbnailPathFor(picture_), true));
    const ThumbnailOptions options{.fromFiles = row.alwaysFile != 0,
                                   .fromSystem = row.useCache != 0};
    ThumbnailSources sources{row.mode, true, &listed, &databases, options};
    const auto record = std::make_unique<AnyThumbnailRecord>();
    const ThumbnailQuery query{.path = picture_, .large = row.large};
    ASSERT_EQ(LookUpThumbnail(query, sources, *record), row.found != kNone);
    const bool large = std::holds_alternative<LargeThumbnailRecord>(*record);
    EXPECT_EQ(large, row.found == kSystem);
    EXPECT_TRUE(large || row.found == kNone || std::get<ThumbnailRecord>(*record).bytes[300] == row.found);
    sources = {row.mode, false, nullptr, nullptr, options};
    EXPECT_EQ(LookUpThumbnail(query, sources, *record),
              row.hasFile && (row.mode == choice::kDiskBased || row.alwaysFile != 0));
  }
  SetDataFolder({});
}

// A thumbnail of what the file was before is none, wherever it is.
TEST_F(Lookup, PassesOverWhatIsNotCurrent) {
  ThumbnailStore databases;
  ListedThumbnails listed;
  const PictureStamp stamp = PictureStampOf(1000, 10);
  listed.Attach(picture_, stamp, Flat(2));
  databases.Add(DatabaseForMode(choice::kLocalDatabase, picture_),
                {Flat(3), picture_, VolumeKeyFor(picture_), false, stamp}, true);
  databases.Flush();
  ThumbnailRecord file = Flat(1);
  ASSERT_TRUE(WriteThumbnailFile(file, ThumbnailPathFor(picture_), true));
  ASSERT_TRUE(platform::SetModificationTime(ThumbnailPathFor(picture_), {1000, 0}));
  const struct {
    const char* name;
    choice::ThumbnailMode mode;
    int64_t modified;
    uint64_t size;
    bool found;
  } rows[] = {
      {"file, as old", choice::kDiskBased, 1000, 99, true},
      {"file, older", choice::kDiskBased, 1001, 10, false},
      {"list", choice::kVirtual, 1000, 10, true},
      {"list, another time", choice::kVirtual, 999, 10, false},
      {"database", choice::kLocalDatabase, 1000, 10, true},
      {"database, another time", choice::kLocalDatabase, 1001, 10, false},
      {"database, another size", choice::kLocalDatabase, 1000, 11, false},
      {"database, nothing known", choice::kLocalDatabase, 0, 0, true},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const ThumbnailSources sources{row.mode, true, &listed, &databases, {.fromFiles = false}};
    const auto record = std::make_unique<AnyThumbnailRecord>();
    EXPECT_EQ(LookUpThumbnail({picture_, row.modified, row.size}, sources, *record), row.found);
  }
}

// What is found is shown without the matte around it, at the size of the view.
TEST(DrawThumbnail, LeavesOutTheMatte) {
  ThumbnailRecord record = Flat(9);
  record.Fill(0x112233);
  // a picture of 94 x 48 whose upper half has the matte's color at the right
  for (int32_t row = 24; row < 72; ++row) {
    for (int32_t x = 1; x < 95; ++x) record.StoredRow(row)[static_cast<size_t>(x) * 3] = 0x99;
  }
  const struct {
    const char* name;
    uint32_t flags;
    int32_t width, height;
  } rows[] = {{"own size", 0, 94, 48},
              {"half size", kDrawHalfSize, 46, 24},
              {"large view", kDrawLargeView, 172, 88}};
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    PackedImage picture;
    const ThumbnailOptions options{.matte = 0x112233, .zoomFilter = choice::kNearest};
    ASSERT_EQ(DrawThumbnailPicture(record, row.flags, options, picture), Status::Ok);
    EXPECT_EQ(picture.Width(), row.width);
    EXPECT_EQ(picture.Height(), row.height);
    EXPECT_EQ(picture.PixelAt(0, 0), 0x332299u);
    EXPECT_EQ(picture.PixelAt(row.width - 1, row.height - 1), 0x332299u);
  }
  record.Fill(0x112233);  // nothing else in it
  PackedImage picture;
  ASSERT_EQ(DrawThumbnailPicture(record, kDrawHalfSize, {.matte = 0x112233}, picture), Status::Ok);
  EXPECT_GT(picture.Width(), 0);
}

}  // namespace
}  // namespace fotomill::test
