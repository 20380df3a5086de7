#include "batch/rename/sequential_rename.h"
#include "batch/rename/undo_rename.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>

#include "batch/new_job.h"
#include "catalog/thumbnails/thumbnail_file.h"
#include "catalog/thumbnails/thumbnail_store.h"
#include "core/data_folder.h"
#include "files/rename_log.h"
#include "settings/settings.h"
#include "support/files.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

using testing::ElementsAre;

class Rename : public testing::Test {
 protected:
  Rename() {
    SetDataFolder(folder_.Path("data"));
    std::filesystem::create_directory(folder_.Path("p"));
  }
  ~Rename() override { SetDataFolder({}); }

  void Make(const std::vector<std::string>& names) const {
    std::filesystem::remove_all(folder_.Path("p"));
    std::filesystem::create_directory(folder_.Path("p"));
    for (const std::string& name : names) WriteText(folder_.Path("p/" + name), name);
  }
  // Each file of the folder as "NAME=CONTENTS"; the contents are its original name.
  std::vector<std::string> There() const {
    std::vector<std::string> files;
    for (const auto& entry : std::filesystem::directory_iterator(folder_.Path("p"))) {
      files.push_back(entry.path().filename().string() + "=" + ReadText(entry.path()));
    }
    std::sort(files.begin(), files.end());
    return files;
  }
  BatchJob RunOn(const std::vector<std::string>& names, const RenameOptions& options) const {
    std::vector<BatchFile> files;
    for (const std::string& name : names)
      files.push_back({folder_.Path("p/" + name), {}, Status::Ok, {}});
    BatchJob job = NewBatchJob();
    RunRename(files, options, job);
    return job;
  }
  // With the rules from the settings.
  BatchJob RunAsSet(const std::vector<std::string>& names, bool dryRun = false) const {
    return RunOn(names, {.rules = SequentialRenameRulesFromSettings(), .dryRun = dryRun});
  }

  TemporaryFolder folder_;
  const ScopedSettings keep_;
};

TEST_F(Rename, Names) {
  const struct {
    const char* name;
    std::vector<std::string> there, renamed;  // the first of these are renamed
    int32_t number, increment, attempts;
    bool hyphen, prefix, skip;
    std::vector<std::string> after;
    int32_t next;
    bool errors = false;
  } rows[] = {
      {"plain",
       {"a.jpg", "b.PNG", "c"},
       {"a.jpg", "b.PNG", "c"},
       1,
       1,
       32760,
       false,
       false,
       false,
       {"PICTURE0001.jpg=a.jpg", "PICTURE0002.PNG=b.PNG", "PICTURE0003=c"},
       4},
      {"hyphen", {"a.jpg"}, {"a.jpg"}, 12345, 5, 32760, true, false, false, {"PICTURE-12345.jpg=a.jpg"}, 12350},
      {"number in front", {"beach.jpg"}, {"beach.jpg"}, 1, 0, 32760, true, true, false, {"0001-beach.jpg=beach.jpg"}, 2},
      {"taken ones are passed over",
       {"PICTURE0001.jpg", "PICTURE0003.jpg", "a.jpg", "b.jpg"},
       {"a.jpg", "b.jpg"},
       1,
       1,
       32760,
       false,
       false,
       false,
       {"PICTURE0001.jpg=PICTURE0001.jpg", "PICTURE0002.jpg=a.jpg", "PICTURE0003.jpg=PICTURE0003.jpg", "PICTURE0004.jpg=b.jpg"},
       5},
      {"colliding ones are left",
       {"PICTURE0001.jpg", "a.jpg", "b.jpg"},
       {"a.jpg", "b.jpg"},
       1,
       1,
       32760,
       false,
       false,
       true,
       {"PICTURE0001.jpg=PICTURE0001.jpg", "PICTURE0002.jpg=b.jpg", "a.jpg=a.jpg"},
       3},
      {"its own name is taken too",
       {"PICTURE0001.jpg"},
       {"PICTURE0001.jpg"},
       1,
       1,
       32760,
       false,
       false,
       false,
       {"PICTURE0002.jpg=PICTURE0001.jpg"},
       3},
      // The counter is incremented before the check: with 3 there are two attempts.
      {"attempts",
       {"PICTURE0001.jpg", "PICTURE0002.jpg", "a.jpg"},
       {"a.jpg"},
       1,
       1,
       3,
       false,
       false,
       false,
       {"PICTURE0001.jpg=PICTURE0001.jpg", "PICTURE0002.jpg=PICTURE0002.jpg", "a.jpg=a.jpg"},
       3,
       true},
      {"attempts below 1", {"a.jpg"}, {"a.jpg"}, 1, 1, -7, false, false, false, {"a.jpg=a.jpg"}, 1, true},
      {"gone", {"a.jpg"}, {"none.jpg", "a.jpg"}, 1, 1, 32760, false, false, false, {"PICTURE0001.jpg=a.jpg"}, 2, true},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    Make(row.there);
    settings.SequentialRenameBaseNumber = row.number;
    settings.SequentialRenameIncrement = row.increment;
    settings.SequentialRenameMaxAttempts = row.attempts;
    settings.SequentialRenameHyphen = row.hyphen;
    settings.SequentialRenamePrefix = row.prefix;
    settings.SequentialRenameSkipCollide = row.skip;
    const BatchJob dry = RunAsSet(row.renamed, true);
    EXPECT_EQ(There().size(), row.there.size());
    EXPECT_EQ(settings.SequentialRenameBaseNumber, row.number);
    const BatchJob job = RunAsSet(row.renamed);
    EXPECT_EQ(There(), row.after);
    EXPECT_EQ(settings.SequentialRenameBaseNumber, row.next);
    EXPECT_EQ(job.errors, row.errors);
    for (size_t i = 0; i < job.progress.Lines().size(); ++i)
      EXPECT_EQ(job.progress.Lines()[i].text, dry.progress.Lines()[i].text);
  }
}

TEST_F(Rename, TheBaseNameHasNoPartInNumbersInFront) {
  for (const char* base : {"a/b", "", "PICTURE"}) {
    Make({"beach.jpg"});
    const BatchJob job = RunOn({"beach.jpg"}, {.rules = {.baseName = base, .numberFirst = true}});
    EXPECT_FALSE(job.errors) << base;
    EXPECT_THAT(There(), ElementsAre("0001beach.jpg=beach.jpg")) << base;
  }
}

// The settings may change while a run waits for others.
TEST_F(Rename, KeepsTheRulesItWasStartedWith) {
  Make({"a.jpg", "b.jpg"});
  settings.SequentialRenameIncrement = 5;
  const RenameOptions options{.rules = SequentialRenameRulesFromSettings()};
  settings = defaultSettings;
  settings.SequentialRenameBaseName = std::string_view("LATER");
  settings.SequentialRenameHyphen = settings.SequentialRenameRandom =
      settings.SequentialRenameSkipCollide = 1;
  RunOn({"a.jpg", "b.jpg"}, options);
  EXPECT_THAT(There(), ElementsAre("PICTURE0001.jpg=a.jpg", "PICTURE0006.jpg=b.jpg"));
}

TEST_F(Rename, Undo) {
  Make({"a.jpg", "b.jpg", "c.jpg"});
  const BatchJob job = RunAsSet({"a.jpg", "b.jpg", "c.jpg"});
  ASSERT_EQ(job.uses.size(), 3u);
  EXPECT_EQ(job.uses[0].from, folder_.Path("p/a.jpg"));
  EXPECT_EQ(job.uses[0].path, folder_.Path("p/PICTURE0001.jpg"));
  EXPECT_EQ(job.uses[0].function, FileFunction::MoveAndCopy);
  WriteText(folder_.Path("p/b.jpg"), "new");
  BatchJob undo;
  ASSERT_TRUE(UndoRename({folder_.Path("p/PICTURE0003.jpg")}, false, undo));
  EXPECT_THAT(There(), ElementsAre("PICTURE0001.jpg=a.jpg", "PICTURE0002.jpg=b.jpg", "b.jpg=new", "c.jpg=c.jpg"));
  ASSERT_TRUE(UndoRename({}, false, undo));
  EXPECT_TRUE(undo.errors);
  EXPECT_THAT(There(), ElementsAre("PICTURE0002.jpg=b.jpg", "a.jpg=a.jpg", "b.jpg=new", "c.jpg=c.jpg"));
  std::filesystem::remove(folder_.Path("p/b.jpg"));
  ASSERT_TRUE(UndoRename({}, false, undo));  // entries that failed can be undone later
  EXPECT_FALSE(undo.errors);
  EXPECT_THAT(There(), ElementsAre("a.jpg=a.jpg", "b.jpg=b.jpg", "c.jpg=c.jpg"));
  EXPECT_TRUE(ReadRenameLog()->files.empty());
}

// The thumbnail file has the new name too, and the record of the old one is marked.
TEST_F(Rename, ThumbnailsFollow) {
  std::filesystem::create_directories(folder_.Path("data"));
  Make({"a.jpg"});
  const std::string database = ThumbnailDatabasePath({});
  DatabaseRecord kept;
  kept.thumbnail.Sign();
  kept.path = folder_.Path("p/a.jpg");
  SharedThumbnailStore().Add(database, kept, true);
  ASSERT_TRUE(WriteThumbnailFile(kept.thumbnail, folder_.Path("p/a.THN"), true));
  const auto hasRecord = [&] {
    ThumbnailRecord found;
    ThumbnailDatabase open;
    SharedThumbnailStore().Close();
    return open.OpenToRead(database) == ThumbnailDatabase::Opened::Done &&
           open.Find(kept.path, "", found);
  };
  const auto thumbnails = [&] {
    std::string names;
    for (const auto& entry : std::filesystem::directory_iterator(folder_.Path("p"))) {
      if (entry.path().extension() == ".THN") names += entry.path().filename();
    }
    return names;
  };
  const BatchJob dry = RunAsSet({"a.jpg"}, true);
  EXPECT_TRUE(dry.uses.empty());
  EXPECT_EQ(thumbnails(), "a.THN");
  EXPECT_TRUE(hasRecord());
  RunAsSet({"a.jpg"});
  EXPECT_EQ(thumbnails(), "PICTURE0001.THN");
  EXPECT_FALSE(hasRecord());
  BatchJob undo;
  ASSERT_TRUE(UndoRename({}, true, undo));
  EXPECT_EQ(thumbnails(), "PICTURE0001.THN");
  ASSERT_TRUE(UndoRename({}, false, undo));
  EXPECT_EQ(thumbnails(), "a.THN");
  ASSERT_EQ(undo.uses.size(), 1u);
  EXPECT_EQ(undo.uses[0].from, folder_.Path("p/PICTURE0001.jpg"));
  // All files of the folder, in either order.
  const BatchJob behind = RunAsSet({"a.jpg", "a.THN"});
  EXPECT_FALSE(behind.errors);
  EXPECT_EQ(thumbnails(), std::filesystem::exists(folder_.Path("p/PICTURE0002.jpg"))
                              ? "PICTURE0002.THN"
                              : "PICTURE0001.THN");
}

// Renames are logged first: a run that is killed in between has either lost nothing or not started.
TEST_F(Rename, KilledRunsCanBeUndone) {
  Make({"a.jpg", "b.jpg"});
  const std::string a = folder_.Path("p/a.jpg"), b = folder_.Path("p/b.jpg");
  {
    RenameLog killed;
    ASSERT_TRUE(killed.Intend({a, folder_.Path("p/1.jpg")}));
    std::filesystem::rename(a, folder_.Path("p/1.jpg"));
    killed.Settle(true);
    ASSERT_TRUE(killed.Intend({b, folder_.Path("p/2.jpg")}));
    std::filesystem::rename(b, folder_.Path("p/2.jpg"));  // and no more
  }
  BatchJob undo;
  ASSERT_TRUE(UndoRename({}, false, undo));
  EXPECT_FALSE(undo.errors);
  EXPECT_THAT(There(), ElementsAre("a.jpg=a.jpg", "b.jpg=b.jpg"));
  {
    RenameLog killed;
    ASSERT_TRUE(killed.Intend({a, folder_.Path("p/1.jpg")}));
    killed.Settle(false);
    ASSERT_TRUE(killed.Intend({b, folder_.Path("p/2.jpg")}));
  }
  EXPECT_EQ(ReadRenameLog()->files.size(), 1u);
  BatchJob nothing;
  ASSERT_TRUE(UndoRename({}, false, nothing));
  EXPECT_FALSE(nothing.errors);
  EXPECT_THAT(There(), ElementsAre("a.jpg=a.jpg", "b.jpg=b.jpg"));
}

TEST_F(Rename, ConcurrentRunsAreBothUndone) {
  Make({"a.jpg", "b.jpg"});
  const auto rename = [&](RenameLog& log, const std::string& from, const std::string& to) {
    ASSERT_TRUE(log.Intend({folder_.Path(from), folder_.Path(to)}));
    std::filesystem::rename(folder_.Path(from), folder_.Path(to));
    log.Settle(true);
  };
  {
    RenameLog first;
    rename(first, "p/a.jpg", "p/1.jpg");
    RenameLog second;
    rename(second, "p/b.jpg", "p/a.jpg");
    rename(first, "p/1.jpg", "p/b.jpg");
    rename(second, "p/a.jpg", "p/2.jpg");
  }
  EXPECT_THAT(There(), ElementsAre("2.jpg=b.jpg", "b.jpg=a.jpg"));
  BatchJob undo;
  ASSERT_TRUE(UndoRename({}, false, undo));
  EXPECT_FALSE(undo.errors);
  EXPECT_THAT(There(), ElementsAre("a.jpg=a.jpg", "b.jpg=b.jpg"));
  // The next run starts a new log; a run that continues while part of it is undone loses nothing.
  RenameLog third;
  rename(third, "p/a.jpg", "p/1.jpg");
  rename(third, "p/b.jpg", "p/2.jpg");
  ASSERT_TRUE(UndoRename({folder_.Path("p/2.jpg")}, false, undo));
  rename(third, "p/b.jpg", "p/3.jpg");
  EXPECT_EQ(ReadRenameLog()->files.size(), 2u);
  ASSERT_TRUE(UndoRename({}, false, undo));
  EXPECT_THAT(There(), ElementsAre("a.jpg=a.jpg", "b.jpg=b.jpg"));
}

TEST_F(Rename, UndoRestoresTheNumber) {
  Make({"a.jpg", "b.jpg"});
  settings.SequentialRenameBaseNumber = 7;
  RunAsSet({"a.jpg", "b.jpg"});
  EXPECT_EQ(settings.SequentialRenameBaseNumber, 9u);
  BatchJob undo = NewBatchJob();
  ASSERT_TRUE(UndoRename({folder_.Path("p/PICTURE0008.jpg")}, false, undo));
  EXPECT_EQ(settings.SequentialRenameBaseNumber, 9u) << "one file is still counted";
  ASSERT_TRUE(UndoRename({}, false, undo));
  EXPECT_EQ(settings.SequentialRenameBaseNumber, 7u);
}

TEST_F(Rename, RandomOrderDependsOnTheSeed) {
  EXPECT_THAT(RandomOrder(8, 1), testing::UnorderedElementsAre(0, 1, 2, 3, 4, 5, 6, 7));
  EXPECT_EQ(RandomOrder(100, 5), RandomOrder(100, 5));
  EXPECT_NE(RandomOrder(100, 5), RandomOrder(100, 6));
  Make({"a", "b", "c", "d"});
  std::vector<std::string> expected;
  const std::vector<size_t> order = RandomOrder(4, 3);
  for (size_t i = 0; i < 4; ++i)
    expected.push_back("PICTURE000" + std::to_string(i + 1) + "=" + "abcd"[order[i]]);
  RunOn({"a", "b", "c", "d"}, {.rules = {.random = true}, .seed = 3});
  EXPECT_EQ(There(), expected);
}

}  // namespace
}  // namespace fotomill::test
