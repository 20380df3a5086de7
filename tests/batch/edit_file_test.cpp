#include "batch/rewrite/edit_file.h"

#include <gtest/gtest.h>

#include "formats/jpeg/jpeg.h"
#include "formats/png/png.h"
#include "operations/engine.h"
#include "platform/files.h"
#include "support/bitmaps.h"
#include "support/codecs.h"
#include "support/files.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

EditRequest RequestOf(const std::string& text) {
  auto recipe = std::make_shared<Recipe>();
  EXPECT_TRUE(ReadRecipe(
                  text, [](std::string_view) { return std::string(); }, *recipe)
                  .empty());
  EditRequest request;
  request.recipe = recipe;
  return request;
}

TEST(EditFile, WritesTheResultOrLeavesTheFileAlone) {
  const TemporaryFolder folder;
  const PicturePointer picture = PatternPicture(32, 16, 24);
  const struct {
    const char* name;
    std::vector<uint8_t> bytes;
    const char* recipe;
    Status status;
    const char* hint;
  } kRows[] = {
      {"a.png", Encode(PngWrite, *picture), "crop 20x10+3+4; brightness 20", Status::Ok, ""},
      {"b.bmp", BitmapFile(9, 5, 8), "rotate 90", Status::Ok, ""},
      {"c.jpg", Encode(JpegWrite, *picture), "gray", Status::Ok, ""},
      {"d.gif",
       Hex("474946383961 0100 0100 800000 000000FFFFFF 2C00000000010001000002024401 00 3B"),
       "resize 20x20", Status::Ok, ""},
      {"e.gif",
       Hex("474946383961 0100 0100 800000 000000FFFFFF 2C00000000010001000002024401 00 "
           "2C00000000010001000002024C01 00 3B"),
       "invert", Status::UnsuitableImage,
       "The file has several pictures; all but one would be lost."},
      {"deep.png",
       Hex("89504E470D0A1A0A0000000D49484452000000010000000110000000006AEE47160000000B49444154789C6"
           "310320100005B004796FB1B"
           "650000000049454E44AE426082"),
       "invert", Status::UnsuitableImage, "The file has data that would be lost."},
      {"f.png", Encode(PngWrite, *picture), "crop 5x5+100+100", Status::EmptyImage, ""},
      {"g.jpg", Hex("FFD8FFD9"), "gray", Status::DamagedFile, nullptr},
  };
  for (const auto& row : kRows) {
    SCOPED_TRACE(row.name);
    const std::string path = folder.Path(row.name);
    WriteBytes(path, row.bytes);
    const EditRequest request = RequestOf(row.recipe);
    PicturePointer wanted;
    const bool loads = LoadPicture({.fileName = path}, wanted) == Status::Ok;
    const RewrittenFile edited = EditPictureFile(path, path, request, {}, {}, {});
    if (row.status != Status::Ok) {
      EXPECT_NE(edited.status, Status::Ok);
      EXPECT_FALSE(edited.changed);
      if (row.hint != nullptr) {
        EXPECT_EQ(edited.status, row.status);
        EXPECT_EQ(edited.hint, row.hint);
      }
      EXPECT_EQ(ReadBytes(path), row.bytes);
      continue;
    }
    ASSERT_EQ(edited.status, Status::Ok) << edited.hint;
    EXPECT_TRUE(edited.changed);
    EXPECT_TRUE(edited.note.empty()) << edited.note.shown;
    ASSERT_TRUE(loads);
    ASSERT_EQ(ApplySteps(*wanted, request.recipe->common, {}), Status::Ok);
    PicturePointer back;
    ASSERT_EQ(LoadPicture({.fileName = path}, back), Status::Ok);
    EXPECT_EQ(back->image.Width(), wanted->image.Width());
    const bool lossless = std::string_view(row.name) != "c.jpg" && wanted->bitsPerPixel <= 8;
    if (lossless || std::string_view(row.name) == "a.png") {
      EXPECT_EQ(PixelText(back->image), PixelText(wanted->image));
    }
  }
}

TEST(EditFile, ChangesPicturesAsTheyAreSeen) {
  const TemporaryFolder folder;
  const PicturePointer picture = PatternPicture(32, 16, 24);
  // orientation 6: a quarter turn to the right
  picture->metadata.exif = Hex("4D4D002A00000008 0001 0112 0003 00000001 00060000 00000000");
  const std::string path = folder.Path("a.png");
  WriteBytes(path, Encode(PngWrite, *picture));
  const RewrittenFile edited = EditPictureFile(path, path, RequestOf("crop 16x8+0+0"), {}, {}, {});
  ASSERT_EQ(edited.status, Status::Ok);
  PicturePointer back;
  ASSERT_EQ(LoadPicture({.fileName = path}, back), Status::Ok);
  ASSERT_EQ(back->image.Width(), 16);
  ASSERT_EQ(back->image.Height(), 8);
  EXPECT_EQ(back->image.PixelAt(15, 0), picture->image.PixelAt(0, 0));
}

TEST(EditFile, BackupsNeverReplaceEachOther) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("a.bmp");
  for (const char* text : {"one", "two", "three"}) {
    WriteText(path, text);
    ASSERT_TRUE(platform::SetModificationTime(path, {1'000'000'000, 0}));
    EXPECT_TRUE(KeepBackup(path));
  }
  EXPECT_EQ(folder.Names(),
            (std::vector<std::string>{"a.bmp", "a.bmp.bak", "a.bmp.bak2", "a.bmp.bak3"}));
  EXPECT_EQ(ReadText(folder.Path("a.bmp.bak")), "one");
  EXPECT_EQ(ReadText(folder.Path("a.bmp.bak3")), "three");
  EXPECT_EQ(platform::FactsOf(folder.Path("a.bmp.bak2")).modified, 1'000'000'000);
  EXPECT_FALSE(KeepBackup(folder.Path("missing.bmp")));
}

}  // namespace
}  // namespace fotomill::test
