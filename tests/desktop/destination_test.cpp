#include <gtest/gtest.h>

#include <filesystem>

#include "batch/destination_name.h"
#include "desktop/models/batch/destination_choice.h"
#include "platform/folders.h"
#include "settings/settings.h"
#include "support/files.h"
#include "support/scoped_settings.h"

namespace fotomill::desktop {
namespace {

namespace fs = std::filesystem;

TEST(Destination, PreviewsTheOutputFolder) {
  const test::ScopedSettings keep;
  const test::TemporaryFolder folder;
  fs::create_directories(folder.Path("in"));
  fs::create_directories(folder.Path("out"));
  const std::vector<std::string> files{folder.Path("in/a.bmp"), folder.Path("in/b.bmp"),
                                       folder.Path("in/c.bmp")};
  for (const char* taken : {"in/a.png", "out/b.png", "out/c.png"})
    test::WriteText(folder.Path(taken), "old");
  // the setting determines the initial choice, not the operation
  for (const int32_t beside : {0, 1}) {
    settings.DestForceSourceDir = beside;
    const DestinationChoice into{.extension = "png", .folder = folder.Path("out")};
    const DestinationChoice own{.extension = "png", .folder = {}};
    DestinationOutlook outlook = OutlookOf(into, files);
    EXPECT_EQ(outlook.first, folder.Path("out/a.png"));
    EXPECT_EQ(outlook.existing, 2u);
    EXPECT_GT(outlook.freeSpace, 0u);
    EXPECT_EQ(PlannedDestination(files[0], {}, {}, JobFor(into)), outlook.first);
    outlook = OutlookOf(own, files);
    EXPECT_EQ(outlook.first, folder.Path("in/a.png"));
    EXPECT_EQ(outlook.existing, 1u);
    EXPECT_EQ(PlannedDestination(files[0], {}, {}, JobFor(own)), outlook.first);
    const DestinationChoice made{.extension = "png", .folder = folder.Path("not/yet/there")};
    EXPECT_GT(OutlookOf(made, files).freeSpace, 0u);
  }
}

TEST(Destination, TypedFoldersAreRelativeToTheCurrentFolder) {
  const struct {
    const char *typed, *whole;
  } rows[] = {{"", ""},
              {"out", "/photos/2026/out"},
              {"out/small/", "/photos/2026/out/small"},
              {"../2027", "/photos/2027"},
              {"/other/out", "/other/out"}};
  for (const auto& row : rows) EXPECT_EQ(WholeFolder(row.typed, "/photos/2026/"), row.whole);
  EXPECT_NE(DestinationProblem({.extension = "png", .folder = WholeFolder("out", "/" + std::string(260, 'f'))}), "");
}

}  // namespace
}  // namespace fotomill::desktop
