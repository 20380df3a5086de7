#include <utility>

#include "pages/generators/catalog.h"
#include "pages/generators/contact.h"
#include "pages/model/placing.h"
#include "printing/kind_rows.h"
#include "printing/value_parsing.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr double kSheetDpi = 300;  // pictures on sheets have at most this resolution
constexpr int32_t kFewest = 1, kMost = 100;
constexpr std::initializer_list<const char*> kFrames{"none", "flat"},
    kFrameLabels{TrLater("No frame"), TrLater("Lines")};

double Margin() { return 10; }

int32_t FromKey(int32_t setting, int32_t usual) {
  return setting >= kFewest && setting <= kMost ? setting : usual;
}

// Columns and rows by the keys for the paper's orientation.
void SetGridByKeys(ContactLayout& layout) {
  const bool wide = layout.pageWidth > layout.pageHeight;
  layout.columns =
      wide ? FromKey(settings.CatalogLandscapeWide, 5) : FromKey(settings.CatalogPortraitWide, 4);
  layout.rows =
      wide ? FromKey(settings.CatalogLandscapeDeep, 4) : FromKey(settings.CatalogPortraitDeep, 5);
}

std::string CompleteContact(const PageValues& values, const PageSetup& setup, PagePlan& plan) {
  ContactLayout layout;
  layout.pageWidth = setup.paper.width;
  layout.pageHeight = setup.paper.height;
  layout.font = settings.CatalogFontName.view();
  layout.names = !values.Flag("no-names");
  layout.frame = values.Text("frame") == "flat" ? CellFrame::Flat : CellFrame::None;
  layout.light = layout.dark = 0xC0C0C0;
  SetGridByKeys(layout);
  std::string wrong = ReadGrid(values.Text("grid"), layout.columns, layout.rows);
  if (wrong.empty()) wrong = ReadColor(values.Text("background"), layout.background);
  if (!wrong.empty()) return wrong;
  if (IsDark(layout.background)) layout.text = 0xFFFFFF;
  FitContactGrid(setup.margin, layout);
  if (layout.cellWidth < 1 || layout.cellHeight < 1)
    return Tr("The cells are too small for pictures.");
  plan.prefix = settings.PrefixCatalog.view();
  plan.run.dpi = kSheetDpi;
  plan.run.generator = [layout](std::span<const PagePicture> pictures) {
    return ContactPages(layout, pictures);
  };
  return {};
}

std::string CompleteCatalog(const PageValues& values, const PageSetup& setup, PagePlan& plan) {
  CatalogOptions catalog;
  catalog.paper = setup.paper;
  catalog.margin = setup.margin;
  if (setup.paper.width > setup.paper.height) std::swap(catalog.columns, catalog.rows);
  if (std::string wrong = ReadGrid(values.Text("grid"), catalog.columns, catalog.rows);
      !wrong.empty())
    return wrong;
  catalog.background = static_cast<Color>(settings.GrafcatBackground);
  catalog.frameTitles = settings.GrafcatFrameTitle != 0;
  catalog.links = !values.Flag("no-links");
  catalog.font = settings.GrafcatFontName.view();
  const std::string &footer = values.Text("footer"), &details = values.Text("details");
  catalog.footer = footer.empty() ? std::string(settings.GrafcatFooter.view()) : footer;
  for (const std::string& text : {catalog.footer, details}) {
    if (std::string wrong = CheckMacros(text); !wrong.empty()) return wrong;
  }
  if (values.Flag("no-footer")) catalog.footer.clear();
  plan.prefix = settings.PrefixCatalog.view();
  plan.run.dpi = kSheetDpi;
  plan.run.texts = {details};
  plan.run.generator = [catalog](std::span<const PagePicture> pictures) {
    return CatalogPages(catalog, pictures);
  };
  return {};
}

// clang-format off
constexpr PageOption kContactOptions[] = {
    {.name = "grid", .kind = PageOptionKind::Text, .label = TrLater("Columns x rows"), .shownAs = "CxR",
     .help = TrLater("Columns and rows (default: CatalogPortraitWide and so on, else 4x5 or 5x4)"), .hint = "4x5"},
    {.name = "frame", .kind = PageOptionKind::Choice, .label = TrLater("Frames"), .shownAs = "HOW",
     .help = TrLater("Line around each picture: none (default) or flat"), .usual = "none", .choices = kFrames,
     .choiceLabels = kFrameLabels},
    {.name = "background", .kind = PageOptionKind::Text, .label = TrLater("Page color"), .shownAs = "RRGGBB",
     .help = TrLater("Page color (default: FFFFFF)"), .hint = "FFFFFF"},
    {.name = "no-names", .help = TrLater("Leave out the file names")},
};
constexpr PageOption kCatalogOptions[] = {
    {.name = "grid", .kind = PageOptionKind::Text, .label = TrLater("Columns x rows"), .shownAs = "CxR",
     .help = TrLater("Columns and rows (default: 3x4, on landscape paper 4x3)"), .hint = "3x4"},
    {.name = "details", .kind = PageOptionKind::Text, .label = TrLater("Details"), .shownAs = "TEXT",
     .help = TrLater("Text below each name; may contain macros (default: %W x %H)"), .usual = "%W x %H"},
    {.name = "footer", .kind = PageOptionKind::Text, .label = TrLater("Footer"), .shownAs = "TEXT",
     .help = TrLater("Text at the bottom of each page; %P is its number (default: GrafcatFooter)")},
    {.name = "no-footer", .help = TrLater("Leave out the footer")},
    {.name = "no-links", .help = TrLater("Leave out the links to the files in PDF")},
};
// clang-format on

}  // namespace

constexpr PageKind kContactKind{"contact", TrLater("Contact sheet"), Margin, kContactOptions,
                                CompleteContact};
constexpr PageKind kCatalogKind{"catalog", TrLater("Catalog"), Margin, kCatalogOptions,
                                CompleteCatalog};

}  // namespace fotomill
