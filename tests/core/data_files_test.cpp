#include <gtest/gtest.h>

#include <filesystem>

#include "core/data_folder.h"
#include "platform/files.h"
#include "settings/folder_override.h"
#include "settings/history_list.h"
#include "settings/previous_version.h"
#include "settings/settings.h"
#include "support/faults.h"
#include "support/files.h"
#include "support/scoped_settings.h"

namespace fotomill {
namespace {

using namespace std::string_literals;
using test::TemporaryFolder;
using Texts = std::vector<std::string>;

TEST(FolderOverride, SetsItsModes) {
  const BrowserModes current{1, 2, 3};
  struct Row {
    const char* name;
    std::string text;
    BrowserModes modes;
  };
  const Row rows[] = {
      {"all three", "[Fotomill]\r\nThumbnailMode=3\r\nViewMode=4\r\nSortMode=5\r\n", {3, 4, 5}},
      {"one", "[Fotomill]\nViewMode= 0\n", {1, 0, 3}},
      {"none", "[Fotomill]\n", current},
      {"empty", "", current},
      {"other section", "[Other]\nViewMode=0\n", current},
      {"no numbers", "[Fotomill]\nThumbnailMode=\nViewMode=x\nSortMode=0x1\n", current},
      {"no modes", "[Fotomill]\nThumbnailMode=4\nViewMode=-1\nSortMode=99999999999\n", current},
      {"zero bytes", "[Fotomill]\nViewMode=\0004\n\0SortMode=1\n"s, current},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    EXPECT_EQ(ModesInOverride(row.text, current), row.modes);
  }
}

TEST(FolderOverride, AppliesOnlyIfEnabled) {
  const test::ScopedSettings saved;
  const TemporaryFolder folder;
  const BrowserModes current{1, 2, 3};
  EXPECT_EQ(ModesForFolder(folder.Path(), current), current) << "no file";
  test::WriteText(folder.Path("fmwpro.override"), "[Fotomill]\nSortMode=0\n");
  EXPECT_EQ(ModesForFolder(folder.Path(), current), (BrowserModes{1, 2, 0}));
  settings.UseFolderOverrides = 0;
  EXPECT_EQ(ModesForFolder(folder.Path(), current), current);
}

class DataFilesTest : public testing::Test {
 protected:
  DataFilesTest() { SetDataFolder(folder_.Path("data")); }
  ~DataFilesTest() override { SetDataFolder({}); }
  static std::string Text(std::string_view name) { return test::ReadText(DataFile(name)); }

  test::ScopedSettings settings_;
  TemporaryFolder folder_;
};

TEST_F(DataFilesTest, HistoryListsTheLatestFirst) {
  settings.CopyHistoryMax = 3;
  EXPECT_EQ(LoadHistoryList(HistoryList::MoveCopy), Texts{});
  for (const char* entry : {"/a", "/b", "~~~DEFAULT~~~", "/b", "/c"}) {
    EXPECT_TRUE(AddToHistoryList(HistoryList::MoveCopy, entry));
  }
  EXPECT_EQ(LoadHistoryList(HistoryList::MoveCopy), (Texts{"/c", "/b", std::string(kDefaultEntry), "/a"}));
  EXPECT_EQ(Text("FMWMoveCopyHistory.txt"), "/c\n/b\n~~~DEFAULT~~~\n/a\n");
  EXPECT_EQ(LoadHistoryList(HistoryList::Tabs), Texts{}) << "each list has its own file";
  for (const std::string& entry : {""s, "a\nb"s, "a\r"s, "a\0b"s, std::string(261, 'x')}) {
    EXPECT_FALSE(AddToHistoryList(HistoryList::MoveCopy, entry));
  }
  EXPECT_TRUE(RemoveFromHistoryList(HistoryList::MoveCopy, "/b"));
  EXPECT_TRUE(RemoveFromHistoryList(HistoryList::MoveCopy, "/b"));
  settings.CopyHistoryMax = 1;
  EXPECT_EQ(LoadHistoryList(HistoryList::MoveCopy), (Texts{"/c", std::string(kDefaultEntry)}));
  EXPECT_EQ(Text("FMWMoveCopyHistory.txt"), "/c\n~~~DEFAULT~~~\n/a\n");
  settings.CopyHistoryMax = -5;
  EXPECT_TRUE(AddToHistoryList(HistoryList::MoveCopy, "/d"));
  EXPECT_EQ(Text("FMWMoveCopyHistory.txt"), "~~~DEFAULT~~~\n");
  EXPECT_TRUE(ClearHistoryList(HistoryList::Tabs));
}

TEST_F(DataFilesTest, DefaultEntryIsNeverPushedOutAndOfferedAsTheBuiltInChoice) {
  settings.EditListMaximum = 2;
  for (const char* entry : {"one", "~~~DEFAULT~~~", "two", "three", "four"})
    EXPECT_TRUE(AddToHistoryList(HistoryList::RenameBases, entry));
  EXPECT_EQ(Text("FMWRenameHistory.txt"), "four\nthree\n~~~DEFAULT~~~\n");
  EXPECT_EQ(ParseHistoryList("1\n2\n3\n~~~DEFAULT~~~\n~~~DEFAULT~~~\n4\n", 2),
            (Texts{"1", "2", std::string(kDefaultEntry)}));
  EXPECT_EQ(ParseRecentFiles("~~~DEFAULT~~~,0\n/a,1\n/b,2\n", 1),
            (std::vector<RecentFile>{{std::string(kDefaultEntry), 0}, {"/a", 1}}));

  EXPECT_EQ(OfferedEntries(HistoryList::RenameBases, "PICTURE"),
            (Texts{"four", "three", "PICTURE"}));
  EXPECT_EQ(OfferedEntries(HistoryList::RenameBases, "three"), (Texts{"four", "three"}));
  EXPECT_EQ(OfferedEntries(HistoryList::RenameBases, ""), (Texts{"four", "three"}));
  EXPECT_EQ(OfferedEntries(HistoryList::Destination, "/here"), Texts{"/here"}) << "without a list";
  EXPECT_TRUE(AddChoice(HistoryList::RenameBases, "PICTURE", "PICTURE"));
  EXPECT_TRUE(AddChoice(HistoryList::RenameBases, "three", "PICTURE"));
  EXPECT_EQ(Text("FMWRenameHistory.txt"), "three\n~~~DEFAULT~~~\nfour\n");
}

TEST_F(DataFilesTest, ReadsDamagedHistories) {
  const std::string longest(260, 'x');
  EXPECT_EQ(ParseHistoryList("\r\n/a\r\n\n/b\n/a\n" + longest + "\n" + longest + "y\nz\0\nlast"s, 10),
            (Texts{"/a", "/b", longest, "last"}));
  EXPECT_EQ(ParseHistoryList("1\n2\n3\n", 2), (Texts{"1", "2"}));
  EXPECT_EQ(ParseRecentFiles("/a,1\n/b,c,2\r\n/a,9\nnone\n,4\n/d,x\n/e,-3 \n/f,99999999999\n", 10),
            (std::vector<RecentFile>{{"/a", 1}, {"/b,c", 2}, {"/e", -3}}));
}

TEST_F(DataFilesTest, RecentFilesRoundTrip) {
  const std::vector<RecentFile> files{{"/pictures/a, b,c", 2}, {"/x\ty,", -1}};
  for (auto file = files.rbegin(); file != files.rend(); ++file) EXPECT_TRUE(AddRecentFile(*file));
  EXPECT_EQ(LoadRecentFiles(), files);
  EXPECT_EQ(Text("FileMenuHistory.txt"), "/pictures/a, b,c,2\n/x\ty,,-1\n");
  EXPECT_TRUE(AddRecentFile({"/x\ty,", 7}));
  EXPECT_EQ(Text("FileMenuHistory.txt"), "/x\ty,,7\n/pictures/a, b,c,2\n");
  EXPECT_FALSE(AddRecentFile({"/two\nlines", 1}));
}

TEST_F(DataFilesTest, NoFaultHarmsAHistory) {
  EXPECT_TRUE(AddToHistoryList(HistoryList::Tabs, "/old"));
  test::ForEachFault([&] {
    const bool done = AddToHistoryList(HistoryList::Tabs, "/new");
    const int64_t countdown = platform::faultCountdown.exchange(0);
    EXPECT_EQ(Text("FMWTabHistory.txt"), done ? "/new\n/old\n" : "/old\n");
    EXPECT_TRUE(RemoveFromHistoryList(HistoryList::Tabs, "/new"));
    platform::faultCountdown = countdown;
  });
  EXPECT_EQ(platform::ListFolder(DataFolder())->size(), 1u);
}

TEST_F(DataFilesTest, CarriesOverThePreviousVersionOnce) {
  const std::string previous = folder_.Path("previous");
  ASSERT_TRUE(platform::MakeFolders(previous + "/folder.txt"));
  const Texts carried{"FMWFileHistoryDatabase.fhdb",
                      "Fotomill Professional 10.ini",
                      "Fotomill.tdb",
                      "My Tabs.browser",
                      "fmwpro.ccl",
                      "notes.TXT",
                      "x.list"};
  const Texts left{"Fotomill Professional 11.ini", "Other.tdb", "list", "picture.jpg", "txt"};
  for (const Texts& names : {carried, left}) {
    for (const std::string& name : names) test::WriteText(previous + "/" + name, "old " + name);
  }
  test::WriteBytes(previous + "/Fotomill.tdb", std::vector<uint8_t>(3'000'000, 7));
  ASSERT_TRUE(platform::MakeFolders(DataFolder()));
  test::WriteText(DataFile("x.list"), "new");

  CarryOver result = CarryOverDataFolder(previous, DataFolder());
  EXPECT_EQ(result.copied.size(), carried.size() - 1);
  EXPECT_EQ(result.kept, Texts{"x.list"});
  EXPECT_EQ(result.failed, Texts{});
  EXPECT_EQ(platform::ListFolder(DataFolder())->size(), carried.size());
  EXPECT_EQ(Text("Fotomill Professional 11.ini"), "old Fotomill Professional 10.ini");
  EXPECT_EQ(Text("x.list"), "new");
  EXPECT_EQ(test::ReadBytes(DataFile("Fotomill.tdb")), std::vector<uint8_t>(3'000'000, 7));

  result = CarryOverDataFolder(previous, DataFolder());
  EXPECT_EQ(result.kept, carried);
  EXPECT_TRUE(CarryOverDataFolder(previous, folder_.Path()).failed.empty());
  EXPECT_TRUE(CarryOverDataFolder(folder_.Path("nowhere"), folder_.Path("never")).copied.empty());
  EXPECT_FALSE(platform::FileExists(folder_.Path("never")));
}

TEST_F(DataFilesTest, FirstStartTakesThePreviousVersionsSettingsOnce) {
  EXPECT_FALSE(CarryOverAtFirstStart()) << "no data folder";
  ASSERT_TRUE(platform::MakeFolders(DataFolder()));
  test::WriteText(DataFile("Fotomill.tdb"), "store");
  EXPECT_FALSE(CarryOverAtFirstStart()) << "no older version";
  test::WriteText(DataFile("Fotomill Professional 10.ini"), "[Fotomill]\nJpegCompression=33\n");
  const auto carried = CarryOverAtFirstStart();
  ASSERT_TRUE(carried);
  EXPECT_EQ(carried->copied, Texts{"Fotomill Professional 10.ini"});
  EXPECT_EQ(CarryOverText(*carried),
            "First start of this version: the settings were copied from \"Fotomill Professional "
            "10.ini\".");
  EXPECT_EQ(Text("Fotomill Professional 11.ini"), "[Fotomill]\nJpegCompression=33\n");
  EXPECT_EQ(Text("Fotomill.tdb"), "store");
  test::WriteText(DataFile("Fotomill Professional 10.ini"), "[Fotomill]\nJpegCompression=44\n");
  EXPECT_FALSE(CarryOverAtFirstStart()) << "once";
  EXPECT_EQ(Text("Fotomill Professional 11.ini"), "[Fotomill]\nJpegCompression=33\n");

  CarryOver failed;
  failed.failed = {"Fotomill Professional 10.ini"};
  EXPECT_NE(CarryOverText(failed).find("could not be copied"), std::string::npos);
}

TEST_F(DataFilesTest, AFirstStartThatCopiesNothingDoesNotSayThatItDid) {
  ASSERT_TRUE(platform::MakeFolders(DataFolder()));
  test::WriteText(DataFile("Fotomill Professional 10.ini"), "[Fotomill]\n");
  const std::string current = DataFile("Fotomill Professional 11.ini");
  // a name that is taken, though not by a file that can be read
  std::filesystem::create_symlink("nowhere", current);
  EXPECT_FALSE(CarryOverAtFirstStart());
  std::filesystem::remove(current);
  const int64_t faults = test::ForEachFault([&] {
    const auto carried = CarryOverAtFirstStart();
    const int64_t countdown = platform::faultCountdown.exchange(0);
    const bool copied = platform::FileExists(current);
    if (carried) {
      EXPECT_EQ(CarryOverText(*carried).find("could not be copied") == std::string::npos, copied);
    }
    std::filesystem::remove(current);
    platform::faultCountdown = countdown;
  });
  EXPECT_GT(faults, 1);
}

TEST_F(DataFilesTest, CarryOverIsAtomic) {
  const std::string previous = folder_.Path("previous");
  ASSERT_TRUE(platform::MakeFolders(previous));
  test::WriteText(previous + "/a.txt", "whole");
  test::ForEachFault([&] {
    const CarryOver result = CarryOverDataFolder(previous, DataFolder());
    const int64_t countdown = platform::faultCountdown.exchange(0);
    EXPECT_EQ(platform::FileExists(DataFile("a.txt")), result.copied == Texts{"a.txt"});
    if (platform::FileExists(DataFile("a.txt"))) {
      EXPECT_EQ(Text("a.txt"), "whole");
      EXPECT_TRUE(platform::DeleteFile(DataFile("a.txt")));
    }
    platform::faultCountdown = countdown;
  });
}

}  // namespace
}  // namespace fotomill
