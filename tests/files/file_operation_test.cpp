#include "files/file_operation.h"

#include <gmock/gmock.h>

#include "catalog/thumbnails/thumbnail_file.h"
#include "catalog/thumbnails/thumbnail_store.h"
#include "core/data_folder.h"
#include "files/file_time_change.h"
#include "files/previous_file.h"
#include "files/undo_list.h"
#include "platform/files.h"
#include "support/faults.h"
#include "support/files.h"
#include "support/scoped_environment.h"
#include "texts/texts.h"

namespace fotomill {
namespace {

using test::ReadText;
using test::WriteText;
using testing::ElementsAre;
using testing::IsEmpty;

class FileOperationTest : public testing::Test {
 protected:
  FileOperationTest() : data_("XDG_DATA_HOME", folder_.Path("data")) {
    for (const char* name : {"from", "to", "from/sub"})
      std::filesystem::create_directory(folder_.Path(name));
    for (const char* name : {"a.png", "b.png", "sub/c.png"}) WriteText(From(name), name);
  }
  std::string From(std::string_view name) const {
    return folder_.Path("from/" + std::string(name));
  }
  std::string To(std::string_view name) const { return folder_.Path("to/" + std::string(name)); }
  std::vector<std::string> Names(const char* folder) const {
    std::vector<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(folder_.Path(folder)))
      names.push_back(entry.path().filename());
    std::sort(names.begin(), names.end());
    return names;
  }
  test::TemporaryFolder folder_;
  test::ScopedEnvironment data_;
};

TEST_F(FileOperationTest, EveryOperationCanBeUndoneAndRedone) {
  for (const FileOperationKind kind :
       {FileOperationKind::Move, FileOperationKind::Copy, FileOperationKind::Trash}) {
    SCOPED_TRACE(static_cast<int>(kind));
    const FileOperationResult done =
        CarryOut(PlanFileOperation(kind, {From("a.png"), From("sub")}, folder_.Path("to")));
    ASSERT_THAT(done.failures, IsEmpty());
    EXPECT_EQ(Names("from").size(), kind == FileOperationKind::Copy ? 3u : 1u);
    EXPECT_EQ(Names("to").size(), kind == FileOperationKind::Trash ? 0u : 2u);
    const FileOperationResult undone = Revert(done.done);
    EXPECT_THAT(undone.failures, IsEmpty());
    EXPECT_THAT(Names("from"), ElementsAre("a.png", "b.png", "sub"));
    EXPECT_THAT(Names("to"), IsEmpty());
    EXPECT_EQ(ReadText(From("sub/c.png")), "sub/c.png");
    const FileOperationResult again = CarryOut(undone.done);
    EXPECT_THAT(again.failures, IsEmpty());
    EXPECT_THAT(Revert(again.done).failures, IsEmpty());
  }
}

TEST_F(FileOperationTest, SidecarsGoAlong) {
  for (const FileOperationKind kind : {FileOperationKind::Move, FileOperationKind::Copy}) {
    SCOPED_TRACE(static_cast<int>(kind));
    const bool copy = kind == FileOperationKind::Copy;
    WriteText(From("a.png.xmp"), "side");
    WriteText(From("b.xmp"), "b");
    // also if they are listed themselves, before or after
    for (const std::vector<std::string>& listed :
         {std::vector{From("a.png"), From("b.png")},
          std::vector{From("a.png"), From("a.png.xmp"), From("b.png")},
          std::vector{From("a.png.xmp"), From("a.png"), From("b.png")}}) {
      const FileOperationResult done =
          CarryOut(PlanFileOperation(kind, listed, folder_.Path("to")));
      EXPECT_THAT(done.failures, IsEmpty());
      EXPECT_THAT(Names("to"), ElementsAre("a.png", "a.png.xmp", "b.png", "b.xmp"));
      EXPECT_EQ(Names("from").size(), copy ? 5u : 1u);
      EXPECT_THAT(Revert(done.done).failures, IsEmpty());
      EXPECT_THAT(Names("to"), IsEmpty());
      EXPECT_THAT(Names("from"), ElementsAre("a.png", "a.png.xmp", "b.png", "b.xmp", "sub"));
    }
    WriteText(To("a.png.xmp"), "of another");
    const FileOperation planned = PlanFileOperation(kind, {From("a.png")}, folder_.Path("to"));
    EXPECT_NE(planned.steps[0].to, To("a.png"));
    const FileOperation forced{kind, {{From("a.png"), To("a.png")}}};
    EXPECT_EQ(CarryOut(forced).failures.size(), 1u);
    EXPECT_THAT(Names("to"), ElementsAre("a.png.xmp"));
    EXPECT_EQ(ReadText(To("a.png.xmp")), "of another");
    std::filesystem::remove(To("a.png.xmp"));
  }
}

// What goes to the trash with a picture comes back; a shared sidecar goes with the last one.
TEST_F(FileOperationTest, SidecarsAreRemovedWithTheirPictures) {
  const FileOperationOptions options{.commentExtension = "txt"};
  const struct {
    const char* name;
    std::vector<std::string> listed;
    std::vector<std::string> left;  // of a.nef, a.png, a.nef.xmp, a.xmp, a.png.txt, a.THN
  } rows[] = {
      {"a shared sidecar stays", {"a.png"}, {"a.THN", "a.nef", "a.nef.xmp", "a.xmp"}},
      {"its own goes", {"a.nef"}, {"a.THN", "a.png", "a.png.txt", "a.xmp"}},
      {"all go with the last", {"a.png", "a.nef"}, {"a.THN"}},
      {"listed themselves", {"a.xmp", "a.nef", "a.nef.xmp"}, {"a.THN", "a.png", "a.png.txt"}},
  };
  const auto fill = [&] {
    std::filesystem::remove_all(folder_.Path("from"));
    std::filesystem::create_directory(folder_.Path("from"));
    for (const char* name : {"a.nef", "a.png", "a.nef.xmp", "a.xmp", "a.png.txt", "a.THN"})
      WriteText(From(name), name);
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    fill();
    const std::vector<std::string> before = Names("from");
    std::vector<std::string> paths;
    for (const std::string& name : row.listed) paths.push_back(From(name));
    FileOperation operation = PlanFileOperation(FileOperationKind::Trash, paths, {}, options);
    for (int round = 0; round < 2; ++round) {
      const FileOperationResult done = CarryOut(operation);
      EXPECT_THAT(done.failures, IsEmpty());
      EXPECT_EQ(Names("from"), row.left);
      operation = Revert(done.done).done;
      EXPECT_EQ(Names("from"), before);
      EXPECT_EQ(ReadText(From("a.png.txt")), "a.png.txt");
    }
    operation = PlanFileOperation(FileOperationKind::Trash, paths, {}, options);
    EXPECT_THAT(DeleteForGood(operation).failures, IsEmpty());
    EXPECT_EQ(Names("from"), row.left);
  }
  // without the extension, texts are no comments; a name that was taken meanwhile is not replaced
  fill();
  const FileOperationResult done =
      CarryOut(PlanFileOperation(FileOperationKind::Trash, {From("a.png"), From("a.nef")}, {}));
  EXPECT_THAT(Names("from"), ElementsAre("a.THN", "a.png.txt"));
  WriteText(From("a.xmp"), "new");
  const FileOperationResult undone = Revert(done.done);
  ASSERT_EQ(undone.failures.size(), 1u);
  EXPECT_EQ(undone.failures[0].path, From("a.xmp"));
  EXPECT_EQ(ReadText(From("a.xmp")), "new");
  EXPECT_TRUE(platform::FileExists(From("a.nef.xmp")));
}

// Comment files, files without an extension and folders take no sidecar of a picture along.
TEST_F(FileOperationTest, SidecarsOfOthersStay) {
  const auto remove = [this](const char* name) {
    const FileOperation operation{FileOperationKind::Trash, {{From(name), {}}}, "txt"};
    EXPECT_THAT(DeleteForGood(operation).failures, IsEmpty());
  };
  for (const char* name : {"a.png.xmp", "a.png.txt", "b", "b.xmp", "b.txt"})
    WriteText(From(name), name);
  std::filesystem::create_directory(From("b.png.xmp"));
  WriteText(From("b.png.xmp/d.png"), "d");
  const std::vector<std::string> before = Names("from");
  for (const char* name : {"a.png.txt", "b"}) {
    SCOPED_TRACE(name);
    const FileOperation move{FileOperationKind::Rename, {{From(name), To("c.d")}}, "txt"};
    const FileOperationResult moved = CarryOut(move);
    EXPECT_THAT(Names("to"), ElementsAre("c.d"));
    EXPECT_THAT(Revert(moved.done).failures, IsEmpty());
    EXPECT_EQ(Names("from"), before);
    remove(name);
    EXPECT_EQ(Names("from").size(), before.size() - 1);
    WriteText(From(name), name);
  }
  for (const char* name : {"b", "b.txt"}) std::filesystem::remove(From(name));
  remove("b.png");
  EXPECT_THAT(Names("from"), ElementsAre("a.png", "a.png.txt", "a.png.xmp", "b.png.xmp", "sub"));
  EXPECT_EQ(ReadText(From("b.png.xmp/d.png")), "d");
}

// Undoing a copy removes the copies of sidecars, but none that came later, and nothing if one of
// them was changed.
TEST_F(FileOperationTest, UndoneCopiesTakeTheirOwnSidecars) {
  WriteText(From("a.png.xmp"), "side");
  const FileOperation plan = PlanFileOperation(FileOperationKind::Copy,
                                               {From("a.png"), From("b.png")}, folder_.Path("to"));
  FileOperationResult done = CarryOut(plan);
  WriteText(To("a.png.xmp"), "other");
  for (const std::string& name : {From("b.png.xmp"), To("b.png.xmp")}) WriteText(name, "later");
  const FileOperationResult undone = Revert(done.done);
  ASSERT_EQ(undone.failures.size(), 1u);
  EXPECT_EQ(undone.failures[0].path, To("a.png"));
  EXPECT_THAT(Names("to"), ElementsAre("a.png", "a.png.xmp", "b.png.xmp"));
  EXPECT_EQ(ReadText(To("b.png.xmp")), "later");

  // a change that was undone is none
  for (const auto& entry : std::filesystem::directory_iterator(folder_.Path("to")))
    std::filesystem::remove(entry);
  done = CarryOut({FileOperationKind::Copy, {{From("a.png"), To("a.png")}}});
  PreviousFiles kept(FileOperationKind::Tag);
  ASSERT_TRUE(kept.Keep(To("a.png.xmp")));
  WriteText(To("a.png.xmp"), "other");
  kept.Replaced(To("a.png.xmp"));
  UndoList list(5);
  list.Add(done.done);
  list.Add(kept.Operation());
  for (int i = 0; i < 2; ++i) {
    FileOperationResult step = Revert(list.PopUndo());
    EXPECT_THAT(step.failures, IsEmpty());
    list.Undone(std::move(step.done));
  }
  EXPECT_THAT(Names("to"), IsEmpty());
}

// A sidecar that pictures share goes to the copies of each.
TEST_F(FileOperationTest, SharedSidecarsAreCopied) {
  for (const char* name : {"a.nef", "a.xmp", "b.png.txt", "b.png.xmp"}) WriteText(From(name), name);
  for (const std::vector<std::string>& listed :
       {std::vector{From("a.nef")}, std::vector{From("a.png")},
        std::vector{From("a.nef"), From("a.png")},
        std::vector{From("a.xmp"), From("a.png"), From("a.nef")}}) {
    const FileOperationResult done =
        CarryOut(PlanFileOperation(FileOperationKind::Copy, listed, folder_.Path("to")));
    EXPECT_THAT(done.failures, IsEmpty());
    EXPECT_EQ(ReadText(To("a.xmp")), "a.xmp");
    EXPECT_EQ(Names("to").size(), listed.size() == 1 ? 2u : 3u);
    EXPECT_THAT(Revert(done.done).failures, IsEmpty());
    EXPECT_THAT(Names("to"), IsEmpty());
  }
  (void)CarryOut(
      PlanFileOperation(FileOperationKind::Copy, {From("b.png.txt")}, folder_.Path("to")));
  EXPECT_THAT(Names("to"), ElementsAre("b.png.txt"));
}

// Every operation on the system fails once: what did not go to the trash is where it was, and undo
// brings back the rest.
TEST_F(FileOperationTest, FaultsInTheTrashLoseNothing) {
  const FileOperationOptions options{.commentExtension = "txt"};
  const std::vector<std::string> names = {"a.png", "a.png.txt", "a.png.xmp", "b.png", "sub"};
  for (const char* name : {"a.png.xmp", "a.png.txt"}) WriteText(From(name), name);
  const int64_t faults = test::ForEachFault([&] {
    const FileOperationResult done = CarryOut(
        PlanFileOperation(FileOperationKind::Trash, {From("a.png"), From("b.png")}, {}, options));
    const int64_t left = platform::faultCountdown.exchange(0);
    if (done.done.steps.size() == 2 && done.failures.empty()) {
      EXPECT_LE(Names("from").size(), 3u);  // sidecars stay if it is unknown whose they are
    }
    EXPECT_THAT(Revert(done.done).failures, IsEmpty());
    EXPECT_EQ(Names("from"), names);
    for (const char* name : {"a.png", "a.png.xmp", "a.png.txt", "b.png"})
      EXPECT_EQ(ReadText(From(name)), name);
    platform::faultCountdown = left;
  });
  EXPECT_GT(faults, 8);
}

TEST_F(FileOperationTest, TimesAreUndoneUnlessTheFileWasChanged) {
  const auto times = [&] { return platform::FileTimesOf(From("a.png")).value(); };
  const platform::ExactTime old{1'000'000'000, 123'456'789}, access{1'100'000'000, 5};
  ASSERT_TRUE(platform::SetFileTimes(From("a.png"), access, old));
  FileTimeChanger changer({.start = 1'000'000'001, .setsAccess = true}, false);
  const FileTimeChange change = changer.Change(From("a.png"), 0);
  ASSERT_EQ(change.status, Status::Ok);
  FileOperation operation{FileOperationKind::Times, {TimesStep(change.changed)}};
  for (int round = 0; round < 2; ++round) {
    EXPECT_EQ(times().modified, (platform::ExactTime{1'000'000'001, 0}));
    operation = Revert(operation).done;
    ASSERT_EQ(operation.steps.size(), 1u);
    EXPECT_EQ(times().modified, old);
    EXPECT_EQ(times().accessed, access);
    operation = CarryOut(operation).done;
  }
  WriteText(From("a.png"), "new");
  const platform::ExactTime now = times().modified;
  EXPECT_EQ(Revert(operation).failures.size(), 1u);
  EXPECT_EQ(times().modified, now);
}

// Every operation on the system fails once while times are set: they are the old ones, or the log
// brings these back.
TEST_F(FileOperationTest, FaultsWhileTimesAreSetLoseNone) {
  const std::string dataBefore = DataFolder();
  SetDataFolder(folder_.Path("data"));
  const platform::ExactTime old{1'000'000'000, 123'456'789}, set{1'500'000'000, 0};
  const auto time = [&] { return platform::ModificationTime(From("a.png")).value(); };
  ASSERT_TRUE(platform::SetFileTimes(From("a.png"), {}, old));
  const int64_t faults = test::ForEachFault([&] {
    FileTimeChange change;
    {
      TimesLog log;
      change = FileTimeChanger({.start = set.seconds}, false, &log).Change(From("a.png"), 0);
    }
    const int64_t left = platform::faultCountdown.exchange(0);
    EXPECT_EQ(time(), change.status == Status::Ok ? set : old);
    const auto logged = ReadTimesLog();
    if (change.status == Status::Ok && change.logged) {
      ASSERT_TRUE(logged && logged->size() == 1);
      EXPECT_EQ(UndoTimes(logged->front(), false).status, Status::Ok);
      EXPECT_EQ(time(), old);
    }
    if (change.status != Status::Ok) {
      EXPECT_TRUE(logged && logged->empty());
    }
    EXPECT_TRUE(platform::SetFileTimes(From("a.png"), {}, old));
    EXPECT_TRUE(WriteTimesLog({}));
    platform::faultCountdown = left;
  });
  EXPECT_GT(faults, 3);
  SetDataFolder(dataBefore);
}

// Thumbnail files go where their pictures go, and records of what is no longer there are marked.
TEST_F(FileOperationTest, ThumbnailsFollowOrGo) {
  const std::string dataBefore = DataFolder();
  std::filesystem::create_directories(folder_.Path("data"));
  SetDataFolder(folder_.Path("data"));
  const auto live = [] {  // records of the global database that are not deleted
    ThumbnailDatabase database;
    DatabaseHeader header;
    DatabaseKey key;
    int64_t count = 0;
    if (database.OpenThumbnailDatabase(ThumbnailDatabasePath({}), false) !=
            ThumbnailDatabase::Opened::Done ||
        !database.ReadDatabaseHeader(header))
      return int64_t{-1};
    for (int64_t i = 0; i < header.count; ++i) count += database.ReadKey(i, key) && !key.deleted;
    return count;
  };
  const struct {
    const char* name;
    FileOperationKind kind;
    const char* path;
    int64_t live, liveAfterUndo;  // of records of a.png and b.png in "from" and a.png in "to"
    const char* thumbnail;        // where a.THN is afterwards, or nowhere
  } rows[] = {
      {"move", FileOperationKind::Move, "a.png", 1, 1, "to/a.THN"},
      {"copy", FileOperationKind::Copy, "a.png", 2, 2, "from/a.THN"},
      {"trash", FileOperationKind::Trash, "a.png", 2, 2, ""},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    std::filesystem::remove(ThumbnailDatabasePath({}));
    for (const std::string& path : {From("a.png"), From("b.png"), To("a.png")}) {
      DatabaseRecord record;
      record.thumbnail.Sign();
      record.path = path;
      SharedThumbnailStore().Add(ThumbnailDatabasePath({}), record, true);
    }
    SharedThumbnailStore().Close();
    ThumbnailRecord record;
    ASSERT_TRUE(WriteThumbnailFile(record, From("a.THN"), true));
    const FileOperationResult done =
        CarryOut(PlanFileOperation(row.kind, {From(row.path)}, folder_.Path("to")));
    ASSERT_THAT(done.failures, IsEmpty());
    EXPECT_EQ(live(), row.live);
    for (const char* place : {"from/a.THN", "to/a.THN"})
      EXPECT_EQ(platform::FileExists(folder_.Path(place)), place == std::string(row.thumbnail));
    ASSERT_THAT(Revert(done.done).failures, IsEmpty());
    EXPECT_EQ(live(), row.liveAfterUndo);
    EXPECT_FALSE(platform::FileExists(To("a.THN")));
  }
  ThumbnailRecord record;
  ASSERT_TRUE(WriteThumbnailFile(record, From("b.THN"), true));
  EXPECT_EQ(DeleteForGood({FileOperationKind::Trash, {{From("b.png"), {}}}}).done.steps.size(), 1u);
  EXPECT_FALSE(platform::FileExists(From("b.THN")));
  EXPECT_EQ(live(), 1);
  SharedThumbnailStore().Close();
  SetDataFolder(dataBefore);
}

TEST_F(FileOperationTest, ThumbnailFilesMayBeAmongTheFiles) {
  ThumbnailRecord record;
  for (const FileOperationKind kind : {FileOperationKind::Trash, FileOperationKind::Move}) {
    for (const char* name : {"a.png", "alone.png"})
      ASSERT_TRUE(WriteThumbnailFile(record, ThumbnailPathFor(From(name)), true));
    const FileOperationResult result = CarryOut(PlanFileOperation(
        kind, {From("a.png"), From("a.THN"), From("alone.THN")}, folder_.Path("to")));
    EXPECT_THAT(result.failures, IsEmpty());
    EXPECT_THAT(Names("from"), ElementsAre("b.png", "sub"));
    ASSERT_THAT(Revert(result.done).failures, IsEmpty());
    EXPECT_TRUE(platform::FileExists(From("a.png")) && platform::FileExists(From("alone.THN")));
  }
}

TEST_F(FileOperationTest, TellsTheHistoryWhatWasUsed) {
  const struct {
    const char* name;
    FileOperationKind kind;
    bool back;
    const char* use;  // "PATH FUNCTION FROM", "-PATH" for one that is gone, or nothing
  } rows[] = {
      {"rename", FileOperationKind::Rename, false, "/to 11 /from"},
      {"rename undone", FileOperationKind::Rename, true, "/from 11 /to"},
      {"move", FileOperationKind::Move, false, "/to 11 /from"},
      {"copy", FileOperationKind::Copy, false, "/from 11 "},
      {"copy undone", FileOperationKind::Copy, true, "-/to"},
      {"output", FileOperationKind::Create, false, ""},
      {"output undone", FileOperationKind::Create, true, "-/to"},
      {"turn", FileOperationKind::Turn, false, "/from 6 "},
      {"turn undone", FileOperationKind::Turn, true, ""},
      {"times", FileOperationKind::Times, false, "/from 16 "},
      {"trash", FileOperationKind::Trash, false, "-/from"},
      {"trash undone", FileOperationKind::Trash, true, ""},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    std::string told;
    for (const FileUse& use : UsesOf({row.kind, {{"/from", "/to"}}}, row.back)) {
      told += use.removed ? "-" + use.path
                          : use.path + " " + std::to_string(static_cast<int>(use.function)) + " " +
                                use.from;
    }
    EXPECT_EQ(told, row.use);
  }
}

TEST_F(FileOperationTest, NothingIsEverReplaced) {
  WriteText(To("a.png"), "there");
  const FileOperation plan =
      PlanFileOperation(FileOperationKind::Copy, {From("a.png")}, folder_.Path("to"));
  EXPECT_EQ(plan.steps[0].to, To("a [1].png"));
  WriteText(To("a [1].png"), "came meanwhile");
  for (const FileOperationKind kind : {FileOperationKind::Move, FileOperationKind::Copy}) {
    const FileOperationResult result = CarryOut({kind, plan.steps});
    EXPECT_THAT(result.done.steps, IsEmpty());
    EXPECT_EQ(result.failures.at(0).reason, "A file of that name already exists.");
  }
  EXPECT_EQ(ReadText(To("a.png")) + ReadText(To("a [1].png")) + ReadText(From("a.png")), "therecame meanwhilea.png");
  if (StartTexts("de")) {
    for (const FileOperationKind kind : {FileOperationKind::Move, FileOperationKind::Copy}) {
      EXPECT_EQ(CarryOut({kind, plan.steps}).failures.at(0).reason,
                "Eine Datei dieses Namens ist schon vorhanden.");
    }
  }
  (void)StartTexts("en");
  // Undoing a move whose old name was taken meanwhile keeps both files.
  const FileOperationResult moved =
      CarryOut(PlanFileOperation(FileOperationKind::Move, {From("b.png")}, folder_.Path("to")));
  WriteText(From("b.png"), "new");
  EXPECT_EQ(Revert(moved.done).failures.size(), 1u);
  EXPECT_EQ(ReadText(From("b.png")) + ReadText(To("b.png")), "newb.png");
  // A copy that was modified is kept as well.
  const FileOperationResult copied =
      CarryOut(PlanFileOperation(FileOperationKind::Copy, {From("sub/c.png")}, folder_.Path("to")));
  WriteText(To("c.png"), "was worked on");
  EXPECT_EQ(Revert(copied.done).failures.size(), 1u);
  EXPECT_EQ(ReadText(To("c.png")), "was worked on");
}

TEST_F(FileOperationTest, FoldersCannotBeMovedIntoThemselves) {
  for (const FileOperationKind kind : {FileOperationKind::Move, FileOperationKind::Copy}) {
    EXPECT_EQ(CarryOut(PlanFileOperation(kind, {From("sub")}, From("sub"))).failures.size(), 1u);
  }
  EXPECT_THAT(Names("from/sub"), ElementsAre("c.png"));
  // Links are deleted, never their targets.
  std::filesystem::create_directory_symlink(folder_.Path("to"), From("sub/link"));
  WriteText(To("kept"), "kept");
  EXPECT_THAT(DeleteForGood({FileOperationKind::Trash, {{From("sub"), {}}}}).failures, IsEmpty());
  EXPECT_THAT(Names("from"), ElementsAre("a.png", "b.png"));
  EXPECT_EQ(ReadText(To("kept")), "kept");
}

TEST_F(FileOperationTest, OnlyFilesInTheStateSeenAreTrashed) {
  FileOperation operation{FileOperationKind::Trash, {}};
  for (const char* name : {"a.png", "b.png"}) {
    operation.steps.push_back({From(name), {}});
    operation.steps.back().seen = platform::StampOf(From(name));
  }
  WriteText(From("b.png"), "was worked on");
  const FileOperationResult done = CarryOut(operation);
  ASSERT_EQ(done.done.steps.size(), 1u);
  ASSERT_EQ(done.failures.size(), 1u);
  EXPECT_EQ(done.failures[0].path, From("b.png"));
  EXPECT_THAT(done.failures[0].reason, testing::HasSubstr("changed"));
  EXPECT_EQ(DeleteForGood(operation).done.steps.size(), 0u);
  EXPECT_EQ(ReadText(From("b.png")), "was worked on");
  // What came back may be trashed again.
  EXPECT_THAT(Revert(done.done).failures, IsEmpty());
  EXPECT_THAT(CarryOut(done.done).failures, IsEmpty());
}

TEST_F(FileOperationTest, CopiesInTheSameFolderAreCalledDuplicates) {
  const FileOperationOptions options{.duplicatePrefix = "Duplicate of "};
  const auto copy = [&](const std::string& folder) {
    const auto plan = PlanFileOperation(FileOperationKind::Copy, {From("a.png"), From("sub")},
                                        folder_.Path(folder), options);
    EXPECT_THAT(CarryOut(plan).failures, IsEmpty());
  };
  copy("to");
  EXPECT_THAT(Names("to"), ElementsAre("a.png", "sub"));
  copy("from");
  copy("from");
  EXPECT_THAT(Names("from"),
              ElementsAre("Duplicate of a [1].png", "Duplicate of a.png", "Duplicate of sub",
                          "Duplicate of sub [1]", "a.png", "b.png", "sub"));
  EXPECT_EQ(ReadText(From("Duplicate of a.png")), "a.png");
  const auto plan =
      PlanFileOperation(FileOperationKind::Copy, {From("b.png")}, folder_.Path("from"));
  EXPECT_EQ(plan.steps.at(0).to, From("b [1].png")) << "without a prefix";
}

TEST_F(FileOperationTest, CopiesEditedWithinASecondAreLeftAlone) {
  const auto plan = PlanFileOperation(FileOperationKind::Copy, {From("a.png"), From("b.png")},
                                      folder_.Path("to"));
  const FileOperationResult done = CarryOut(plan);
  WriteText(To("a.png"), "A.png");  // as long as before
  const FileOperationResult undone = Revert(done.done);
  EXPECT_THAT(Names("to"), ElementsAre("a.png"));
  ASSERT_EQ(undone.left.size(), 1u);
  EXPECT_EQ(undone.left[0].to, To("a.png"));
}

TEST(UndoList, KeepsWhatCouldNotBeUndone) {
  UndoList list(2);
  for (const char* name : {"a", "b"}) list.Add({FileOperationKind::Rename, {{name, "x"}}});
  const FileOperation failed = list.PopUndo();
  list.NotUndone(failed);
  list.Undone({});
  EXPECT_EQ(list.UndoName(), "rename of a") << "the others come first";
  list.Undone(list.PopUndo());
  EXPECT_EQ(list.UndoName(), "rename of b");
  list.NotUndone({});
  list.NotRedone(list.PopUndo());
  EXPECT_FALSE(list.CanUndo());
  EXPECT_EQ(list.RedoName(), "rename of a");
}

TEST_F(FileOperationTest, ChangesOfOneFileAreUndoneAndRedoneInARow) {
  UndoList list(4);
  for (const char* text : {"one", "two", "three"}) {
    PreviousFiles previous(FileOperationKind::Tag);
    ASSERT_TRUE(previous.Keep(From("a.png")));
    ASSERT_TRUE(previous.Keep(From("a.png.xmp")));
    std::filesystem::remove(From("a.png"));  // a new file, as functions write it
    std::filesystem::remove(From("a.png.xmp"));
    WriteText(From("a.png"), text);
    WriteText(From("a.png.xmp"), text);
    for (const char* name : {"a.png", "a.png.xmp"}) previous.Replaced(From(name));
    list.Add(previous.Operation());
  }
  const auto undo = [&] {
    FileOperationResult result = Revert(list.PopUndo());
    EXPECT_THAT(result.failures, IsEmpty());
    list.Undone(std::move(result.done));
    return ReadText(From("a.png"));
  };
  const auto redo = [&] {
    FileOperationResult result = CarryOut(list.PopRedo());
    EXPECT_THAT(result.failures, IsEmpty());
    list.Redone(std::move(result.done));
    return ReadText(From("a.png.xmp"));
  };
  for (int round = 0; round < 2; ++round) {
    EXPECT_EQ(undo(), "two");
    EXPECT_EQ(undo(), "one");
    EXPECT_EQ(redo(), "two");
    EXPECT_EQ(undo(), "one");
    EXPECT_EQ(undo(), "a.png");
    EXPECT_FALSE(platform::FileExists(From("a.png.xmp")));
    for (const char* text : {"one", "two", "three"}) EXPECT_EQ(redo(), text);
  }
  // So can the copy that is changed.
  list.Add(CarryOut(PlanFileOperation(FileOperationKind::Copy, {From("b.png")}, folder_.Path("to")))
               .done);
  PreviousFiles previous(FileOperationKind::Tag);
  ASSERT_TRUE(previous.Keep(To("b.png")));
  std::filesystem::remove(To("b.png"));
  WriteText(To("b.png"), "B");
  previous.Replaced(To("b.png"));
  list.Add(previous.Operation());
  for (int i = 0; i < 2; ++i) (void)undo();
  EXPECT_THAT(Names("to"), IsEmpty());
  // Changes by others in between are not overwritten.
  EXPECT_EQ(undo(), "two");
  std::filesystem::copy_file(From("a.png"), From("other"));
  std::filesystem::last_write_time(From("other"),
                                   std::filesystem::last_write_time(From("a.png")));
  std::filesystem::rename(From("other"), From("a.png"));
  EXPECT_EQ(Revert(list.PopUndo()).failures.size(), 1u);
}

TEST(UndoList, KeepsALimitedNumber) {
  UndoList list(2);
  const auto operation = [](const char* name) {
    return FileOperation{FileOperationKind::Rename, {{name, "x"}}};
  };
  for (const char* name : {"a", "b", "c"}) list.Add(operation(name));
  list.Add({});
  EXPECT_EQ(list.UndoName(), "rename of c");
  list.Undone(list.PopUndo());
  EXPECT_EQ(list.RedoName(), "rename of c");
  list.Redone(list.PopRedo());
  list.Undone(list.PopUndo());
  list.Undone(list.PopUndo());
  EXPECT_FALSE(list.CanUndo());
  list.Add(operation("d"));
  EXPECT_FALSE(list.CanRedo());
  // The limit applies at once, to what is there as well.
  list.SetLimit(3);
  list.Add(operation("e"));
  list.Add(operation("f"));
  list.SetLimit(1);
  EXPECT_EQ(list.UndoName(), "rename of f");
  list.Undone(list.PopUndo());
  EXPECT_FALSE(list.CanUndo());
  list.SetLimit(0);
  EXPECT_FALSE(list.CanRedo());
  list.Add(operation("g"));
  EXPECT_FALSE(list.CanUndo());
}

}  // namespace
}  // namespace fotomill
