#include "platform/temporary_file.h"

#include <gmock/gmock.h>
#include <signal.h>
#include <unistd.h>

#include <set>

#include "platform/files.h"
#include "platform/folders.h"
#include "platform/process.h"
#include "support/child.h"
#include "support/faults.h"
#include "support/files.h"
#include "support/scoped_environment.h"

namespace fotomill::platform {
namespace {

namespace fs = std::filesystem;
using test::ReadText;
using test::ScopedEnvironment;
using test::TemporaryFolder;
using test::WriteText;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::StartsWith;

std::span<const uint8_t> BytesOf(std::string_view text) {
  return {reinterpret_cast<const uint8_t*>(text.data()), text.size()};
}

// Works in a fresh temporary folder and a fresh current folder.
class TemporaryFileTest : public testing::Test {
 protected:
  TemporaryFileTest() : variable_("TMPDIR", temporary_.Path()), before_(CurrentFolder()) {
    EXPECT_EQ(chdir(current_.Path().c_str()), 0);
  }
  ~TemporaryFileTest() override { EXPECT_EQ(chdir(before_.c_str()), 0); }
  TemporaryFolder temporary_, current_;
  ScopedEnvironment variable_;
  std::string before_;
};

TEST_F(TemporaryFileTest, KeepsTheOldContentsOfAFile) {
  const std::string path = current_.Path("a.txt");
  // another volume
  for (const std::string& folder :
       {current_.Path("new/undo"), std::string("/dev/shm/fmw-keep-test")}) {
    SCOPED_TRACE(folder);
    const int64_t faults = test::ForEachFault([&] {
      WriteText(path, "before");
      TemporaryFile kept, other;
      const bool done = kept.Keep(path, folder);
      EXPECT_EQ(kept.Path().empty(), !done);
      const bool replaced = WriteWholeFile(path, "after");
      EXPECT_EQ(ReadText(path), replaced ? "after" : "before");
      kept.Swap(other);
      EXPECT_EQ(done ? ReadText(other.Path()) : "before", "before");
    });
    EXPECT_GT(faults, 2);
    EXPECT_TRUE(fs::is_empty(folder));
    fs::remove(folder);
  }
  TemporaryFile kept;
  EXPECT_FALSE(kept.Keep(current_.Path("missing"), current_.Path()));
  EXPECT_FALSE(kept.Keep(current_.Path(), current_.Path()));
}

TEST_F(TemporaryFileTest, HasAUniqueNameAndIsDeletedWithItsOwner) {
  std::set<std::string> paths;
  {
    TemporaryFile files[5];
    for (TemporaryFile& file : files) {
      ASSERT_TRUE(file.Create(".JPG"));
      EXPECT_THAT(file.Path(), StartsWith(temporary_.Path("FMWT")));
      EXPECT_TRUE(file.Path().ends_with(".JPG"));
      EXPECT_EQ(fs::status(file.Path()).permissions(), fs::perms::owner_read | fs::perms::owner_write);
      paths.insert(file.Path());
    }
    ASSERT_TRUE(files[0].Write(BytesOf("first and long")));
    ASSERT_TRUE(files[0].Write(BytesOf("second")));
    EXPECT_EQ(ReadText(files[0].Path()), "second");
    ASSERT_TRUE(files[0].Create());
    EXPECT_TRUE(files[0].Path().ends_with(".tmp"));
    EXPECT_EQ(temporary_.Names().size(), 5u);
  }
  EXPECT_EQ(paths.size(), 5u);
  EXPECT_THAT(temporary_.Names(), IsEmpty());
  EXPECT_THAT(current_.Names(), IsEmpty());
}

TEST_F(TemporaryFileTest, FallsBackToTheFixedNameOnce) {
  fs::create_directories(temporary_.Path(std::string(250, 'd')));
  const ScopedEnvironment tooLong("TMPDIR", temporary_.Path(std::string(250, 'd')));
  TemporaryFile first, second, third;
  ASSERT_TRUE(first.Create());
  EXPECT_EQ(first.Path(), current_.Path("TEMP$$$.$$$"));
  ASSERT_TRUE(second.Create(".JPG"));
  EXPECT_EQ(second.Path(), current_.Path("TEMP$$$.JPG"));
  EXPECT_FALSE(third.Create());
  first.Delete();
  fs::create_symlink("target", current_.Path("TEMP$$$.$$$"));
  EXPECT_FALSE(third.Create());
  second.Delete();
  EXPECT_THAT(current_.Names(), ElementsAre("TEMP$$$.$$$"));
}

TEST_F(TemporaryFileTest, DoesNotWriteThroughALinkPutInItsPlace) {
  TemporaryFile file;
  ASSERT_TRUE(file.Create());
  WriteText(current_.Path("precious"), "old");
  fs::remove(file.Path());
  fs::create_symlink(current_.Path("precious"), file.Path());
  EXPECT_FALSE(file.Write(BytesOf("new")));
  EXPECT_EQ(ReadText(current_.Path("precious")), "old");
  EXPECT_FALSE(file.Create("/../x"));
}

TEST_F(TemporaryFileTest, LeavesNothingOnEveryFault) {
  EXPECT_GE(test::ForEachFault([&] {
              {
                TemporaryFile file;
                if (file.Create() && file.Write(BytesOf("text"))) {
                  EXPECT_EQ(ReadText(file.Path()), "text");
                }
              }
              EXPECT_THAT(temporary_.Names(), IsEmpty());
              EXPECT_THAT(current_.Names(), IsEmpty());
            }),
            3);
}

TEST_F(TemporaryFileTest, IsDeletedEvenByASecondTerminationRequest) {
  const int status = test::InChild([&] {
    TemporaryFile file, kept;
    if (!file.Create() || !kept.Create()) _exit(1);
    CatchTermination();
    raise(SIGINT);
    if (temporary_.Names().size() != 2) _exit(2);
    raise(SIGINT);
  });
  EXPECT_TRUE(WIFSIGNALED(status)) << status;
  EXPECT_THAT(temporary_.Names(), IsEmpty());
}

}  // namespace
}  // namespace fotomill::platform
