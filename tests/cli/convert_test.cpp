#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>
#include <nlohmann/json.hpp>

#include "support/bitmaps.h"
#include "support/command_line.h"
#include "support/files.h"

namespace fotomill::test {
namespace {

namespace fs = std::filesystem;
using nlohmann::json;
using testing::ElementsAre;
using testing::HasSubstr;

class Convert : public testing::Test {
 protected:
  Convert() {
    WriteBytes(In("a.bmp"), BitmapFile(8, 2, 24));
    WriteBytes(In("mono.bmp"), BitmapFile(8, 2, 1));
    fs::create_directories(In("tree/one/two"));
    WriteBytes(In("tree/top.bmp"), BitmapFile(3, 3, 8));
    WriteBytes(In("tree/one/two/low.bmp"), BitmapFile(3, 3, 8));
  }
  std::string In(const std::string& name) const { return folder_.Path(name); }
  CommandResult Run(std::vector<std::string> arguments, const Terminal& terminal = {}) {
    arguments.insert(arguments.begin(), "convert");
    return RunCommand(arguments, terminal);
  }
  std::vector<std::string> Names(const std::string& folder) const {
    std::vector<std::string> names;
    for (const auto& entry : fs::directory_iterator(In(folder)))
      names.push_back(entry.path().filename());
    std::sort(names.begin(), names.end());
    return names;
  }

  TemporaryFolder folder_;
};

TEST_F(Convert, WritesBesideTheSourceIntoAFolderOrUnderAName) {
  const CommandResult beside = Run({In("a.bmp"), "--to", "pcx"});
  EXPECT_EQ(beside.status, 0) << beside.err;
  EXPECT_EQ(beside.out, In("a.bmp") + " -> " + In("a.pcx") + "\n");
  EXPECT_EQ(beside.err, "One file was processed.\n");
  EXPECT_EQ(RunCommand({"verify", In("a.pcx")}).status, 0);

  EXPECT_EQ(Run({In("a.bmp"), "-t", ".PCX", "-d", In("new/deep"), "--prefix", "Small_ "}).status, 0);
  EXPECT_THAT(Names("new/deep"), ElementsAre("Small_ a.pcx"));
  EXPECT_EQ(Run({In("a.bmp"), "-o", In("named.pcx")}).status, 0);
  EXPECT_EQ(Run({In("a.bmp"), "-o", In("odd.name"), "-t", "pcx"}).status, 0);
  EXPECT_EQ(ReadBytes(In("odd.name")), ReadBytes(In("named.pcx")));
}

TEST_F(Convert, UsageErrorsChangeNothing) {
  const std::vector<std::string> before = folder_.Names();
  const struct {
    const char* name;
    std::vector<std::string> arguments;
    const char* message;
  } rows[] = {
      {"no format", {In("a.bmp")}, "--to"},
      {"unknown format", {In("a.bmp"), "-t", "bm"}, "Unknown format \"bm\". Did you mean \"bmp\"?"},
      {"three characters do not do", {In("a.bmp"), "-t", "bmpx"}, "Unknown format \"bmpx\"."},
      {"format that is only read", {In("a.bmp"), "-t", "otf"}, "OTF cannot be written."},
      {"name without format", {In("a.bmp"), "-o", In("x.abc")}, "selects no format"},
      {"two places", {In("a.bmp"), "-t", "pcx", "-o", In("x.pcx"), "-d", In("d")}, "cannot be combined"},
      {"one name for two", {In("a.bmp"), In("mono.bmp"), "-o", In("x.pcx")}, "exactly one"},
      {"prefix that leads up", {In("a.bmp"), "-t", "pcx", "--prefix", "../"}, "prefix"},
      {"prefix into a folder", {In("a.bmp"), "-t", "pcx", "--prefix", "d/"}, "prefix"},
      {"prefix with control character", {In("a.bmp"), "-t", "pcx", "--prefix", "a\nb"}, "prefix"},
      {"long prefix", {In("a.bmp"), "-t", "pcx", "--prefix", std::string(33, 'p')}, "32"},
      {"folder that is a file", {In("a.bmp"), "-t", "pcx", "-d", In("mono.bmp")}, "is not a folder"},
      {"tree without folder", {In("tree"), "-t", "pcx", "--keep-tree"}, "--dest"},
      {"question without a terminal", {In("a.bmp"), "-t", "pcx", "--overwrite", "ask"}, "terminal"},
      {"empty folder name", {In("a.bmp"), "-t", "pcx", "--dest", ""}, "--dest: is empty"},
      {"missing list", {"-t", "pcx", "--files-from", In("none")}, "cannot be read"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const CommandResult result = Run(row.arguments);
    EXPECT_EQ(result.status, 2);
    EXPECT_THAT(result.err, HasSubstr(row.message));
    EXPECT_EQ(result.out, "");
    EXPECT_EQ(folder_.Names(), before);
  }
}

TEST_F(Convert, FailuresLeaveNothingBehindAndDoNotStopTheRun) {
  WriteText(In("broken.bmp"), "no bitmap");
  fs::create_directory(In("out"));
  fs::create_directory(In("out/a.pcx"));
  mkfifo(In("out/mono.pcx").c_str(), 0600);
  const CommandResult result =
      Run({In("broken.bmp"), In("gone.bmp"), In("a.bmp"), In("mono.bmp"), In("tree"), "-t", "pcx",
           "-d", In("out"), "--overwrite", "replace", "--json"});
  EXPECT_EQ(result.status, 1);
  std::vector<int> statuses;
  for (const json& element : json::parse(result.out)) {
    statuses.push_back(element["status"]);
    EXPECT_EQ(element.size(), 4u) << element;
    EXPECT_EQ(element["destination"].get<std::string>().empty(), element["status"] != 0);
  }
  EXPECT_THAT(statuses, ElementsAre(2, 1, 10, 10, 0));
  EXPECT_THAT(Names("out"), ElementsAre("a.pcx", "mono.pcx", "top.pcx"));
  EXPECT_TRUE(result.Says("4 files failed.\nThere were errors\n5 files were processed.")) << result.err;

  EXPECT_EQ(Run({In("a.bmp"), "-o", In("no/such/folder.pcx")}).status, 1);
  const CommandResult tooLong = Run({In("a.bmp"), "-t", "pcx", "-d", In(std::string(240, 'd'))});
  EXPECT_THAT(tooLong.err, HasSubstr("Invalid destination."));
  EXPECT_FALSE(fs::exists(In(std::string(240, 'd'))));
}

TEST_F(Convert, ExistingDestinations) {
  const struct {
    const char* name;
    std::vector<std::string> options;
    const char* input;               // typed input; null: no terminal
    std::vector<std::string> names;  // in the folder afterwards
    bool kept;                       // whether a.pcx still has the old text
  } rows[] = {
      {"default without a terminal", {}, nullptr, {"a [1].pcx", "a.pcx"}, true},
      {"keep both", {"--overwrite", "keep-both"}, nullptr, {"a [1].pcx", "a.pcx"}, true},
      {"replace", {"--overwrite", "replace"}, nullptr, {"a.pcx"}, false},
      {"skip", {"--overwrite", "skip"}, nullptr, {"a.pcx"}, true},
      {"asked, replaced", {}, "what\n r \n", {"a.pcx"}, false},
      {"asked, kept", {"--overwrite", "ask"}, "k\n", {"a [1].pcx", "a.pcx"}, true},
      {"asked, skipped", {}, "s\n", {"a.pcx"}, true},
      {"asked, no answer", {}, "", {"a.pcx"}, true},
      {"not asked", {"--no-input"}, "r\n", {"a [1].pcx", "a.pcx"}, true},
      {"dry run", {"--overwrite", "replace", "-n"}, nullptr, {"a.pcx"}, true},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    fs::remove_all(In("out"));
    fs::create_directory(In("out"));
    WriteText(In("out/a.pcx"), "old");
    std::vector<std::string> arguments{In("a.bmp"), "-t", "pcx", "-d", In("out")};
    arguments.insert(arguments.end(), row.options.begin(), row.options.end());
    const bool terminal = row.input != nullptr;
    EXPECT_EQ(Run(arguments, {terminal ? row.input : "", terminal}).status, 0);
    EXPECT_EQ(Names("out"), row.names);
    EXPECT_EQ(ReadText(In("out/a.pcx")) == "old", row.kept);
  }
}

TEST_F(Convert, AnswersApplyToTheRest) {
  fs::create_directory(In("out"));
  WriteText(In("out/a.pcx"), "old");
  WriteText(In("out/mono.pcx"), "old");
  const CommandResult result =
      Run({In("a.bmp"), In("mono.bmp"), "-t", "pcx", "-d", In("out")}, {"R\n", true});
  EXPECT_EQ(result.status, 0);
  EXPECT_NE(ReadText(In("out/a.pcx")), "old");
  EXPECT_NE(ReadText(In("out/mono.pcx")), "old");
}

TEST_F(Convert, SourcesWithTheSameNameNeverReplaceEachOther) {
  EXPECT_EQ(Run({In("a.bmp"), "-o", In("tree/a.pcx")}).status, 0);
  for (const char* policy : {"keep-both", "replace"}) {
    SCOPED_TRACE(policy);
    fs::remove_all(In("out"));
    const CommandResult result =
        Run({In("a.bmp"), In("tree/a.pcx"), "-t", "pcx", "-d", In("out"), "--overwrite", policy});
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_THAT(Names("out"), ElementsAre("a [1].pcx", "a.pcx"));
  }
  // The permission to replace applies to the requested names, not to numbered ones chosen during
  // the run.
  Run({In("a.bmp"), In("tree/a.pcx"), "-t", "pcx", "-d", In("out"), "--overwrite", "replace"});
  EXPECT_THAT(Names("out"), ElementsAre("a [1].pcx", "a [2].pcx", "a.pcx"));
  // A source that is still to be read is not replaced by another's output.
  fs::copy_file(In("tree/a.pcx"), In("mono.pcx"));
  const std::vector<uint8_t> old = ReadBytes(In("mono.pcx"));
  EXPECT_EQ(Run({In("mono.bmp"), In("mono.pcx"), "-t", "pcx", "--overwrite", "replace"}).status, 0);
  EXPECT_EQ(ReadBytes(In("mono.pcx")), old);
  EXPECT_TRUE(fs::exists(In("mono [1].pcx")));
}

TEST_F(Convert, SourceMayBeItsOwnDestination) {
  EXPECT_EQ(Run({In("a.bmp"), "-t", "bmp"}).status, 0);
  EXPECT_TRUE(fs::exists(In("a [1].bmp")));
  EXPECT_EQ(Run({In("a.bmp"), "-t", "bmp", "--overwrite", "replace"}).status, 0);
  EXPECT_EQ(RunCommand({"verify", In("a.bmp")}).status, 0);
  EXPECT_FALSE(fs::exists(In("a [2].bmp")));
}

TEST_F(Convert, NumberedVariantsStayInTheirRange) {
  WriteText(In("a.pcx"), "old");
  WriteText(In("a [7].pcx"), "old");
  const auto run = [&](const std::string& least) {
    return Run({In("a.bmp"), "-t", "pcx", "--set", "NumberedVariantMin=" + least,
                "--set=NumberedVariantMax=8"});
  };
  EXPECT_EQ(run("7").out, In("a.bmp") + " -> " + In("a [8].pcx") + "\n");
  const CommandResult full = run("7");
  EXPECT_EQ(full.status, 1);
  EXPECT_THAT(full.err, HasSubstr("Unable to create a new file - write aborted."));
  EXPECT_EQ(run("9").status, 1);
  EXPECT_EQ(folder_.Names().size(), 6u);
}

TEST_F(Convert, KeepsFoldersAndTimes) {
  const auto then = fs::file_time_type::clock::now() - std::chrono::hours(1000);
  fs::last_write_time(In("tree/top.bmp"), then);
  EXPECT_EQ(Run({In("tree"), "-r", "-t", "pcx", "-d", In("out"), "--keep-tree", "--keep-times"}).status, 0);
  EXPECT_TRUE(fs::exists(In("out/one/two/low.pcx")));
  EXPECT_EQ(fs::last_write_time(In("out/top.pcx")), fs::last_write_time(In("tree/top.bmp")));
}

TEST_F(Convert, DepthIsReducedOnlyWhenAskedFor) {
  const CommandResult refused = Run({In("a.bmp"), "-t", "mac", "-d", In("out")});
  EXPECT_EQ(refused.status, 1);
  EXPECT_THAT(refused.err, HasSubstr("Too many colors. Use --reduce"));
  EXPECT_FALSE(fs::exists(In("out")));
  EXPECT_EQ(Run({In("a.bmp"), "-t", "mac", "-d", In("out"), "--reduce"}).status, 0);
  EXPECT_EQ(Run({In("mono.bmp"), "-t", "mac", "-d", In("out")}).status, 0);
}

TEST_F(Convert, DryRunPrintsTheSameAndChangesNothing) {
  WriteText(In("broken.bmp"), "no bitmap");
  const std::vector<std::string> arguments{folder_.Path(), In("tree"), "-t",
                                           "pcx",          "-d",       In("out")};
  std::vector<std::string> dry = arguments;
  dry.push_back("--dry-run");
  const CommandResult told = Run(dry);
  EXPECT_FALSE(fs::exists(In("out")));
  const CommandResult done = Run(arguments);
  EXPECT_EQ(told.out, done.out);
  EXPECT_EQ(told.err, done.err);
  EXPECT_EQ(told.status, 1);
}

TEST_F(Convert, PagesBeyondTheLast) {
  const CommandResult result = Run({In("a.bmp"), "-t", "pcx", "--page", "2"});
  EXPECT_EQ(result.status, 1);
  EXPECT_THAT(result.err, HasSubstr("No images in this document. The file has only one page."));
}

}  // namespace
}  // namespace fotomill::test
