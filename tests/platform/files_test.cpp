#include "platform/files.h"

#include <gmock/gmock.h>
#include <sys/stat.h>
#include <sys/time.h>
#include <unistd.h>

#include <thread>

#include "platform/paths.h"
#include "platform/posix/handle.h"
#include "support/faults.h"
#include "support/files.h"

namespace fotomill::platform {
namespace {

namespace fs = std::filesystem;
using test::ReadText;
using test::TemporaryFolder;
using test::WriteText;
using testing::ElementsAre;

TEST(Paths, SplitAndJoin) {
  const struct {
    const char *path, *folder, *base, *extension;
  } rows[] = {
      {"", "", "", ""},
      {"a", "", "a", ""},
      {"a.b", "", "a", ".b"},
      {"a.b.c", "", "a.b", ".c"},
      {"a.", "", "a", "."},
      {".hidden", "", "", ".hidden"},
      {"/", "/", "", ""},
      {"/a", "/", "a", ""},
      {"x.y/a", "x.y/", "a", ""},
      {"x.y/", "x.y/", "", ""},
      {"../a.PCX", "../", "a", ".PCX"},
      {"a\\b:c.bmp", "", "a\\b:c", ".bmp"},
      {"/n\nl/-\".\xFF", "/n\nl/", "-\"", ".\xFF"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.path);
    const PathParts parts = SplitPath(row.path);
    EXPECT_EQ(parts.drive, "");
    EXPECT_EQ(parts.folder, row.folder);
    EXPECT_EQ(parts.base, row.base);
    EXPECT_EQ(parts.extension, row.extension);
    EXPECT_EQ(JoinPath(parts), row.path);
  }
  EXPECT_EQ(JoinFolder("", "n"), "n");
  EXPECT_EQ(JoinFolder("f", "n"), "f/n");
  EXPECT_EQ(JoinFolder("/", "n"), "/n");
}

// A folder with one entry of each kind.
class FilesTest : public testing::Test {
 protected:
  FilesTest() {
    WriteText(Path("regular"), "12345");
    EXPECT_TRUE(MakeFolders(Path("folder")));
    EXPECT_EQ(mkfifo(Path("fifo").c_str(), 0600), 0);
    fs::create_symlink("regular", Path("to regular"));
    fs::create_symlink("folder", Path("to folder"));
    fs::create_symlink("nothing", Path("to nothing"));
    fs::create_symlink("circle", Path("circle"));
  }
  std::string Path(std::string_view name) const { return folder_.Path(name); }
  TemporaryFolder folder_;
};

TEST_F(FilesTest, KindsOfEverything) {
  const struct {
    const char* name;
    FileKind kind;
    bool link, exists;
  } rows[] = {
      {"regular", FileKind::Regular, false, true},    {"folder", FileKind::Folder, false, true},
      {"fifo", FileKind::Other, false, true},         {"to regular", FileKind::Regular, true, true},
      {"to folder", FileKind::Folder, true, true},    {"to nothing", FileKind::Other, true, true},
      {"circle", FileKind::Other, true, true},        {"nothing", FileKind::Missing, false, false},
      {"regular/x", FileKind::Missing, false, false}, {"none/x", FileKind::Missing, false, false},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const FileFacts facts = FactsOf(Path(row.name));
    EXPECT_EQ(facts.kind, row.kind);
    EXPECT_EQ(facts.link, row.link);
    EXPECT_EQ(FileExists(Path(row.name)), row.exists);
    EXPECT_EQ(IsRegularFile(Path(row.name)), row.kind == FileKind::Regular);
    EXPECT_EQ(IsFolder(Path(row.name)), row.kind == FileKind::Folder);
  }
  EXPECT_EQ(FactsOf(Path(std::string(300, 'x'))).kind, FileKind::Missing);
  EXPECT_EQ(FactsOf("").kind, FileKind::Missing);

  const std::vector<FolderEntry> entries = ListFolder(Path("")).value();
  size_t listed = 0;
  for (const auto& row : rows) {
    for (const FolderEntry& entry : entries) {
      if (entry.name != row.name) continue;
      ++listed;
      EXPECT_EQ(entry.kind, row.kind) << row.name;
      EXPECT_EQ(entry.link, row.link) << row.name;
    }
  }
  EXPECT_EQ(listed, entries.size());
  EXPECT_EQ(listed, 7u);
}

TEST_F(FilesTest, FactsHaveSizeTimesAndIdentity) {
  const timeval times[2] = {{5, 0}, {1'000'000'000, 0}};
  ASSERT_EQ(utimes(Path("regular").c_str(), times), 0);
  const FileFacts facts = FactsOf(Path("to regular"));
  EXPECT_EQ(facts.size, 5u);
  EXPECT_EQ(facts.modified, 1'000'000'000);
  EXPECT_GE(facts.created, 1'000'000'000);  // birth time, or modification time if there is none
  EXPECT_EQ(facts.identity, FactsOf(Path("regular")).identity);
  EXPECT_NE(facts.identity, FactsOf(Path("folder")).identity);
}

TEST(Files, ListingKeepsAnyNameInByteOrder) {
  const TemporaryFolder folder;
  const std::vector<std::string> names = {"\nnew line", " blank",  "\"quoted\"", "--help",
                                          ".hidden",    "B",       "a",          "a\\b",
                                          "\xC3\xA9",   "\xFF\xFE"};
  for (const std::string& name : names) WriteText(folder.Path(name), "");
  std::vector<std::string> listed;
  const std::vector<FolderEntry> entries = ListFolder(folder.Path()).value();
  for (const FolderEntry& entry : entries) listed.push_back(entry.name);
  EXPECT_EQ(listed, names);
  EXPECT_FALSE(ListFolder(folder.Path("a")));
  EXPECT_FALSE(ListFolder(folder.Path("missing")));
  EXPECT_GT(test::ForEachFault([&] {
              const auto again = ListFolder(folder.Path());
              EXPECT_TRUE(!again || again->size() == names.size());
            }),
            10);
}

TEST_F(FilesTest, CreatesFoldersWithTheirParents) {
  EXPECT_TRUE(MakeFolders(Path("a/b//c/")));
  EXPECT_TRUE(IsFolder(Path("a/b/c")));
  EXPECT_TRUE(MakeFolders(Path("a/b")));
  EXPECT_TRUE(MakeFolders(Path("to folder/x")));
  EXPECT_TRUE(IsFolder(Path("folder/x")));
  for (const char* name : {"regular", "regular/x", "to nothing", "fifo/x"})
    EXPECT_FALSE(MakeFolders(Path(name))) << name;
  EXPECT_FALSE(MakeFolders(""));
}

TEST_F(FilesTest, DeletesFilesAndLinksNeverFolders) {
  for (const char* name : {"folder", "nothing", "regular/x"})
    EXPECT_FALSE(DeleteFile(Path(name))) << name;
  for (const char* name : {"to folder", "to nothing", "to regular", "fifo", "circle"})
    EXPECT_TRUE(DeleteFile(Path(name))) << name;
  EXPECT_THAT(folder_.Names(), ElementsAre("folder", "regular"));
}

constexpr RefusingRename allWays[] = {RefusingRename::Directly, RefusingRename::ByLink,
                                      RefusingRename::ByPlaceholder};

TEST_F(FilesTest, Renames) {
  WriteText(Path("new"), "new");
  for (const RefusingRename way : allWays) {
    SCOPED_TRACE(static_cast<int>(way));
    refusingRename = way;
    for (const char* taken : {"regular", "folder", "fifo", "to nothing", "to regular"}) {
      EXPECT_EQ(RenameFile(Path("new"), Path(taken), Existing::Refuse), CommitResult::Taken) << taken;
    }
    EXPECT_EQ(RenameFile(Path("new"), Path("none/x"), Existing::Refuse), CommitResult::Failed);
    EXPECT_EQ(RenameFile(Path("missing"), Path("free"), Existing::Refuse), CommitResult::Failed);
    EXPECT_FALSE(FileExists(Path("free")));
    EXPECT_EQ(RenameFile(Path("new"), Path("free"), Existing::Refuse), CommitResult::Done);
    EXPECT_FALSE(FileExists(Path("new")));
    EXPECT_EQ(RenameFile(Path("free"), Path("new"), Existing::Refuse), CommitResult::Done);
    EXPECT_EQ(ReadText(Path("new")), "new");
  }
  refusingRename = RefusingRename::Directly;
  EXPECT_EQ(RenameFile(Path("folder"), Path("free"), Existing::Refuse), CommitResult::Done);
  EXPECT_EQ(RenameFile(Path("free"), Path("folder"), Existing::Refuse), CommitResult::Done);
  for (const char* other : {"folder", "fifo", "none/x"}) {
    EXPECT_EQ(RenameFile(Path("new"), Path(other), Existing::Replace), CommitResult::Failed) << other;
  }
  EXPECT_EQ(RenameFile(Path("missing"), Path("regular"), Existing::Replace), CommitResult::Failed);
  EXPECT_EQ(ReadText(Path("regular")), "12345");
  EXPECT_EQ(RenameFile(Path("new"), Path("to regular"), Existing::Replace), CommitResult::Done);
  EXPECT_FALSE(FactsOf(Path("to regular")).link);
  EXPECT_EQ(ReadText(Path("regular")), "12345");
  EXPECT_EQ(RenameFile(Path("to regular"), Path("free"), Existing::Refuse), CommitResult::Done);
  EXPECT_EQ(RenameFile(Path("free"), Path("regular"), Existing::Replace), CommitResult::Done);
  EXPECT_EQ(ReadText(Path("regular")), "new");
}

TEST(Files, OneWinsARaceForAName) {
  const TemporaryFolder folder;
  constexpr int kRunners = 4, kRounds = 60;
  for (int round = 0; round < kRounds; ++round) {
    refusingRename = allWays[round % 3];
    for (int i = 0; i < kRunners; ++i) WriteText(folder.Path(std::to_string(i)), std::to_string(i));
    CommitResult results[kRunners];
    std::vector<std::thread> runners;
    for (int i = 0; i < kRunners; ++i) {
      runners.emplace_back([&, i] {
        results[i] =
            RenameFile(folder.Path(std::to_string(i)), folder.Path("name"), Existing::Refuse);
      });
    }
    for (std::thread& runner : runners) runner.join();
    EXPECT_EQ(std::count(results, results + kRunners, CommitResult::Done), 1);
    EXPECT_EQ(std::count(results, results + kRunners, CommitResult::Taken), kRunners - 1);
    const int winner =
        static_cast<int>(std::find(results, results + kRunners, CommitResult::Done) - results);
    EXPECT_EQ(ReadText(folder.Path("name")), std::to_string(winner));
    EXPECT_EQ(folder.Names().size(), static_cast<size_t>(kRunners));  // the others keep their files
    ASSERT_TRUE(DeleteFile(folder.Path("name")));
  }
  refusingRename = RefusingRename::Directly;
}

TEST_F(FilesTest, AttributesAndTimes) {
  EXPECT_TRUE(IsHidden("/a/.b"));
  EXPECT_FALSE(IsHidden("/.a/b"));
  EXPECT_TRUE(SetHidden(Path("regular"), true));
  EXPECT_FALSE(IsHidden(Path("regular")));
  ASSERT_EQ(chmod(Path("regular").c_str(), 0440), 0);
  EXPECT_TRUE(SetNormal(Path("regular")));
  EXPECT_EQ(fs::status(Path("regular")).permissions(), static_cast<fs::perms>(0640));
  EXPECT_FALSE(SetNormal(Path("nothing")));

  WriteText(Path("copy"), "x");
  const timeval times[2] = {{5, 0}, {1'234'567'890, 250'000}};
  ASSERT_EQ(utimes(Path("regular").c_str(), times), 0);
  EXPECT_TRUE(CopyTimes(Path("regular"), Path("copy")));
  EXPECT_EQ(fs::last_write_time(Path("copy")), fs::last_write_time(Path("regular")));
  EXPECT_FALSE(CopyTimes(Path("nothing"), Path("copy")));
  EXPECT_FALSE(CopyTimes(Path("regular"), Path("nothing")));
}

TEST_F(FilesTest, ReadsWholeSmallFiles) {
  const struct {
    const char* name;
    uint64_t most;
    ReadResult result;
  } rows[] = {
      {"regular", 5, ReadResult::Done},      {"regular", 4, ReadResult::TooLarge}, {"regular", UINT64_MAX, ReadResult::Done},
      {"to regular", 9, ReadResult::Done},   {"nothing", 9, ReadResult::Missing},  {"none/x", 9, ReadResult::Missing},
      {"to nothing", 9, ReadResult::Failed}, {"folder", 9, ReadResult::Failed},    {"fifo", 9, ReadResult::Failed},
      {"circle", 9, ReadResult::Failed},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    std::string contents = "old";
    EXPECT_EQ(ReadWholeFile(Path(row.name), row.most, contents), row.result);
    EXPECT_EQ(contents, row.result == ReadResult::Done ? "12345" : "");
  }
  std::string contents;
  EXPECT_EQ(ReadWholeFile("/proc/self/status", 1 << 20, contents), ReadResult::Done);  // reports no size
  EXPECT_TRUE(contents.starts_with("Name:"));
  EXPECT_EQ(ReadWholeFile("/proc/self/status", 20, contents), ReadResult::TooLarge);
}

TEST_F(FilesTest, WholeFileIsOldOrNewOnEveryFault) {
  const std::vector<std::string> before = folder_.Names();
  const std::string text(100'000, 'n');
  EXPECT_GE(test::ForEachFault([&] {
              WriteText(Path("regular"), "12345");
              const bool done = WriteWholeFile(Path("regular"), text);
              EXPECT_EQ(ReadText(Path("regular")), done ? text : "12345");
              EXPECT_EQ(folder_.Names(), before);
              std::string read;
              const ReadResult result = ReadWholeFile(Path("regular"), 1 << 20, read);
              EXPECT_TRUE(result == ReadResult::Done || (result == ReadResult::Failed && read.empty()));
            }),
            5);
}

}  // namespace
}  // namespace fotomill::platform
