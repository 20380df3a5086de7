#include "desktop/models/files/turn_one_file.h"

#include <gmock/gmock.h>

#include <algorithm>
#include <atomic>
#include <future>
#include <map>

#include "catalog/thumbnails/thumbnail_file.h"
#include "core/data_folder.h"
#include "desktop/models/files/open_wildcard.h"
#include "desktop/models/files/operation_options.h"
#include "desktop/models/files/pasted_picture.h"
#include "desktop/models/shell/favorites.h"
#include "desktop/models/shell/session.h"
#include "desktop/models/shell/tab_sets.h"
#include "desktop/models/thumbnails/thumbnail.h"
#include "desktop/models/thumbnails/thumbnail_offer.h"
#include "files/previous_file.h"
#include "platform/files.h"
#include "registry/registry.h"
#include "settings/settings.h"
#include "support/bitmaps.h"
#include "support/files.h"
#include "support/scoped_environment.h"
#include "support/scoped_settings.h"

namespace fotomill::desktop {
namespace {

using test::ReadText;
using test::WriteText;
using testing::ElementsAre;
using testing::IsEmpty;

class DesktopFilesTest : public testing::Test {
 protected:
  DesktopFilesTest() : data_("XDG_DATA_HOME", folder_.Path("data")) {
    for (const char* name : {"from", "to", "from/sub"})
      std::filesystem::create_directory(folder_.Path(name));
    for (const char* name : {"a.png", "b.png", "sub/c.png"}) WriteText(From(name), name);
  }
  std::string From(std::string_view name) const {
    return folder_.Path("from/" + std::string(name));
  }
  std::string To(std::string_view name) const { return folder_.Path("to/" + std::string(name)); }
  test::TemporaryFolder folder_;
  test::ScopedEnvironment data_;
};

TEST_F(DesktopFilesTest, RotationsAreUndoneAndTheirThumbnailsRemoved) {
  const std::string data = DataFolder();
  SetDataFolder(folder_.Path("data"));
  const std::string path = From("turned.bmp");
  test::WriteBytes(path, test::BitmapFile(9, 5, 24));
  const std::string old = ReadText(path);
  ASSERT_EQ(WriteThumbnail(path, {}), Status::Ok);
  FileOperationResult result = TurnOneFile(path, Orientation::QuarterRight);
  ASSERT_THAT(result.failures, IsEmpty());
  EXPECT_EQ(FileOperationName(result.done), "rotation of turned.bmp");
  EXPECT_FALSE(platform::FileExists(ThumbnailPathFor(path)));
  const std::string turned = ReadText(path);
  EXPECT_NE(turned, old);
  ASSERT_EQ(WriteThumbnail(path, {}), Status::Ok);  // younger than what comes back
  for (int round = 0; round < 2; ++round) {
    ASSERT_THAT(Revert(result.done).failures, IsEmpty());
    EXPECT_EQ(ReadText(path), old);
    EXPECT_FALSE(platform::FileExists(ThumbnailPathFor(path)));
    ASSERT_THAT(CarryOut(result.done).failures, IsEmpty());
    EXPECT_EQ(ReadText(path), turned);
  }
  WriteText(path, "somebody's work");
  EXPECT_EQ(Revert(result.done).failures.size(), 1u);
  EXPECT_EQ(ReadText(path), "somebody's work");
  EXPECT_EQ(TurnOneFile(From("a.png"), Orientation::HalfTurn).failures.size(), 1u);  // no picture
  std::filesystem::create_symlink("turned.bmp", From("link.bmp"));
  test::WriteBytes(path, test::BitmapFile(9, 5, 24));
  EXPECT_EQ(TurnOneFile(From("link.bmp"), Orientation::HalfTurn).failures.size(), 1u);
  EXPECT_TRUE(std::filesystem::is_symlink(From("link.bmp")));
  // Files that replace outputs of a batch before it ends are someone else's work, too.
  PreviousFiles batch;
  ASSERT_TRUE(batch.Keep(path) && batch.Keep(From("b.png")));
  WriteText(path, "turned");
  batch.Replaced(path);
  for (const std::string& file : {path, From("b.png")}) WriteText(file, "somebody's later work");
  const FileOperation operation = batch.Operation();
  EXPECT_EQ(operation.steps.size(), 1u);
  EXPECT_EQ(Revert(operation).failures.size(), 1u);
  EXPECT_EQ(ReadText(path), "somebody's later work");
  SetDataFolder(data);
}

TEST_F(DesktopFilesTest, PastedPicturesGetAFreeName) {
  PastedPicture pasted{FilledImage(2, 1, 0x332211), {255, 7}};
  for (const char* name : {"Picture from clipboard.png", "Picture from clipboard [1].png"}) {
    const FileOperationResult result = KeepPastedPicture(pasted, folder_.Path("to"));
    ASSERT_EQ(result.done.steps.size(), 1u);
    EXPECT_EQ(result.done.steps[0].to, To(name));
    PicturePointer picture;
    ASSERT_EQ(LoadPicture({.fileName = To(name)}, picture), Status::Ok);
    EXPECT_EQ(picture->image.PixelAt(1, 0), 0x112233u);  // red first
    EXPECT_EQ(picture->alpha.PixelAt(1, 0), 7u);
  }
  EXPECT_EQ(KeepPastedPicture(pasted, folder_.Path("none")).failures.size(), 1u);
}

TEST(Favorites, AreKeptInOrderAndFollowRenames) {
  const test::TemporaryFolder folder;
  const std::string before = DataFolder();
  SetDataFolder(folder.Path());
  Favorites favorites;
  for (const char* added : {"/b", "/a/c", "/b", "/a b"}) EXPECT_TRUE(favorites.Add(added));
  EXPECT_FALSE(favorites.Add("/new\nline"));
  Favorites other;  // in another process
  EXPECT_TRUE(other.Remove("/b"));
  EXPECT_TRUE(favorites.FollowRename("/a", "/z"));
  EXPECT_FALSE(favorites.FollowRename("/q", "/z"));
  favorites.Load();
  EXPECT_EQ(favorites.Folders(), (std::vector<std::string>{"/z/c", "/a b"}));
  SetDataFolder(before);
}

TEST(TabSets, AreStoredInTheDataFolder) {
  const test::TemporaryFolder folder;
  const std::string before = DataFolder();
  SetDataFolder(folder.Path());
  for (const char* file : {"b10.fmwtabset", "b2.fmwtabset", "other.txt"})
    WriteText(folder.Path(file), "");
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

// What an offer tells is called apart; the test waits for its end.
TEST(ThumbnailOffer, TellsHowFarItIsAndTakesAnEarlyAnswer) {
  const test::TemporaryFolder folder;
  ThumbnailBrowser browser;
  browser.folder = folder.Path();
  for (const char* name : {"a.bmp", "b.bmp"}) {
    test::WriteBytes(folder.Path(name), test::BitmapFile(3, 3, 24));
    browser.files.emplace_back(name);
  }
  for (const bool early : {false, true}) {
    SCOPED_TRACE(early);
    std::atomic<int> scanned = 0, asked = 0;
    std::promise<bool> ended;
    std::promise<std::shared_ptr<ThumbnailOffer>> started;
    const auto offer = started.get_future().share();
    ThumbnailOffer::Events events;
    events.scanning = [&](const std::string& text, size_t done, size_t total) {
      scanned += text == "Scanning " + browser.folder && done <= total && total == 2;
      if (early) offer.get()->Answer(0);
    };
    events.ask = [&](int32_t count, int32_t) {
      asked += count;
      offer.get()->Answer(kUpdateLater);
    };
    events.keep = [](const ThumbnailUpdateOptions&) {};
    events.building = [](size_t, size_t) {};
    events.ended = [&](bool changed) { ended.set_value(changed); };
    started.set_value(ThumbnailOffer::Start(browser, events, 0));
    EXPECT_FALSE(ended.get_future().get());
    EXPECT_GE(scanned, 1);
    EXPECT_EQ(asked, early ? 0 : 2);
  }
}

TEST(Session, RoundTripsAndIgnoresInvalidLines) {
  Session session{
      900,      600, true,
      "Size:9", 1,   {{"/a=b [Tab]", {{1, 4, 3}, true}, 1234, "x.png", false}, {"/c", {}, 0, ""}}};
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

TEST(OpenWildcard, HasAllPicturesFirstAndExtensionsInBothCases) {
  const std::string wildcard = OpenWildcard();
  EXPECT_TRUE(wildcard.starts_with("All pictures|*.AVI;*.BGA;*.BMP;")) << wildcard;
  EXPECT_NE(wildcard.find("|(BMP) Windows bitmap|*.BMP;*.bmp|"), std::string::npos);
  EXPECT_EQ(std::ranges::count(wildcard, '|'),
            static_cast<ptrdiff_t>(2 * OpenFileFilter().size() - 1));
}

TEST(OpenWildcard, BeginsWithAFilterThatIsThere) {
  const test::ScopedSettings keep;
  const auto count = static_cast<int32_t>(OpenFileFilter().size());
  for (const auto& [kept, first] : std::map<int32_t, int>{
           {-1, 0}, {0, 0}, {count - 1, count - 1}, {count, 0}, {INT32_MAX, 0}}) {
    settings.OpenFilterIndex = kept;
    EXPECT_EQ(FirstOpenFilter(), first) << kept;
  }
}

TEST(OperationOptions, DuplicatesHaveThePrefixAsItIsSet) {
  const test::ScopedSettings keep;
  settings.PrefixDuplicate = std::string_view("Copy_of_");
  EXPECT_EQ(FileOperationOptionsFromSettings().duplicatePrefix, "Copy_of_");
  settings.FilenameUnderbars = 0;
  EXPECT_EQ(FileOperationOptionsFromSettings().duplicatePrefix, "Copy of ");
}

}  // namespace
}  // namespace fotomill::desktop
