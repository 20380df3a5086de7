#include "desktop/models/metadata/exif_editor.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "batch/rewrite/exif_file.h"
#include "desktop/models/metadata/strip_preview.h"
#include "formats/jpeg/jpeg.h"
#include "metadata/edit/exif_input.h"
#include "metadata/edit/strip.h"
#include "support/codecs.h"
#include "support/files.h"

namespace fotomill::desktop {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;

constexpr uint16_t kTitle = 0x010e, kArtist = 0x013b, kIso = 0x8827, kTaken = 0x9003,
                   kFlash = 0x9209, kMetering = 0x9207, kLatitude = 0x0002;

// Pictures with an artist each; the first also has the time it was taken.
class ExifEditing : public testing::Test {
 protected:
  ExifEditing() {
    for (const char* name : {"a.jpg", "b.jpg"}) {
      const std::string path = folder_.Path(name);
      test::WriteBytes(path, test::Encode(JpegWrite, *test::PatternPicture(32, 16, 24)));
      Write(path, [&](ExifEditor& editor) { editor.Set(kArtist, name); });
      paths_.push_back(path);
    }
    Write(paths_[0], [](ExifEditor& editor) { editor.Set(kTaken, "2024:05:31 14:10:00"); });
    test::WriteText(folder_.Path("c.gif"), "GIF89a");
    Open();
  }
  void Open() {
    std::vector<ExifFileTexts> files;
    for (const std::string& path : paths_) files.push_back(ReadExifFile(path));
    files.push_back(ReadExifFile(folder_.Path("c.gif")));
    editor_.SetFiles(std::move(files));
  }
  static void Write(const std::string& path, const std::function<void(ExifEditor&)>& change) {
    ExifEditor editor;
    editor.SetFiles({ReadExifFile(path)});
    change(editor);
    ASSERT_EQ(EditExifFile(path, path, editor.Changer(true), {}, {}).status, Status::Ok);
  }
  // Writes the changes to all files; the statuses.
  std::vector<Status> WriteAll(bool addNew) {
    std::vector<Status> statuses;
    for (const std::string& path : editor_.Changeable())
      statuses.push_back(EditExifFile(path, path, editor_.Changer(addNew), {}, {}).status);
    Open();
    return statuses;
  }
  std::string In(size_t file, uint16_t tag) const {
    const auto& texts = editor_.Files()[file].texts;
    const auto found = texts.find(tag);
    return found == texts.end() ? "-" : found->second;
  }

  test::TemporaryFolder folder_;
  std::vector<std::string> paths_;
  ExifEditor editor_;
};

TEST_F(ExifEditing, RowsTellWhatTheFilesShare) {
  EXPECT_EQ(editor_.Changeable(), paths_);
  EXPECT_THAT(editor_.Files()[2].problem, HasSubstr("JPEG"));
  const ExifEditRow artist = editor_.Row(kArtist), taken = editor_.Row(kTaken);
  EXPECT_TRUE(artist.mixed && artist.removable && artist.text.empty());
  EXPECT_EQ(artist.files, 2u);
  EXPECT_TRUE(!taken.mixed && !taken.changed);
  EXPECT_EQ(taken.files, 1u);
  EXPECT_FALSE(editor_.Row(0x9000).removable);  // the version
  const auto rows = editor_.Rows(false, "person WHO");
  ASSERT_EQ(rows.size(), 1u);
  EXPECT_EQ(rows[0].tag, kArtist);
  EXPECT_EQ(editor_.Rows(false, "14:10").size(), 1u);  // by value
  EXPECT_EQ(editor_.Rows(false, "Image title").size(), 0u);
  EXPECT_EQ(editor_.Rows(true, "Image title").size(), 1u);
}

TEST_F(ExifEditing, OnlyChangedTagsAreWritten) {
  EXPECT_EQ(editor_.Set(kTitle, "Lake"), "");
  EXPECT_NE(editor_.Set(kIso, "99999"), "");
  EXPECT_EQ(editor_.Set(kTaken, "2024:05:31 14:10:00"), "");  // the second file gets it
  editor_.Set(kMetering, "Spot");
  editor_.Revert(kMetering);
  EXPECT_THAT(editor_.Summary(),
              ElementsAre("Image title: Lake", "DateTime of original data: 2024:05:31 14:10:00"));
  EXPECT_TRUE(editor_.Adds());
  EXPECT_THAT(WriteAll(false), ElementsAre(Status::Ok, Status::Ok));
  EXPECT_EQ(In(0, kTitle) + In(1, kTaken), "--");
  EXPECT_THAT(WriteAll(true), ElementsAre(Status::Ok, Status::Ok));
  EXPECT_FALSE(editor_.Adds());
  for (const size_t file : {0u, 1u}) {
    EXPECT_EQ(In(file, kTitle), "Lake");
    EXPECT_EQ(In(file, kTaken), "2024:05:31 14:10:00");
    EXPECT_EQ(In(file, kArtist), file == 0 ? "a.jpg" : "b.jpg");
    EXPECT_EQ(In(file, kIso) + In(file, kMetering), "--");
  }
  editor_.Clear();
  EXPECT_EQ(editor_.Set(kTitle, "Lake"), "");  // as in both files
  EXPECT_FALSE(editor_.HasChanges());
  editor_.Remove(kTitle);
  EXPECT_TRUE(editor_.Row(kTitle).removed);
  WriteAll(true);
  EXPECT_EQ(In(0, kTitle) + In(1, kTitle), "--");
}

TEST_F(ExifEditing, TimesAreShiftedWhereThereAreSome) {
  editor_.Shift(-3600 * 15);
  EXPECT_EQ(editor_.Row(kTaken).text, "2024:05:30 23:10:00");
  EXPECT_TRUE(editor_.Row(kTaken).changed && !editor_.Row(kArtist).changed);
  EXPECT_THAT(WriteAll(true), ElementsAre(Status::Ok, Status::InformationError));
  EXPECT_EQ(In(0, kTaken), "2024:05:30 23:10:00");
  // a typed time is not shifted
  editor_.Set(kTaken, "2000:01:01 00:00:00");
  WriteAll(true);
  EXPECT_EQ(In(0, kTaken), "2000:01:01 00:00:00");
}

TEST_F(ExifEditing, PlacesReplaceEachOther) {
  constexpr std::string_view kTrack =
      "<gpx><trk><trkseg><trkpt lat=\"46\" lon=\"11\"><time>2024-05-31T12:00:00Z</time></trkpt>"
      "<trkpt lat=\"46.2\" lon=\"11\"><time>2024-05-31T12:20:00Z</time></trkpt></trkseg></trk>"
      "</gpx>";
  const auto track = std::make_shared<GpsTrack>();
  ASSERT_EQ(track->Parse({reinterpret_cast<const uint8_t*>(kTrack.data()), kTrack.size()}),
            Status::Ok);
  bool mixed = false;
  EXPECT_FALSE(editor_.Place(mixed) || mixed);
  EXPECT_EQ(editor_.OnTrack(*track, -7200), 1u);
  EXPECT_EQ(editor_.OnTrack(*track, {}), 0u);
  editor_.Set(PlaceEntries({.latitude = 48.5, .longitude = -11}));
  EXPECT_EQ(editor_.Place(mixed)->latitude, 48.5);
  editor_.Follow(track, -7200);
  EXPECT_FALSE(editor_.Place(mixed));
  EXPECT_THAT(WriteAll(true), ElementsAre(Status::Ok, Status::InformationError));
  EXPECT_FALSE(editor_.Place(mixed));
  EXPECT_TRUE(mixed);
  EXPECT_THAT(In(0, kLatitude), HasSubstr("46.000 6.000 0.000"));
  editor_.RemovePlace();
  EXPECT_TRUE(editor_.Row(kLatitude).removed);
  EXPECT_THAT(WriteAll(true), ElementsAre(Status::Ok, Status::Ok));
  EXPECT_EQ(In(0, kLatitude), "-");
}

TEST(ExifFlash, PartsMakeTheNumber) {
  const std::string text = "Fire: Y Return: D Mode: A Function: N Redeye: Y";
  uint32_t bits = 0;
  for (const FlashPart& part : FlashParts()) bits |= static_cast<uint32_t>(part.mask) << part.shift;
  EXPECT_EQ(bits, 127u);
  EXPECT_EQ(FlashNumber(text), 127u);
  EXPECT_EQ(FlashNumber("nonsense"), 0u);
}

TEST(ExifHints, GiveTheLimits) {
  EXPECT_EQ(ExifInputHint(kIso), "1 to 32767");
  EXPECT_EQ(ExifInputHint(0x9204), "-99.99 to 99.99");
  EXPECT_EQ(ExifInputHint(kArtist), "");
  EXPECT_THAT(ExifInputWords(0x0112), testing::SizeIs(8));  // without Unknown
  EXPECT_THAT(ExifInputWords(0x0019), ElementsAre("K", "M", "N"));
  EXPECT_TRUE(ExifInputWords(kFlash).empty());
}

TEST_F(ExifEditing, RemovalIsShownBefore) {
  const StripPreview all = PreviewStrip(paths_[0], {kKeepUsually, false}),
                     none = PreviewStrip(paths_[0], {kKeepExif, false}),
                     some = PreviewStrip(paths_[0], {kKeepCopyright, false}),
                     bad = PreviewStrip(folder_.Path("c.gif"), {kKeepUsually, false});
  EXPECT_EQ(all.removed + "|" + all.left, "EXIF|nothing");
  EXPECT_EQ(none.removed + "|" + none.left, "nothing|EXIF");
  EXPECT_EQ(some.removed + "|" + some.left, "some EXIF tags|EXIF");
  EXPECT_FALSE(bad.problem.empty());
  EXPECT_EQ(MetadataInFile(paths_[0]), "EXIF");
}

}  // namespace
}  // namespace fotomill::desktop
