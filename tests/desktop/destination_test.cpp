#include <gtest/gtest.h>

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

TEST(Destination, FormatsAreThoseOfTheDefaultFormat) {
  std::vector<std::string> extensions;
  for (const DestinationFormat& format : DestinationFormats())
    extensions.push_back(format.extension);
  EXPECT_EQ(extensions, DestinationExtensions());
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
