#include "batch/archive/extract_run.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <map>

#include "archive/packed_sizes.h"
#include "batch/archive/create_run.h"
#include "batch/outcome_box.h"
#include "batch/prompts.h"
#include "files/file_operation.h"
#include "files/previous_file.h"
#include "platform/files.h"
#include "registry/registry.h"
#include "support/files.h"

namespace fotomill::test {
namespace {

using testing::ElementsAre;

// Gives one password, and counts the questions.
class OnePassword : public Prompts {
 public:
  std::optional<std::string> password;
  int asked = 0;
  NameAnswer AskDestinationName(const NameQuestion&) override { return {}; }
  OverwriteAnswer AskOverwrite(const OverwriteQuestion&) override { return {}; }
  std::optional<std::string> AskPassword(const std::string&) override {
    ++asked;
    return password;
  }
  bool ConfirmFormat(const std::string&) override { return true; }
  bool ConfirmNewFolder(const std::string&) override { return true; }
};

class ArchiveRun : public testing::Test {
 protected:
  ArchiveRun() {
    EXPECT_TRUE(platform::MakeFolders(folder_.Path("in/sub")));
    WriteText(folder_.Path("in/a.txt"), std::string(5000, 'a'));
    WriteText(folder_.Path("in/sub/b.txt"), "b");
  }
  static void Prepare(BatchJob& job, OutcomeBox& box, OnePassword& prompts, bool replace) {
    job.box = &box;
    job.prompts = &prompts;
    job.formatIndex = FindFormatByName("a.zip");
    job.naming.confirmFormat = false;
    job.overwrite.prompt = true;
    job.overwrite.keepBoth = !replace;
    job.applyToRest = true;
  }
  // The statuses of the lines.
  std::vector<Status> Create(const std::vector<std::string>& files, std::string password = {},
                             bool add = false, bool replace = false) {
    OutcomeBox box;
    BatchJob job;
    Prepare(job, box, prompts_, replace);
    CreateArchive request{
        .path = zip_, .files = files, .password = std::move(password), .add = add};
    request.naming.base = folder_.Path("in");
    request.keepPrevious = [this](const std::string& path) { return previous_.Keep(path); };
    request.replaced = [this](const std::string& path) { previous_.Replaced(path); };
    EXPECT_EQ(RunCreateArchive(request, job), Status::Ok);
    return StatusesOf(box);
  }
  std::vector<Status> Extract(const ArchivePart& part, bool replace = false,
                              bool keepPaths = true) {
    OutcomeBox box;
    BatchJob job;
    Prepare(job, box, prompts_, replace);
    EXPECT_EQ(RunExtract(part, {.folder = folder_.Path("out"), .keepPaths = keepPaths}, job),
              Status::Ok);
    return StatusesOf(box);
  }
  static std::vector<Status> StatusesOf(const OutcomeBox& box) {
    std::vector<Status> statuses;
    for (const FileOutcome& outcome : box.outcomes) statuses.push_back(outcome.status);
    return statuses;
  }
  std::string Out(const std::string& name) const {
    const std::string path = folder_.Path("out/" + name);
    return platform::FileExists(path) ? ReadText(path) : "-";
  }

  TemporaryFolder folder_;
  const std::string zip_ = folder_.Path("x.zip");
  OnePassword prompts_;
  PreviousFiles previous_{FileOperationKind::Change};
};

TEST_F(ArchiveRun, NamesAreRelativeAndPartsCanBeChosen) {
  EXPECT_THAT(Create({folder_.Path("in/a.txt"), folder_.Path("in/sub")}),
              ElementsAre(Status::Ok, Status::Ok));
  EXPECT_THAT(Extract({.path = zip_, .names = {"sub"}}), ElementsAre(Status::Ok));
  EXPECT_EQ(Out("sub/b.txt") + Out("a.txt"), "b-");
  EXPECT_THAT(Extract({.path = zip_}), ElementsAre(Status::Ok, Status::Ok));
  EXPECT_EQ(Out("sub/b [1].txt") + std::to_string(Out("a.txt").size()), "b5000");
  WriteText(folder_.Path("out/a.txt"), "old");
  EXPECT_THAT(Extract({.path = zip_, .names = {"a.txt", "sub/b.txt"}}, true, false),
              ElementsAre(Status::Ok, Status::Ok));
  EXPECT_EQ(Out("b.txt") + std::to_string(Out("a.txt").size()), "b5000");
  const std::vector<uint8_t> file = ReadBytes(zip_);
  const auto sizes = ZipPackedSizes(file, 100);
  ASSERT_EQ(sizes.size(), 2u);
  EXPECT_LT(sizes.at("a.txt"), 200u);
  for (size_t size = 0; size < file.size(); ++size)
    (void)ZipPackedSizes(std::span(file).first(size), 100);
  EXPECT_EQ(ZipPackedSizes(file, 1).size(), 1u);
}

TEST_F(ArchiveRun, AddingKeepsTheOthersAndCanBeUndone) {
  Create({folder_.Path("in/a.txt")});
  const std::vector<uint8_t> old = ReadBytes(zip_);
  WriteText(folder_.Path("in/a.txt"), "new");
  EXPECT_THAT(Create({folder_.Path("in/sub/b.txt")}, {}, true), ElementsAre(Status::Ok));
  EXPECT_THAT(Create({folder_.Path("in/a.txt")}, {}, true), ElementsAre(Status::Ok));
  EXPECT_THAT(Extract({.path = zip_}), ElementsAre(Status::Ok, Status::Ok));
  EXPECT_EQ(Out("a.txt") + Out("sub/b.txt"), "newb");
  WriteText(zip_, "no archive");
  EXPECT_THAT(Create({folder_.Path("in/a.txt")}, {}, true), ElementsAre(Status::UnsupportedFormat));
  EXPECT_EQ(ReadText(zip_), "no archive");
}

TEST_F(ArchiveRun, PasswordsAreAskedForOnce) {
  Create({folder_.Path("in")}, "secret");
  BatchJob job;
  OutcomeBox box;
  Prepare(job, box, prompts_, false);
  EXPECT_EQ(RunArchiveTest({.path = zip_}, job), Status::Ok);
  EXPECT_TRUE(box.outcomes.empty());  // the question was canceled
  prompts_.password = "wrong";
  EXPECT_THAT(Extract({.path = zip_}),
              ElementsAre(Status::InvalidPassword, Status::InvalidPassword));
  prompts_.password = "secret";
  EXPECT_EQ(RunArchiveTest({.path = zip_}, job), Status::Ok);
  EXPECT_THAT(StatusesOf(box), ElementsAre(Status::Ok, Status::Ok));
  EXPECT_EQ(prompts_.asked, 3);
  // What is added is encrypted as well, and a wrong password changes nothing.
  WriteText(folder_.Path("in/c.txt"), "c");
  const std::vector<uint8_t> old = ReadBytes(zip_);
  prompts_.password = "wrong";
  EXPECT_THAT(Create({folder_.Path("in/c.txt")}, {}, true), ElementsAre(Status::InvalidPassword));
  EXPECT_EQ(ReadBytes(zip_), old);
  prompts_.password = "secret";
  EXPECT_THAT(Create({folder_.Path("in/c.txt")}, {}, true), ElementsAre(Status::Ok));
  EXPECT_THAT(Extract({.path = zip_, .password = "secret"}),
              ElementsAre(Status::Ok, Status::Ok, Status::Ok));
  EXPECT_EQ(Out("c.txt"), "c");
}

}  // namespace
}  // namespace fotomill::test
