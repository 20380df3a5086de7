#include "cli/commands/contact_sheet.h"

#include <memory>
#include <string>

#include "batch/new_job.h"
#include "cli/frame/destination_format.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/frame/terminal_box.h"
#include "cli/frame/terminal_prompts.h"
#include "cli/selection/file_selection.h"
#include "pages/catalog_page.h"
#include "printing/value_parsing.h"
#include "platform/existence.h"
#include "platform/files.h"
#include "settings/settings.h"
#include "texts/status_text.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct SheetOptions {
  SelectionOptions selection;
  std::string to, dest;
  std::string frame = "raised";
  std::string background;
  int32_t columns = 0, rows = 0;  // 0: use settings
  int32_t cell = 96;
  int32_t pageWidth = 0, pageHeight = 0;
  int32_t jobs = 0;
  bool blackText = false;
  bool noNames = false;
  bool reduce = false;
  bool dryRun = false;
  bool json = false;
};

constexpr int32_t kColumns = 5, kRows = 4, kMostCells = 1000;
constexpr const char* kNoFont = TrLater(
    "No font for the names was found; use --no-names, or install a font (package "
    "fonts-dejavu-core).");
constexpr Color kPaper = 0xFFFFFF;

int32_t FirstAbove0(int32_t option, int32_t setting, int32_t usual) {
  if (option > 0) return option;
  return setting > 0 && setting <= kMostCells ? setting : usual;
}

// Fills `look`. Returns an error message, empty on success.
std::string ReadLook(const SheetOptions& options, CatalogLook& look) {
  look.columns = FirstAbove0(options.columns, settings.CatalogLandscapeWide, kColumns);
  look.rows = FirstAbove0(options.rows, settings.CatalogLandscapeDeep, kRows);
  look.cellWidth = look.cellHeight = options.cell;
  look.pageWidth = options.pageWidth;
  look.pageHeight = options.pageHeight;
  look.frame = options.frame == "none"   ? CellFrame::None
               : options.frame == "flat" ? CellFrame::Flat
                                         : CellFrame::Raised;
  look.blackText = options.blackText;
  look.names = !options.noNames;
  if (options.blackText) look.background = kPaper;
  if (std::string wrong = ReadColor(options.background, look.background); !wrong.empty())
    return wrong;
  const Rectangle page = PageSize(look);
  if (CheckPackedSize(page.width, page.height, 24) != Status::Ok) {
    return Tr("A page of %1 x %2 pixels is too large.", page.width, page.height);
  }
  const Rectangle first = CellPlace(look, 0);
  if (first.x < 0 || first.y < 0) return Tr("The page is smaller than its cells.");
  return {};
}

int RunSheet(const SheetOptions& options, const CommandContext& context) {
  BatchJob job = NewBatchJob();
  job.remember = nullptr;
  ContactSheetOptions sheet;
  sheet.onFaces = settings.CatalogFacedetectOptions != 0;
  sheet.fontName = settings.CatalogFontName.view();
  sheet.upright = settings.ExifAdjustOrientation != 0;
  if (const std::string wrong = ReadDestinationFormat(options.to, job); !wrong.empty())
    return UsageError(context, wrong);
  if (const std::string wrong = ReadLook(options, sheet.look); !wrong.empty())
    return UsageError(context, wrong);
  if (platform::ExistenceOf(options.dest) == platform::Existence::Yes &&
      !platform::IsFolder(options.dest)) {
    return UsageError(context, Tr("\"%1\" is not a folder.", options.dest));
  }
  const auto selection = SelectFiles(options.selection, context);
  if (!selection) return kExitUsage;

  ResultOutput output(context, options.json);
  output.CloseWith(selection->leftOut);
  TerminalBox box(output, true, false);
  TerminalPrompts prompts(context, output);
  job.destinationFolder = options.dest;
  job.box = &box;
  job.naming.beside = false;
  if (context.MayAsk()) job.prompts = &prompts;
  sheet.page = {.reduce = options.reduce, .dryRun = options.dryRun};
  sheet.reduceHint = Tr("Use --reduce to reduce them.");
  sheet.jobs = static_cast<uint32_t>(options.jobs);
  if (const Status status = RunContactSheet(selection->files, sheet, job); status != Status::Ok) {
    const std::string hint =
        status == Status::ResourceError ? std::string(" ") + Tr(kNoFont) : std::string();
    output.Message(output.ShownMessage(options.dest) + ": " + StatusText(status) + hint);
    return kExitFailed;
  }
  return FinishBatch(job, context);
}

}  // namespace

void SetUpContactSheet(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<SheetOptions>();
  AddSelection(app, options->selection, context);
  Require(AddName(app, "-t,--to", options->to, "EXT", "Format of the pages, by extension"));
  Require(
      AddName(app, "-d,--dest", options->dest, "DIR", "Folder of the pages, created if needed"));
  AddNumber(app, "--columns", options->columns, "N", 1, kMostCells,
            "Pictures per row (default: CatalogLandscapeWide, else 5)");
  AddNumber(app, "--rows", options->rows, "N", 1, kMostCells,
            "Rows per page (default: CatalogLandscapeDeep, else 4)");
  AddNumber(app, "--cell", options->cell, "N", 8, 4096,
            "Longer side of each picture in pixels (default: 96)");
  AddNumber(app, "--page-width", options->pageWidth, "N", 1, 65535,
            "Page width in pixels (default: fits the cells)");
  AddNumber(app, "--page-height", options->pageHeight, "N", 1, 65535,
            "Page height in pixels (default: fits the cells)");
  AddChoice(app, "--frame", options->frame, "HOW",
            "Frame around each cell: none, raised (default) or flat", {"none", "raised", "flat"});
  AddFlag(app, "--black-text", options->blackText,
          "Black names and flat frames; on white unless --background is given");
  AddText(app, "--background", options->background, "RRGGBB", "Page color (default: 606060)");
  AddFlag(app, "--no-names", options->noNames, "Leave out the file names");
  AddFlag(app, "--reduce", options->reduce, "Reduce colors if the format supports fewer");
  AddNumber(app, "-j,--jobs", options->jobs, "N", 0, INT32_MAX,
            "Number of parallel jobs (default: 0, one per core)");
  AddDryRunAndJson(app, options->dryRun, options->json,
                   "Print a JSON array of {file, destination, status, message}");
  SetFooter(app,
            "Pages are named Catalog_00001.EXT and so on; PrefixCatalog sets the prefix. Existing files are never replaced.\n"
            "CatalogFontName sets the font of the names.",
            "fotomill contact-sheet holiday -r --to jpg --dest sheets --cell 160");
  context.run = [options, &context] { return RunSheet(*options, context); };
}

}  // namespace fotomill::cli
