#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>

#include "batch/new_job.h"
#include "pages/catalog_page.h"
#include "registry/registry.h"
#include "settings/settings.h"
#include "support/bitmaps.h"
#include "support/files.h"
#include "support/pictures.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

TEST(CatalogPage, FirstFreeNames) {
  EXPECT_EQ(CatalogPageName("Catalog_", 1, "JPG"), "Catalog_00001.jpg");
  EXPECT_EQ(CatalogPageName("", 123456, "png"), "123456.png");
  const TemporaryFolder folder;
  WriteText(folder.Path("Catalog_00002.bmp"), "mine");
  BatchJob job = NewBatchJob();
  job.formatIndex = FindFormatByName("x.bmp");
  job.destinationFolder = folder.Path();
  // is for names derived from a source, and must not make pages replace each other
  job.naming.extensionCase = 1;
  job.overwrite.prompt = false;
  const PicturePointer page = MakePicture(4, 4, 24);
  std::string path;
  for (const char* name : {"Catalog_00001.bmp", "Catalog_00003.bmp"}) {
    EXPECT_EQ(WriteCatalogPage(*page, {}, job, path), Status::Ok);
    EXPECT_EQ(path, folder.Path(name));
  }
  job.catalogPage = kLastCatalogPage - 2;
  EXPECT_EQ(WriteCatalogPage(*page, {}, job, path), Status::Ok);
  EXPECT_EQ(WriteCatalogPage(*page, {}, job, path), Status::ErrorWritingFile);
  job.catalogPage = 0;
  job.formatIndex = FindFormatByName("x.kdc");
  EXPECT_EQ(WriteCatalogPage(*page, {}, job, path), Status::UnsupportedFunction);
  EXPECT_EQ(folder.Names().size(), 4u);
}

TEST(CatalogPage, IsTheSameWithAnyNumberOfJobs) {
  const TemporaryFolder folder;
  std::vector<BatchFile> files;
  for (int i = 0; i < 9; ++i) {
    files.push_back({folder.Path("p" + std::to_string(i) + ".bmp"), {}, Status::Ok, {}});
    WriteBytes(files.back().name, BitmapFile(10 + i * i * 40, 30 + (9 - i) * 60, 24));
  }
  WriteText(files[4].name, "broken");
  std::vector<std::vector<uint8_t>> sheets;
  for (const uint32_t jobs : {1u, 4u}) {
    ContactSheetOptions options{.look = {.columns = 3, .rows = 1}, .page = {}, .jobs = jobs};
    BatchJob job = NewBatchJob();
    job.formatIndex = FindFormatByName("x.bmp");
    job.destinationFolder = folder.Path("out" + std::to_string(jobs));
    ASSERT_EQ(RunContactSheet(files, options, job), Status::Ok);
    EXPECT_TRUE(job.errors);
    EXPECT_EQ(job.progress.Files(), 9u);
    for (size_t i = 0; i < 9; ++i) EXPECT_EQ(job.progress.Lines()[i].item.file, i);
    EXPECT_THAT(job.progress.Lines()[8].text, testing::EndsWith("Catalog_00003.bmp"));
    for (const char* name : {"/Catalog_00001.bmp", "/Catalog_00002.bmp", "/Catalog_00003.bmp"}) {
      sheets.push_back(ReadBytes(job.destinationFolder + name));
    }
  }
  ASSERT_EQ(sheets.size(), 6u);
  for (size_t i = 0; i < 3; ++i) EXPECT_TRUE(sheets[i] == sheets[i + 3] && !sheets[i].empty()) << i;
}

// Aborts when a given file has been drawn.
class AbortingBox : public ProgressBox {
 public:
  AbortingBox(const BatchJob& job, std::string last) : job_(job), last_(std::move(last)) {}
  bool Open(const ProgressModel&) override { return true; }
  void ShowLine(const ProgressLine&, const FileOutcome*) override {}
  void ShowStatus(const std::string&) override {}
  void Tick() override {
    if (job_.source.view() == last_) job_.stop.Stop();
  }
  void StayOpen(const ProgressModel&) override {}
  void Close(const ProgressModel&) override {}

 private:
  const BatchJob& job_;
  const std::string last_;
};

TEST(CatalogPage, WritesNoPartialPageAfterAbort) {
  const TemporaryFolder folder;
  std::vector<BatchFile> files;
  for (int i = 0; i < 5; ++i) {
    files.push_back({folder.Path("p" + std::to_string(i) + ".bmp"), {}, Status::Ok, {}});
    WriteBytes(files.back().name, BitmapFile(9, 9, 24));
  }
  for (const uint32_t jobs : {1u, 3u}) {
    SCOPED_TRACE(jobs);
    const ContactSheetOptions options{.look = {.columns = 3, .rows = 1}, .page = {}, .jobs = jobs};
    BatchJob job = NewBatchJob();
    AbortingBox box(job, files[3].name);
    job.box = &box;
    job.formatIndex = FindFormatByName("x.bmp");
    job.destinationFolder = folder.Path("out" + std::to_string(jobs));
    ASSERT_EQ(RunContactSheet(files, options, job), Status::Ok);
    EXPECT_EQ(job.progress.Files(), 3u);
    EXPECT_TRUE(std::filesystem::exists(job.destinationFolder + "/Catalog_00001.bmp"));
    EXPECT_FALSE(std::filesystem::exists(job.destinationFolder + "/Catalog_00002.bmp"));
  }
}

}  // namespace
}  // namespace fotomill::test
