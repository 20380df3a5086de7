#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>

#include "batch/destination_name.h"
#include "core/data_folder.h"
#include "desktop/models/batch/destination_choice.h"
#include "desktop/models/batch/named_sizes.h"
#include "platform/folders.h"
#include "registry/registry.h"
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

TEST(Destination, FurtherFormatsFollowThoseOfTheDefaultFormat) {
  std::vector<std::string> usual, further;
  for (const DestinationFormat& format : DestinationFormats()) {
    EXPECT_TRUE(format.further || further.empty());
    (format.further ? further : usual).push_back(format.extension);
  }
  EXPECT_EQ(usual, DestinationExtensions());  // no plug-ins in this test
  const auto has = [&](const char* extension) {
    return std::ranges::count(further, extension) == 1;
  };
  EXPECT_TRUE(has("gif"));
  EXPECT_TRUE(has("webp"));
  EXPECT_FALSE(has("jpeg"));  // the same as jpg
  EXPECT_FALSE(has("avi"));   // cannot be written
  for (const DestinationFormat& format : DestinationFormats())
    EXPECT_EQ(JobFor({.extension = format.extension, .folder = {}}).formatIndex, format.row);
}

TEST(Destination, SizesAreTypedFreely) {
  struct {
    const char *typed, *step;  // null: refused
  } const rows[] = {
      {"", ""},
      {"  ", ""},
      {"50%", "resize 50%"},
      {"1600", "resize 1600"},
      {"800 x 600", "resize 800x600"},
      {"640 \u00D7 480", "resize 640x480"},
      {"big", nullptr},
      {"0x0", nullptr},
      {"10; flip horizontal", nullptr},
  };
  for (const auto& row : rows) {
    std::string step = "old";
    EXPECT_EQ(ResizeStep(row.typed, step), row.step != nullptr) << row.typed;
    EXPECT_EQ(step, row.step == nullptr ? "" : row.step) << row.typed;
  }
}

TEST(Destination, AddsSizeQualityAndNameToARecipe) {
  const test::ScopedSettings keep;
  const test::TemporaryFolder folder;
  SetDataFolder(folder.Path());
  fs::create_directories(folder.Path("recipes"));
  test::WriteText(folder.Path("recipes/two.recipe"),
                  "sharpen 0.5\noutput a\nsave name=own quality=11\noutput b\nsave\n");
  const std::vector<std::string> files{folder.Path("x.bmp")};
  DestinationChoice choice{.extension = "jpg",
                           .folder = folder.Path("out"),
                           .resize = "resize 50%",
                           .name = "%F-small",
                           .quality = 80};
  EXPECT_EQ(DestinationProblem(choice), "");
  EXPECT_EQ(OutlookOf(choice, files).first, folder.Path("out/x-small.jpg"));
  BatchFunction function = FunctionFor(choice, JobFor(choice));
  ASSERT_EQ(function.outputs.size(), 1u);
  EXPECT_EQ(function.outputs[0].quality, 80);
  EXPECT_EQ(function.history, FileFunction::Transform);

  choice.recipe = "two";
  function = FunctionFor(choice, JobFor(choice));
  ASSERT_EQ(function.outputs.size(), 2u);
  EXPECT_EQ(function.outputs[0].quality, 11);
  EXPECT_EQ(function.outputs[1].quality, 80);
  EXPECT_EQ(function.outputs[0].name(files[0], nullptr), "own");
  EXPECT_EQ(function.outputs[1].name(files[0], nullptr), "x-small");
  EXPECT_EQ(OutlookOf(choice, files).first, folder.Path("out/own.jpg"));

  // Names with facts of the picture are shown as typed; formats without quality have none.
  choice = {.extension = "png", .folder = folder.Path("out"), .name = "%D", .quality = 80};
  EXPECT_EQ(OutlookOf(choice, files).first, folder.Path("out/%D.png"));
  EXPECT_EQ(FunctionFor(choice, JobFor(choice)).outputs.at(0).quality, 0);
  choice.name = "%Q";
  EXPECT_NE(DestinationProblem(choice), "");
  choice.name = "a/b";
  EXPECT_NE(DestinationProblem(choice), "");
  choice.name = "";
  choice.recipe = "none of that name";
  EXPECT_NE(DestinationProblem(choice), "");
  EXPECT_TRUE(FunctionFor({.extension = "png", .folder = {}}, {}).outputs.empty());
  SetDataFolder({});
}

TEST(Destination, TheStepBeginsWithTheLastFormatAndTheDefaultStays) {
  const test::ScopedSettings keep;
  const test::TemporaryFolder folder;
  SetDataFolder(folder.Path());
  const std::vector<DestinationFormat> formats = DestinationFormats();
  const auto first = [&] { return formats[FirstFormat(formats)].extension; };
  EXPECT_EQ(first(), "png");
  KeepChoice({.extension = "tif", .folder = {}}, "/shown");
  EXPECT_EQ(first(), "tif");
  EXPECT_EQ(settings.DefaultFileExtension.view(), "png");
  EXPECT_EQ(settings.DestForceSourceDir, 1);
  settings.UseDefaultDestFormat = 1;
  EXPECT_EQ(first(), "png");
  settings.UseDefaultDestFormat = 0;
  settings.LastFormatSelected = 10'000;
  EXPECT_EQ(first(), "png");

  // The browser's folder is offered as the built-in choice, and kept as such.
  EXPECT_EQ(RecentDestinations("/shown"), std::vector<std::string>{"/shown"});
  KeepChoice({.extension = "tif", .folder = "/out"}, "/shown");
  KeepChoice({.extension = "tif", .folder = "/shown"}, "/shown");
  EXPECT_EQ(settings.DestForceSourceDir, 0);
  EXPECT_EQ(RecentDestinations("/elsewhere"), (std::vector<std::string>{"/elsewhere", "/out"}));
  SetDataFolder({});
}

TEST(Destination, AsksForWhatTheSettingsSay) {
  const test::ScopedSettings keep;
  using Parts = std::vector<DestinationPart>;
  const struct {
    int32_t prompt, combined;
    Parts parts;
  } rows[] = {{1, 1, {DestinationPart::Both}},
              {1, 0, {DestinationPart::Format, DestinationPart::Folder}},
              {0, 1, {DestinationPart::Format}},
              {0, 0, {DestinationPart::Format}}};
  for (const auto& row : rows) {
    settings.PromptForDestination = row.prompt;
    settings.DestinationWindowCombined = row.combined;
    EXPECT_EQ(DestinationParts(), row.parts);
  }
}

TEST(Destination, ACommentGoesIntoTheOutputs) {
  const test::TemporaryFolder folder;
  test::WriteBytes(folder.Path("a.bmp"),
                   test::ReadBytes(test::SourcePath("samples/bmp-true-color.bmp")));
  const std::vector<BatchFile> files{{.name = folder.Path("a.bmp"), .below = {}, .hint = {}}};
  const auto commentOf = [&](const char* comment) {
    const DestinationChoice choice{.extension = "jpg", .folder = folder.Path(), .comment = comment};
    BatchJob job = JobFor(choice);
    job.naming.confirmFormat = false;
    job.overwrite.prompt = false;
    EXPECT_EQ(RunBatch(files, FunctionFor(choice, job), job), Status::Ok);
    EXPECT_EQ(job.writeComments, *comment != '\0' || settings.WriteFileComments != 0);
    PicturePointer picture;
    EXPECT_EQ(LoadPicture({.fileName = folder.Path("a.jpg")}, picture), Status::Ok);
    std::filesystem::remove(folder.Path("a.jpg"));
    return picture == nullptr ? "" : std::string(picture->comment.begin(), picture->comment.end());
  };
  EXPECT_EQ(commentOf("Zürich, 1998"), "Zürich, 1998");
  EXPECT_EQ(commentOf(""), "");
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
