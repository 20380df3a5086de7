#include "platform/store_file.h"

#include <gmock/gmock.h>
#include <signal.h>
#include <sys/stat.h>
#include <unistd.h>

#include <thread>

#include "platform/files.h"
#include "platform/process.h"
#include "support/child.h"
#include "support/faults.h"
#include "support/files.h"

namespace fotomill::platform {
namespace {

namespace fs = std::filesystem;
using Mode = StoreFile::Mode;
using OpenResult = StoreFile::OpenResult;
using test::ReadText;
using test::TemporaryFolder;
using test::WriteText;

std::span<const uint8_t> BytesOf(std::string_view text) {
  return {reinterpret_cast<const uint8_t*>(text.data()), text.size()};
}

TEST(StoreFile, OpensRegularFilesOnly) {
  const TemporaryFolder folder;
  WriteText(folder.Path("regular"), "12345");
  ASSERT_EQ(mkfifo(folder.Path("fifo").c_str(), 0600), 0);
  fs::create_directory(folder.Path("folder"));
  fs::create_symlink("regular", folder.Path("link"));
  fs::create_symlink("nothing", folder.Path("dangling"));
  const struct {
    const char* name;
    OpenResult read, readWrite, createNew;
  } rows[] = {
      {"regular", OpenResult::Done, OpenResult::Done, OpenResult::Exists},
      {"link", OpenResult::Done, OpenResult::Failed, OpenResult::Exists},
      {"dangling", OpenResult::Failed, OpenResult::Failed, OpenResult::Exists},
      {"folder", OpenResult::Failed, OpenResult::Failed, OpenResult::Exists},
      {"fifo", OpenResult::Failed, OpenResult::Failed, OpenResult::Exists},
      {"regular/x", OpenResult::Missing, OpenResult::Missing, OpenResult::Failed},
      {"new", OpenResult::Missing, OpenResult::Missing, OpenResult::Done},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    StoreFile file;
    EXPECT_EQ(file.Open(folder.Path(row.name), Mode::Read), row.read);
    EXPECT_EQ(file.Open(folder.Path(row.name), Mode::ReadWrite), row.readWrite);
    EXPECT_EQ(file.Open(folder.Path(row.name), Mode::CreateNew), row.createNew);
    EXPECT_EQ(file.IsOpen(), row.createNew == OpenResult::Done);
  }
  EXPECT_FALSE(FileExists(folder.Path("nothing")));
}

TEST(StoreFile, ReadsAndWritesAllOrFails) {
  const TemporaryFolder folder;
  StoreFile file;
  ASSERT_EQ(file.Open(folder.Path("store"), Mode::CreateNew), OpenResult::Done);
  EXPECT_TRUE(file.WriteAt(2, BytesOf("cdef")));
  EXPECT_TRUE(file.WriteAt(0, BytesOf("ab")));
  EXPECT_EQ(file.Size(), 6u);
  EXPECT_GT(file.Modified(), int64_t{1'600'000'000} * 1'000'000'000);
  uint8_t bytes[4];
  EXPECT_TRUE(file.ReadAt(2, bytes));
  EXPECT_EQ(std::string(bytes, bytes + 4), "cdef");
  for (const uint64_t offset : {uint64_t{3}, uint64_t{6}, uint64_t{INT64_MAX} - 1, UINT64_MAX}) {
    EXPECT_FALSE(file.ReadAt(offset, bytes)) << offset;
  }
  EXPECT_FALSE(file.WriteAt(UINT64_MAX - 1, BytesOf("ab")));
  StoreFile moved = std::move(file);
  EXPECT_TRUE(moved.Sync());
  EXPECT_FALSE(file.Sync());
  StoreFile reader;
  ASSERT_EQ(reader.Open(folder.Path("store"), Mode::Read), OpenResult::Done);
  EXPECT_FALSE(reader.WriteAt(0, BytesOf("x")));
  EXPECT_EQ(ReadText(folder.Path("store")), "abcdef");
}

TEST(StoreFile, DetectsReplacement) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("store");
  WriteText(path, "old");
  StoreFile file;
  ASSERT_EQ(file.Open(path, Mode::ReadWrite), OpenResult::Done);
  EXPECT_TRUE(file.IsStill(path));
  ASSERT_TRUE(WriteWholeFile(path, "new"));
  EXPECT_FALSE(file.IsStill(path));
  ASSERT_TRUE(DeleteFile(path));
  EXPECT_FALSE(file.IsStill(path));
}

// Increments the decimal number in a store `rounds` times, each time under the lock.
void Count(const std::string& path, int rounds) {
  StoreFile file;
  if (file.Open(path, Mode::ReadWrite) != OpenResult::Done) return;
  for (int i = 0; i < rounds; ++i) {
    const StoreLock lock(file);
    uint8_t digits[4];
    if (!lock.Held() || !file.ReadAt(0, digits)) return;
    const std::string next = std::to_string(std::stoi(std::string(digits, digits + 4)) + 1);
    if (!file.WriteAt(0, BytesOf(next))) return;
  }
}

TEST(StoreFile, LockIsExclusiveForThreadsAndProcesses) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("store");
  WriteText(path, "1000");
  pid_t children[3];
  for (pid_t& child : children) {
    child = fork();
    if (child == 0) {
      Count(path, 100);
      _exit(0);
    }
  }
  std::thread other(Count, path, 100);
  Count(path, 100);
  other.join();
  for (const pid_t child : children) waitpid(child, nullptr, 0);
  EXPECT_EQ(ReadText(path), "1500");
}

TEST(StoreFile, LockEndsWithItsProcessAndCanBeInterrupted) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("store");
  WriteText(path, "x");
  StoreFile file;
  ASSERT_EQ(file.Open(path, Mode::ReadWrite), OpenResult::Done);
  test::InChild([&] {
    StoreFile own;
    if (own.Open(path, Mode::ReadWrite) == OpenResult::Done && own.Lock()) kill(getpid(), SIGKILL);
  });
  ASSERT_TRUE(file.Lock());
  const int status = test::InChild([&] {
    StoreFile own;
    if (own.Open(path, Mode::ReadWrite) != OpenResult::Done) _exit(1);
    CatchTermination();
    raise(SIGTERM);
    _exit(own.Lock() ? 2 : 3);  // the parent holds it: fails instead of waiting forever
  });
  EXPECT_EQ(WEXITSTATUS(status), 3);
}

TEST(StoreFile, EveryOperationMayFail) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("store");
  EXPECT_EQ(test::ForEachFault([&] {
              fs::remove(path);
              StoreFile file;
              const OpenResult opened = file.Open(path, Mode::CreateNew);
              EXPECT_EQ(FileExists(path), opened == OpenResult::Done);
              uint8_t byte[1] = {7};
              const bool done = opened == OpenResult::Done && file.Lock() &&
                                file.WriteAt(0, byte) && file.Sync() && file.ReadAt(0, byte);
              EXPECT_EQ(done, faultCountdown > 0);
            }),
            5);
}

}  // namespace
}  // namespace fotomill::platform
