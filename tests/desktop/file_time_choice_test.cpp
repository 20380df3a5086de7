#include "desktop/models/metadata/file_time_choice.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdlib>

#include "core/workers/stop_token.h"
#include "formats/jpeg/jpeg.h"
#include "platform/file_times.h"
#include "settings/settings.h"
#include "support/codecs.h"
#include "support/files.h"
#include "support/scoped_settings.h"

namespace fotomill::desktop {
namespace {

using testing::HasSubstr;

FileTimeChoice Choice(FileTimeSource source, const char* time, bool sequence, const char* step) {
  FileTimeChoice choice;
  choice.source = source;
  choice.time = time;
  choice.sequence = sequence;
  choice.step = step;
  return choice;
}

TEST(FileTimeChoice, GivesARuleOrSaysWhatIsWrong) {
  using enum FileTimeSource;
  constexpr const char* kTime = "2024-05-31 14:03:09";
  const struct {
    FileTimeChoice choice;
    const char* problem;
    bool taken, start;
    int64_t increment;
  } rows[] = {
      {Choice(Taken, "x", true, "x"), "", true, false, 0},  // what is not used may be anything
      {Choice(Given, kTime, false, "x"), "", false, true, 0},
      {Choice(Given, kTime, true, "0:01:30"), "", false, true, 90},
      {Choice(Given, kTime, true, "-0:00:10"), "", false, true, -10},
      {Choice(Given, "2024-02-30", false, "1"), "\"2024-02-30\" is not a time", false, false, 0},
      {Choice(Given, kTime, true, "soon"), "\"soon\" is not a time difference", false, true, 0},
      {Choice(FirstFile, "x", false, "10"), "", false, false, 10},
      {Choice(FirstFile, "x", false, ""), "is not a time difference", false, false, 0},
  };
  for (const auto& row : rows) {
    FileTimeRule rule;
    EXPECT_THAT(ReadFileTimeRule(row.choice, rule), HasSubstr(row.problem));
    EXPECT_EQ(ReadFileTimeRule(row.choice, rule).empty(), *row.problem == '\0');
    if (*row.problem != '\0') continue;
    EXPECT_EQ(rule.taken, row.taken);
    EXPECT_EQ(rule.start.has_value(), row.start);
    EXPECT_EQ(rule.increment, row.increment);
  }
  FileTimeChoice none;
  none.modification = false;
  FileTimeRule rule;
  EXPECT_NE(ReadFileTimeRule(none, rule), "");
  none.access = true;
  EXPECT_EQ(ReadFileTimeRule(none, rule), "");
  EXPECT_TRUE(rule.setsAccess && !rule.setsModification);
}

TEST(FileTimeChoice, IsKeptInTheSettings) {
  const test::ScopedSettings keep;
  for (const char* step : {"1:02:03", "-0:00:07", "0:00:00"}) {
    FileTimeChoice choice = Choice(FileTimeSource::Given, "2024-05-31 14:03:09", true, step);
    choice.modification = false;
    choice.access = true;
    StoreFileTimeChoice(choice);
    const FileTimeChoice kept = FileTimeChoiceFromSettings();
    EXPECT_EQ(kept.time, choice.time);
    EXPECT_EQ(kept.step, choice.step);
    EXPECT_TRUE(kept.sequence && kept.access && !kept.modification);
  }
  // neither wrong texts nor a time that was not chosen
  StoreFileTimeChoice(Choice(FileTimeSource::Given, "never", true, "never"));
  StoreFileTimeChoice(Choice(FileTimeSource::Taken, "2001-01-01", true, "never"));
  EXPECT_EQ(FileTimeChoiceFromSettings().time, "2024-05-31 14:03:09");
  EXPECT_EQ(FileTimeChoiceFromSettings().step, "0:00:00");
}

TEST(FileTimeChoice, PreviewSetsNothing) {
  const test::TemporaryFolder folder;
  std::vector<std::string> files{folder.Path("a.jpg"), folder.Path("gone.jpg"),
                                 folder.Path("b.jpg")};
  constexpr int64_t kOld = 1700000000;
  for (const size_t i : {0, 2}) {
    test::WriteBytes(files[i], test::Encode(JpegWrite, *test::PatternPicture(8, 8, 24)));
    ASSERT_TRUE(platform::SetFileTimes(files[i], {}, platform::ExactTime{kOld, 0}));
  }
  FileTimeRule rule{.start = 1600000000, .increment = 60};
  const auto preview = [&] {
    std::vector<FileTimeRow> rows;
    PreviewFileTimes(files, rule, {}, StopToken(),
                     [&](const FileTimeRow& row) { rows.push_back(row); });
    return rows;
  };
  std::vector<FileTimeRow> rows = preview();
  ASSERT_EQ(rows.size(), 3u);
  EXPECT_EQ(rows[0].before, LocalTimeText(kOld));
  EXPECT_EQ(rows[0].after, LocalTimeText(1600000000));
  EXPECT_NE(rows[1].problem, "");
  EXPECT_EQ(rows[2].after, LocalTimeText(1600000060)) << "missing files do not count";
  EXPECT_EQ(platform::ModificationTime(files[0])->seconds, kOld);
  rule = {.taken = true};
  rows = preview();
  EXPECT_EQ(rows[0].problem, "It does not say when it was taken.");
  EXPECT_EQ(rows[0].before, LocalTimeText(kOld));
  EXPECT_EQ(rows[0].after, "");
}

}  // namespace
}  // namespace fotomill::desktop
