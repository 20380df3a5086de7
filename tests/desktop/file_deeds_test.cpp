#include "desktop/models/browser/file_deeds.h"

#include <gmock/gmock.h>

#include "catalog/thumbnails/thumbnail_file.h"
#include "core/data_folder.h"
#include "desktop/models/files/pasted_picture.h"
#include "desktop/models/files/previous_file.h"
#include "desktop/models/shell/favourites.h"
#include "desktop/models/shell/session.h"
#include "desktop/models/shell/tab_sets.h"
#include "desktop/models/thumbnails/thumbnail.h"
#include "platform/files.h"
#include "registry/registry.h"
#include "support/bitmaps.h"
#include "support/files.h"
#include "support/scoped_environment.h"

namespace fotomill::desktop {
namespace {

using test::ReadText;
using test::WriteText;
using testing::ElementsAre;
using testing::IsEmpty;

class FileDeedsTest : public testing::Test {
 protected:
  FileDeedsTest() : data_("XDG_DATA_HOME", folder_.Path("data")) {
    for (const char* name : {"from", "to", "from/sub"}) std::filesystem::create_directory(folder_.Path(name));
    for (const char* name : {"a.png", "b.png", "sub/c.png"}) WriteText(From(name), name);
  }
  std::string From(std::string_view name) const { return folder_.Path("from/" + std::string(name)); }
  std::string To(std::string_view name) const { return folder_.Path("to/" + std::string(name)); }
  std::vector<std::string> Names(const char* folder) const {
    std::vector<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(folder_.Path(folder))) names.push_back(entry.path().filename());
    std::sort(names.begin(), names.end());
    return names;
  }
  test::TemporaryFolder folder_;
  test::ScopedEnvironment data_;
};

TEST_F(FileDeedsTest, EveryDeedCanBeTakenBackAndDoneAgain) {
  for (const DeedKind kind : {DeedKind::Move, DeedKind::Copy, DeedKind::Trash}) {
    SCOPED_TRACE(static_cast<int>(kind));
    const DeedResult done = CarryOut(PlanDeed(kind, {From("a.png"), From("sub")}, folder_.Path("to")));
    ASSERT_THAT(done.failures, IsEmpty());
    EXPECT_EQ(Names("from").size(), kind == DeedKind::Copy ? 3u : 1u);
    EXPECT_EQ(Names("to").size(), kind == DeedKind::Trash ? 0u : 2u);
    const DeedResult undone = TakeBack(done.done);
    EXPECT_THAT(undone.failures, IsEmpty());
    EXPECT_THAT(Names("from"), ElementsAre("a.png", "b.png", "sub"));
    EXPECT_THAT(Names("to"), IsEmpty());
    EXPECT_EQ(ReadText(From("sub/c.png")), "sub/c.png");
    const DeedResult again = CarryOut(undone.done);
    EXPECT_THAT(again.failures, IsEmpty());
    EXPECT_THAT(TakeBack(again.done).failures, IsEmpty());
  }
}

TEST_F(FileDeedsTest, TurnsGiveTheFileBackAndTheirThumbnailsGo) {
  const std::string data = DataFolder();
  SetDataFolder(folder_.Path("data"));
  const std::string path = From("turned.bmp");
  test::WriteBytes(path, test::BitmapFile(9, 5, 24));
  const std::string old = ReadText(path);
  ASSERT_EQ(WriteThumbnail(path, {}), Status::Ok);
  DeedResult result = TurnOneFile(path, Orientation::QuarterRight);
  ASSERT_THAT(result.failures, IsEmpty());
  EXPECT_EQ(DeedName(result.done), "rotation of turned.bmp");
  EXPECT_FALSE(platform::FileExists(ThumbnailPathFor(path)));
  const std::string turned = ReadText(path);
  EXPECT_NE(turned, old);
  for (int round = 0; round < 2; ++round) {
    ASSERT_THAT(TakeBack(result.done).failures, IsEmpty());
    EXPECT_EQ(ReadText(path), old);
    ASSERT_THAT(CarryOut(result.done).failures, IsEmpty());
    EXPECT_EQ(ReadText(path), turned);
  }
  WriteText(path, "somebody's work");
  EXPECT_EQ(TakeBack(result.done).failures.size(), 1u);
  EXPECT_EQ(ReadText(path), "somebody's work");
  EXPECT_EQ(TurnOneFile(From("a.png"), Orientation::HalfTurn).failures.size(), 1u);  // no picture
  std::filesystem::create_symlink("turned.bmp", From("link.bmp"));
  test::WriteBytes(path, test::BitmapFile(9, 5, 24));
  EXPECT_EQ(TurnOneFile(From("link.bmp"), Orientation::HalfTurn).failures.size(), 1u);
  EXPECT_TRUE(std::filesystem::is_symlink(From("link.bmp")));
  // What comes after a batch has replaced a file, and before it ends, is somebody else's work as well.
  PreviousFiles batch;
  ASSERT_TRUE(batch.Keep(path) && batch.Keep(From("b.png")));
  WriteText(path, "turned");
  batch.Replaced(path);
  for (const std::string& file : {path, From("b.png")}) WriteText(file, "somebody's later work");
  const FileDeed deed = batch.Deed();
  EXPECT_EQ(deed.steps.size(), 1u);
  EXPECT_EQ(TakeBack(deed).failures.size(), 1u);
  EXPECT_EQ(ReadText(path), "somebody's later work");
  SetDataFolder(data);
}

TEST_F(FileDeedsTest, NothingIsEverReplaced) {
  WriteText(To("a.png"), "there");
  const FileDeed plan = PlanDeed(DeedKind::Copy, {From("a.png")}, folder_.Path("to"));
  EXPECT_EQ(plan.steps[0].to, To("a [1].png"));
  WriteText(To("a [1].png"), "came meanwhile");
  for (const DeedKind kind : {DeedKind::Move, DeedKind::Copy}) {
    const DeedResult result = CarryOut({kind, plan.steps});
    EXPECT_THAT(result.done.steps, IsEmpty());
    EXPECT_EQ(result.failures.at(0).reason, "A file of that name already exists.");
  }
  EXPECT_EQ(ReadText(To("a.png")) + ReadText(To("a [1].png")) + ReadText(From("a.png")), "therecame meanwhilea.png");
  // Undoing a move whose old name was given away leaves both files.
  const DeedResult moved = CarryOut(PlanDeed(DeedKind::Move, {From("b.png")}, folder_.Path("to")));
  WriteText(From("b.png"), "new");
  EXPECT_EQ(TakeBack(moved.done).failures.size(), 1u);
  EXPECT_EQ(ReadText(From("b.png")) + ReadText(To("b.png")), "newb.png");
  // A copy that was worked on stays as well.
  const DeedResult copied = CarryOut(PlanDeed(DeedKind::Copy, {From("sub/c.png")}, folder_.Path("to")));
  WriteText(To("c.png"), "was worked on");
  EXPECT_EQ(TakeBack(copied.done).failures.size(), 1u);
  EXPECT_EQ(ReadText(To("c.png")), "was worked on");
}

TEST_F(FileDeedsTest, AFolderDoesNotGoIntoItself) {
  for (const DeedKind kind : {DeedKind::Move, DeedKind::Copy}) {
    EXPECT_EQ(CarryOut(PlanDeed(kind, {From("sub")}, From("sub"))).failures.size(), 1u);
  }
  EXPECT_THAT(Names("from/sub"), ElementsAre("c.png"));
  // Links are deleted, never what they lead to.
  std::filesystem::create_directory_symlink(folder_.Path("to"), From("sub/link"));
  WriteText(To("kept"), "kept");
  EXPECT_THAT(DeleteForGood({From("sub")}).failures, IsEmpty());
  EXPECT_THAT(Names("from"), ElementsAre("a.png", "b.png"));
  EXPECT_EQ(ReadText(To("kept")), "kept");
}

TEST(UndoList, KeepsSoMany) {
  UndoList list(2);
  const auto deed = [](const char* name) { return FileDeed{DeedKind::Rename, {{name, "x"}}}; };
  for (const char* name : {"a", "b", "c"}) list.Add(deed(name));
  list.Add({});
  EXPECT_EQ(list.UndoName(), "rename of c");
  list.Undone(list.TakeUndo());
  EXPECT_EQ(list.RedoName(), "rename of c");
  list.Redone(list.TakeRedo());
  list.Undone(list.TakeUndo());
  list.Undone(list.TakeUndo());
  EXPECT_FALSE(list.CanUndo());
  list.Add(deed("d"));
  EXPECT_FALSE(list.CanRedo());
}

TEST(Favourites, AreKeptInOrderAndFollowRenames) {
  const test::TemporaryFolder folder;
  const std::string before = DataFolder();
  SetDataFolder(folder.Path());
  Favourites favourites;
  for (const char* added : {"/b", "/a/c", "/b", "/a b"}) EXPECT_TRUE(favourites.Add(added));
  EXPECT_FALSE(favourites.Add("/new\nline"));
  Favourites other;  // of another process
  EXPECT_TRUE(other.Remove("/b"));
  EXPECT_TRUE(favourites.FollowRename("/a", "/z"));
  EXPECT_FALSE(favourites.FollowRename("/q", "/z"));
  favourites.Load();
  EXPECT_EQ(favourites.Folders(), (std::vector<std::string>{"/z/c", "/a b"}));
  SetDataFolder(before);
}

TEST(TabSets, AreFilesOfTheDataFolder) {
  const test::TemporaryFolder folder;
  const std::string before = DataFolder();
  SetDataFolder(folder.Path());
  for (const char* file : {"b10.fmwtabset", "b2.fmwtabset", "other.txt"}) WriteText(folder.Path(file), "");
  EXPECT_THAT(TabSetNames(), ElementsAre("b2", "b10"));
  for (const char* name : {"", "a/b", ".hidden", "a\nb"}) EXPECT_EQ(TabSetFile(name), "") << name;
  EXPECT_TRUE(DeleteTabSet("b10"));
  EXPECT_FALSE(HasTabSet("b10"));
  EXPECT_FALSE(DeleteTabSet("a/b"));
  SetDataFolder(before);
}

TEST(FolderViews, AreKeptPerFolderTheLatestFirst) {
  const FolderView otherwise{{2, 3, 0}}, large{{0, 4, 2}, true};
  FolderViews views = FolderViews::Parse("1,5,0,/a,b\r\n9,0,0,/beyond\n1,5,0,\nnonsense\n");
  EXPECT_EQ(views.Find("/a,b", otherwise), (FolderView{{2, 1, 5}}));
  EXPECT_EQ(views.Find("/beyond", otherwise), otherwise);
  views.Keep("/new\nline", large);
  views.Keep("/c", large);
  views.Keep("/a,b", large);
  EXPECT_EQ(views.Text(), "4,2,1,/a,b\n4,2,1,/c\n");
  for (int i = 0; i < 499; ++i) views.Keep("/many" + std::to_string(i), otherwise);
  EXPECT_EQ(views.Find("/c", otherwise), otherwise);  // the oldest of 501
  EXPECT_EQ(views.Find("/a,b", otherwise), (FolderView{{2, 4, 2}, true}));
}

TEST_F(FileDeedsTest, APastedPictureTakesAFreeName) {
  PastedPicture pasted{FilledImage(2, 1, 0x332211), {255, 7}};
  for (const char* name : {"Picture from clipboard.png", "Picture from clipboard [1].png"}) {
    const DeedResult result = KeepPastedPicture(pasted, folder_.Path("to"));
    ASSERT_EQ(result.done.steps.size(), 1u);
    EXPECT_EQ(result.done.steps[0].to, To(name));
    PicturePointer picture;
    ASSERT_EQ(LoadPicture({.fileName = To(name)}, picture), Status::Ok);
    EXPECT_EQ(picture->image.PixelAt(1, 0), 0x112233u);  // red first
    EXPECT_EQ(picture->alpha.PixelAt(1, 0), 7u);
  }
  EXPECT_EQ(KeepPastedPicture(pasted, folder_.Path("none")).failures.size(), 1u);
}

TEST(Session, ComesBackAndForgivesOddLines) {
  Session session{900, 600, true, "Size:9", 1, {{"/a=b [Tab]", {{1, 4, 3}, true}, 1234, "x.png"}, {"/c", {}, 0, ""}}};
  EXPECT_EQ(ParseSession(SessionText(session)), session);
  session.tabs[1].folder = "/new\nline";
  EXPECT_EQ(ParseSession(SessionText(session)).tabs.size(), 1u);
  const Session odd = ParseSession(
      "Folder=/lost\r\n[Tab]\r\nFolder=/x\r\nScroll=-5\r\nViewMode=99999999999\r\nnonsense\r\n[Tab]\n[Frame]\nTab=-1");
  ASSERT_EQ(odd.tabs.size(), 1u);
  EXPECT_EQ(odd.tabs[0].folder, "/x");
  EXPECT_EQ(odd.tabs[0].scroll, 0);
  EXPECT_EQ(odd.tab, 0u);
}

}  // namespace
}  // namespace fotomill::desktop
