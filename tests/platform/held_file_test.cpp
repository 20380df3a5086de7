#include "platform/held_file.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <signal.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <filesystem>
#include <functional>

#include "platform/existence.h"
#include "platform/files.h"
#include "platform/posix/exchange.h"
#include "platform/posix/stale_files.h"
#include "platform/reason.h"
#include "support/child.h"
#include "support/files.h"

namespace fotomill::platform {
namespace {

namespace fs = std::filesystem;
using test::InChild;
using test::ReadText;
using test::TemporaryFolder;
using test::WriteText;
using testing::ElementsAre;
using testing::HasSubstr;

std::span<const uint8_t> BytesOf(std::string_view text) {
  return {reinterpret_cast<const uint8_t*>(text.data()), text.size()};
}

CommitResult WriteAs(const std::string& path, std::string_view text) {
  OutputFile file;
  if (!file.Create(path) || !file.Write(BytesOf(text))) return CommitResult::Failed;
  return file.Commit(Existing::Replace);
}

// Drops root privileges within a scope, since root may do everything.
class OrdinaryUser {
 public:
  OrdinaryUser() : stepped_(geteuid() == 0 && setegid(65534) == 0 && seteuid(65534) == 0) {}
  ~OrdinaryUser() {
    if (stepped_ && (seteuid(0) != 0 || setegid(0) != 0)) ADD_FAILURE() << "cannot step up again";
  }
  OrdinaryUser(const OrdinaryUser&) = delete;
  OrdinaryUser& operator=(const OrdinaryUser&) = delete;

 private:
  bool stepped_;
};

class HeldFileTest : public testing::TestWithParam<ReplaceWay> {
 protected:
  HeldFileTest() { replaceWay = GetParam(); }
  ~HeldFileTest() override {
    replaceWay = ReplaceWay::Exchange;
    beforeReplacing = nullptr;
  }
  std::string Path(std::string_view name = "file") const { return folder_.Path(name); }
  TemporaryFolder folder_;
};
INSTANTIATE_TEST_SUITE_P(Ways, HeldFileTest, testing::Values(ReplaceWay::Exchange, ReplaceWay::Link, ReplaceWay::Look));

// How another program changes the file, and the result.
void WriteInPlace(const std::string& path) { WriteText(path, "theirs, in place"); }
void SaveBeside(const std::string& path) {
  WriteText(path + ".new", "theirs");
  fs::rename(path + ".new", path);
}
void Remove(const std::string& path) { fs::remove(path); }

TEST_P(HeldFileTest, ConcurrentChangesAreKept) {
  const struct {
    const char* name;
    void (*change)(const std::string& path);
    const char* left;
    bool seenAfterwards;  // even when only checked afterwards
  } rows[] = {{"in place", WriteInPlace, "theirs, in place", true},
              {"saved beside", SaveBeside, "theirs", GetParam() == ReplaceWay::Exchange},
              {"same length, in place", [](const std::string& path) { WriteText(path, "OLD"); }, "OLD", true}};
  for (const auto& row : rows) {
    for (const bool gap : {false, true}) {
      if (gap && (GetParam() == ReplaceWay::Look || !row.seenAfterwards)) continue;
      SCOPED_TRACE(std::string(row.name) + (gap ? ", in the last moment" : ""));
      WriteText(Path(), "old");
      ASSERT_TRUE(SetModificationTime(Path(), {1'000'000'000, 5}));
      HeldFile held;
      ASSERT_TRUE(held.Hold(Path()));
      if (!gap) row.change(Path());
      beforeReplacing = gap ? row.change : nullptr;
      EXPECT_EQ(WriteAs(Path(), "ours"), CommitResult::Failed);
      beforeReplacing = nullptr;
      EXPECT_TRUE(held.Changed());
      EXPECT_EQ(SystemReason(), "The file was changed by another program");
      EXPECT_EQ(ReadText(Path()), row.left);
      EXPECT_THAT(folder_.Names(), ElementsAre("file"));
    }
  }
  HeldFile held;
  ASSERT_TRUE(held.Hold(Path()));
  Remove(Path());
  EXPECT_EQ(WriteAs(Path(), "ours"), CommitResult::Failed) << "it was deleted";
  ASSERT_TRUE(held.Hold(Path()));
  EXPECT_EQ(WriteAs(Path(), "ours"), CommitResult::Done) << "it was not there";
  ASSERT_TRUE(held.Hold(Path()));
  EXPECT_EQ(WriteAs(Path(), "ours again"), CommitResult::Done);
  EXPECT_FALSE(held.Changed());
  EXPECT_EQ(ReadText(Path()), "ours again");
  EXPECT_EQ(WriteAs(Path(), "and again"), CommitResult::Failed) << "it is not the held one any more";
  held.Release();
  EXPECT_EQ(WriteAs(Path(), "and again"), CommitResult::Done);
  EXPECT_THAT(folder_.Names(), ElementsAre("file"));
}

// Each appends its letter to the contents; without the lock, letters would be lost.
TEST_P(HeldFileTest, RunsAreSerialized) {
  constexpr int kRuns = 8, kTimes = 20;
  WriteText(Path(), "");
  pid_t children[kRuns];
  for (pid_t& child : children) {
    child = fork();
    if (child != 0) continue;
    for (int i = 0; i < kTimes; ++i) {
      HeldFile held;
      if (!held.Hold(Path()) || WriteAs(Path(), ReadText(Path()) + "x") != CommitResult::Done)
        _exit(1);
    }
    _exit(0);
  }
  for (const pid_t child : children) {
    int status = -1;
    waitpid(child, &status, 0);
    EXPECT_EQ(status, 0);
  }
  EXPECT_EQ(ReadText(Path()), std::string(kRuns * kTimes, 'x'));
}

TEST(ReplacedFile, KeepsTheFilesAttributes) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("file");
  WriteText(path, "old");
  if (setxattr(path.c_str(), "user.rating", "5", 1, 0) != 0)
    GTEST_SKIP() << "no extended attributes here";
  const std::string longer(2000, 't');
  ASSERT_EQ(setxattr(path.c_str(), "user.tags", longer.data(), longer.size(), 0), 0);
  // Version 2; the owner rw, user 65533 r, the group none, mask r, others none.
  const std::string list(
      "\2\0\0\0"
      "\1\0\6\0\xff\xff\xff\xff"
      "\2\0\4\0\xfd\xff\0\0"
      "\4\0\0\0\xff\xff\xff\xff"
      "\20\0\4\0\xff\xff\xff\xff"
      "\40\0\0\0\xff\xff\xff\xff",
      44);
  const bool hasList =
      setxattr(path.c_str(), "system.posix_acl_access", list.data(), list.size(), 0) == 0;
  const bool root = geteuid() == 0;
  if (root) {
    ASSERT_EQ(chown(path.c_str(), 1234, 4321), 0);
  }
  ASSERT_EQ(WriteAs(path, "new"), CommitResult::Done);
  EXPECT_EQ(TakeLostAttributes(), "");
  char value[4096];
  EXPECT_EQ(getxattr(path.c_str(), "user.rating", value, sizeof value), 1);
  EXPECT_EQ(getxattr(path.c_str(), "user.tags", value, sizeof value), 2000);
  if (hasList) {
    ASSERT_EQ(getxattr(path.c_str(), "system.posix_acl_access", value, sizeof value), 44);
    EXPECT_EQ(std::string(value, 44), list);
  }
  struct stat facts;
  ASSERT_EQ(stat(path.c_str(), &facts), 0);
  if (!root) return;
  EXPECT_EQ(facts.st_uid, 1234u);
  EXPECT_EQ(facts.st_gid, 4321u);
  // An ordinary user cannot set the owner, and reports that.
  ASSERT_EQ(removexattr(path.c_str(), "system.posix_acl_access") == 0 || !hasList, true);
  ASSERT_EQ(chmod(path.c_str(), 0666), 0);
  ASSERT_EQ(chmod(folder.Path().c_str(), 0777), 0);
  const OrdinaryUser ordinary;
  ASSERT_EQ(WriteAs(path, "newer"), CommitResult::Done);
  EXPECT_EQ(TakeLostAttributes(), "group, owner");
  EXPECT_EQ(TakeLostAttributes(), "");
}

TEST(ReplacedFile, SystemLinksAreKept) {
  const TemporaryFolder folder;
  fs::create_directory(folder.Path("folder"));
  fs::create_symlink("folder", folder.Path("to-folder"));
  fs::create_symlink("/dev/null", folder.Path("to-device"));
  fs::create_symlink("/proc/self/fd/1", folder.Path("to-open-file"));
  for (const char* name : {"to-folder", "to-device", "to-open-file"}) {
    EXPECT_EQ(WriteAs(folder.Path(name), "new"), CommitResult::Failed) << name;
    EXPECT_TRUE(fs::is_symlink(folder.Path(name))) << name;
  }
}

TEST(Existence, HasThreeValues) {
  const TemporaryFolder folder;
  fs::create_directory(folder.Path("locked"));
  WriteText(folder.Path("locked/there"), "");
  ASSERT_EQ(chmod(folder.Path().c_str(), 0755), 0);
  EXPECT_EQ(ExistenceOf(folder.Path("locked/there")), Existence::Yes);
  EXPECT_EQ(ExistenceOf(folder.Path("locked/none")), Existence::No);
  EXPECT_EQ(ExistenceOf(folder.Path("none/none")), Existence::No);
  ASSERT_EQ(chmod(folder.Path("locked").c_str(), 0), 0);
  {
    const OrdinaryUser ordinary;
    EXPECT_EQ(ExistenceOf(folder.Path("locked/there")), Existence::Unknown);
    EXPECT_EQ(SystemReason(), "Permission denied");
    OutputFile file;
    ForgetReason();
    EXPECT_FALSE(file.Create(folder.Path("locked/new")));
    EXPECT_EQ(SystemReason(), "Permission denied");
    EXPECT_FALSE(MakeFolders(folder.Path("locked/a/b")));
    EXPECT_EQ(SystemReason(), "Permission denied");
  }
  ASSERT_EQ(chmod(folder.Path("locked").c_str(), 0755), 0);
}

TEST(StaleFiles, OfKilledRunsAreDeleted) {
  const TemporaryFolder folder;
  std::string dead, live = OwnerOfTemporary();
  int ends[2];
  ASSERT_EQ(pipe(ends), 0);
  InChild([&] {
    const std::string owner = OwnerOfTemporary();
    (void)!write(ends[1], owner.data(), owner.size());
  });
  close(ends[1]);
  char text[64];
  const ssize_t count = read(ends[0], text, sizeof text);
  close(ends[0]);
  ASSERT_GT(count, 0);
  dead.assign(text, static_cast<size_t>(count));
  for (const std::string& owner : {dead, live}) {
    WriteText(folder.Path(".fmw-" + owner + "-1.tmp"), "left");
    WriteText(folder.Path("FMWT" + owner + "-00000001.jpg"), "left");
  }
  WriteText(folder.Path("FMWTheatre.jpg"), "mine");
  WriteText(folder.Path(".fmw-" + dead + "-2.tmp"), "of a thread that writes it");
  const int locked = open(folder.Path(".fmw-" + dead + "-2.tmp").c_str(), O_RDONLY | O_CLOEXEC);
  ASSERT_EQ(flock(locked, LOCK_EX | LOCK_NB), 0);
  DeleteStaleFiles(folder.Path());
  EXPECT_THAT(folder.Names(), testing::UnorderedElementsAre(".fmw-" + dead + "-2.tmp", ".fmw-" + live + "-1.tmp",
                                                            "FMWT" + live + "-00000001.jpg", "FMWTheatre.jpg"));
  close(locked);
}

}  // namespace
}  // namespace fotomill::platform
