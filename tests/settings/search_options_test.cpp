#include "settings/search_options.h"

#include <gmock/gmock.h>

#include "core/data_folder.h"
#include "settings/settings.h"
#include "support/files.h"
#include "support/scoped_environment.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

using testing::ElementsAre;

TEST(SearchOptions, RemembersWhereSearchesLooked) {
  const ScopedSettings keep;
  const TemporaryFolder folder;
  const std::string dataBefore = DataFolder();
  SetDataFolder(folder.Path("data"));
  const std::string home = folder.Path("home"), pictures = home + "/Pictures";
  for (const char* name : {"data", "home", "home/Pictures", "home/Documents", "a", "b"})
    std::filesystem::create_directory(folder.Path(name));
  const ScopedEnvironment userHome("HOME", home), config("XDG_CONFIG_HOME", home);
  settings.PictureSearchHistoryMax = 2;
  settings.PictureSearchPreservePath = 1;
  EXPECT_EQ(SearchFolderFromSettings("/current"), "/current");
  for (const char* name : {"home", "b", "home/Pictures", "a"})
    EXPECT_TRUE(RememberSearchFolder(folder.Path(name)));
  EXPECT_EQ(SearchFolderFromSettings("/current"), folder.Path("a"));
  EXPECT_THAT(OfferedSearchFolders(),
              ElementsAre(folder.Path("a"), pictures, home + "/Documents", home));
  // a user's folder is found where it is now
  EXPECT_TRUE(RememberSearchFolder(pictures + "/"));
  EXPECT_EQ(settings.PictureSearchSpecialFolder, 39);
  std::filesystem::remove(pictures);
  EXPECT_EQ(SearchFolderFromSettings("/current"), home);
  settings.PictureSearchPreservePath = 0;
  EXPECT_EQ(SearchFolderFromSettings("/current"), "/current");
  EXPECT_FALSE(RememberSearchFolder("/" + std::string(300, 'x')));
  EXPECT_EQ(settings.PictureSearchPath.view(), pictures);
  RememberSearchDestination(folder.Path("b"));
  EXPECT_EQ(SearchDestinationFromSettings(), folder.Path("b"));
  std::filesystem::remove(folder.Path("b"));
  EXPECT_EQ(SearchDestinationFromSettings(), "");
  SetDataFolder(dataBefore);
}

}  // namespace
}  // namespace fotomill::test
