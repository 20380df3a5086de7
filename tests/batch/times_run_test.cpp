#include "batch/rewrite/times_run.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "batch/outcome_box.h"
#include "platform/file_times.h"
#include "support/files.h"

namespace fotomill::test {
namespace {

// Files that fail are reported in their place and do not count in a sequence.
TEST(TimesRun, SetsTimesInOrder) {
  const TemporaryFolder folder;
  std::vector<BatchFile> files;
  for (int i = 0; i < 40; ++i) {
    files.push_back({.name = folder.Path(std::to_string(i) + ".txt"), .below = {}, .hint = {}});
    if (i != 7) WriteText(files.back().name, "x");
  }
  for (const bool dryRun : {true, false}) {
    OutcomeBox lines;
    BatchJob job;
    job.box = &lines;
    std::vector<std::string> changed;
    const TimesFunction function{
        .rule = {.start = 1600000000, .increment = 60},
        .dryRun = dryRun,
        .changed = [&](const std::string& path, const FileTimeChange& change) {
          if (change.status == Status::Ok) changed.push_back(path);
        }};
    EXPECT_EQ(RunFileTimes(files, function, job), Status::Ok);
    ASSERT_EQ(lines.outcomes.size(), files.size());
    EXPECT_EQ(changed.size(), 39u);
    EXPECT_EQ(job.errors, true);
    for (size_t i = 0; i < files.size(); ++i) {
      EXPECT_EQ(lines.outcomes[i].source, files[i].name);
      EXPECT_EQ(lines.outcomes[i].status, i == 7 ? Status::FileOpenError : Status::Ok);
      if (i == 7) continue;
      const int64_t wanted = 1600000000 + 60 * static_cast<int64_t>(i < 7 ? i : i - 1);
      EXPECT_THAT(lines.outcomes[i].note.shown, testing::StartsWith(LocalTimeText(wanted)));
      EXPECT_EQ(platform::ModificationTime(files[i].name)->seconds == wanted, !dryRun);
    }
    EXPECT_EQ(job.filesChanged, !dryRun);
  }
}

}  // namespace
}  // namespace fotomill::test
