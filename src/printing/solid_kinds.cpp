#include <algorithm>
#include <utility>

#include "pages/generators/cutout.h"
#include "pages/generators/poster.h"
#include "printing/kind_rows.h"
#include "printing/value_parsing.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr double kOverlap = 10;
constexpr double kMostSheets = 10000;
constexpr double kLeastStep = 5;  // from sheet to sheet, in millimeters
constexpr const char* kSheetLabel = TrLater("Sheet %1 of %2 (row %3, column %4)");
constexpr const char* kSketchTitle = TrLater("%1: %2 x %3 cm on %4 sheets");
constexpr const char* kCutoutNote =
    TrLater("Cut along the solid lines, fold along the dashed lines, glue the flaps.");

double Margin() { return 10; }
std::vector<std::string> PosterSizes() { return {"A2", "A1", "A0", "60x40cm", "90x60cm"}; }

// Size and overlap of a poster.
std::string ReadPoster(const PageValues& values, PosterOptions& poster) {
  const std::string &size = values.Text("size"), &grid = values.Text("grid");
  if (!size.empty() && !grid.empty())
    return Tr("Give either the size of the poster or its sheets, not both.");
  if (!size.empty()) {
    const auto parsed = ParseSize(size, Papers());
    if (!parsed) return Tr("\"%1\" is not a size such as 60x40cm or A1.", size);
    poster.size = *parsed;
  }
  if (settings.PrintPosterSize > 0) poster.columns = std::min(settings.PrintPosterSize, 100);
  std::string wrong = ReadGrid(grid, poster.columns, poster.rows);
  if (wrong.empty()) wrong = ReadLength(values.Text("overlap"), poster.overlap);
  if (!wrong.empty()) return wrong;
  const double room = std::min(poster.paper.width, poster.paper.height) - 2 * poster.margin;
  const double step = room - poster.overlap;
  if (step < kLeastStep) return Tr("The overlap leaves no room on the sheets.");
  const double sheets = (poster.size.width / step + 1) * (poster.size.height / step + 1);
  return sheets > kMostSheets ? Tr("The poster would need too many sheets.") : std::string();
}

std::string CompletePoster(const PageValues& values, const PageSetup& setup, PagePlan& plan) {
  PosterOptions poster;
  poster.paper = setup.paper;
  poster.margin = setup.margin;
  poster.overlap = kOverlap;
  poster.turnPaper = !values.Flag("landscape");
  poster.cutLines = !values.Flag("no-cut-lines");
  poster.cutLineColor = static_cast<Color>(settings.PrintPosterCutlineColor);
  poster.sketch = settings.PrintPosterPreview != 0 && !values.Flag("no-sketch");
  poster.font = settings.PrintFontName.view();
  poster.label = Tr(std::string_view(kSheetLabel));
  poster.sketchTitle = Tr(std::string_view(kSketchTitle));
  if (std::string wrong = ReadPoster(values, poster); !wrong.empty()) return wrong;
  plan.prefix = "Poster_";
  plan.leftOut = Tr("The poster would need too many sheets.");
  plan.run.generator = [poster](std::span<const PagePicture> pictures) {
    return PosterPages(poster, pictures);
  };
  return {};
}

std::string CompleteCutout(const PageValues& values, const PageSetup& setup,
                           std::vector<CutoutNet> nets, PagePlan& plan) {
  CutoutOptions cutout;
  cutout.paper = setup.paper;
  cutout.margin = setup.margin;
  cutout.foreground = static_cast<Color>(settings.PrintDodecForeground);
  cutout.background = static_cast<Color>(settings.PrintDodecBackground);
  cutout.dashed = settings.PrintDodecDashedLines != 0;
  cutout.font = settings.PrintFontName.view();
  if (cutout.dashed) cutout.note = Tr(kCutoutNote);
  const double largest = LargestEdge(cutout, nets);
  if (largest < 1) return Tr("The paper is too small.");
  const std::string& size = values.Text("size");
  std::string wrong = ReadLength(size, cutout.edge);
  if (wrong.empty() && !size.empty() && cutout.edge <= 0)
    wrong = Tr("\"%1\" is not a length such as 10mm, 1cm or 0.5in.", size);
  if (wrong.empty() && cutout.edge > largest)
    wrong = Tr("Edges can have at most %1 mm on this paper.", static_cast<int64_t>(largest));
  if (!wrong.empty()) return wrong;
  plan.leftOut = Tr("There are more pictures than faces.");
  plan.run.generator = [cutout, nets = std::move(nets)](std::span<const PagePicture> pictures) {
    return CutoutPages(cutout, nets, pictures);
  };
  return {};
}

std::string CompleteCube(const PageValues& values, const PageSetup& setup, PagePlan& plan) {
  plan.prefix = "Cube_";
  return CompleteCutout(values, setup, {CubeNet()}, plan);
}

std::string CompleteDodecahedron(const PageValues& values, const PageSetup& setup, PagePlan& plan) {
  plan.prefix = "Dodecahedron_";
  return CompleteCutout(values, setup, {DodecahedronNet(false), DodecahedronNet(true)}, plan);
}

// clang-format off
constexpr PageOption kPosterOptions[] = {
    {.name = "size", .kind = PageOptionKind::Text, .label = TrLater("Size"), .shownAs = "SIZE",
     .help = TrLater("Size to fit into, such as 60x40cm or A1"), .examples = PosterSizes},
    {.name = "grid", .kind = PageOptionKind::Text, .label = TrLater("Sheets"), .shownAs = "CxR",
     .help = TrLater("Sheets across and down (default: two across, or PrintPosterSize)"), .hint = "2x2"},
    {.name = "overlap", .kind = PageOptionKind::Text, .label = TrLater("Overlap"), .shownAs = "LENGTH",
     .help = TrLater("Overlap of neighboring sheets (default: 10mm)"), .hint = "10mm"},
    {.name = "no-cut-lines", .help = TrLater("Leave out the lines to cut along")},
    {.name = "no-sketch", .label = TrLater("Leave out the assembly sketch"),
     .help = TrLater("Leave out the page that shows how the sheets fit together")},
};
constexpr PageOption kCutoutOptions[] = {
    {.name = "size", .kind = PageOptionKind::Text, .label = TrLater("Edges"), .shownAs = "LENGTH",
     .help = TrLater("Length of the edges, such as 5cm (default: as long as the paper allows)"), .hint = "5cm"},
};
// clang-format on

}  // namespace

constexpr PageKind kPosterKind{"poster", TrLater("Poster"), Margin, kPosterOptions, CompletePoster};
constexpr PageKind kCubeKind{"cube", TrLater("Cube"), Margin, kCutoutOptions, CompleteCube};
constexpr PageKind kDodecahedronKind{"dodecahedron", TrLater("Dodecahedron"), Margin,
                                     kCutoutOptions, CompleteDodecahedron};

}  // namespace fotomill
