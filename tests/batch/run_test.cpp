#include "batch/run.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <filesystem>
#include <map>
#include <thread>

#include "batch/new_job.h"
#include "catalog/thumbnails/thumbnail_file.h"
#include "catalog/thumbnails/thumbnail_store.h"
#include "registry/registry.h"
#include "support/bitmaps.h"
#include "support/faults.h"
#include "support/files.h"
#include "support/scoped_environment.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

namespace fs = std::filesystem;

class Run : public testing::Test {
 protected:
  std::string In(const std::string& name) const { return folder_.Path(name); }

  BatchJob NewJob() const {
    BatchJob job = NewBatchJob();
    job.formatIndex = FindFormatByName("x.pcx");
    job.destinationFolder = In("out");
    return job;
  }
  std::map<std::string, std::vector<uint8_t>> Outputs() const {
    std::map<std::string, std::vector<uint8_t>> outputs;
    for (const auto& entry : fs::recursive_directory_iterator(In("out"))) {
      if (entry.is_regular_file()) outputs[entry.path().string()] = ReadBytes(entry.path());
    }
    return outputs;
  }
  static std::vector<std::string> LinesOf(const BatchJob& job) {
    std::vector<std::string> lines;
    for (const ProgressLine& line : job.progress.Lines()) lines.push_back(line.text);
    return lines;
  }

  TemporaryFolder folder_;
  const ScopedSettings keep_;
};

TEST_F(Run, ParallelResultsEqualSequentialOnes) {
  std::vector<BatchFile> files;
  for (const char* folder : {"one", "two", "three"}) {
    fs::create_directory(In(folder));
    for (const char* name : {"a", "a [1]", "b", "c [2]", "c"}) {
      const std::string path = In(folder) + "/" + name + ".bmp";
      // Sizes with different processing times, so that threads overtake each other.
      const int32_t side = 10 + static_cast<int32_t>(files.size() * 7919 % 13) * 60;
      WriteBytes(path, BitmapFile(side, side, 24));
      files.push_back({path, {}, Status::Ok, {}});
    }
    WriteText(In(folder) + "/b.bmp", "broken");
    files.push_back({In("none.bmp"), {}, Status::FileOpenError, "The file does not exist."});
    files.push_back({In("vanished.bmp"), {}, Status::Ok, {}});
  }
  const struct {
    const char* name;
    OverwritePolicy policy;
    bool applyToRest;
  } rows[] = {
      {"keep both", {}, true},
      {"replace", {.prompt = false}, false},
      {"leave out", {.skip = true}, false},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    std::vector<std::string> lines;
    std::map<std::string, std::vector<uint8_t>> outputs;
    for (const uint32_t jobs : {1u, 2u, 7u}) {
      fs::remove_all(In("out"));
      fs::create_directory(In("out"));
      WriteText(In("out/c.pcx"), "old");
      WriteText(In("out/a [1] [1].pcx"), "old");
      BatchJob job = NewJob();
      job.overwrite = row.policy;
      job.applyToRest = row.applyToRest;
      ASSERT_EQ(RunBatch(files, {.jobs = jobs}, job), Status::Ok);
      EXPECT_TRUE(job.errors);
      EXPECT_EQ(job.uses.size(), std::count_if(job.progress.Lines().begin(),
                                               job.progress.Lines().end(), [](const auto& line) {
                                                 return line.item.file >= 0 &&
                                                        line.item.status == Status::Ok &&
                                                        !line.item.skipped;
                                               }));
      if (jobs == 1) {
        lines = LinesOf(job);
        outputs = Outputs();
      }
      EXPECT_EQ(LinesOf(job), lines) << jobs;
      EXPECT_EQ(Outputs(), outputs) << jobs;
    }
    EXPECT_EQ(lines.back(), "21 files were processed.");
  }
}

// What was kept of a file that is replaced, or was there before a new one, is not shown for it.
TEST_F(Run, OutputsLoseTheThumbnailsOfWhatWasThere) {
  fs::create_directory(In("out"));
  std::vector<BatchFile> files;
  for (const char* name : {"a", "b"}) {
    WriteBytes(In(std::string(name) + ".bmp"), BitmapFile(8, 8, 24));
    files.push_back({In(std::string(name) + ".bmp"), {}, Status::Ok, {}});
  }
  WriteText(In("out/a.pcx"), "old");
  const std::string database = In("out/Fotomill.tdb");
  DatabaseRecord record;
  record.thumbnail.Sign();
  for (const char* name : {"out/a.pcx", "out/b.pcx", "out/c.pcx"}) {
    record.path = In(name);
    SharedThumbnailStore().Add(database, record, true);
  }
  for (const char* name : {"out/a.THN", "out/b.THN"})
    ASSERT_TRUE(WriteThumbnailFile(record.thumbnail, In(name), true));
  SharedThumbnailStore().Close();
  for (const bool dryRun : {true, false}) {
    BatchJob job = NewJob();
    job.overwrite = {.prompt = false};
    ASSERT_EQ(RunBatch(files, {.dryRun = dryRun}, job), Status::Ok);
    EXPECT_EQ(fs::exists(In("out/a.THN")), dryRun);
    EXPECT_TRUE(fs::exists(In("out/b.THN"))) << "it may be that of another picture";
    SharedThumbnailStore().Close();
    ThumbnailDatabase open;
    DatabaseKey key;
    ASSERT_EQ(open.OpenToRead(database), ThumbnailDatabase::Opened::Done);
    for (int64_t i = 0; i < 3; ++i) {
      ASSERT_TRUE(open.ReadKey(i, key));
      EXPECT_EQ(key.deleted, !dryRun && i < 2) << i;
    }
  }
}

TEST_F(Run, PrefixesApplyBeforeCollisions) {
  WriteBytes(In("a.bmp"), BitmapFile(8, 8, 24));
  const BatchFile file{In("a.bmp"), {}, Status::Ok, {}};
  const struct {
    BatchFunction function;
    const char* name;
  } rows[] = {{{.history = FileFunction::Crop}, "Cropped_ a.pcx"},
              {{.history = FileFunction::Crop}, "Cropped_ a [1].pcx"},
              {{.history = FileFunction::Crop, .prefix = ""}, "a.pcx"},
              {{.prefix = "Duplicate of "}, "Duplicate of a.pcx"}};
  for (const auto& row : rows) {
    BatchJob job = NewJob();
    ASSERT_EQ(RunBatch({&file, 1}, row.function, job), Status::Ok);
    EXPECT_EQ(job.progress.Lines()[0].text, file.name + " -> " + In("out/") + row.name);
  }
}

TEST_F(Run, TheLaterOfTwoOutputsOfOneNameIsNumberedAndSaysWhy) {
  fs::create_directory(In("two"));
  fs::create_directory(In("out"));
  std::vector<BatchFile> files;
  for (const char* name : {"a.bmp", "two/a.bmp", "b.bmp"}) {
    WriteBytes(In(name), BitmapFile(8, 8, 24));
    files.push_back({In(name), {}, Status::Ok, {}});
  }
  WriteText(In("out/b.pcx"), "old");
  const std::string why = ": Numbered, as another file of this run is \"a.pcx\".";
  const struct {
    const char* name;
    OverwritePolicy policy;
    const char* third;
  } rows[] = {{"keep both", {}, "b [1].pcx"}, {"replace", {.prompt = false}, "b.pcx"}};
  for (const auto& row : rows) {
    for (const uint32_t jobs : {1u, 3u}) {
      SCOPED_TRACE(row.name);
      for (const char* made : {"a.pcx", "a [1].pcx", "b [1].pcx"}) fs::remove(In("out/") + made);
      BatchJob job = NewJob();
      job.overwrite = row.policy;
      ASSERT_EQ(RunBatch(files, {.jobs = jobs}, job), Status::Ok);
      EXPECT_EQ(job.progress.Lines()[0].text, files[0].name + " -> " + In("out/a.pcx"));
      EXPECT_EQ(job.progress.Lines()[1].text, files[1].name + " -> " + In("out/a [1].pcx") + why);
      // one that was there before says nothing of that
      EXPECT_EQ(job.progress.Lines()[2].text, files[2].name + " -> " + In("out/") + row.third);
    }
  }
}

TEST_F(Run, FailedOutputsReleaseTheirName) {
  fs::create_directory(In("two"));
  WriteBytes(In("a.bmp"), BitmapFile(70000, 1, 24));  // too wide for JPEG
  WriteBytes(In("two/a.bmp"), BitmapFile(8, 8, 24));
  const std::vector<BatchFile> files{{In("a.bmp"), {}, Status::Ok, {}},
                                     {In("two/a.bmp"), {}, Status::Ok, {}}};
  for (const uint32_t jobs : {1u, 4u}) {
    fs::remove_all(In("out"));
    BatchJob job = NewJob();
    job.formatIndex = FindFormatByName("x.jpg");
    ASSERT_EQ(RunBatch(files, {.jobs = jobs}, job), Status::Ok);
    EXPECT_EQ(job.progress.Lines()[0].item.status, Status::UnsuitableImage);
    EXPECT_THAT(
        job.progress.Lines()[0].text,
        testing::EndsWith("Unsuitable image. The format holds at most 65500 x 65500 pixels."));
    EXPECT_EQ(job.progress.Lines()[1].text, In("two/a.bmp") + " -> " + In("out/a.jpg"));
  }
}

TEST_F(Run, NumberedNamesMayBecomeTooLong) {
  fs::create_directory(In("out"));
  const std::string base(260 - In("out/.pcx").size(), 'n');
  const BatchFile file{In(base + ".bmp"), {}, Status::Ok, {}};
  WriteBytes(file.name, BitmapFile(8, 8, 24));
  WriteText(In("out/" + base + ".pcx"), "old");
  BatchJob job = NewJob();
  job.applyToRest = true;  // keep both
  ASSERT_EQ(RunBatch({&file, 1}, {}, job), Status::Ok);
  EXPECT_EQ(job.progress.Lines()[0].item.status, Status::InvalidDestination);
  EXPECT_THAT(job.progress.Lines()[0].text, testing::EndsWith(" The path would be longer than 260 characters."));
  EXPECT_EQ(Outputs().size(), 1u);
}

TEST_F(Run, SourcesAreReadBeforeTheyAreReplaced) {
  // Each file's output is the next one's source and replaces it: the last output has
  // the first picture.
  for (const uint32_t jobs : {1u, 4u}) {
    fs::remove(In("a [1].bmp"));
    WriteBytes(In("a.dib"), BitmapFile(300, 300, 24));
    WriteBytes(In("a.bmp"), BitmapFile(5, 5, 24));
    const std::vector<BatchFile> files{{In("a.dib"), {}, Status::Ok, {}},
                                       {In("a.bmp"), {}, Status::Ok, {}}};
    BatchJob job = NewJob();
    job.formatIndex = FindFormatByName("x.bmp");
    job.destinationFolder.clear();
    job.overwrite.prompt = false;
    ASSERT_EQ(RunBatch(files, {.jobs = jobs}, job), Status::Ok);
    EXPECT_EQ(job.progress.Lines()[0].text, In("a.dib") + " -> " + In("a [1].bmp") +
                                                ": Numbered, as another file of this run is \"a.bmp\".");
    EXPECT_EQ(job.progress.Lines()[1].text, In("a.bmp") + " -> " + In("a.bmp"));
    EXPECT_EQ(ReadBytes(In("a [1].bmp")).size(), ReadBytes(In("a.dib")).size());
  }
}

TEST_F(Run, KeepsToTheJobLimitAndStartsNothingAfterAbort) {
  std::vector<BatchFile> files;
  for (int i = 0; i < 60; ++i) {
    files.push_back({In("p" + std::to_string(i) + ".bmp"), {}, Status::Ok, {}});
    WriteBytes(files.back().name, BitmapFile(8, 8, 24));
  }
  for (const uint32_t jobs : {1u, 3u}) {
    fs::remove_all(In("out"));
    std::atomic<int> now{0}, most{0}, begun{0};
    BatchJob job = NewJob();
    const auto transform = [&](PictureRecord&) {
      most = std::max<int>(most, ++now);
      if (++begun == 20) {
        job.stop.Stop();
        // ending one job does not affect another, such as the preview of a dialog
        BatchJob other = NewJob();
        EXPECT_EQ(RunBatch({}, {.dryRun = true}, other), Status::Ok);
      }
      std::this_thread::sleep_for(std::chrono::milliseconds(1));
      --now;
      return Status::Ok;
    };
    ASSERT_EQ(RunBatch(files, {.transform = transform, .jobs = jobs}, job), Status::Ok);
    EXPECT_LE(most, static_cast<int>(jobs));
    EXPECT_LE(begun, 20 + static_cast<int>(jobs));
    // files in progress leave nothing behind
    const auto whole = static_cast<uint32_t>(Outputs().size());
    EXPECT_LE(whole, static_cast<uint32_t>(begun));
    EXPECT_GE(whole + jobs, static_cast<uint32_t>(begun));
    EXPECT_EQ(job.progress.Files(), whole);
    EXPECT_EQ(LinesOf(job).back(), CountLine(whole));
  }
}

// The first file waits until the box was told that the others are done.
TEST_F(Run, TellsWhatIsInWorkBeforeTheFirstFileIsDone) {
  class Box : public ProgressBox {
   public:
    explicit Box(std::atomic<bool>& told) : told_(told) {}
    bool Open(const ProgressModel&) override { return true; }
    void ShowLine(const ProgressLine&, const FileOutcome*) override { ++lines; }
    void ShowStatus(const std::string&) override {}
    void ShowWork(const ProgressWork& work) override {
      works.push_back(work);
      if (work.done == 2 && lines == 0) told_ = true;
    }
    void StayOpen(const ProgressModel&) override {}
    void Close(const ProgressModel&) override {}
    int lines = 0;
    std::vector<ProgressWork> works;

   private:
    std::atomic<bool>& told_;
  };
  std::vector<BatchFile> files;
  for (const char* name : {"a.bmp", "b.bmp", "c.bmp"}) {
    WriteBytes(In(name), BitmapFile(name[0] == 'a' ? 9 : 8, 8, 24));
    files.push_back({In(name), {}, Status::Ok, {}});
  }
  std::atomic<bool> told{false};
  Box box(told);
  const auto transform = [&](PictureRecord& picture) {
    for (int i = 0; i < 1000 && picture.width == 9 && !told; ++i)
      std::this_thread::sleep_for(std::chrono::milliseconds(10));
    return Status::Ok;
  };
  BatchJob job = NewJob();
  job.box = &box;
  ASSERT_EQ(RunBatch(files, {.transform = transform, .jobs = 2}, job), Status::Ok);
  if (std::thread::hardware_concurrency() > 1) {
    EXPECT_TRUE(told);
    const auto waiting = std::ranges::find(box.works, 2u, &ProgressWork::done);
    EXPECT_EQ(waiting->file, files[0].name);
    EXPECT_EQ(waiting->inWork, 1u);
  }
  EXPECT_EQ(box.works.front().done, 0u);
  EXPECT_EQ(box.works.front().count, 3u);
  // one after the other, each is told when it begins
  told = true;
  Box single(told);
  BatchJob other = NewJob();
  other.box = &single;
  other.overwrite.prompt = false;
  ASSERT_EQ(RunBatch(files, {.jobs = 1}, other), Status::Ok);
  for (const BatchFile& file : files)
    EXPECT_NE(std::ranges::find(single.works, file.name, &ProgressWork::file), single.works.end());
}

TEST_F(Run, NoFaultLosesAFile) {
  const std::string bin = In("home/Trash/files/a.pcx");
  const ScopedEnvironment environment("XDG_DATA_HOME", In("home"));
  WriteBytes(In("a.bmp"), BitmapFile(8, 8, 24));
  const BatchFile file{In("a.bmp"), {}, Status::Ok, {}};
  for (const bool recycle : {false, true}) {
    SCOPED_TRACE(recycle);
    const int64_t faults = ForEachFault([&] {
      const int64_t planned = platform::faultCountdown.exchange(0);
      fs::remove_all(In("out"));
      fs::remove_all(In("home"));
      fs::create_directories(In("home"));
      fs::create_directory(In("out"));
      WriteText(In("out/a.pcx"), "old");
      BatchJob job = NewJob();
      job.overwrite = {.prompt = false, .recycle = recycle};
      platform::faultCountdown = planned;
      ASSERT_EQ(RunBatch({&file, 1}, {}, job), Status::Ok);
      const bool there = fs::exists(In("out/a.pcx")),
                 old = there && ReadText(In("out/a.pcx")) == "old";
      EXPECT_EQ(job.errors, !there || old);
      EXPECT_EQ(old || (there && !recycle) || (fs::exists(bin) && ReadText(bin) == "old"), true);
      EXPECT_EQ(Outputs().size(), there);
    });
    EXPECT_GT(faults, 4);
  }
}

}  // namespace
}  // namespace fotomill::test
