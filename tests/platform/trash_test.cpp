#include <gmock/gmock.h>
#include <sched.h>
#include <sys/mount.h>
#include <unistd.h>

#include "platform/clock.h"
#include "platform/files.h"
#include "platform/reason.h"
#include "platform/rights.h"
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

std::vector<std::string> NamesIn(const std::string& folder) {
  std::vector<std::string> names;
  for (const FolderEntry& entry : ListFolder(folder).value_or(std::vector<FolderEntry>{}))
    names.push_back(entry.name);
  return names;
}

// The user's data folder is a fresh one on the files' device, so that their trash is data/Trash.
class TrashTest : public testing::Test {
 protected:
  TrashTest() : data_("XDG_DATA_HOME", folder_.Path("data")), zone_("TZ", "XYZ-2") {
    fs::create_directory(folder_.Path("pictures"));
    FixNow(951782399);
  }
  ~TrashTest() override { FixNow(-1); }
  std::string Picture(std::string_view name) const {
    return folder_.Path("pictures/" + std::string(name));
  }
  std::string Trash(std::string_view name) const {
    return folder_.Path("data/Trash/" + std::string(name));
  }
  TemporaryFolder folder_;
  ScopedEnvironment data_, zone_;
};

TEST_F(TrashTest, RecordsPathAndTime) {
  const std::string name = "100% \"a\"\n\xC3\xA9\xFF.bmp";
  WriteText(Picture(name), "pixels");
  EXPECT_TRUE(HasTrash(Picture(name)));
  EXPECT_FALSE(FileExists(Trash("")));
  ASSERT_TRUE(MoveToTrash(Picture(name)));
  EXPECT_FALSE(FileExists(Picture(name)));
  EXPECT_EQ(ReadText(Trash("files/" + name)), "pixels");
  EXPECT_EQ(
      ReadText(Trash("info/" + name + ".trashinfo")),
      "[Trash Info]\nPath=" + folder_.Path("pictures") + "/100%25%20%22a%22%0A%C3%A9%FF.bmp\nDeletionDate=2000-02-29T01:59:59\n");
  EXPECT_EQ(fs::status(Trash("")).permissions(), fs::perms::owner_all);
}

TEST_F(TrashTest, KeepsFilesWithTheSameName) {
  for (const char* text : {"1", "2", "3"}) {
    WriteText(Picture("a.b.bmp"), text);
    ASSERT_TRUE(MoveToTrash(Picture("a.b.bmp")));
  }
  EXPECT_THAT(NamesIn(Trash("files")), ElementsAre("a.b.2.bmp", "a.b.3.bmp", "a.b.bmp"));
  EXPECT_EQ(ReadText(Trash("files/a.b.2.bmp")), "2");
  WriteText(Trash("files/left"), "without info");  // a name may exist in either folder
  WriteText(Picture("left"), "new");
  ASSERT_TRUE(MoveToTrash(Picture("left")));
  EXPECT_EQ(ReadText(Trash("files/left")), "without info");
  EXPECT_EQ(ReadText(Trash("files/left.2")), "new");
  EXPECT_FALSE(FileExists(Trash("info/left.trashinfo")));
}

TEST_F(TrashTest, RestoresTheLastDeleted) {
  for (const char* text : {"older", "newer"}) {
    WriteText(Picture("a%.bmp"), text);
    ASSERT_TRUE(MoveToTrash(Picture("a%.bmp")));
    FixNow(Now() + 1);
  }
  EXPECT_FALSE(RestoreFromTrash(Picture("b.bmp")));
  WriteText(Picture("a%.bmp"), "in the way");
  EXPECT_FALSE(RestoreFromTrash(Picture("a%.bmp")));
  EXPECT_EQ(ReadText(Picture("a%.bmp")), "in the way");
  for (const char* text : {"newer", "older"}) {
    fs::remove(Picture("a%.bmp"));
    ASSERT_TRUE(RestoreFromTrash(Picture("a%.bmp")));
    EXPECT_EQ(ReadText(Picture("a%.bmp")), text);
  }
  EXPECT_THAT(NamesIn(Trash("info")), IsEmpty());
}

TEST_F(TrashTest, AcceptsFoldersLinksAndLongNames) {
  fs::create_directories(Picture("folder/inner"));
  fs::create_symlink("folder", Picture("link"));
  fs::create_symlink("nothing", Picture("dangling"));
  const std::string longName = std::string(250, 'n') + ".bmp";
  WriteText(Picture(longName), "long");
  fs::create_symlink(Picture(""), folder_.Path("way"));
  EXPECT_TRUE(MoveToTrash(folder_.Path("way/link")));
  EXPECT_TRUE(MoveToTrash(Picture("dangling")));
  EXPECT_TRUE(MoveToTrash(Picture("folder/")));
  EXPECT_TRUE(MoveToTrash(Picture(longName)));
  EXPECT_THAT(NamesIn(Picture("")), IsEmpty());
  EXPECT_TRUE(fs::is_directory(Trash("files/folder/inner")));
  EXPECT_TRUE(fs::is_symlink(Trash("files/link")));
  EXPECT_THAT(ReadText(Trash("info/link.trashinfo")), testing::HasSubstr("/pictures/link\n"));
  EXPECT_THAT(ReadText(Trash("info/" + std::string(200, 'n') + ".bmp.trashinfo")), testing::HasSubstr("/" + longName + "\n"));
}

TEST_F(TrashTest, FailsWithoutLeftovers) {
  const std::vector<std::string> before = folder_.Names();
  for (const std::string& path :
       {Picture("missing"), Picture("no/such"), Picture("."), Picture(".."), std::string("/"), std::string()}) {
    EXPECT_FALSE(MoveToTrash(path)) << path;
    EXPECT_FALSE(HasTrash(path)) << path;
  }
  WriteText(Picture("a"), "1");
  EXPECT_GE(test::ForEachFault([&] {
              if (MoveToTrash(Picture("a"))) {
                EXPECT_FALSE(FileExists(Picture("a")));
              } else {
                EXPECT_EQ(ReadText(Picture("a")), "1");
                EXPECT_EQ(folder_.Names(), before);  // not even an empty trash
              }
            }),
            6);
  WriteText(Picture("b"), "1");
  fs::remove_all(folder_.Path("data"));
  WriteText(folder_.Path("data"), "in the way");
  EXPECT_FALSE(MoveToTrash(Picture("b")));
  EXPECT_EQ(ReadText(Picture("b")), "1");
}

// Mounts a small volume at `folder`, visible to this process only. False if that is not permitted.
bool MountVolume(const std::string& folder) {
  const std::string user = std::to_string(getuid()), group = std::to_string(getgid());
  if (unshare(CLONE_NEWNS) != 0) {
    if (unshare(CLONE_NEWUSER | CLONE_NEWNS) != 0) return false;
    WriteText("/proc/self/setgroups", "deny");
    WriteText("/proc/self/uid_map", user + " " + user + " 1");
    WriteText("/proc/self/gid_map", group + " " + group + " 1");
  }
  return mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0 &&
         mount("none", folder.c_str(), "tmpfs", 0, "size=1m") == 0;
}

constexpr int kNotAllowed = 77;

TEST_F(TrashTest, SaysWhyAFileCannotBeMoved) {
  constexpr auto kAll = fs::perms::all;
  WriteText(Picture("a"), "1");
  EXPECT_TRUE(MayBeMoved(Picture("a")));
  fs::create_directories(Trash("files"));
  for (const char* folder : {"", "data", "data/Trash", "data/Trash/files"})
    fs::permissions(folder_.Path(folder), kAll);
  fs::permissions(Picture(""), fs::perms::others_write, fs::perm_options::remove);
  const int status = test::InChild([&] {
    if (getuid() == 0 && (setgid(65534) != 0 || setuid(65534) != 0)) _exit(kNotAllowed);
    if (getuid() != 65534)
      fs::permissions(Picture(""), fs::perms::owner_read | fs::perms::owner_exec);
    const bool refused = !MayBeMoved(Picture("a")) && !MoveToTrash(Picture("a"));
    _exit(refused && SystemReason() == "Permission denied" ? 0 : 1);
  });
  fs::permissions(Picture(""), kAll);
  ASSERT_TRUE(WIFEXITED(status));
  if (WEXITSTATUS(status) == kNotAllowed) GTEST_SKIP() << "another user is not allowed";
  EXPECT_EQ(WEXITSTATUS(status), 0);
  EXPECT_TRUE(MoveToTrash(Picture("a")));
  EXPECT_FALSE(MoveToTrash(Picture("a")));
  EXPECT_EQ(SystemReason(), "");
}

TEST_F(TrashTest, OtherVolumesHaveTheirOwn) {
  const int status = test::InChild([&] {
    if (!MountVolume(Picture(""))) _exit(kNotAllowed);
    const std::string user = std::to_string(getuid());
    const std::string own = ".Trash-" + user, administered = ".Trash/" + user;
    int step = 0;
    const auto check = [&step](bool holds) {
      ++step;
      if (!holds) _exit(step);
    };
    const auto gone = [&](const char* name, const std::string& trash) {
      fs::create_directories(Picture("sub"));
      WriteText(Picture(std::string("sub/") + name), name);
      return HasTrash(Picture(std::string("sub/") + name)) &&
             MoveToTrash(Picture(std::string("sub/") + name)) &&
             ReadText(Picture(trash + "/files/" + name)) == name &&
             ReadText(Picture(trash + "/info/" + name + ".trashinfo"))
                     .find("\nPath=sub/" + std::string(name) + "\n") != std::string::npos;
    };
    check(gone("a", own));
    fs::create_directory(Picture(".Trash"));
    check(gone("unsticky", own));
    fs::permissions(Picture(".Trash"), fs::perms::sticky_bit, fs::perm_options::add);
    check(gone("b", administered));
    fs::remove_all(Picture(".Trash"));
    fs::create_directory(Picture("elsewhere"));
    fs::permissions(Picture("elsewhere"), fs::perms::sticky_bit, fs::perm_options::add);
    fs::create_symlink("elsewhere", Picture(".Trash"));  // links are not trusted
    check(gone("c", own));
    fs::rename(Picture(own), Picture("moved"));
    fs::create_symlink("moved", Picture(own));
    WriteText(Picture("d"), "d");
    check(!HasTrash(Picture("d")) && !MoveToTrash(Picture("d")) && ReadText(Picture("d")) == "d");
    check(!MoveToTrash(Picture("")));  // the volume's own top folder
    // Folders created by others are not trusted with our files; only root can test this.
    for (const char* foreign : {"", "/files", "/info"}) {
      fs::remove_all(Picture(own));
      fs::create_directories(Picture(own + "/files"));
      fs::create_directories(Picture(own + "/info"));
      if (chown(Picture(own + foreign).c_str(), getuid() + 1, getgid()) != 0) break;
      check(!MoveToTrash(Picture("d")) && ReadText(Picture("d")) == "d");
    }
    check(!FileExists(folder_.Path("data")));
  });
  ASSERT_TRUE(WIFEXITED(status));
  if (WEXITSTATUS(status) == kNotAllowed) GTEST_SKIP() << "this system does not allow a mount";
  EXPECT_EQ(WEXITSTATUS(status), 0) << "the number of the check that failed";
}

}  // namespace
}  // namespace fotomill::platform
