#include <gtest/gtest.h>

#include "batch/job.h"
#include "batch/progress_model.h"

namespace fotomill::test {
namespace {

TEST(Progress, ClosingLines) {
  const struct {
    int files;
    int failed;  // of them
    bool noSummary, closeWhenDone;
    std::vector<std::string> closing;
    bool open;
  } rows[] = {
      {0, 0, false, true, {"No files were processed."}, false},
      {1, 0, false, true, {"One file was processed."}, false},
      {3, 0, false, false, {"3 files were processed."}, true},
      {3, 1, false, true, {"There were errors", "3 files were processed."}, true},
      {2, 2, true, true, {"There were errors"}, true},
      {2, 0, true, true, {}, false},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(testing::Message() << row.files << " files, " << row.failed << " failed");
    BatchJob job;
    job.noSummary = row.noSummary;
    job.errors = true;
    ASSERT_TRUE(OpenProgressBox(job));
    EXPECT_FALSE(job.errors || !job.progress.AbortLive() || job.progress.CloseLive());
    for (int i = 0; i < row.files; ++i) {
      FileOutcome outcome{.source = "a", .destination = "b"};
      if (i < row.failed) outcome.status = Status::DamagedFile;
      ReportOutcome(job, outcome, i, row.files);
    }
    if (row.files > 0) {
      EXPECT_EQ(job.progress.StatusText(), "Processing file " + std::to_string(row.files) + " of " + std::to_string(row.files));
    }
    const size_t before = job.progress.Lines().size();
    job.progress.Finish(job.errors, !job.noSummary, {.closeWhenDone = row.closeWhenDone});
    std::vector<std::string> closing;
    for (size_t i = before; i < job.progress.Lines().size(); ++i)
      closing.push_back(job.progress.Lines()[i].text);
    EXPECT_EQ(closing, row.closing);
    EXPECT_EQ(job.progress.StatusText(), CountLine(static_cast<uint32_t>(row.files)))
        << "no file is in work";
    EXPECT_EQ(job.progress.IsOpen(), row.open);
    EXPECT_EQ(job.progress.CloseLive() && job.progress.HasScrollBar(), row.open);
    EXPECT_FALSE(job.progress.AbortLive());
    const int32_t last = static_cast<int32_t>(job.progress.Lines().size()) - 1;
    EXPECT_EQ(job.progress.Selected(), row.noSummary ? -1 : last);
  }
}

TEST(Progress, PlacesOfTheBoxAndItsControls) {
  const ProgressSettings tall{}, fixed{.optimizeWindow = false};
  EXPECT_EQ(ProgressBoxPlace(1001, 700, tall), (Rectangle{290, 8, 420, 684}));
  EXPECT_EQ(ProgressBoxPlace(1001, 700, fixed), (Rectangle{290, 135, 420, 430}));
  EXPECT_EQ(ProgressBoxPlace(401, 301, fixed), (Rectangle{-9, -64, 420, 430}));  // toward 0
  const ProgressLayout layout = LayOutProgressBox(413, 401, tall);
  EXPECT_EQ(layout.list, (Rectangle{5, 5, 403, 337}));
  EXPECT_EQ(layout.status, (Rectangle{8, 351, 397, 16}));
  EXPECT_EQ(layout.abort, (Rectangle{71, 371, 64, 22}));
  EXPECT_EQ(layout.close, (Rectangle{277, 371, 64, 22}));
  EXPECT_EQ(LayOutProgressBox(101, 90, tall).abort.x, -7);

  const struct {
    ProgressSettings box;
    ProgressListKind kind;
    int32_t rowHeight;
  } rows[] = {
      {{.optimizeWindow = false, .showMissingThumbnails = true}, ProgressListKind::Plain, 0},
      {{}, ProgressListKind::VariableRows, 0},
      {{.showMissingThumbnails = true}, ProgressListKind::FixedRows, 54},
      {{.thumbnails = false, .showMissingThumbnails = true}, ProgressListKind::FixedRows, 0},
  };
  for (const auto& row : rows) {
    EXPECT_EQ(LayOutProgressBox(400, 400, row.box).kind, row.kind);
    EXPECT_EQ(LayOutProgressBox(400, 400, row.box).rowHeight, row.rowHeight);
  }
}

}  // namespace
}  // namespace fotomill::test
