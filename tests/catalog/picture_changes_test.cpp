#include "catalog/thumbnails/picture_changes.h"

#include <gmock/gmock.h>

#include "catalog/thumbnails/thumbnail_file.h"
#include "catalog/thumbnails/thumbnail_store.h"
#include "core/data_folder.h"
#include "platform/files.h"
#include "support/bitmaps.h"
#include "support/files.h"

namespace fotomill::test {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testing::UnorderedElementsAre;

// Pictures with records in the global database and those of their folders.
class PictureChanges : public testing::Test {
 protected:
  PictureChanges() {
    for (const char* folder : {"data", "p", "p/sub", "q"})
      std::filesystem::create_directory(folder_.Path(folder));
    SetDataFolder(folder_.Path("data"));
    for (const char* name : {"p/a.bmp", "p/b.bmp", "p/sub/c.bmp", "q/a.bmp"}) {
      WriteBytes(folder_.Path(name), BitmapFile(3, 3, 24));
      Keep(name, ThumbnailDatabasePath({}));
      Keep(name, ThumbnailDatabasePath(std::filesystem::path(folder_.Path(name)).parent_path()));
    }
    SharedThumbnailStore().Close();
  }
  ~PictureChanges() override {
    SharedThumbnailStore().Close();
    SetDataFolder({});
  }
  void Keep(const std::string& name, const std::string& database) const {
    DatabaseRecord record;
    record.thumbnail.Sign();
    record.path = folder_.Path(name);
    record.volume = VolumeKeyFor(record.path);
    SharedThumbnailStore().Add(database, record, true);
  }
  // Paths of the records that are not deleted, below the test's folder.
  std::vector<std::string> Live(const std::string& database) const {
    ThumbnailDatabase open;
    DatabaseHeader header;
    std::vector<std::string> live;
    if (open.OpenThumbnailDatabase(database, false) != ThumbnailDatabase::Opened::Done ||
        !open.ReadDatabaseHeader(header))
      return {"unreadable"};
    DatabaseKey key;
    for (int64_t i = 0; i < open.RecordCount(header); ++i) {
      if (open.ReadKey(i, key) && !key.deleted)
        live.push_back(key.path.substr(folder_.Path().size() + 1));
    }
    return live;
  }
  std::vector<std::string> Global() const { return Live(ThumbnailDatabasePath({})); }
  std::vector<std::string> Local(const std::string& folder) const {
    return Live(folder_.Path(folder + "/Fotomill.tdb"));
  }
  void Mark(const std::string& path, const std::string& to = {}) const {
    const PictureChange change{folder_.Path(path), to.empty() ? to : folder_.Path(to)};
    MarkChangedRecords({&change, 1});
  }
  // A thumbnail file that is so many seconds younger than its picture.
  void PutThumbnail(const std::string& name, int64_t younger) const {
    ThumbnailRecord record;
    const std::string path = ThumbnailPathFor(folder_.Path(name));
    ASSERT_TRUE(WriteThumbnailFile(record, path, true));
    const auto time = platform::ModificationTime(folder_.Path(name));
    const int64_t seconds = time ? time->seconds : 1'000'000'000;
    ASSERT_TRUE(platform::SetModificationTime(path, {seconds + younger, 0}));
  }
  bool Exists(const std::string& name) const { return std::filesystem::exists(folder_.Path(name)); }

  TemporaryFolder folder_;
};

TEST_F(PictureChanges, MarkTheRecordsOfBothDatabases) {
  Mark("p/a.bmp");  // replaced: it is still there
  EXPECT_THAT(Global(), ElementsAre("p/b.bmp", "p/sub/c.bmp", "q/a.bmp"));
  EXPECT_THAT(Local("p"), ElementsAre("p/b.bmp"));
  EXPECT_THAT(Local("q"), ElementsAre("q/a.bmp"));
  // Moved: what was known of the new name goes as well.
  std::filesystem::rename(folder_.Path("p/b.bmp"), folder_.Path("q/a.bmp"));
  Mark("p/b.bmp", "q/a.bmp");
  EXPECT_THAT(Global(), ElementsAre("p/sub/c.bmp"));
  EXPECT_THAT(Local("p"), IsEmpty());
  EXPECT_THAT(Local("q"), IsEmpty());
  // Compaction has something to drop.
  ThumbnailDatabase database;
  ASSERT_EQ(database.OpenThumbnailDatabase(ThumbnailDatabasePath({}), false),
            ThumbnailDatabase::Opened::Done);
  ASSERT_EQ(database.CompactThumbnailDatabase(false), ThumbnailDatabase::Compacted::Done);
  EXPECT_EQ(std::filesystem::file_size(ThumbnailDatabasePath({})), 60u + 28442u);
}

TEST_F(PictureChanges, OfFoldersMarkWhatWasInThem) {
  std::filesystem::rename(folder_.Path("p"), folder_.Path("r"));
  Mark("p", "r");
  EXPECT_THAT(Global(), ElementsAre("q/a.bmp"));
  EXPECT_THAT(Local("r"), IsEmpty());
  std::filesystem::remove_all(folder_.Path("q"));
  Mark("q");
  EXPECT_THAT(Global(), IsEmpty());
  EXPECT_FALSE(Exists("q")) << "no database is made to mark something in it";
}

TEST_F(PictureChanges, WaitForRecordsThatWereOnlyGathered) {
  Keep("p/new.bmp", ThumbnailDatabasePath({}));
  Mark("p/new.bmp");
  SharedThumbnailStore().Close();  // appends what is still gathered
  EXPECT_THAT(Global(), testing::Not(testing::Contains("p/new.bmp")));
}

// Without rights to write, everything stays, and nobody is kept waiting.
TEST_F(PictureChanges, LeaveADatabaseThatIsNone) {
  SharedThumbnailStore().Close();
  WriteText(ThumbnailDatabasePath({}), "a letter");
  Mark("p/a.bmp");
  EXPECT_EQ(ReadText(ThumbnailDatabasePath({})), "a letter");
  EXPECT_THAT(Local("p"), ElementsAre("p/b.bmp"));
}

TEST_F(PictureChanges, ThumbnailFilesFollowOrGo) {
  const auto move = [&](const std::string& from, const std::string& to) {
    std::filesystem::rename(folder_.Path(from), folder_.Path(to));
    FollowThumbnailFile(folder_.Path(from), folder_.Path(to));
  };
  PutThumbnail("p/a.bmp", 5);
  move("p/a.bmp", "q/z.bmp");
  EXPECT_TRUE(!Exists("p/a.THN") && Exists("q/z.THN"));
  move("q/z.bmp", "q/z.dib");  // the base name stays
  EXPECT_TRUE(Exists("q/z.THN"));
  // The new name has one that would pass for the picture's, so nobody knows whose is whose.
  PutThumbnail("p/b.bmp", 5);
  move("q/z.dib", "p/b.png");
  EXPECT_TRUE(!Exists("q/z.THN") && !Exists("p/b.THN"));
  // Left behind by a picture that another program deleted.
  PutThumbnail("p/gone.bmp", 4'000'000'000);
  move("p/b.bmp", "p/gone.bmp");
  EXPECT_FALSE(Exists("p/gone.THN"));
  // What merely has the name stays, as do links.
  WriteText(folder_.Path("p/gone.THN"), "my notes");
  move("p/gone.bmp", "p/a.bmp");
  EXPECT_EQ(ReadText(folder_.Path("p/gone.THN")), "my notes");
  DeleteThumbnailFile(folder_.Path("p/gone.bmp"));
  EXPECT_TRUE(Exists("p/gone.THN"));
  PutThumbnail("q/a.bmp", 5);
  std::filesystem::create_symlink(folder_.Path("q/a.THN"), folder_.Path("p/a.THN"));
  DeleteThumbnailFile(folder_.Path("p/a.bmp"));
  EXPECT_TRUE(Exists("p/a.THN") && Exists("q/a.THN"));
  PutThumbnail("q/a.bmp", -5);
  DeleteMisleadingThumbnailFile(folder_.Path("q/a.bmp"));
  EXPECT_TRUE(Exists("q/a.THN")) << "it is older than the picture, so it misleads nobody";
  DeleteThumbnailFile(folder_.Path("q/a.bmp"));
  EXPECT_FALSE(Exists("q/a.THN"));
  // Thumbnail files that are named themselves are nobody's thumbnail.
  PutThumbnail("q/mine.bmp", 5);
  move("q/mine.THN", "q/my own.THN");
  EXPECT_TRUE(Exists("q/my own.THN"));
  DeleteMisleadingThumbnailFile(folder_.Path("q/my own.THN"));
  DeleteThumbnailFile(folder_.Path("q/my own.THN"));
  EXPECT_TRUE(Exists("q/my own.THN"));
}

TEST_F(PictureChanges, TellWhichThumbnailFilesWentWithTheirPictures) {
  const PictureChange changes[] = {{folder_.Path("p/a.bmp"), folder_.Path("q/z.bmp")},
                                   {folder_.Path("p/b.bmp")}};
  const auto went = [&](const char* name) { return WentWithPicture(folder_.Path(name), changes); };
  EXPECT_TRUE(went("p/a.THN") && went("p/b.THN"));
  EXPECT_FALSE(went("p/c.THN") || went("p/a.bmp") || went("q/z.THN"));
  PutThumbnail("p/a.bmp", 5);
  EXPECT_FALSE(went("p/a.THN")) << "it is still there";
}

TEST_F(PictureChanges, AreKeptBesideAPathThatDoesNotFit) {
  Keep("p/new.bmp", ThumbnailDatabasePath({}));
  Keep("p/" + std::string(260, 'x') + ".bmp", ThumbnailDatabasePath({}));
  SharedThumbnailStore().Close();
  EXPECT_THAT(Global(), testing::Contains("p/new.bmp"));
}

}  // namespace
}  // namespace fotomill::test
