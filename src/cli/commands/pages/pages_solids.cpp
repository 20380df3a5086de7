#include <algorithm>
#include <memory>

#include "cli/commands/pages/page_command.h"
#include "cli/commands/pages/pages.h"
#include "cli/frame/options.h"
#include "pages/generators/cutout.h"
#include "pages/generators/poster.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct PosterCommand : PageCommandOptions {
  std::string size, grid, overlap;
  bool noCutLines = false, noSketch = false;
};

struct CutoutCommand : PageCommandOptions {
  std::string size;
};

constexpr double kMargin = 10, kOverlap = 10;
constexpr double kMostSheets = 10000;
constexpr double kLeastStep = 5;  // from sheet to sheet, in millimeters
constexpr const char* kSheetLabel = TrLater("Sheet %1 of %2 (row %3, column %4)");
constexpr const char* kSketchTitle = TrLater("%1: %2 x %3 cm on %4 sheets");
constexpr const char* kCutoutNote =
    TrLater("Cut along the solid lines, fold along the dashed lines, glue the flaps.");

std::string BadLength(const std::string& text) {
  return Tr("\"%1\" is not a length such as 10mm, 1cm or 0.5in.", text);
}

// Size and overlap of a poster. Returns an error message, empty on success.
std::string ReadPoster(const PosterCommand& options, PosterOptions& poster) {
  if (!options.size.empty() && !options.grid.empty())
    return Tr("Only one of --size and --grid can be given.");
  if (!options.size.empty()) {
    const auto size = ParseSize(options.size, Papers());
    if (!size) return Tr("\"%1\" is not a size such as 60x40cm or A1.", options.size);
    poster.size = *size;
  }
  if (settings.PrintPosterSize > 0) poster.columns = std::min(settings.PrintPosterSize, 100);
  if (!options.grid.empty() && !ReadGrid(options.grid, poster.columns, poster.rows))
    return Tr("--grid takes columns and rows, such as 4x5.");
  if (!options.overlap.empty()) {
    const auto overlap = ParseLength(options.overlap);
    if (!overlap) return BadLength(options.overlap);
    poster.overlap = *overlap;
  }
  const double room = std::min(poster.paper.width, poster.paper.height) - 2 * poster.margin;
  if (room - poster.overlap < kLeastStep) return Tr("The overlap leaves no room on the sheets.");
  const double step = room - poster.overlap;
  const double sheets = (poster.size.width / step + 1) * (poster.size.height / step + 1);
  return sheets > kMostSheets ? Tr("The poster would need too many sheets.") : std::string();
}

int RunPoster(const PosterCommand& options, const CommandContext& context) {
  PageSetup setup;
  if (const std::string wrong = ReadPageSetup(options, kMargin, setup); !wrong.empty())
    return UsageError(context, wrong);
  PosterOptions poster;
  poster.paper = setup.paper;
  poster.margin = setup.margin;
  poster.overlap = kOverlap;
  poster.turnPaper = !options.landscape;
  poster.cutLines = !options.noCutLines;
  poster.cutLineColor = static_cast<Color>(settings.PrintPosterCutlineColor);
  poster.sketch = settings.PrintPosterPreview != 0 && !options.noSketch;
  poster.font = settings.PrintFontName.view();
  poster.label = Tr(std::string_view(kSheetLabel));
  poster.sketchTitle = Tr(std::string_view(kSketchTitle));
  if (const std::string wrong = ReadPoster(options, poster); !wrong.empty())
    return UsageError(context, wrong);
  PageCommand command;
  command.prefix = "Poster_";
  command.leftOut = Tr("The poster would need too many sheets.");
  command.run.generator = [poster](std::span<const PagePicture> pictures) {
    return PosterPages(poster, pictures);
  };
  return RunPages(options, std::move(command), context);
}

int RunCutout(const CutoutCommand& options, std::vector<CutoutNet> nets, const std::string& prefix,
              const CommandContext& context) {
  PageSetup setup;
  if (const std::string wrong = ReadPageSetup(options, kMargin, setup); !wrong.empty())
    return UsageError(context, wrong);
  CutoutOptions cutout;
  cutout.paper = setup.paper;
  cutout.margin = setup.margin;
  cutout.foreground = static_cast<Color>(settings.PrintDodecForeground);
  cutout.background = static_cast<Color>(settings.PrintDodecBackground);
  cutout.dashed = settings.PrintDodecDashedLines != 0;
  cutout.font = settings.PrintFontName.view();
  if (cutout.dashed) cutout.note = Tr(kCutoutNote);
  const double largest = LargestEdge(cutout, nets);
  if (largest < 1) return UsageError(context, Tr("The paper is too small."));
  if (!options.size.empty()) {
    const auto edge = ParseLength(options.size);
    if (!edge || *edge <= 0) return UsageError(context, BadLength(options.size));
    if (*edge > largest) {
      return UsageError(context, Tr("Edges can have at most %1 mm on this paper.",
                                    static_cast<int64_t>(largest)));
    }
    cutout.edge = *edge;
  }
  PageCommand command;
  command.prefix = prefix;
  command.leftOut = Tr("There are more pictures than faces.");
  command.run.generator = [cutout, nets = std::move(nets)](std::span<const PagePicture> pictures) {
    return CutoutPages(cutout, nets, pictures);
  };
  return RunPages(options, std::move(command), context);
}

std::shared_ptr<CutoutCommand> DeclareCutout(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<CutoutCommand>();
  AddPageOptions(app, *options, context);
  AddText(app, "--size", options->size, "LENGTH",
          "Length of the edges, such as 5cm (default: as long as the paper allows)");
  return options;
}

}  // namespace

void SetUpPagesPoster(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<PosterCommand>();
  AddPageOptions(app, *options, context);
  AddText(app, "--size", options->size, "SIZE", "Size to fit into, such as 60x40cm or A1");
  AddText(app, "--grid", options->grid, "CxR",
          "Sheets across and down (default: two across, or PrintPosterSize)");
  AddText(app, "--overlap", options->overlap, "LENGTH",
          "Overlap of neighboring sheets (default: 10mm)");
  AddFlag(app, "--no-cut-lines", options->noCutLines, "Leave out the lines to cut along");
  AddFlag(app, "--no-sketch", options->noSketch,
          "Leave out the page that shows how the sheets fit together");
  SetFooter(app,
            "Dashed ticks beside a sheet show where the edge of the next one goes. Cut lines have "
            "the color PrintPosterCutlineColor.",
            "fotomill pages poster sunset.jpg --size 80x60cm --out poster.pdf");
  context.run = [options, &context] { return RunPoster(*options, context); };
}

void SetUpPagesCube(CLI::App& app, CommandContext& context) {
  const auto options = DeclareCutout(app, context);
  SetFooter(app,
            "The first six pictures are on top, front, bottom, back, left and right; fewer are "
            "repeated. The PrintDodec... keys set colors and lines.",
            "fotomill pages cube family -r --size 5cm --out cube.pdf");
  context.run = [options, &context] { return RunCutout(*options, {CubeNet()}, "Cube_", context); };
}

void SetUpPagesDodecahedron(CLI::App& app, CommandContext& context) {
  const auto options = DeclareCutout(app, context);
  SetFooter(app,
            "Two pages with six faces each; fewer than twelve pictures are repeated. The "
            "PrintDodec... keys set colors and lines.",
            "fotomill pages dodecahedron months/*.jpg --out calendar.pdf");
  context.run = [options, &context] {
    return RunCutout(*options, {DodecahedronNet(false), DodecahedronNet(true)}, "Dodecahedron_",
                     context);
  };
}

}  // namespace fotomill::cli
