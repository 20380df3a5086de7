#include "platform/folders.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include "platform/files.h"
#include "support/files.h"
#include "support/scoped_environment.h"

namespace fotomill::platform {
namespace {

using test::ScopedEnvironment;
using test::TemporaryFolder;
using test::WriteText;

TEST(Folders, FollowTheBaseDirectorySpecification) {
  const TemporaryFolder folder;
  const ScopedEnvironment home("HOME", folder.Path() + "/");
  const struct {
    const char* name;
    SpecialFolder which;
    const char* variable;
    const char* value;
    std::string expected;
  } rows[] = {
      {"configuration by default", SpecialFolder::ApplicationData, "XDG_CONFIG_HOME", nullptr, folder.Path(".config")},
      {"configuration elsewhere", SpecialFolder::ApplicationData, "XDG_CONFIG_HOME", "/else//", "/else"},
      {"a relative value is ignored", SpecialFolder::ApplicationData, "XDG_CONFIG_HOME", "else", folder.Path(".config")},
      {"an empty value is ignored", SpecialFolder::ApplicationData, "XDG_CONFIG_HOME", "", folder.Path(".config")},
      {"cache by default", SpecialFolder::Cache, "XDG_CACHE_HOME", nullptr, folder.Path(".cache")},
      {"home", SpecialFolder::Home, "UNUSED", nullptr, folder.Path()},
      {"temporary by default", SpecialFolder::Temporary, "TMPDIR", nullptr, "/tmp"},
      {"temporary elsewhere", SpecialFolder::Temporary, "TMPDIR", "/usr/", "/usr"},
      {"temporary folder missing", SpecialFolder::Temporary, "TMPDIR", "/no/such", "/tmp"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const ScopedEnvironment variable(row.variable, row.value);
    EXPECT_EQ(SpecialFolderPath(row.which), row.expected);
  }
}

TEST(Folders, UserFoldersComeFromUserDirs) {
  const TemporaryFolder folder;
  const ScopedEnvironment home("HOME", folder.Path());
  const ScopedEnvironment configuration("XDG_CONFIG_HOME", folder.Path());
  EXPECT_EQ(SpecialFolderPath(SpecialFolder::Pictures), folder.Path());
  ASSERT_TRUE(MakeFolders(folder.Path("Pictures")));
  EXPECT_EQ(SpecialFolderPath(SpecialFolder::Pictures), folder.Path("Pictures"));
  const struct {
    const char* list;
    std::string pictures;
  } rows[] = {
      {"XDG_PICTURES_DIR=\"$HOME/Bilder\"\n", folder.Path("Bilder")},
      {"# remark\n  XDG_DOCUMENTS_DIR=\"/d\"\nXDG_PICTURES_DIR=\"/p/q/\"", "/p/q"},
      {"XDG_PICTURES_DIR=\"/with \\\"quotes\\\" \\$\"", "/with \"quotes\" $"},
      {"XDG_PICTURES_DIR=\"$HOME/\"", folder.Path()},
      {"XDG_PICTURES_DIR=\"relative\"", folder.Path("Pictures")},
      {"XDG_PICTURES_DIR=\"/open end", folder.Path("Pictures")},
      {"XDG_PICTURES_DIR_2=\"/other\"", folder.Path("Pictures")},
      {"XDG_PICTURES_DIR=", folder.Path("Pictures")},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.list);
    WriteText(folder.Path("user-dirs.dirs"), row.list);
    EXPECT_EQ(SpecialFolderPath(SpecialFolder::Pictures), row.pictures);
  }
}

TEST(Folders, PathsBecomeAbsolute) {
  const struct {
    const char *path, *expected;
  } rows[] = {
      {"/", "/"},        {"//", "/"},          {"/a/./b/../c/", "/a/c"}, {"/../..", "/"},
      {"/a//b", "/a/b"}, {"/a/...", "/a/..."}, {"/a/..", "/"},           {"/-x\n/.y", "/-x\n/.y"},
  };
  for (const auto& row : rows) EXPECT_EQ(AbsolutePath(row.path), row.expected) << row.path;
  const std::string current = CurrentFolder();
  EXPECT_EQ(AbsolutePath("a/../-b"), (current == "/" ? "" : current) + "/-b");
  EXPECT_EQ(AbsolutePath(""), current);
}

TEST(Folders, ADeletedCurrentFolderIsEmpty) {
  const std::string before = CurrentFolder();
  {
    const TemporaryFolder folder;
    ASSERT_EQ(chdir(folder.Path().c_str()), 0);
    EXPECT_EQ(CurrentFolder(), folder.Path());
  }
  EXPECT_EQ(CurrentFolder(), "");
  EXPECT_EQ(AbsolutePath("x"), "x");
  ASSERT_EQ(chdir(before.c_str()), 0);
}

TEST(Folders, ProgramPathIsThisProgram) {
  EXPECT_TRUE(IsRegularFile(ProgramPath()));
  EXPECT_TRUE(ProgramPath().ends_with("/test_platform")) << ProgramPath();
  EXPECT_EQ(ProgramFolder() + "/test_platform", ProgramPath());
}

}  // namespace
}  // namespace fotomill::platform
