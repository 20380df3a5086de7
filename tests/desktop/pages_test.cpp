#include <gtest/gtest.h>

#include <chrono>
#include <condition_variable>
#include <map>
#include <mutex>

#include "batch/new_job.h"
#include "desktop/models/pages/order_keys.h"
#include "desktop/models/pages/page_order.h"
#include "desktop/models/pages/page_preview.h"
#include "desktop/models/pages/page_work.h"
#include "printing/gallery_plan.h"
#include "settings/settings.h"
#include "support/files.h"
#include "support/scoped_settings.h"

namespace fotomill::desktop {
namespace {

const PageOption& OptionOf(const PageOrder& order, std::string_view name) {
  for (const auto options : {order.Kind().options, SharedPageOptions()}) {
    for (const PageOption& option : options) {
      if (option.name == name) return option;
    }
  }
  ADD_FAILURE() << "no option " << name;
  return SharedPageOptions()[0];
}

std::string Plan(const PageOrder& order) {
  PagePlan plan;
  return order.Plan(plan);
}

TEST(PageOrder, KeysRememberOptions) {
  const struct {
    const char *kind, *option, *value;
    std::string next;           // the value of the next window
    std::vector<int32_t> keys;  // what is stored
    std::vector<int32_t> (*read)();
  } kRows[] = {
      {"contact",
       "paper",
       "Letter",
       "Letter",
       {12},
       [] { return std::vector{settings.PrintSize}; }},
      {"contact", "paper", "100x90mm", "A4", {0}, [] { return std::vector{settings.PrintSize}; }},
      {"cube",
       "landscape",
       "yes",
       "yes",
       {1},
       [] { return std::vector{settings.NewPrintOrientation}; }},
      {"contact",
       "grid",
       "7x3",
       "7x3",
       {7, 3},
       [] {
         return std::vector{settings.CatalogPortraitWide, settings.CatalogPortraitDeep};
       }},
      {"contact",
       "grid",
       "7x",
       "",
       {0, 0},
       [] {
         return std::vector{settings.CatalogPortraitWide, settings.CatalogPortraitDeep};
       }},
      {"photo", "size", "4x6in", "4x6in", {4}, [] { return std::vector{settings.PhotoPrnFormat}; }},
      {"photo",
       "size",
       "9x13cm, id",
       "10x15cm",
       {0},
       [] { return std::vector{settings.PhotoPrnFormat}; }},
      {"photo",
       "margin",
       "1.2cm",
       "12mm",
       {12},
       [] { return std::vector{settings.PhotoPrnMargin}; }},
      {"photo",
       "no-cut-lines",
       "yes",
       "yes",
       {0},
       [] { return std::vector{settings.PhotoPrnCutlineEnable}; }},
      {"print",
       "size",
       "actual",
       "actual",
       {2},
       [] { return std::vector{settings.NewPrintSizeMode}; }},
      {"print",
       "size",
       "75%",
       "75%",
       {3, 75},
       [] {
         return std::vector{settings.NewPrintSizeMode, settings.PrintWorkshopSizeFactor};
       }},
      {"print",
       "size",
       "13x18cm",
       "13x18cm",
       {4, 1, 13, 18},
       [] {
         return std::vector{settings.NewPrintSizeMode, settings.PrintWorkshopUnits,
                            settings.PrintWorkshopSizeWidth, settings.PrintWorkshopSizeDepth};
       }},
      {"print",
       "size",
       "5x7in",
       "5x7in",
       {0, 5, 7},
       [] {
         return std::vector{settings.PrintWorkshopUnits, settings.PrintWorkshopSizeWidth,
                            settings.PrintWorkshopSizeDepth};
       }},
      {"print",
       "size",
       "passport",
       "35.0x45.0mm",
       {2, 413, 531},
       [] {
         return std::vector{settings.PrintWorkshopUnits, settings.PrintWorkshopSizeWidth,
                            settings.PrintWorkshopSizeDepth};
       }},
      {"print", "size", "10x", "fit", {0}, [] { return std::vector{settings.NewPrintSizeMode}; }},
      {"print",
       "position",
       "bottom-right",
       "bottom-right",
       {2, 2},
       [] {
         return std::vector{settings.PrintWorkshopPosH, settings.PrintWorkshopPosV};
       }},
      {"print",
       "position",
       "top",
       "top",
       {0, 1},
       [] {
         return std::vector{settings.PrintWorkshopPosH, settings.PrintWorkshopPosV};
       }},
      {"print",
       "no-turn",
       "yes",
       "yes",
       {0},
       [] { return std::vector{settings.PrintWorkshopAutoRotate}; }},
      {"print", "names", "yes", "yes", {1}, [] { return std::vector{settings.PrintFileNames}; }},
      {"print",
       "rule",
       "2pt",
       "2pt",
       {1, 2},
       [] {
         return std::vector{settings.PrintWorkshopRuleUse, settings.PrintWorkshopRuleSize};
       }},
      {"print",
       "crop-marks",
       "yes",
       "yes",
       {1},
       [] { return std::vector{settings.PrintWorkshopCropmarks}; }},
      {"poster",
       "no-sketch",
       "yes",
       "yes",
       {0},
       [] { return std::vector{settings.PrintPosterPreview}; }},
      {"catalog", "footer", "Leaf %P", "Leaf %P", {}, [] { return std::vector<int32_t>(); }},
      {"catalog",
       "footer",
       "%Q",
       "Page %P printed by Fotomill",
       {},
       [] { return std::vector<int32_t>(); }},
      {"poster", "overlap", "5mm", "", {}, [] { return std::vector<int32_t>(); }},
  };
  for (const auto& row : kRows) {
    SCOPED_TRACE(std::string(row.kind) + " " + row.option + " " + row.value);
    const test::ScopedSettings scoped;
    PageOrder order(row.kind);
    EXPECT_TRUE(order.Set(OptionOf(order, row.option), row.value));
    EXPECT_FALSE(order.Set(OptionOf(order, row.option), row.value));
    EXPECT_EQ(order.ValueOf(OptionOf(order, row.option)), row.value);
    EXPECT_EQ(row.read(), row.keys);
    const PageOrder next(row.kind);
    EXPECT_EQ(next.ValueOf(OptionOf(next, row.option)), row.next);
    EXPECT_EQ(Plan(next), "");
  }
}

TEST(PageOrder, FlagsTurnOffWhatTheKeysTurnOn) {
  const test::ScopedSettings scoped;
  settings.PrintFileNames = 1;
  PageOrder order("print");
  const PageOption& names = OptionOf(order, "names");
  EXPECT_EQ(order.ValueOf(names), "yes");
  const PagePicture picture{.file = "a.png", .name = "a.png", .width = 40, .height = 30};
  const auto texts = [&] {
    PagePlan plan;
    EXPECT_EQ(order.Plan(plan), "");
    const std::vector<Page> pages = plan.run.generator({&picture, 1});
    return std::ranges::count_if(pages.at(0).items, [](const PageItem& item) {
      return std::holds_alternative<TextItem>(item);
    });
  };
  EXPECT_EQ(texts(), 1);
  EXPECT_TRUE(order.Set(names, ""));
  EXPECT_EQ(texts(), 0);
}

TEST(PageOrder, PaperIsCommonToAllKinds) {
  const test::ScopedSettings scoped;
  PageOrder order("contact");
  const PageOption &paper = SharedPageOptions()[0], &margin = OptionOf(order, "margin");
  EXPECT_TRUE(order.SetPaper({420, 297}));
  EXPECT_EQ(order.ValueOf(paper), "A3");
  EXPECT_EQ(order.Paper(), (PaperSize{420, 297}));
  order.Set(margin, "33mm");
  order.Choose("cube");
  EXPECT_EQ(order.ValueOf(paper), "A3");
  EXPECT_EQ(order.ValueOf(margin), "");
  EXPECT_FALSE(order.SetPaper({420, 297}));
  EXPECT_TRUE(order.SetPaper({101, 333}));
  EXPECT_EQ(order.ValueOf(paper), "101x333mm");
  order.Choose("contact");
  EXPECT_EQ(order.ValueOf(margin), "33mm");
}

// Four pictures, the last one damaged.
std::vector<BatchFile> Pictures(const test::TemporaryFolder& folder) {
  const auto good = test::ReadBytes(test::SourcePath("samples/bmp-true-color.bmp"));
  std::vector<std::string> paths;
  for (const char* name : {"a.bmp", "b.bmp", "c.bmp", "d.bmp"}) {
    paths.push_back(folder.Path(name));
    test::WriteBytes(paths.back(), good);
  }
  test::WriteText(paths.back(), "BM is all there is");
  return FilesOf(paths);
}

PageRunOptions OptionsFor(const char* kind, const std::map<std::string, std::string>& values) {
  PageValues given;
  for (const auto& [name, value] : values) given.Set(name, value);
  PagePlan plan;
  EXPECT_EQ(PlanPages(PageKindOf(kind), given, plan), "");
  return plan.run;
}

class Viewer {
  std::mutex mutex_;  // these outlive the preview, whose threads use them
  std::condition_variable came_;
  PagePreview preview_;

 public:
  explicit Viewer(std::vector<BatchFile> files)
      : preview_(std::move(files), [this] {
          const std::lock_guard lock(mutex_);
          came_.notify_all();
        }) {}
  void Request(uint64_t order, const PageRunOptions& options, size_t page, double zoom = 1) {
    preview_.Request({.order = order,
                      .options = options,
                      .page = page,
                      .width = 210,
                      .height = 297,
                      .zoom = zoom});
  }
  PageViewPointer Next() {
    const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(60);
    while (std::chrono::steady_clock::now() < end) {
      if (PageViewPointer view = preview_.Fetch()) return view;
      std::unique_lock lock(mutex_);
      came_.wait_for(lock, std::chrono::milliseconds(20));
    }
    ADD_FAILURE() << "no page came";
    return std::make_shared<PageView>();
  }
};

TEST(PagePreview, ShowsThePagesOfTheLatestOrder) {
  const test::TemporaryFolder folder;
  Viewer viewer(Pictures(folder));
  const PageRunOptions contact = OptionsFor("contact", {{"grid", "1x2"}, {"no-names", "yes"}}),
                       dark = OptionsFor(
                           "contact",
                           {{"grid", "1x3"}, {"no-names", "yes"}, {"background", "204060"}});
  const struct {
    uint64_t order;
    const PageRunOptions& options;
    size_t page;
    double zoom;
    size_t pages, shown;
    int32_t width;
    uint8_t corner;  // red at the top left
  } kRows[] = {
      {1, contact, 0, 1, 2, 0, 210, 0xFF},
      {1, contact, 9, 1, 2, 1, 210, 0xFF},  // beyond the last page
      {1, contact, 1, 2, 2, 1, 420, 0xFF},
      {2, dark, 1, 1, 1, 0, 210, 0x20},
      {1, contact, 1, 1, 2, 1, 210, 0xFF},  // an older one, which was kept
  };
  for (const auto& row : kRows) {
    viewer.Request(row.order, row.options, row.page, row.zoom);
    const PageViewPointer view = viewer.Next();
    EXPECT_EQ(view->status, Status::Ok);
    EXPECT_EQ(view->order, row.order);
    EXPECT_EQ(view->pages, row.pages);
    EXPECT_EQ(view->page, row.shown);
    ASSERT_EQ(view->image.width, row.width);
    EXPECT_EQ(view->image.Row(0)[0], row.corner);
    ASSERT_EQ(view->problems.size(), 1u);
    EXPECT_EQ(view->problems[0].substr(0, 7), "d.bmp: ");
  }
  for (uint64_t order = 3; order < 40; ++order) viewer.Request(order, contact, 0);
  viewer.Request(40, dark, 0);
  while (true) {
    const PageViewPointer view = viewer.Next();
    if (view->order == 0 || view->order == 40) break;
  }
  // Pictures that have no room, and pictures that are no pictures.
  viewer.Request(41, OptionsFor("cube", {}), 0);
  EXPECT_EQ(viewer.Next()->leftOut, 0u);
  Viewer empty({{.name = folder.Path("none.png"), .below = {}, .hint = {}}});
  empty.Request(1, contact, 0);
  EXPECT_EQ(empty.Next()->pages, 0u);
}

TEST(PageWork, WritesPdfAndReportsEachPicture) {
  const test::TemporaryFolder folder;
  const std::vector<BatchFile> files = Pictures(folder);
  PagePlan plan;
  ASSERT_EQ(PlanPages(PageKindOf("print"), {}, plan), "");
  const auto run = [&](const std::string& path, bool abort) {
    BatchJob job = NewBatchJob();
    job.boxSettings.closeWhenDone = false;
    if (abort) job.stop.Stop();
    (void)WritePagesPdf(files, plan, FileFunction::Print, path, job);
    std::string lines;
    for (const ProgressLine& line : job.progress.Lines()) lines += line.text + "\n";
    return std::pair(lines, job.uses.size());
  };
  const auto [lines, uses] = run(folder.Path("x.pdf"), false);
  EXPECT_NE(lines.find("a.bmp -> " + folder.Path("x.pdf")), std::string::npos) << lines;
  EXPECT_NE(lines.find("d.bmp: "), std::string::npos) << lines;
  EXPECT_NE(lines.find("There were errors"), std::string::npos) << lines;
  EXPECT_EQ(uses, 3u);
  EXPECT_EQ(test::ReadText(folder.Path("x.pdf")).substr(0, 5), "%PDF-");
  const auto [aborted, none] = run(folder.Path("y.pdf"), true);
  EXPECT_EQ(aborted.find("->"), std::string::npos) << aborted;
  EXPECT_EQ(none, 0u);
  const auto [failed, no] = run(folder.Path("no/folder/z.pdf"), false);
  EXPECT_NE(failed.find("z.pdf: "), std::string::npos) << failed;
  EXPECT_EQ(no, 0u);
  EXPECT_EQ(folder.Names(),
            (std::vector<std::string>{"a.bmp", "b.bmp", "c.bmp", "d.bmp", "x.pdf"}));
}

TEST(PageWork, BuildsGalleries) {
  const test::TemporaryFolder folder;
  PageOrder order("gallery");
  const struct {
    const char *option, *value;
    bool good;
  } kRows[] = {{"sizes", "480,320", false}, {"sizes", "100,200", true}, {"caption", "%Q", false},
               {"caption", "%F", true},     {"theme", "/no/theme", false}, {"theme", "", true}};
  for (const auto& row : kRows) {
    order.Set(OptionOf(order, row.option), row.value);
    EXPECT_EQ(Plan(order).empty(), row.good) << row.option << " " << row.value;
  }
  GalleryOptions gallery;
  ASSERT_EQ(PlanGallery(order.Values(), folder.Path("web"), gallery), "");
  BatchJob job = NewBatchJob();
  job.boxSettings.closeWhenDone = false;
  EXPECT_EQ(WriteGallery(Pictures(folder), gallery, job), Status::Ok);
  EXPECT_EQ(job.uses.size(), 3u);
  EXPECT_TRUE(job.errors);
  const std::string page = test::ReadText(folder.Path("web/index.html"));
  EXPECT_NE(page.find("<title>web</title>"), std::string::npos);
  EXPECT_NE(page.find("pictures/c-"), std::string::npos);
  EXPECT_EQ(page.find("pictures/d-"), std::string::npos);
}

}  // namespace
}  // namespace fotomill::desktop
