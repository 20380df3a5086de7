#include "batch/destination_name.h"

#include <gtest/gtest.h>

#include <set>

#include "batch/prompts.h"
#include "registry/registry.h"

namespace fotomill::test {
namespace {

// Gives scripted answers, and records the questions.
class ScriptedPrompts : public Prompts {
 public:
  std::vector<OverwriteAnswer> answers;
  std::vector<std::optional<std::string>> names;
  std::vector<OverwriteQuestion> questions;
  bool skipNames = false;
  int namesAsked = 0;

  NameAnswer AskDestinationName(const NameQuestion&) override {
    ++namesAsked;
    const auto name = names.empty() ? std::nullopt : names.front();
    if (!names.empty()) names.erase(names.begin());
    return {.ok = name.has_value(), .name = name.value_or(""), .skipRest = skipNames};
  }
  OverwriteAnswer AskOverwrite(const OverwriteQuestion& question) override {
    questions.push_back(question);
    if (answers.empty()) return {};
    OverwriteAnswer answer = answers.front();
    answers.erase(answers.begin());
    return answer;
  }
  std::optional<std::string> AskPassword(const std::string&) override { return std::nullopt; }
  bool ConfirmFormat(const std::string&) override { return true; }
  bool ConfirmNewFolder(const std::string&) override { return true; }
};

int32_t RowOf(std::string_view extension) {
  return FindFormatByName("x." + std::string(extension));
}

// The outcome in short: the path, prefixed by "!" if it replaces a file, or why there is none.
std::string Settle(BatchJob& job, const std::set<std::string>& there, const std::string& source) {
  job.formatIndex = RowOf("tif");
  Destination destination;
  destination.path = PlannedDestination(source, {}, {}, job);
  using platform::Existence;
  const TakenTest taken = [&](const std::string& path) {
    return path.starts_with("unknown") ? Existence::Unknown
           : there.contains(path)      ? Existence::Yes
                                       : Existence::No;
  };
  const VariantMaker variant = [&](std::string& path) {
    return MakeNumberedVariant(path, job.naming.firstVariant, job.naming.lastVariant, taken);
  };
  if (MakeDestinationName(destination, source, {}, job, taken, variant) ==
      DestinationAnswer::Skip) {
    FileOutcome outcome;
    if (destination.search != VariantSearch::Found) SayNoName(destination, outcome);
    return destination.search == VariantSearch::AllTaken ? "no variant"
           : outcome.status == Status::Ok                ? "skipped"
                                          : std::string(StatusMessage(outcome.status));
  }
  return (destination.replace ? destination.recycle ? "!~" : "!" : "") + destination.path;
}

// If the system cannot tell whether a name exists, it counts as neither free nor taken, and
// searches end.
TEST(DestinationName, SearchesForNamesEnd) {
  BatchJob job;
  EXPECT_EQ(Settle(job, {}, "unknown.bmp"), "Error creating file.");
  EXPECT_EQ(Settle(job, {"a.tif"}, "a.bmp"), "a [1].tif");
  const TakenTest allTaken = [](const std::string&) { return platform::Existence::Yes; };
  const TakenTest unknown = [](const std::string&) { return platform::Existence::Unknown; };
  const StopSource stopped;
  stopped.Stop();
  const struct {
    const char* name;
    const TakenTest& taken;
    int64_t last;
    StopToken stop;
    VariantSearch search;
  } rows[] = {
      {"range used up", allTaken, 5, {}, VariantSearch::AllTaken},
      {"too many", allTaken, INT32_MAX, {}, VariantSearch::GivenUp},
      {"nobody can tell", unknown, INT32_MAX, {}, VariantSearch::Unknown},
      {"stopped", allTaken, INT32_MAX, stopped.Token(), VariantSearch::Stopped},
  };
  for (const auto& row : rows) {
    std::string path = "a.tif";
    EXPECT_EQ(MakeNumberedVariant(path, 1, row.last, row.taken, row.stop), row.search) << row.name;
    EXPECT_EQ(path, "a.tif");
  }
  FileOutcome outcome;
  Destination destination;
  destination.search = VariantSearch::GivenUp;
  SayNoName(destination, outcome);
  EXPECT_EQ(outcome.status, Status::InvalidDestination);
  EXPECT_FALSE(outcome.skipped);
}

TEST(DestinationName, ExtensionsMatchTheSourcesCase) {
  const struct {
    const char *format, *source;
    const char* styles[3];
  } rows[] = {
      {"TIF", "Jpg", {"Tif", "TIF", "tif"}}, {"JPEG", "BMP", {"JPEg", "JPEg", "jpeg"}}, {"PCX", "bmp", {"pcx", "PCX", "pcx"}},
      {"MP3", "PNG", {"MP3", "MP3", "mp3"}}, {"PCX", "", {"pcx", "pcx", "pcx"}},        {"PCX", "7Zx", {"pCx", "pCX", "pcx"}},
  };
  for (const auto& row : rows) {
    for (int32_t style = 0; style < 3; ++style) {
      EXPECT_EQ(CasedExtension(row.format, row.source, style), row.styles[style]) << row.source << style;
    }
  }
}

TEST(DestinationName, FolderPrefixAndTree) {
  const struct {
    const char *source, *below, *prefix, *folder, *path;
    bool beside;
  } rows[] = {
      {"in/PHOTO.Jpg", "", "", "", "in/PHOTO.Tif", false},
      {"in/a.b.bmp", "", "Cropped_ ", "out", "out/Cropped_ a.b.tif", false},
      {"a", "", "Duplicate of ", "out/", "out/Duplicate of a.tif", false},
      {"in/one/a.bmp", "one", "", "out", "out/one/a.tif", false},
      {"in/one/a.bmp", "one", "", "out", "in/one/a.tif", true},
  };
  for (const auto& row : rows) {
    BatchJob job;
    job.formatIndex = RowOf("tif");
    job.destinationFolder = row.folder;
    job.naming.beside = row.beside;
    EXPECT_EQ(PlannedDestination(row.source, row.below, row.prefix, job), row.path);
  }
  EXPECT_EQ(CompletedDestination("name", "out"), "out/name");
  EXPECT_EQ(CompletedDestination("other/name", "out"), "other/name");
  EXPECT_EQ(CompletedDestination("name", std::string(255, 'f')), std::string(255, 'f') + "/name");
  EXPECT_EQ(CompletedDestination("names", std::string(255, 'f')), std::nullopt);
}

TEST(DestinationName, ExistingNames) {
  const OverwriteChecks ask{}, replace{.keepBoth = false};
  const struct {
    const char* name;
    OverwritePolicy policy;
    bool applyToRest, prompts;
    std::vector<OverwriteAnswer> answers;
    const char* outcome;
    size_t questions;
    std::vector<std::pair<Remembered, int32_t>> kept = {};
  } rows[] = {
      {"nobody to ask", {.keepBoth = false}, false, false, {}, "a [2].tif", 0},
      {"no prompt", {.prompt = false}, false, true, {}, "!a.tif", 0},
      {"no prompt, recycled", {.prompt = false, .recycle = true}, false, true, {}, "!~a.tif", 0},
      {"left out", {.skip = true}, false, true, {}, "skipped", 0},
      {"applied to the rest, both", {}, true, true, {}, "a [2].tif", 0},
      {"applied to the rest", {.keepBoth = false}, true, true, {}, "!a.tif", 0},
      {"cancelled", {}, false, true, {{}}, "skipped", 1},
      {"both", {}, false, true, {{true, ask, "a", false}}, "a [2].tif", 1},
      {"both, by a typed name", {}, false, true, {{true, ask, "new", false}}, "new.tif", 1},
      {"both, by a typed name that is taken", {}, false, true, {{true, ask, "b", false}}, "b [1].tif", 1},
      {"replaced", {}, false, true, {{true, replace, "a", false}}, "!a.tif", 1, {{Remembered::OverwriteKeepBoth, 0}}},
      {"renamed", {.keepBoth = false}, false, true, {{true, replace, "new", false}}, "new.tif", 1},
      {"renamed to a taken one, then cancelled", {.keepBoth = false}, false, true, {{true, replace, "b", false}}, "skipped", 2},
      {"renamed to a taken one, for all",
       {.keepBoth = false},
       false,
       true,
       {{true, {.keepBoth = false, .applyToRest = true}, "b", false}},
       "!b.tif",
       1},
      {"a name that leads elsewhere",
       {.keepBoth = false},
       false,
       true,
       {{true, replace, "../b", false}, {true, replace, "", false}, {true, replace, "c", false}},
       "c.tif",
       3},
      {"never again, into the bin",
       {.keepBoth = false},
       false,
       true,
       {{true, {.notify = false, .keepBoth = false, .recycle = true, .previews = false}, "a", false}},
       "!~a.tif",
       1,
       {{Remembered::PromptBeforeOverwrite, 0}, {Remembered::OverwriteRecycle, 1}, {Remembered::OverwritePreviews, 0}}},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    ScriptedPrompts prompts;
    prompts.answers = row.answers;
    BatchJob job;
    job.overwrite = row.policy;
    job.applyToRest = row.applyToRest;
    std::vector<std::pair<Remembered, int32_t>> kept;
    job.remember = [&](Remembered what, int32_t value) { kept.emplace_back(what, value); };
    job.prompts = row.prompts ? &prompts : nullptr;
    EXPECT_EQ(Settle(job, {"a.tif", "a [1].tif", "b.tif"}, "a.bmp"), row.outcome);
    EXPECT_EQ(prompts.questions.size(), row.questions);
    EXPECT_EQ(kept, row.kept);
  }
}

TEST(DestinationName, AnswersApplyToTheRest) {
  ScriptedPrompts prompts;
  prompts.answers = {{true, {.applyToRest = true}, "a", false}};
  BatchJob job;
  job.prompts = &prompts;
  const std::set<std::string> there{"a.tif", "b.tif", "c.tif"};
  EXPECT_EQ(Settle(job, there, "a.bmp"), "a [1].tif");
  EXPECT_EQ(Settle(job, there, "b.bmp"), "b [1].tif");

  prompts.answers = {{.checks = {}, .name = {}, .skipRest = true}};
  job.applyToRest = false;
  EXPECT_EQ(Settle(job, there, "b.bmp"), "skipped");
  EXPECT_EQ(Settle(job, there, "c.bmp"), "skipped");
  EXPECT_EQ(prompts.questions.size(), 2u);
}

TEST(DestinationName, TypedNamesAndVariants) {
  ScriptedPrompts prompts;
  BatchJob job;
  job.prompts = &prompts;
  job.naming.askName = true;
  prompts.names = {"bad\nname", "x/../../up", "..", std::string(300, 'l'), "else.where"};
  EXPECT_EQ(Settle(job, {}, "in/a.BMP"), "in/else.TIF");
  prompts.names = {"/other/b.tif"};
  EXPECT_EQ(Settle(job, {"/other/b.tif"}, "in/a.bmp"), "skipped");  // the prompt was canceled
  EXPECT_EQ(Settle(job, {}, "in/a.bmp"), "skipped");
  prompts.skipNames = true;
  prompts.namesAsked = 0;
  for (const char* source : {"in/a.bmp", "in/b.bmp"}) EXPECT_EQ(Settle(job, {}, source), "skipped");
  EXPECT_EQ(prompts.namesAsked, 1) << "the rest is skipped, too";
  job.naming.askName = false;

  job.applyToRest = true;
  const struct {
    int32_t first, last;
    const char* outcome;
  } rows[] = {{2, 1, "no variant"},
              {1, 2, "no variant"},
              {1, 3, "a [3].tif"},
              {-1, INT32_MAX, "a [-1].tif"},
              {INT32_MAX, INT32_MAX, "a [2147483647].tif"}};
  for (const auto& row : rows) {
    job.naming.firstVariant = row.first;
    job.naming.lastVariant = row.last;
    EXPECT_EQ(Settle(job, {"a.tif", "a [1].tif", "a [2].tif"}, "a.bmp"), row.outcome);
  }
}

}  // namespace
}  // namespace fotomill::test
