#include "platform/output_file.h"

#include <gmock/gmock.h>
#include <signal.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <thread>

#include "platform/files.h"
#include "platform/posix/handle.h"
#include "platform/process.h"
#include "support/child.h"
#include "support/faults.h"
#include "support/files.h"

namespace fotomill::platform {
namespace {

namespace fs = std::filesystem;
using test::ReadText;
using test::TemporaryFolder;
using test::WriteText;
using testing::ElementsAre;
using testing::IsEmpty;

std::span<const uint8_t> BytesOf(std::string_view text) {
  return {reinterpret_cast<const uint8_t*>(text.data()), text.size()};
}

// Every case runs with each method of creating a file.
class OutputFileTest : public testing::TestWithParam<UnnamedFiles> {
 protected:
  OutputFileTest() { unnamedFiles = GetParam(); }
  ~OutputFileTest() override { unnamedFiles = UnnamedFiles::Work; }
  std::string Path(std::string_view name) const { return folder_.Path(name); }
  TemporaryFolder folder_;
};
INSTANTIATE_TEST_SUITE_P(Systems, OutputFileTest,
                         testing::Values(UnnamedFiles::Work, UnnamedFiles::DoNotWork,
                                         UnnamedFiles::GetNoName));

CommitResult WriteAs(const std::string& path, std::string_view text, Existing existing,
                     bool sync = false) {
  OutputFile file;
  if (!file.Create(path) || !file.Write(BytesOf("?")) || !file.Write(BytesOf(text.substr(1))))
    return CommitResult::Failed;
  if (!file.WriteAt(0, BytesOf(text.substr(0, 1)))) return CommitResult::Failed;
  return file.Commit(existing, sync);
}

TEST_P(OutputFileTest, AppearsWholeUnderAnyName) {
  const std::vector<std::string> names = {
      "\nline\n", " ", "\"'`$", "--out", ".hidden", "a", "a.b.c", "back\\slash", std::string(255, 'n'), "\xFF\xFE.bmp"};
  for (const std::string& name : names) {
    OutputFile file;
    ASSERT_TRUE(file.Create(Path(name)));
    EXPECT_TRUE(file.Write(BytesOf("text")));
    EXPECT_FALSE(FileExists(Path(name)));
    EXPECT_EQ(file.Commit(Existing::Refuse), CommitResult::Done);
    EXPECT_EQ(file.Commit(Existing::Refuse), CommitResult::Failed);
    EXPECT_EQ(ReadText(Path(name)), "text");
    EXPECT_EQ(WriteAs(Path(name), "other", Existing::Refuse), CommitResult::Taken);
    EXPECT_EQ(ReadText(Path(name)), "text");
    EXPECT_EQ(WriteAs(Path(name), "other", Existing::Replace), CommitResult::Done);
    EXPECT_EQ(ReadText(Path(name)), "other");
  }
  EXPECT_EQ(folder_.Names(), names);
}

TEST_P(OutputFileTest, InvalidDestinationsAreUnchanged) {
  fs::create_directory(Path("folder"));
  WriteText(Path("folder/inner"), "inner");
  ASSERT_EQ(mkfifo(Path("fifo").c_str(), 0600), 0);
  WriteText(Path("regular"), "old");
  for (const std::string& name :
       {Path("folder"), Path("fifo"), Path("folder/"), Path("."), Path("no/such"),
        Path("regular/x"), Path(std::string(256, 'n')), std::string()}) {
    OutputFile file;
    EXPECT_FALSE(file.Create(name)) << name;
    EXPECT_FALSE(file.Write(BytesOf("x"))) << name;
    EXPECT_EQ(file.Commit(Existing::Replace), CommitResult::Failed) << name;
  }
  OutputFile late;  // the name is taken before the commit
  ASSERT_TRUE(late.Create(Path("late")));
  ASSERT_EQ(mkfifo(Path("late").c_str(), 0600), 0);
  EXPECT_EQ(late.Commit(Existing::Replace), CommitResult::Failed);
  EXPECT_THAT(folder_.Names(), ElementsAre("fifo", "folder", "late", "regular"));
  ASSERT_EQ(chmod(Path("regular").c_str(), 0444), 0);
  ASSERT_EQ(chmod(folder_.Path().c_str(), 0777), 0);
  // root may write to everything
  const bool stepsDown = geteuid() == 0 && seteuid(65534) == 0;
  EXPECT_EQ(WriteAs(Path("regular"), "new", Existing::Replace), CommitResult::Failed);
  if (stepsDown) {
    ASSERT_EQ(seteuid(0), 0);
  }
  EXPECT_EQ(ReadText(Path("regular")), "old");
}

TEST_P(OutputFileTest, LinksAreReplacedNeverFollowed) {
  WriteText(Path("precious"), "old");
  fs::create_symlink("precious", Path("link"));
  fs::create_symlink("nothing", Path("dangling"));
  EXPECT_EQ(WriteAs(Path("dangling"), "new", Existing::Refuse), CommitResult::Taken);
  for (const char* name : {"link", "dangling"}) {
    EXPECT_EQ(WriteAs(Path(name), "new", Existing::Replace), CommitResult::Done) << name;
    EXPECT_FALSE(fs::is_symlink(Path(name)));
  }
  EXPECT_EQ(ReadText(Path("precious")), "old");
  EXPECT_THAT(folder_.Names(), ElementsAre("dangling", "link", "precious"));
}

TEST_P(OutputFileTest, PermissionsFollowTheMaskOrTheOldFile) {
  const mode_t saved = umask(027);
  const struct {
    const char* name;
    mode_t old, expected;  // old 0: a new file
  } rows[] = {
      {"new", 0, 0640}, {"private", 0600, 0600}, {"shared", 0666, 0666}, {"program", 0755, 0755}, {"special", 06711, 0711}};
  for (const auto& row : rows) {
    if (row.old != 0) {
      WriteText(Path(row.name), "old");
      ASSERT_EQ(chmod(Path(row.name).c_str(), row.old), 0);
    }
    EXPECT_EQ(WriteAs(Path(row.name), "new", Existing::Replace), CommitResult::Done);
    EXPECT_EQ(fs::status(Path(row.name)).permissions(), static_cast<fs::perms>(row.expected)) << row.name;
  }
  umask(saved);
}

TEST_P(OutputFileTest, OldOrNewAndNoLeftoversOnEveryFault) {
  const std::string text(300'000, 'n');
  const struct {
    const char* name;
    bool old, sync;
    Existing existing;
  } rows[] = {
      {"new, refusing", false, false, Existing::Refuse},
      {"new, synced", false, true, Existing::Refuse},
      {"new, replacing", false, false, Existing::Replace},
      {"over an old file", true, false, Existing::Replace},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    EXPECT_GE(test::ForEachFault([&] {
                fs::remove(Path("file"));
                if (row.old) WriteText(Path("file"), "old");
                const bool done =
                    WriteAs(Path("file"), text, row.existing, row.sync) == CommitResult::Done;
                EXPECT_EQ(ReadText(Path("file")), done ? text : row.old ? "old" : "");
                EXPECT_EQ(folder_.Names().size(), done || row.old ? 1u : 0u);
              }),
              row.old || row.sync ? 6 : 5);
  }
}

TEST_P(OutputFileTest, AFullDiskLeavesTheOldFile) {
  WriteText(Path("file"), "old");
  const int status = test::InChild([&] {
    const rlimit limit{100'000, 100'000};
    setrlimit(RLIMIT_FSIZE, &limit);
    signal(SIGXFSZ, SIG_IGN);
    OutputFile file;
    const std::string text(70'000, 'n');
    if (!file.Create(Path("file")) || !file.Write(BytesOf(text))) _exit(1);
    if (file.Write(BytesOf(text)) || file.Write(BytesOf("x"))) _exit(2);  // write errors are sticky
    if (file.Commit(Existing::Replace) != CommitResult::Failed) _exit(3);
  });
  EXPECT_EQ(status, 0);
  EXPECT_EQ(ReadText(Path("file")), "old");
  EXPECT_THAT(folder_.Names(), ElementsAre("file"));
}

TEST_P(OutputFileTest, AKilledProgramLeavesNothing) {
  for (const int number : {SIGKILL, SIGTERM}) {
    // only a named file can be left behind
    if (number == SIGKILL && GetParam() == UnnamedFiles::DoNotWork) continue;
    const int status = test::InChild([&] {
      OutputFile file;
      if (!file.Create(Path("file")) || !file.Write(BytesOf("text"))) _exit(1);
      CatchTermination();
      raise(SIGINT);
      raise(number);
    });
    EXPECT_TRUE(WIFSIGNALED(status));
    EXPECT_EQ(WTERMSIG(status), number);
    EXPECT_THAT(folder_.Names(), IsEmpty());
  }
}

TEST_P(OutputFileTest, OneWinsARaceForAName) {
  constexpr int kRunners = 4, kRounds = 30;
  for (int round = 0; round < kRounds; ++round) {
    CommitResult results[kRunners];
    std::vector<std::thread> runners;
    for (int i = 0; i < kRunners; ++i) {
      runners.emplace_back(
          [&, i] { results[i] = WriteAs(Path("name"), std::to_string(i), Existing::Refuse); });
    }
    for (std::thread& runner : runners) runner.join();
    EXPECT_EQ(std::count(results, results + kRunners, CommitResult::Done), 1);
    EXPECT_EQ(std::count(results, results + kRunners, CommitResult::Taken), kRunners - 1);
    const int winner =
        static_cast<int>(std::find(results, results + kRunners, CommitResult::Done) - results);
    EXPECT_EQ(ReadText(Path("name")), std::to_string(winner));
    EXPECT_THAT(folder_.Names(), ElementsAre("name"));
    fs::remove(Path("name"));
  }
}

}  // namespace
}  // namespace fotomill::platform
