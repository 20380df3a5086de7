#include "platform/programs.h"

#include <gtest/gtest.h>

#include "platform/posix/desktop_entries.h"
#include "support/files.h"
#include "support/scoped_environment.h"

namespace fotomill::platform {
namespace {

using test::WriteText;
using Words = std::vector<std::string>;

TEST(DesktopEntries, TypesAndCommandLines) {
  constexpr const char* kGlobs =
      "# made\n50:image/jpeg:*.jpg\n50:application/gz:*.gz\n50:image/svg:*.svg\n50:image/svg-gz:*.svg.gz\n"
      "50:text/late:*.gz\n60:text/heavy:*.svg\n50:a:read?\n";
  const struct {
    const char *name, *type;
  } rows[] = {{"a.JPG", "image/jpeg"}, {"a.svg.gz", "image/svg-gz"}, {"b.gz", "application/gz"}, {"a.svg", "text/heavy"}, {"readm", ""}, {"jpg", ""}};
  for (const auto& row : rows) EXPECT_EQ(MimeTypeIn(kGlobs, row.name), row.type) << row.name;
  EXPECT_EQ(SplitExec("\"/opt/my \\\"app\\\"\" -x  %F"), (Words{"/opt/my \"app\"", "-x", "%F"}));
  EXPECT_FALSE(SplitExec("a \"b").has_value());
  EXPECT_FALSE(ProgramOfEntry("[Desktop Entry]\nType=Application\nName=T\nExec=t\nTerminal=true\n").has_value());
  EXPECT_FALSE(ProgramOfEntry("[Other]\nType=Application\nName=T\nExec=t\n").has_value());
}

TEST(Programs, TheUsersChoiceFirst) {
  const test::TemporaryFolder folder;
  const auto entry = [&](const std::string& name, const char* line) {
    WriteText(folder.Path("data/applications/" + name),
              "[Desktop Entry]\nType=Application\nName=" + name + "\nExec=" + line + "\n");
  };
  for (const char* made : {"data/mime", "data/applications/kde", "config", "none"})
    std::filesystem::create_directories(folder.Path(made));
  WriteText(folder.Path("data/mime/globs2"), "50:image/png:*.png\n");
  WriteText(folder.Path("data/applications/mimeinfo.cache"),
            "[MIME Cache]\nimage/png=one.desktop;kde-two.desktop;bad.desktop;gone.desktop;\n");
  WriteText(folder.Path("config/mimeapps.list"),
            "[Removed Associations]\nimage/png=bad.desktop;\n[Default Applications]\nimage/png=three.desktop\n");
  entry("one.desktop", "one --new=%f %i 5%%");
  entry("kde/two.desktop", "two %U");
  entry("three.desktop", "three");
  entry("bad.desktop", "bad");
  const test::ScopedEnvironment data("XDG_DATA_HOME", folder.Path("data").c_str()),
      dirs("XDG_DATA_DIRS", folder.Path("none").c_str());
  const test::ScopedEnvironment config("XDG_CONFIG_HOME", folder.Path("config").c_str()),
      etc("XDG_CONFIG_DIRS", folder.Path("none").c_str());
  const std::vector<Program> programs = ProgramsFor("/x/a.png");
  ASSERT_EQ(programs.size(), 3u);
  EXPECT_EQ(programs[0].name, "three.desktop");
  const Words files = {"/x/a.png", "/x/-b.png"};
  EXPECT_EQ(StartsOf(programs[0], files), (std::vector<Words>{{"three", "/x/a.png"}, {"three", "/x/-b.png"}}));
  EXPECT_EQ(StartsOf(programs[1], files),
            (std::vector<Words>{{"one", "--new=/x/a.png", "5%"}, {"one", "--new=/x/-b.png", "5%"}}));
  EXPECT_EQ(StartsOf(programs[2], files), (std::vector<Words>{{"two", "/x/a.png", "/x/-b.png"}}));
  EXPECT_TRUE(ProgramsFor("/x/a.unknown").empty());
}

}  // namespace
}  // namespace fotomill::platform
