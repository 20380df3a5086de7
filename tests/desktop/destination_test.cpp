#include <gtest/gtest.h>

#include <filesystem>

#include "batch/destination_name.h"
#include "desktop/models/batch/destination_choice.h"
#include "desktop/models/batch/named_sizes.h"
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

TEST(Destination, ResizeOffersTheSizesOfTheSettings) {
  const test::ScopedSettings keep;
  settings.Transform320.AssignCut(" 30, 20 ");
  for (PathText* wrong : {&settings.Transform640, &settings.Transform800})
    wrong->AssignCut(wrong == &settings.Transform640 ? "640" : "0,480");
  settings.Transform1024.AssignCut("1024,-768");
  settings.Transform1280.AssignCut("1280,1024");
  const std::vector<NamedSize> sizes = NamedSizes();
  ASSERT_EQ(sizes.size(), 2u);
  EXPECT_EQ(sizes[0].text, "30 \u00D7 20");
  EXPECT_EQ(sizes[0].step, "resize 30x20");
  EXPECT_EQ(sizes[1].step, "resize 1280x1024");

  settings.PrefixTransform.AssignCut("Small_");
  const test::TemporaryFolder folder;
  const DestinationChoice choice{
      .extension = "png", .folder = folder.Path(""), .keepMetadata = false, .step = sizes[0].step};
  const BatchJob job = JobFor(choice);
  const BatchFunction function = FunctionFor(choice, job);
  EXPECT_EQ(function.history, FileFunction::Transform);
  EXPECT_FALSE(function.keepMetadata);
  ASSERT_EQ(function.outputs.size(), 1u);
  EXPECT_EQ(OutlookOf(choice, {"/photos/a.bmp"}).first, folder.Path("Small_a.png"));
  EXPECT_TRUE(FunctionFor({.extension = "png", .folder = {}}, job).outputs.empty());
}

}  // namespace
}  // namespace fotomill::desktop
