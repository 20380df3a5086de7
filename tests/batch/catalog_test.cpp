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

TEST(CatalogDrawing, Places) {
  CatalogLook look{.columns = 2,
                   .rows = 3,
                   .cellWidth = 96,
                   .cellHeight = 80,
                   .pageWidth = 301,
                   .pageHeight = 400};
  // (301 - 2 x 108 + 12) / 2 and (400 - 3 x 101) / 2
  EXPECT_EQ(CellPlace(look, 0), (Rectangle{48, 48, 96, 80}));
  EXPECT_EQ(CellPlace(look, 3), (Rectangle{156, 149, 96, 80}));
  const struct {
    int32_t width, height;
    Rectangle place;
  } rows[] = {
      {300, 200, {50, 58, 96, 64}}, {200, 300, {71, 50, 53, 80}}, {12, 10, {50, 50, 96, 80}},
      {48, 10, {50, 80, 96, 20}},   {100000, 1, {50, 89, 96, 1}}, {1, 2147483647, {97, 50, 1, 80}},
  };
  for (const auto& row : rows)
    EXPECT_EQ(PicturePlace(look, CellPlace(look, 0), row.width, row.height), row.place)
        << row.width;
  look.pageWidth = look.pageHeight = 0;  // equal margins on all sides of the grid
  EXPECT_EQ(PageSize(look), (Rectangle{0, 0, 228, 327}));
  EXPECT_EQ(CellPlace(look, 0), (Rectangle{12, 12, 96, 80}));
}

TEST(CatalogDrawing, FrameAndPicture) {
  const PicturePointer picture = MakePicture(96, 80, 24);
  for (const bool raised : {true, false}) {
    for (const bool black : {false, true}) {
      const CatalogLook look{.columns = 1,
                             .rows = 1,
                             .cellHeight = 80,
                             .frame = raised ? CellFrame::Raised : CellFrame::Flat,
                             .blackText = black,
                             .names = false,
                             .background = 0x302010};
      PackedImage page;
      ASSERT_EQ(NewCatalogPage(look, page), Status::Ok);
      ASSERT_EQ(DrawCell(look, 0, picture->image, {}, nullptr, page), Status::Ok);
      const int32_t flat = black ? 0 : 0xA0A0A0, light = raised ? 0xFFFFFF : flat,
                    dark = raised ? 0x404040 : flat;
      const struct {
        int32_t x, y, color;
      } pixels[] = {{11, 11, 0x102030},  {12, 12, light},    {50, 12, light}, {12, 60, light},
                    {111, 60, dark},     {50, 95, dark},     {111, 95, dark}, {112, 95, 0x102030},
                    {111, 96, 0x102030}, {13, 13, 0x102030}, {14, 14, 0},     {109, 93, 0},
                    {110, 94, 0x102030}};
      for (const auto& pixel : pixels)
        EXPECT_EQ(page.PixelAt(pixel.x, pixel.y), pixel.color) << pixel.x << "," << pixel.y;
    }
  }
}

TEST(CatalogDrawing, NamesStayInTheirArea) {
  TextFont font;
  ASSERT_EQ(font.OpenForLine("No Such Family", kCaptionHeight), Status::Ok);
  const std::string name = "a & b.jpg", lengthy(100, 'w'), odd = "\xff\xc0\xaf\x01\xe2\x82";
  EXPECT_EQ(font.Fitted(name, 96), name);
  const std::string cut = font.Fitted(lengthy, 96);
  EXPECT_TRUE(cut.starts_with("www") && cut.ends_with("\xe2\x80\xa6")) << cut;
  EXPECT_LE(font.WidthOf(cut), 96);
  EXPECT_GT(font.WidthOf(odd), 0);
  EXPECT_GT(font.WidthOf("&&"), font.WidthOf("&"));

  const CatalogLook look{.columns = 1, .rows = 1, .frame = CellFrame::None, .background = 0};
  for (const std::string& text : {name, lengthy, odd}) {
    PackedImage page;
    ASSERT_EQ(NewCatalogPage(look, page), Status::Ok);
    ASSERT_EQ(DrawCell(look, 0, {}, text, &font, page), Status::Ok);
    int32_t left = 1000, right = 0, top = 1000, bottom = 0, gray = 0;
    for (int32_t y = 0; y < page.Height(); ++y) {
      for (int32_t x = 0; x < page.Width(); ++x) {
        const int32_t pixel = page.PixelAt(x, y);
        if (pixel == 0) continue;
        left = std::min(left, x), right = std::max(right, x), top = std::min(top, y),
        bottom = std::max(bottom, y);
        gray += pixel != 0xFFFFFF;
      }
    }
    // The cell ends at row 12 + 2 + 96; the text is 3 to 18 below it.
    EXPECT_TRUE(top >= 113 && bottom < 128 && left >= 14 && right < 110) << text;
    EXPECT_NEAR(left - 14, 109 - right, 3) << text;
    EXPECT_GT(gray, 0) << text;
  }
}

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
