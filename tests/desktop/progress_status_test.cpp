#include "desktop/models/batch/progress_status.h"

#include <gtest/gtest.h>

#include "desktop/models/batch/name_field.h"

namespace fotomill::desktop {
namespace {

TEST(ProgressStatus, TellsWhatIsInWorkAndWhatAbortWaitsFor) {
  const ProgressWork begun{.done = 0, .count = 12, .inWork = 2, .file = "/p/a.jpg"},
      half{.done = 6, .count = 12, .inWork = 2, .file = "/p/g.jpg"},
      last{.done = 12, .count = 12, .inWork = 0, .file = {}},
      one{.done = 6, .count = 12, .inWork = 1, .file = "/p/g.jpg"};
  const struct {
    const char* name;
    ProgressFacts facts;
    const char* line;
  } rows[] = {
      {"from the start", {.status = {}, .work = begun}, "Processing file 1 of 12: a.jpg"},
      {"no guess yet", {.status = {}, .work = half, .seconds = 2}, "Processing file 7 of 12: g.jpg"},
      {"time left", {.status = "old", .work = half, .seconds = 8}, "Processing file 7 of 12, 8 s left: g.jpg"},
      {"minutes", {.status = {}, .work = half, .seconds = 61}, "Processing file 7 of 12, 2 min left: g.jpg"},
      {"all done", {.status = {}, .work = last, .seconds = 8}, "Processing file 12 of 12"},
      {"others wait", {.status = {}, .work = begun, .waiting = 2}, "Processing file 1 of 12, 2 batches are waiting: a.jpg"},
      {"no work told", {.status = "Processing file 3 of 5"}, "Processing file 3 of 5"},
      {"abort, one", {.status = {}, .work = one, .seconds = 8, .stopping = true}, "Stopping when g.jpg is done..."},
      {"abort, two", {.status = {}, .work = half, .stopping = true}, "Stopping when 2 files are done..."},
      {"abort, none", {.status = {}, .work = last, .stopping = true}, "Stopping..."},
      {"ended", {.status = "13 files were processed.", .work = last, .stopping = true, .ended = true, .waiting = 1}, "13 files were processed."},
  };
  for (const auto& row : rows) EXPECT_EQ(ProgressStatusLine(row.facts), row.line) << row.name;
}

TEST(NameField, KeepsTheExtensionApart) {
  EXPECT_EQ(NameInField("/p/out/a.b.png", "/p/out/"), "a.b");
  EXPECT_EQ(NameInField("/p/else/a.png", "/p/out/"), "/p/else/a");
  const struct {
    const char *text, *path;
  } rows[] = {
      {"photo", "/p/out/photo.png"},     {"my.photo", "/p/out/my.photo.png"},
      {"photo.PNG", "/p/out/photo.PNG"}, {"sub/photo", "/p/out/sub/photo.png"},
      {"/q/photo", "/q/photo.png"},      {"", ""},
  };
  for (const auto& row : rows)
    EXPECT_EQ(PathOfField(row.text, "png", "/p/out/old.png"), row.path) << row.text;
  // "scan.png.jpg" becomes "scan.png.png" unless the user says otherwise
  EXPECT_EQ(PathOfField("scan.png", "png", "/p/out/scan.png.png"), "/p/out/scan.png.png");
}

}  // namespace
}  // namespace fotomill::desktop
