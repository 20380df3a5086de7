#include "batch/rewrite/turn_run.h"

#include <gtest/gtest.h>

#include <filesystem>

#include "formats/jpeg/jpeg.h"
#include "formats/png/png.h"
#include "formats/webp/webp.h"
#include "platform/files.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "support/bitmaps.h"
#include "support/codecs.h"
#include "support/faults.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

namespace fs = std::filesystem;

std::vector<std::string> LinesOf(const BatchJob& job) {
  std::vector<std::string> lines;
  for (const ProgressLine& line : job.progress.Lines()) lines.push_back(line.text);
  return lines;
}

TEST(Turn, ChangesFilesOnlyWithoutLoss) {
  const TemporaryFolder folder;
  const PicturePointer picture = PatternPicture(32, 16, 24);
  const struct {
    const char* name;
    std::vector<uint8_t> bytes;
    const char* hint;  // null: it is rotated
  } rows[] = {
      {"a.jpg", Encode(JpegWrite, *picture), nullptr},
      {"b.png", Encode(PngWrite, *picture), nullptr},
      {"c.bmp", BitmapFile(9, 5, 8), nullptr},
      {"d.webp", Encode(WebpWrite, *picture), nullptr},
      {"deep.png",
       Hex("89504E470D0A1A0A0000000D49484452000000010000000110000000006AEE47160000000B49444154789C6"
           "310320100005B004796FB1B"
           "650000000049454E44AE426082"),
       "The file has data that would be lost."},
      {"e.gif",
       Hex("474946383961 0100 0100 800000 000000FFFFFF 2C00000000010001000002024401 00 "
           "2C00000000010001000002024C01 00 3B"),
       "The file has several pictures; all but one would be lost."},
      {"f.jpg", Hex("FFD8FFD9"), ""},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const std::string path = folder.Path(row.name);
    WriteBytes(path, row.bytes);
    ASSERT_TRUE(platform::SetModificationTime(path, {1'000'000'000, 500}));
    const TurnRequest right{.turn = Orientation::QuarterRight, .keepTime = true};
    const RewrittenFile turned = TurnPictureFile(path, path, right, {}, {});
    EXPECT_EQ(platform::FactsOf(path).modified, 1'000'000'000);
    if (row.hint != nullptr) {
      EXPECT_NE(turned.status, Status::Ok);
      EXPECT_EQ(turned.hint, row.hint);
      EXPECT_EQ(ReadBytes(path), row.bytes);
      continue;
    }
    ASSERT_EQ(turned.status, Status::Ok) << turned.hint;
    EXPECT_TRUE(turned.note.empty());
    PicturePointer before, after;
    WriteBytes(folder.Path(std::string("before-") + row.name), row.bytes);
    ASSERT_EQ(LoadPicture({.fileName = folder.Path(std::string("before-") + row.name)}, before), Status::Ok);
    ASSERT_EQ(LoadPicture({.fileName = path}, after), Status::Ok);
    ASSERT_EQ(after->image.Width(), before->image.Height());
    // decoding a rotated block rounds differently
    if (std::string_view(row.name) == "a.jpg") continue;
    for (int32_t x = 0; x < before->image.Width(); ++x) {
      EXPECT_EQ(before->image.PixelAt(x, 1), after->image.PixelAt(after->image.Width() - 2, x));
    }
  }
}

TEST(Turn, StopsWithinAFile) {
  const TemporaryFolder folder;
  const PicturePointer picture = PatternPicture(32, 16, 24);
  const StopSource stop;
  stop.Stop();
  for (const auto& [name, bytes] : {std::pair{"a.jpg", Encode(JpegWrite, *picture)},
                                    {"b.png", Encode(PngWrite, *picture)}}) {
    SCOPED_TRACE(name);
    const std::string path = folder.Path(name);
    WriteBytes(path, bytes);
    const TurnRequest request{.turn = Orientation::HalfTurn, .stop = stop.Token()};
    EXPECT_EQ(TurnPictureFile(path, path, request, {}, {}).status, Status::FunctionCancelled);
    EXPECT_EQ(ReadBytes(path), bytes);
  }
}

TEST(Turn, SkipsFilesThatWouldLoseTexts) {
  const ScopedSettings scoped;
  const TemporaryFolder folder;
  const PicturePointer commented = PatternPicture(9, 5, 24), tagged = PatternPicture(9, 5, 24);
  commented->comment = {'h', 'i'};
  tagged->metadata.xmp = {'<', 'x', '/', '>'};
  const struct {
    const PicturePointer& picture;
    const char* hint;
  } rows[] = {{commented, "The comment would be lost."},
              {tagged, "EXIF, XMP or the color profile would be lost."}};
  const std::string path = folder.Path("a.png");
  for (const auto& row : rows) {
    SCOPED_TRACE(row.hint);
    settings.PreserveEXIF = 1;
    const std::vector<uint8_t> file = Encode(PngWrite, *row.picture);
    for (const bool kept : {false, true}) {
      settings.PreserveEXIF = kept;
      WriteBytes(path, file);
      const RewrittenFile turned = TurnPictureFile(path, path, {.turn = Orientation::QuarterRight},
                                                   {}, {.encode = EncodeOptionsFromSettings()});
      EXPECT_EQ(turned.status, kept ? Status::Ok : Status::UnsuitableImage);
      EXPECT_EQ(turned.hint, kept ? "" : row.hint);
      EXPECT_EQ(ReadBytes(path) == file, !kept);
    }
  }
}

TEST(Turn, KeepsNamesAndOldFiles) {
  const TemporaryFolder folder;
  const std::vector<uint8_t> bitmap = BitmapFile(9, 5, 24);
  for (const char* name : {"a.bmp", "b.bmp", "c.bmp"}) WriteBytes(folder.Path(name), bitmap);
  fs::create_symlink(folder.Path("c.bmp"), folder.Path("link.bmp"));
  std::vector<BatchFile> files;
  for (const char* name : {"a.bmp", "b.bmp", "a.bmp", "link.bmp"})
    files.push_back({.name = folder.Path(name), .below = {}, .hint = {}});
  TurnFunction function{.request = {.turn = Orientation::HalfTurn}, .inPlace = true};
  function.keepPrevious = [&](const std::string& path) { return path != folder.Path("b.bmp"); };
  BatchJob job;
  ASSERT_EQ(RunTurn(files, function, job), Status::Ok);
  const std::vector<std::string> lines = LinesOf(job);
  ASSERT_GE(lines.size(), 4u);
  EXPECT_EQ(lines[0], folder.Path("a.bmp") + " -> " + folder.Path("a.bmp"));
  EXPECT_EQ(lines[1], folder.Path("b.bmp") + ": Error creating file. There is not enough disk space to keep the old file for undo.");
  EXPECT_NE(lines[2].find("listed twice"), std::string::npos);
  EXPECT_NE(lines[3].find("This is a link"), std::string::npos);
  EXPECT_NE(ReadBytes(folder.Path("a.bmp")), bitmap);
  EXPECT_EQ(ReadBytes(folder.Path("b.bmp")), bitmap);
  EXPECT_TRUE(fs::is_symlink(folder.Path("link.bmp")));
  EXPECT_EQ(ReadBytes(folder.Path("c.bmp")), bitmap);

  // In another folder, outputs avoid each other and existing files; the second rotation restores
  // the first picture.
  function = {.request = {.turn = Orientation::HalfTurn}};
  BatchJob other;
  other.destinationFolder = folder.Path("out");
  ASSERT_EQ(RunTurn(std::span(files).first(3), function, other), Status::Ok);
  PicturePointer twice, once;
  ASSERT_EQ(LoadPicture({.fileName = folder.Path("out/a.bmp")}, twice), Status::Ok);
  ASSERT_EQ(LoadPicture({.fileName = folder.Path("c.bmp")}, once), Status::Ok);
  EXPECT_TRUE(SamePixels(once->image, twice->image));
  EXPECT_TRUE(fs::exists(folder.Path("out/a [1].bmp")));
  EXPECT_THAT(LinesOf(other)[2], testing::HasSubstr("a [1].bmp: Numbered, as another file of this run is \"a.bmp\"."));
  // A rotation by nothing leaves the file alone.
  EXPECT_FALSE(TurnPictureFile(folder.Path("c.bmp"), folder.Path("c.bmp"), {}, {}, {}).changed);
}

TEST(Turn, KeepsTheOldFileOnEveryFault) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("a.jpg");
  const std::vector<uint8_t> file = Encode(JpegWrite, *PatternPicture(32, 16, 24));
  const int64_t faults = ForEachFault([&] {
    WriteBytes(path, file);
    const Status status =
        TurnPictureFile(path, path, {.turn = Orientation::HalfTurn}, {}, {}).status;
    EXPECT_EQ(ReadBytes(path) == file, status != Status::Ok);
    EXPECT_EQ(folder.Names().size(), 1u);
  });
  EXPECT_GT(faults, 3);
  WriteOptions options;
  options.makeWay = [&] {
    WriteText(path, "somebody's work");
    return true;
  };
  EXPECT_NE(TurnPictureFile(path, path, {.turn = Orientation::HalfTurn}, {}, options).status, Status::Ok);
  // Nor is a text dropped that a new file would not have.
  std::vector<uint8_t> written = Encode(PngWrite, *PatternPicture(9, 5, 24));
  const std::vector<uint8_t> author = Hex("00000009 74455874 417574686F72004D65 00000000");
  written.insert(written.end() - 12, author.begin(), author.end());
  const std::string png = folder.Path("a.png");
  WriteBytes(png, written);
  EXPECT_EQ(TurnPictureFile(png, png, {.turn = Orientation::HalfTurn}, {}, {}).status, Status::UnsuitableImage);
  EXPECT_EQ(ReadBytes(png), written);
  EXPECT_EQ(ReadText(path), "somebody's work");
}

}  // namespace
}  // namespace fotomill::test
