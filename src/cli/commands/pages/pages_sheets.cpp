#include <memory>
#include <utility>

#include "cli/commands/pages/page_command.h"
#include "cli/commands/pages/pages.h"
#include "cli/frame/options.h"
#include "operations/macros.h"
#include "pages/generators/catalog.h"
#include "pages/generators/contact.h"
#include "pages/model/placing.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct ContactCommand : PageCommandOptions {
  std::string grid;
  std::string frame = "none";
  std::string background;
  bool noNames = false;
};

struct CatalogCommand : PageCommandOptions {
  std::string grid, details, footer;
  bool noFooter = false, noLinks = false;
};

constexpr double kMargin = 10;
constexpr double kSheetDpi = 300;  // pictures on sheets have at most this resolution
constexpr int32_t kFewest = 1, kMost = 100;

int32_t FromKey(int32_t setting, int32_t usual) {
  return setting >= kFewest && setting <= kMost ? setting : usual;
}

// Columns and rows: as given, else by the keys for the paper's orientation.
bool SetGrid(const std::string& grid, ContactLayout& layout) {
  const bool wide = layout.pageWidth > layout.pageHeight;
  layout.columns =
      wide ? FromKey(settings.CatalogLandscapeWide, 5) : FromKey(settings.CatalogPortraitWide, 4);
  layout.rows =
      wide ? FromKey(settings.CatalogLandscapeDeep, 4) : FromKey(settings.CatalogPortraitDeep, 5);
  return grid.empty() || ReadGrid(grid, layout.columns, layout.rows);
}

int RunContact(const ContactCommand& options, const CommandContext& context) {
  PageSetup setup;
  if (const std::string wrong = ReadPageSetup(options, kMargin, setup); !wrong.empty())
    return UsageError(context, wrong);
  ContactLayout layout;
  layout.pageWidth = setup.paper.width;
  layout.pageHeight = setup.paper.height;
  layout.font = settings.CatalogFontName.view();
  layout.names = !options.noNames;
  layout.frame = options.frame == "flat" ? CellFrame::Flat : CellFrame::None;
  layout.light = layout.dark = 0xC0C0C0;
  if (!SetGrid(options.grid, layout))
    return UsageError(context, Tr("--grid takes columns and rows, such as 4x5."));
  if (!options.background.empty()) {
    const auto color = ReadColor(options.background);
    if (!color)
      return UsageError(context, Tr("--background takes a color as RRGGBB, such as FFFFFF."));
    layout.background = *color;
    if (IsDark(*color)) layout.text = 0xFFFFFF;
  }
  FitContactGrid(setup.margin, layout);
  if (layout.cellWidth < 1 || layout.cellHeight < 1)
    return UsageError(context, Tr("The cells are too small for pictures."));
  PageCommand command;
  command.prefix = settings.PrefixCatalog.view();
  command.run.dpi = kSheetDpi;
  command.run.generator = [layout](std::span<const PagePicture> pictures) {
    return ContactPages(layout, pictures);
  };
  return RunPages(options, std::move(command), context);
}

int RunCatalog(const CatalogCommand& options, const CommandContext& context) {
  PageSetup setup;
  if (const std::string wrong = ReadPageSetup(options, kMargin, setup); !wrong.empty())
    return UsageError(context, wrong);
  CatalogOptions catalog;
  catalog.paper = setup.paper;
  catalog.margin = setup.margin;
  if (setup.paper.width > setup.paper.height) std::swap(catalog.columns, catalog.rows);
  if (!options.grid.empty() && !ReadGrid(options.grid, catalog.columns, catalog.rows))
    return UsageError(context, Tr("--grid takes columns and rows, such as 4x5."));
  catalog.background = static_cast<Color>(settings.GrafcatBackground);
  catalog.frameTitles = settings.GrafcatFrameTitle != 0;
  catalog.links = !options.noLinks;
  catalog.font = settings.GrafcatFontName.view();
  catalog.footer =
      options.footer.empty() ? std::string(settings.GrafcatFooter.view()) : options.footer;
  for (const std::string& text : {catalog.footer, options.details}) {
    if (const RecordedText problem = MacroProblem(text); !problem.empty())
      return UsageError(context, "\"" + text + "\" " + problem.shown);
  }
  if (options.noFooter) catalog.footer.clear();
  PageCommand command;
  command.prefix = settings.PrefixCatalog.view();
  command.run.dpi = kSheetDpi;
  command.run.texts = {options.details};
  command.run.generator = [catalog](std::span<const PagePicture> pictures) {
    return CatalogPages(catalog, pictures);
  };
  return RunPages(options, std::move(command), context);
}

}  // namespace

void SetUpPagesContact(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<ContactCommand>();
  AddPageOptions(app, *options, context);
  AddText(app, "--grid", options->grid, "CxR",
          "Columns and rows (default: CatalogPortraitWide and so on, else 4x5 or 5x4)");
  AddChoice(app, "--frame", options->frame, "HOW",
            "Line around each picture: none (default) or flat", {"none", "flat"});
  AddText(app, "--background", options->background, "RRGGBB", "Page color (default: FFFFFF)");
  AddFlag(app, "--no-names", options->noNames, "Leave out the file names");
  SetFooter(app,
            "In PDF, each picture has a bookmark, and names can be searched. CatalogFontName sets "
            "the font.",
            "fotomill pages contact holiday -r --out sheets.pdf --grid 4x6");
  context.run = [options, &context] { return RunContact(*options, context); };
}

void SetUpPagesCatalog(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<CatalogCommand>();
  options->details = "%W x %H";
  AddPageOptions(app, *options, context);
  AddText(app, "--grid", options->grid, "CxR",
          "Columns and rows (default: 3x4, on landscape paper 4x3)");
  AddText(app, "--details", options->details, "TEXT",
          "Text below each name; may contain macros (default: %W x %H)");
  AddText(app, "--footer", options->footer, "TEXT",
          "Text at the bottom of each page; %P is its number (default: GrafcatFooter)");
  AddFlag(app, "--no-footer", options->noFooter, "Leave out the footer");
  AddFlag(app, "--no-links", options->noLinks, "Leave out the links to the files in PDF");
  SetFooter(app,
            "GrafcatBackground, GrafcatFontName and GrafcatFrameTitle set page color, font, and "
            "names in a bar above the pictures.",
            "fotomill pages catalog paintings -r --details \"%D, %W x %H\" --out catalog.pdf");
  context.run = [options, &context] { return RunCatalog(*options, context); };
}

}  // namespace fotomill::cli
