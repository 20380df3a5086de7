#include <algorithm>

#include "core/choice_lists.h"
#include "pages/generators/print.h"
#include "printing/kind_rows.h"
#include "printing/value_parsing.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr double kLeastRoom = 5;  // within matte and rule
constexpr double kLineSpacing = 1.2;
constexpr std::initializer_list<const char*> kPositions{"center",    "top",         "bottom",
                                                        "left",      "right",       "top-left",
                                                        "top-right", "bottom-left", "bottom-right"};
constexpr std::initializer_list<const char*> kPositionLabels{
    TrLater("Center"),    TrLater("Top"),         TrLater("Bottom"),
    TrLater("Left"),      TrLater("Right"),       TrLater("Top left"),
    TrLater("Top right"), TrLater("Bottom left"), TrLater("Bottom right")};
constexpr const char* kSizeWords[] = {"fit", "fill", "actual"};

double Margin() { return 10; }

std::vector<std::string> SizeExamples() {
  std::vector<std::string> sizes(std::begin(kSizeWords), std::end(kSizeWords));
  sizes.emplace_back("50%");
  for (std::string& name : NamesOf(PrintSizes())) sizes.push_back(std::move(name));
  return sizes;
}

// The unit of the keys for sizes, in millimeters.
double UnitOfKeys(double dpi) {
  switch (settings.PrintWorkshopUnits) {
    case choice::kInches: return kMmPerInch;
    case choice::kCentimeters: return 10;
    default: return kMmPerInch / dpi;
  }
}

constexpr PrintSizing kModes[] = {PrintSizing::Fit, PrintSizing::Fill, PrintSizing::Actual,
                                  PrintSizing::Percent, PrintSizing::Given};

void SetSizingByKeys(PrintOptions& print) {
  const int32_t last = std::size(kModes) - 1;
  print.sizing = kModes[std::clamp(settings.PrintWorkshopSizeMode, 0, last)];
  const double unit = UnitOfKeys(print.dpi);
  if (settings.PrintWorkshopSizeWidth > 0 && settings.PrintWorkshopSizeDepth > 0)
    print.size = {settings.PrintWorkshopSizeWidth * unit, settings.PrintWorkshopSizeDepth * unit};
}

// The size: as given, else by the keys PrintWorkshopSizeMode and so on.
std::string ReadSizing(const std::string& text, PrintOptions& print) {
  const std::string wrong = Tr("\"%1\" is not a print size such as 10x15cm or passport.", text);
  print.percent = std::clamp(settings.PrintWorkshopSizeFactor, 1, 10000);
  if (text.empty()) {
    SetSizingByKeys(print);
    return {};
  }
  if (const auto* const word = std::ranges::find(kSizeWords, text); word != std::end(kSizeWords)) {
    print.sizing = kModes[word - kSizeWords];
    return {};
  }
  if (text.ends_with('%')) {
    const auto percent = ParseLength(text.substr(0, text.size() - 1));
    if (!percent || *percent < 1 || *percent > 10000) return wrong;
    print.sizing = PrintSizing::Percent;
    print.percent = *percent;
    return {};
  }
  const auto size = ParseSize(text, PrintSizes());
  if (!size) return wrong;
  print.sizing = PrintSizing::Given;
  print.size = *size;
  return {};
}

// A position such as "top-left".
void ReadPosition(const std::string& text, PrintOptions& print) {
  const auto side = [](int32_t key) { return key == 1 ? -1 : key == 2 ? 1 : 0; };
  const bool centered =
      text == "center" || (text.empty() && settings.CentrePrintedImages != 0 &&
                           settings.PrintWorkshopPosH == 0 && settings.PrintWorkshopPosV == 0);
  if (centered) return;
  if (text.empty()) {
    print.across = settings.PrintWorkshopPosH == 0 ? -1 : side(settings.PrintWorkshopPosH);
    print.down = settings.PrintWorkshopPosV == 0 ? -1 : side(settings.PrintWorkshopPosV);
    return;
  }
  print.across = text.ends_with("left") ? -1 : text.ends_with("right") ? 1 : 0;
  print.down = text.starts_with("top") ? -1 : text.starts_with("bottom") ? 1 : 0;
}

std::string ReadDecoration(const PageValues& values, PrintOptions& print) {
  if (settings.PrintWorkshopRuleUse != 0)
    print.rule = std::clamp(settings.PrintWorkshopRuleSize, 0, 1000) * kMmPerPoint;
  std::string wrong = ReadLength(values.Text("rule"), print.rule, kMmPerPoint);
  if (wrong.empty()) wrong = ReadLength(values.Text("matte"), print.matte);
  if (!wrong.empty()) return wrong;
  const double room = std::min(print.paper.width, print.paper.height) - 2 * print.margin;
  if (room - 2 * (print.matte + print.rule) < kLeastRoom)
    return Tr("The margins leave no room on the paper.");
  print.ruleColor = static_cast<Color>(settings.PrintWorkshopRuleColor);
  print.ruleShadow = settings.PrintWorkshopRuleShade != 0;
  print.matteColor = static_cast<Color>(settings.PrintWorkshopMattColor);
  print.cropMarks = values.Flag("crop-marks") || settings.PrintWorkshopCropmarks != 0;
  print.registerMarks = settings.PrintWorkshopPrepress != 0;
  print.background = static_cast<Color>(settings.PrintBackground);
  return {};
}

// Title and comment.
std::string ReadTexts(const PageValues& values, PrintOptions& print, PagePlan& plan) {
  std::string title = values.Text("title"), comment = values.Text("comment");
  if (values.Flag("titles") && title.empty()) title = settings.PrintTitleText.view();
  if (values.Flag("comments") && comment.empty()) comment = settings.PrintWorkshopComment.view();
  for (const std::string& text : {title, comment}) {
    if (std::string wrong = CheckMacros(text); !wrong.empty()) return wrong;
  }
  print.texts = !title.empty() || !comment.empty();
  if (print.texts) plan.run.texts = {title, comment};
  return {};
}

std::string Complete(const PageValues& values, const PageSetup& setup, PagePlan& plan) {
  PrintOptions print;
  print.paper = setup.paper;
  print.margin = setup.margin;
  if (const int32_t dpi = values.Number("dpi"); dpi > 0) print.dpi = dpi;
  std::string wrong = ReadSizing(values.Text("size"), print);
  if (wrong.empty()) wrong = ReadDecoration(values, print);
  if (wrong.empty()) wrong = ReadTexts(values, print, plan);
  if (!wrong.empty()) return wrong;
  ReadPosition(values.Text("position"), print);
  print.turnPage =
      settings.PrintWorkshopAutoRotate != 0 && !values.Flag("no-turn") && !values.Flag("landscape");
  print.wholeDots = settings.PrintIntegral != 0;
  print.expandHalftones = settings.ExpandPrintedHalftones != 0;
  print.font = settings.PrintFontName.view();
  print.lineHeight = std::clamp(settings.PrintFontSize, 4, 72) * kLineSpacing * kMmPerPoint;
  print.names = values.Flag("names") || settings.PrintFileNames != 0;
  PagePictureOptions& reading = plan.run.reading;
  if (reading.brightness == 0) reading.brightness = std::clamp(settings.PrintBrightness, -100, 100);
  if (reading.contrast == 0) reading.contrast = std::clamp(settings.PrintContrast, -100, 100);
  plan.prefix = "Print_";
  plan.run.generator = [print](std::span<const PagePicture> pictures) {
    return PrintPages(print, pictures);
  };
  return {};
}

// clang-format off
constexpr PageOption kOptions[] = {
    {.name = "size", .kind = PageOptionKind::Text, .label = TrLater("Size"), .shownAs = "SIZE",
     .help = TrLater("fit, fill, actual, a percentage such as 50%, or the size to fit into: 10x15cm (default: "
                     "PrintWorkshopSizeMode)"),
     .examples = SizeExamples},
    {.name = "position", .kind = PageOptionKind::Choice, .label = TrLater("Position"), .shownAs = "WHERE",
     .help = TrLater("Position on the page"), .choices = kPositions,
     .choiceLabels = kPositionLabels},
    {.name = "no-turn", .help = TrLater("Do not turn the page for wide pictures")},
    {.name = "names", .help = TrLater("Print the file names")},
    {.name = "title", .kind = PageOptionKind::Text, .label = TrLater("Title"), .shownAs = "TEXT",
     .help = TrLater("Text above each picture; may contain macros")},
    {.name = "titles", .label = TrLater("Title from Setup"),
     .help = TrLater("Print the text of PrintTitleText above")},
    {.name = "comment", .kind = PageOptionKind::Text, .label = TrLater("Comment"), .shownAs = "TEXT",
     .help = TrLater("Text below each picture, as above")},
    {.name = "comments", .label = TrLater("Comment from Setup"),
     .help = TrLater("Print the text of PrintWorkshopComment below")},
    {.name = "rule", .kind = PageOptionKind::Text, .label = TrLater("Line"), .shownAs = "WIDTH",
     .help = TrLater("Line around pictures, such as 1pt or 0.5mm"), .hint = "1pt"},
    {.name = "matte", .kind = PageOptionKind::Text, .label = TrLater("Border"), .shownAs = "WIDTH",
     .help = TrLater("Border around pictures in the color PrintWorkshopMattColor"), .hint = "5mm"},
    {.name = "crop-marks", .label = TrLater("Crop marks at the corners"),
     .help = TrLater("Print marks at the corners to cut along")},
};
// clang-format on

}  // namespace

constexpr PageKind kPrintKind{"print", TrLater("Single prints"), Margin, kOptions, Complete};

}  // namespace fotomill
