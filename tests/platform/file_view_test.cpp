#include "platform/file_view.h"

#include <gtest/gtest.h>
#include <signal.h>
#include <sys/stat.h>
#include <unistd.h>

#include <numeric>
#include <vector>

#include "support/child.h"
#include "support/faults.h"
#include "support/files.h"

namespace fotomill::platform {
namespace {

namespace fs = std::filesystem;
using test::TemporaryFolder;
using test::WriteBytes;

// Nonzero bytes that depend on their offset.
std::vector<uint8_t> Pattern(size_t size) {
  std::vector<uint8_t> bytes(size);
  for (size_t i = 0; i < size; ++i) bytes[i] = static_cast<uint8_t>(1 + (i * 7 + i / 251) % 255);
  return bytes;
}

bool Equal(std::span<const uint8_t> view, std::span<const uint8_t> expected) {
  return std::equal(view.begin(), view.end(), expected.begin(), expected.end());
}

constexpr size_t kSizes[] = {0, 1, 4096, 262'143, 262'144, 262'145, 5'000'001};

TEST(FileView, ShowsTheWholeFileOrItsHead) {
  const TemporaryFolder folder;
  for (const size_t size : kSizes) {
    SCOPED_TRACE(size);
    const std::vector<uint8_t> bytes = Pattern(size);
    const std::string path = folder.Path("file");
    WriteBytes(path, bytes);
    FileView view;
    ASSERT_TRUE(view.Open(path));
    EXPECT_TRUE(Equal(view.Bytes(), bytes));
    EXPECT_EQ(view.FileSize(), size);
    for (const size_t part : {size_t{0}, size / 2, size, size + 1}) {
      ASSERT_TRUE(view.OpenHead(path.c_str(), part));
      const size_t seen = std::min(part, size);
      EXPECT_TRUE(Equal(view.Bytes(), std::span(bytes).first(seen)));
      EXPECT_EQ(view.FileSize(), size);
      std::vector<uint8_t> rest(size - seen);
      EXPECT_TRUE(view.ReadAt(seen, rest));  // the file after the head
      EXPECT_TRUE(Equal(rest, std::span(bytes).subspan(seen)));
      uint8_t one[1];
      for (const uint64_t past : {uint64_t{size}, UINT64_MAX})
        EXPECT_FALSE(view.ReadAt(past, one)) << past;
    }
    FileView moved = std::move(view);
    EXPECT_TRUE(view.Bytes().empty());
    EXPECT_TRUE(Equal(moved.Bytes(), bytes));
    moved.DropBefore(size / 2);
    moved.DropBefore(UINT64_MAX);
    EXPECT_TRUE(Equal(moved.Bytes(), bytes));  // read again
    EXPECT_TRUE(moved.Intact());
  }
}

TEST(FileView, OpensRegularFilesOnly) {
  const TemporaryFolder folder;
  ASSERT_EQ(mkfifo(folder.Path("fifo").c_str(), 0600), 0);
  fs::create_directory(folder.Path("folder"));
  fs::create_symlink("nothing", folder.Path("dangling"));
  fs::create_symlink("fifo", folder.Path("to fifo"));
  WriteBytes(folder.Path("regular"), Pattern(10));
  FileView view;
  for (const std::string& path :
       {folder.Path("fifo"), folder.Path("folder"), folder.Path("dangling"), folder.Path("to fifo"),
        folder.Path("missing"), std::string("/dev/null"), std::string("/dev/zero"),
        std::string()}) {
    ASSERT_TRUE(view.Open(folder.Path("regular")));
    EXPECT_FALSE(view.Open(path)) << path;
    EXPECT_TRUE(view.Bytes().empty()) << path;
    EXPECT_EQ(view.FileSize(), 0u) << path;
  }
}

TEST(FileView, TruncatedFilesReadAsZerosAndAreNotIntact) {
  const TemporaryFolder folder;
  constexpr size_t kSize = 1'000'000;
  const std::vector<uint8_t> bytes = Pattern(kSize);
  for (const size_t left : {size_t{0}, size_t{1}, size_t{4096}, size_t{500'000}, kSize - 1}) {
    SCOPED_TRACE(left);
    const std::string path = folder.Path("file"), other = folder.Path("other");
    WriteBytes(path, bytes);
    WriteBytes(other, bytes);
    FileView before, view, after;
    ASSERT_TRUE(before.Open(other) && view.Open(path) && after.Open(other));
    ASSERT_EQ(truncate(path.c_str(), static_cast<off_t>(left)), 0);
    EXPECT_TRUE(Equal(view.Bytes().first(left), std::span(bytes).first(left)));
    const std::span<const uint8_t> lost = view.Bytes().subspan(left);
    EXPECT_EQ(std::accumulate(lost.begin(), lost.end(), 0), 0);
    EXPECT_FALSE(view.Intact());
    std::vector<uint8_t> copy(kSize);
    EXPECT_FALSE(view.ReadAt(0, copy));
    EXPECT_TRUE(before.Intact() && after.Intact());  // other views are not affected
    EXPECT_TRUE(Equal(before.Bytes(), bytes) && Equal(after.Bytes(), bytes));
    ASSERT_TRUE(view.Open(other));  // a slot is reset
    EXPECT_TRUE(view.Intact() && Equal(view.Bytes(), bytes));
  }
}

TEST(FileView, OtherBusErrorsStillCrash) {
  const TemporaryFolder folder;
  WriteBytes(folder.Path("file"), Pattern(1'000'000));
  const int status = test::InChild([&] {
    FileView view;
    if (!view.Open(folder.Path("file"))) _exit(91);
    signal(SIGALRM, SIG_DFL);
    alarm(20);
    kill(getpid(), SIGBUS);
    _exit(92);
  });
  EXPECT_FALSE(WIFEXITED(status) && WEXITSTATUS(status) > 90) << status;  // signal or sanitizer
}

TEST(FileView, MoreViewsThanTableSlots) {
  const TemporaryFolder folder;
  const std::vector<uint8_t> bytes = Pattern(300'000);
  WriteBytes(folder.Path("file"), bytes);
  std::vector<FileView> views(300);
  for (FileView& view : views) ASSERT_TRUE(view.Open(folder.Path("file")));
  for (const FileView& view : views) ASSERT_TRUE(Equal(view.Bytes(), bytes));
}

TEST(FileView, FailsCleanlyOnEveryFault) {
  const TemporaryFolder folder;
  for (const size_t size : {size_t{1000}, size_t{500'000}}) {
    const std::vector<uint8_t> bytes = Pattern(size);
    WriteBytes(folder.Path("file"), bytes);
    EXPECT_GE(test::ForEachFault([&] {
                FileView view;
                if (view.Open(folder.Path("file"))) {
                  EXPECT_TRUE(Equal(view.Bytes(), bytes));
                } else {
                  EXPECT_EQ(view.FileSize(), 0u);
                }
              }),
              2);
  }
}

}  // namespace
}  // namespace fotomill::platform
