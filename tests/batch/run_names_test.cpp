#include "batch/run_names.h"

#include <gtest/gtest.h>

#include <utility>
#include <vector>

#include "support/files.h"

namespace fotomill::test {
namespace {

// Files whose names depend on other files of the run must wait for those.
TEST(RunNames, OnlyIndependentFilesRunAhead) {
  // sources and outputs; the prompt is about the first one
  using Plan = std::vector<std::pair<const char*, const char*>>;
  const struct {
    const char* name;
    Plan plan;
    // independent of the others; its source may be overwritten by another's output
    bool alone, overwritten;
  } rows[] = {
      {"names apart", {{"/x/a.bmp", "/out/a.pcx"}, {"/x/b.bmp", "/out/b.pcx"}}, true, false},
      {"two sources, one output", {{"/x/a.bmp", "/out/a.pcx"}, {"/y/a.bmp", "/out/a.pcx"}}, false, false},
      {"one name spelled twice", {{"/x/a.bmp", "/out/a.pcx"}, {"/y/a.bmp", "/out/../out/a.pcx"}}, false, false},
      {"output on another's source", {{"/x/a.bmp", "/x/b.bmp"}, {"/x/b.bmp", "/out/b.pcx"}}, false, false},
      {"another's output on the source", {{"/x/a.bmp", "/x/c.bmp"}, {"/x/b.bmp", "/x/a.bmp"}}, true, true},
      {"output on its own source", {{"/x/a.bmp", "/x/a.bmp"}, {"/x/b.bmp", "/x/b.bmp"}}, true, false},
      {"source named twice", {{"/x/a.bmp", "/x/a.bmp"}, {"/x/a.bmp", "/x/a.bmp"}}, false, true},
      {"may be another's variant", {{"/x/a [1].bmp", "/out/a [1].pcx"}, {"/x/a.bmp", "/out/a.pcx"}}, false, false},
      {"variant of nothing", {{"/x/a [1].bmp", "/out/a [1].pcx"}, {"/x/b.bmp", "/out/b.pcx"}}, true, false},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    RunNames names;
    for (const auto& [source, planned] : row.plan) {
      names.AddSource(source);
      names.AddPlanned(planned);
    }
    EXPECT_EQ(names.ConcernsNobodyElse(row.plan[0].first, row.plan[0].second), row.alone);
    EXPECT_EQ(names.IsOutputOfOthers(row.plan[0].first, std::vector<std::string>{row.plan[0].second}), row.overwritten);
  }
}

TEST(RunNames, AreReservedUntilReleased) {
  const TemporaryFolder folder;
  WriteText(folder.Path("there"), "");
  RunNames names;
  names.AddSource("/x/a.bmp");
  names.AddPlanned("/out/a.pcx");
  EXPECT_TRUE(names.TakenByRun("/x/a.bmp", "/x/b.bmp"));
  EXPECT_FALSE(names.TakenByRun("/x/a.bmp", "/x/a.bmp")) << "its own source";
  EXPECT_EQ(names.Taken("/out/a.pcx", "/x/a.bmp"), platform::Existence::No);
  names.Give("/out/a.pcx");
  EXPECT_EQ(names.Taken("/out/b/../a.pcx", "/x/a.bmp"), platform::Existence::Yes);
  names.Release("/out/a.pcx");
  EXPECT_EQ(names.Taken("/out/a.pcx", "/x/a.bmp"), platform::Existence::No);
  EXPECT_FALSE(names.TakenByRun(folder.Path("there"), "/x/a.bmp"));
  EXPECT_EQ(names.Taken(folder.Path("there"), "/x/a.bmp"), platform::Existence::Yes);
}

}  // namespace
}  // namespace fotomill::test
