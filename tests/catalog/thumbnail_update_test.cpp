#include "catalog/thumbnails/thumbnail_update.h"

#include <gmock/gmock.h>

#include "catalog/thumbnails/orphan_times.h"
#include "catalog/thumbnails/thumbnail_record.h"
#include "core/data_folder.h"
#include "platform/clock.h"
#include "platform/volumes.h"
#include "support/bitmaps.h"
#include "support/files.h"

namespace fotomill::test {
namespace {

using platform::DriveKind;
using testing::ElementsAre;

constexpr int64_t kNow = 1'700'000'000, kDay = 86400;

class Face : public ThumbnailUpdateFace {
 public:
  bool ShowProgress(const std::string& text, size_t, size_t) override {
    progress = text;
    return goesOn;
  }
  void AttachRecord(const std::string& file, const ThumbnailRecord& record) override {
    attached.push_back(file + (record.HasMagic("THNL") ? "" : "?"));
  }
  int32_t AskForUpdate(int32_t asked, int32_t preselected) override {
    count = asked;
    selected = preselected;
    return answer;
  }
  int32_t BuildThumbnails(const std::vector<std::string>& files) override {
    built = files;
    return 1;
  }
  void Refresh() override { refreshed = true; }
  void KeepChoice(const ThumbnailUpdateOptions&) override { kept = true; }
  bool kept = false;

  bool goesOn = true, refreshed = false;
  int32_t answer = 0, count = -1, selected = -1;
  std::string progress;
  std::vector<std::string> attached, built;
};

class ThumbnailUpdate : public testing::Test {
 protected:
  ThumbnailUpdate() {
    kind = DriveKind::Fixed;
    platform::ReplaceVolumeFunction([](const std::string&) {
      return platform::Volume{true, "v", 1, kind};
    });
    platform::FixNow(kNow);
    SetDataFolder(data_.Path());
    for (const char* name : {"a.bmp", "b.bmp", ".c.bmp"})
      WriteBytes(folder_.Path(name), BitmapFile(3, 3, 24));
    for (const char* name : {"a.THN", "gone.THN", "B.thn.txt"}) WriteText(folder_.Path(name), "");
    browser_.options.compacts = true;
    browser_.folder = folder_.Path();
    browser_.files = {"a.bmp", "b.bmp", ".c.bmp"};
  }
  ~ThumbnailUpdate() override {
    platform::FixNow(-1);
    SetDataFolder({});
    platform::ReplaceVolumeFunction(nullptr);
  }
  std::string Times() const { return data_.Path("FMWThumbnailCleanUp.txt"); }
  bool HasOrphan() const { return std::filesystem::exists(folder_.Path("gone.THN")); }

  static inline DriveKind kind;
  TemporaryFolder folder_, data_;
  ThumbnailBrowser browser_;
  Face face_;
};

TEST_F(ThumbnailUpdate, IsOfferedIfUseful) {
  const struct {
    const char* name;
    choice::ThumbnailMode mode;
    choice::ViewMode view;
    DriveKind drive;
    int32_t flag;
    bool asks, offered, compacted;
  } rows[] = {
      {"disk", choice::kDiskBased, choice::kViewSmall, DriveKind::Fixed, 1, true, true, true},
      {"virtual", choice::kVirtual, choice::kViewLarge, DriveKind::Ram, 1, true, true, true},
      {"database", choice::kLocalDatabase, choice::kViewLarge, DriveKind::Fixed, 1, true, false, false},
      {"removable", choice::kDiskBased, choice::kViewLarge, DriveKind::Removable, 1, true, false, false},
      {"optical", choice::kDiskBased, choice::kViewLarge, DriveKind::Optical, 1, true, true, false},
      {"unknown drive", choice::kDiskBased, choice::kViewLarge, DriveKind::Unknown, 1, true, false, false},
      {"details", choice::kDiskBased, choice::kViewDetails, DriveKind::Network, 1, true, false, true},
      {"switched off", choice::kDiskBased, choice::kViewLarge, DriveKind::Fixed, 0, true, false, true},
      {"not here", choice::kDiskBased, choice::kViewLarge, DriveKind::Fixed, 1, false, false, true},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    WriteText(folder_.Path("gone.THN"), "");
    std::filesystem::remove(Times());
    ThumbnailBrowser browser = browser_;
    browser.mode = row.mode;
    browser.view = row.view;
    browser.asks = row.asks;
    kind = row.drive;
    browser.options.offers = row.flag != 0;
    Face face;
    EXPECT_EQ(OfferThumbnailUpdate(browser, face), row.offered);
    EXPECT_EQ(face.count, row.offered ? 2 : -1);
    EXPECT_EQ(HasOrphan(), !row.compacted);
    EXPECT_EQ(LastOrphanRemoval(browser.folder), row.compacted ? kNow : 0);
    EXPECT_EQ(face.attached, row.mode == choice::kVirtual ? std::vector<std::string>{"b.bmp"} : std::vector<std::string>());
  }
}

TEST_F(ThumbnailUpdate, StoresTheAnswer) {
  const struct {
    int32_t stored, selected, answer, storedAfter, flagAfter;
    bool asksAfter, builds, keeps;
  } rows[] = {
      {102, 102, 101, 101, 1, true, true, true},  {7, 101, 102, 102, 1, true, false, true}, {102, 102, 103, 102, 1, false, false, false},
      {105, 101, 104, 104, 0, true, false, true}, {103, 103, 0, 103, 1, true, false, false},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.answer);
    ThumbnailBrowser browser = browser_;
    browser.options.choice = row.stored;
    Face face;
    face.answer = row.answer;
    EXPECT_TRUE(OfferThumbnailUpdate(browser, face));
    EXPECT_EQ(face.progress, "Scanning " + browser.folder);
    EXPECT_EQ(face.selected, row.selected);
    EXPECT_EQ(browser.options.choice, row.storedAfter);
    EXPECT_EQ(browser.options.offers, row.flagAfter != 0);
    EXPECT_EQ(face.kept, row.keeps);
    EXPECT_EQ(browser.asks, row.asksAfter);
    EXPECT_EQ(face.refreshed, row.builds);
    EXPECT_EQ(face.built, row.builds ? (std::vector<std::string>{"b.bmp", ".c.bmp"}) : std::vector<std::string>());
  }
  face_.goesOn = false;
  EXPECT_FALSE(OfferThumbnailUpdate(browser_, face_));
  EXPECT_EQ(face_.count, -1);
  browser_.files = {"a.bmp"};
  face_.goesOn = true;
  EXPECT_FALSE(OfferThumbnailUpdate(browser_, face_)) << "none is missing";
}

TEST_F(ThumbnailUpdate, RemovesOrphansPeriodically) {
  EXPECT_TRUE(IsCompactionDue(browser_)) << "never yet";
  ASSERT_TRUE(KeepOrphanRemoval(browser_.folder, kNow - 30 * kDay));
  EXPECT_FALSE(IsCompactionDue(browser_));
  ASSERT_TRUE(KeepOrphanRemoval(browser_.folder, kNow - 30 * kDay - 1));
  EXPECT_TRUE(IsCompactionDue(browser_));
  browser_.compacts = false;
  EXPECT_FALSE(IsCompactionDue(browser_));
  browser_.options.compacts = false;
  EXPECT_FALSE(RemoveOrphanThumbnails(browser_));
  browser_.options.compacts = true;
  kind = DriveKind::Optical;
  EXPECT_FALSE(RemoveOrphanThumbnails(browser_));
  EXPECT_TRUE(HasOrphan());
  kind = DriveKind::Removable;
  WriteText(folder_.Path("B.THN"), "");
  EXPECT_TRUE(RemoveOrphanThumbnails(browser_));
  EXPECT_THAT(folder_.Names(), ElementsAre(".c.bmp", "B.THN", "B.thn.txt", "a.THN", "a.bmp", "b.bmp"));
  // The time is the folder's, not the browser's.
  ThumbnailBrowser another = browser_;
  another.compacts = true;
  EXPECT_FALSE(IsCompactionDue(another));
  another.folder += "/sub";
  EXPECT_TRUE(IsCompactionDue(another));
}

TEST_F(ThumbnailUpdate, CleansFoldersWithoutPictures) {
  browser_.files.clear();
  EXPECT_FALSE(OfferThumbnailUpdate(browser_, face_));
  EXPECT_FALSE(HasOrphan());
  EXPECT_EQ(LastOrphanRemoval(browser_.folder), kNow);
}

TEST_F(ThumbnailUpdate, KeepsTheTimesOfFolders) {
  for (const char* folder : {"/a", "/b,c", "/a"}) EXPECT_TRUE(KeepOrphanRemoval(folder, 7));
  EXPECT_TRUE(KeepOrphanRemoval("/\xff", -5));
  EXPECT_FALSE(KeepOrphanRemoval("/a\nb", 7));
  EXPECT_FALSE(KeepOrphanRemoval("", 7));
  EXPECT_EQ(ReadText(Times()), "-5,/\xff\n7,/a\n7,/b,c\n");
  WriteText(Times(), "7\nx,/a\n,/a\n7.5,/a\n8,/b,c\r\n9,/a");
  EXPECT_EQ(LastOrphanRemoval("/a"), 9);
  EXPECT_EQ(LastOrphanRemoval("/b,c"), 8);
  EXPECT_EQ(LastOrphanRemoval("/d"), 0);
  std::string many;
  for (int i = 0; i < 6000; ++i) many += "1,/" + std::to_string(i) + "\n";
  WriteText(Times(), many);
  EXPECT_TRUE(KeepOrphanRemoval("/5", 2));
  EXPECT_EQ(LastOrphanRemoval("/5"), 2);
  EXPECT_EQ(LastOrphanRemoval("/4999"), 1);
  EXPECT_EQ(LastOrphanRemoval("/5000"), 0);
}

}  // namespace
}  // namespace fotomill::test
