#include <algorithm>
#include <memory>

#include "cli/commands/pages/page_command.h"
#include "cli/commands/pages/pages.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "core/choice_lists.h"
#include "operations/macros.h"
#include "pages/generators/photo.h"
#include "pages/generators/print.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct PhotoCommand : PageCommandOptions {
  std::vector<std::string> sizes;
  std::string gap;
  std::string fit = "fill";
  int32_t copies = 1;
  bool noCutLines = false;
};

struct PrintCommand : PageCommandOptions {
  std::string size, position;
  std::string title, comment;
  std::string rule, matte;
  bool titles = false, comments = false, names = false;
  bool noTurn = false, cropMarks = false;
};

constexpr int32_t kMostCopies = 10000;
constexpr double kPhotoMargin = 5, kPrintMargin = 10;
constexpr double kLeastRoom = 5;  // within matte and rule

std::string BadLength(const std::string& text) {
  return Tr("\"%1\" is not a length such as 10mm, 1cm or 0.5in.", text);
}
std::string BadSize(const std::string& text) {
  return Tr("\"%1\" is not a print size; \"fotomill pages papers\" lists them.", text);
}

// "10x15cm" or a name, with a number of copies before a colon: "4:passport".
bool ReadPhotoSize(const std::string& text, int32_t copies, PhotoSize& photo) {
  std::string_view name = text;
  photo.copies = copies;
  if (const size_t colon = name.find(':'); colon != std::string_view::npos) {
    const auto own = ParseLength(name.substr(0, colon));
    if (!own || *own < 1 || *own > kMostCopies || *own != static_cast<int32_t>(*own)) return false;
    photo.copies = static_cast<int32_t>(*own);
    name.remove_prefix(colon + 1);
  }
  const auto size = ParseSize(name, PrintSizes());
  if (!size) return false;
  photo.size = *size;
  const auto named = std::ranges::find_if(
      PrintSizes(), [&](const NamedSize& print) { return print.upright && print.size == *size; });
  photo.upright = named != PrintSizes().end();
  return true;
}

std::string ReadPhotos(const PhotoCommand& options, PhotoOptions& photos) {
  std::vector<std::string> sizes = options.sizes;
  if (sizes.empty()) {
    const auto last = static_cast<int32_t>(PrintSizes().size()) - 1;
    sizes = {PrintSizes()[static_cast<size_t>(std::clamp(settings.PhotoPrnFormat, 0, last))].name};
  }
  for (const std::string& text : sizes) {
    if (!ReadPhotoSize(text, options.copies, photos.sizes.emplace_back())) return BadSize(text);
  }
  if (!options.gap.empty()) {
    const auto gap = ParseLength(options.gap);
    if (!gap) return BadLength(options.gap);
    photos.gap = std::min(*gap, kMostSide);  // more would be rounding errors of places
  }
  return PhotosFit(photos) ? std::string()
                           : Tr("A print is larger than the paper without its margins.");
}

int RunPhoto(const PhotoCommand& options, const CommandContext& context) {
  PageSetup setup;
  const double margin = settings.PhotoPrnMargin > 0 ? settings.PhotoPrnMargin : kPhotoMargin;
  if (const std::string wrong = ReadPageSetup(options, margin, setup); !wrong.empty())
    return UsageError(context, wrong);
  PhotoOptions photos;
  photos.paper = setup.paper;
  photos.margin = setup.margin;
  photos.fit = options.fit == "fit" ? PictureFit::Inside : PictureFit::Cover;
  photos.cutLines = settings.PhotoPrnCutlineEnable != 0 && !options.noCutLines;
  photos.cutLineColor = static_cast<Color>(settings.PhotoPrnCutlineColor);
  if (const std::string wrong = ReadPhotos(options, photos); !wrong.empty())
    return UsageError(context, wrong);
  PageCommand command;
  command.prefix = "Photo_";
  command.leftOut = Tr("There are too many prints.");
  command.run.generator = [photos](std::span<const PagePicture> pictures) {
    return PhotoPages(photos, pictures);
  };
  return RunPages(options, std::move(command), context);
}

// The unit of the keys for sizes, in millimeters.
double UnitOfKeys(double dpi) {
  switch (settings.PrintWorkshopUnits) {
    case choice::kInches: return kMmPerInch;
    case choice::kCentimeters: return 10;
    default: return kMmPerInch / dpi;
  }
}

// The size: as given, else by the keys PrintWorkshopSizeMode and so on.
std::string ReadSizing(const PrintCommand& options, PrintOptions& print) {
  constexpr PrintSizing kModes[] = {PrintSizing::Fit, PrintSizing::Fill, PrintSizing::Actual,
                                    PrintSizing::Percent, PrintSizing::Given};
  constexpr const char* kWords[] = {"fit", "fill", "actual"};
  print.percent = std::clamp(settings.PrintWorkshopSizeFactor, 1, 10000);
  if (options.size.empty()) {
    const int32_t last = std::size(kModes) - 1;
    print.sizing = kModes[std::clamp(settings.PrintWorkshopSizeMode, 0, last)];
    const double unit = UnitOfKeys(print.dpi);
    if (settings.PrintWorkshopSizeWidth > 0 && settings.PrintWorkshopSizeDepth > 0)
      print.size = {settings.PrintWorkshopSizeWidth * unit, settings.PrintWorkshopSizeDepth * unit};
    return {};
  }
  for (size_t i = 0; i < std::size(kWords); ++i) {
    if (options.size != kWords[i]) continue;
    print.sizing = kModes[i];
    return {};
  }
  if (options.size.ends_with('%')) {
    const auto percent = ParseLength(options.size.substr(0, options.size.size() - 1));
    if (!percent || *percent < 1 || *percent > 10000) return BadSize(options.size);
    print.sizing = PrintSizing::Percent;
    print.percent = *percent;
    return {};
  }
  const auto size = ParseSize(options.size, PrintSizes());
  if (!size) return BadSize(options.size);
  print.sizing = PrintSizing::Given;
  print.size = *size;
  return {};
}

// A position such as "top-left".
void ReadPosition(const PrintCommand& options, PrintOptions& print) {
  const auto side = [](int32_t key) { return key == 1 ? -1 : key == 2 ? 1 : 0; };
  const std::string& text = options.position;
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

std::string ReadDecoration(const PrintCommand& options, PrintOptions& print) {
  print.rule = settings.PrintWorkshopRuleUse != 0
                   ? std::clamp(settings.PrintWorkshopRuleSize, 0, 1000) * kMmPerPoint
                   : 0;
  if (!options.rule.empty()) {
    const auto width = ParseLength(options.rule, kMmPerPoint);
    if (!width) return BadLength(options.rule);
    print.rule = *width;
  }
  if (!options.matte.empty()) {
    const auto width = ParseLength(options.matte);
    if (!width) return BadLength(options.matte);
    print.matte = *width;
  }
  const double room = std::min(print.paper.width, print.paper.height) - 2 * print.margin;
  if (room - 2 * (print.matte + print.rule) < kLeastRoom)
    return Tr("The margins leave no room on the paper.");
  print.ruleColor = static_cast<Color>(settings.PrintWorkshopRuleColor);
  print.ruleShadow = settings.PrintWorkshopRuleShade != 0;
  print.matteColor = static_cast<Color>(settings.PrintWorkshopMattColor);
  print.cropMarks = options.cropMarks || settings.PrintWorkshopCropmarks != 0;
  print.registerMarks = settings.PrintWorkshopPrepress != 0;
  print.background = static_cast<Color>(settings.PrintBackground);
  return {};
}

int RunPrint(PrintCommand options, const CommandContext& context) {
  PageSetup setup;
  if (const std::string wrong = ReadPageSetup(options, kPrintMargin, setup); !wrong.empty())
    return UsageError(context, wrong);
  PrintOptions print;
  print.paper = setup.paper;
  print.margin = setup.margin;
  if (options.dpi > 0) print.dpi = options.dpi;
  std::string wrong = ReadSizing(options, print);
  if (wrong.empty()) wrong = ReadDecoration(options, print);
  if (!wrong.empty()) return UsageError(context, wrong);
  ReadPosition(options, print);
  print.turnPage = settings.PrintWorkshopAutoRotate != 0 && !options.noTurn && !options.landscape;
  print.wholeDots = settings.PrintIntegral != 0;
  print.expandHalftones = settings.ExpandPrintedHalftones != 0;
  print.font = settings.PrintFontName.view();
  print.lineHeight = std::clamp(settings.PrintFontSize, 4, 72) * 1.2 * kMmPerPoint;
  print.names = options.names || settings.PrintFileNames != 0;
  if (options.brightness == 0) options.brightness = std::clamp(settings.PrintBrightness, -100, 100);
  if (options.contrast == 0) options.contrast = std::clamp(settings.PrintContrast, -100, 100);
  PageCommand command;
  command.prefix = "Print_";
  if (options.titles && options.title.empty()) options.title = settings.PrintTitleText.view();
  if (options.comments && options.comment.empty())
    options.comment = settings.PrintWorkshopComment.view();
  for (const std::string& text : {options.title, options.comment}) {
    if (const RecordedText problem = MacroProblem(text); !problem.empty())
      return UsageError(context, "\"" + text + "\" " + problem.shown);
  }
  print.texts = !options.title.empty() || !options.comment.empty();
  if (print.texts) command.run.texts = {options.title, options.comment};
  command.run.generator = [print](std::span<const PagePicture> pictures) {
    return PrintPages(print, pictures);
  };
  return RunPages(options, std::move(command), context);
}

struct PapersCommand {
  bool json = false;
};

std::string Millimeters(double length) {
  std::string text = std::to_string(static_cast<int64_t>(length * 10 + 0.5));
  if (text.size() < 2) text.insert(0, 1, '0');
  const char tenth = text.back();
  text.pop_back();
  return tenth == '0' ? text : text + "." + tenth;
}

int RunPapers(const PapersCommand& options, const CommandContext& context) {
  ResultOutput output(context, options.json);
  const auto list = [&](const char* kind, std::span<const NamedSize> sizes) {
    for (const NamedSize& named : sizes) {
      if (output.IsJson()) {
        output.Element({{"name", named.name},
                        {"kind", kind},
                        {"width", named.size.width},
                        {"height", named.size.height}});
        continue;
      }
      std::string line = named.name;
      line.resize(std::max<size_t>(line.size(), 12), ' ');
      output.Line(line + " " + kind + "  " + Millimeters(named.size.width) + " x " +
                  Millimeters(named.size.height) + " mm");
    }
  };
  list("paper", Papers());
  list("print", PrintSizes());
  output.EndArray();
  return kExitOk;
}

}  // namespace

void SetUpPagesPhoto(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<PhotoCommand>();
  AddPageOptions(app, *options, context);
  AddRepeatedText(app, "--size", options->sizes, "SIZE",
                  "Size of the prints: 10x15cm, 4x6in or a name listed by \"pages papers\"; 4:SIZE "
                  "for four copies; may be repeated (default: PhotoPrnFormat)");
  AddNumber(app, "--copies", options->copies, "N", 1, kMostCopies, "Copies of each print");
  AddText(app, "--gap", options->gap, "LENGTH", "Space between prints (default: none)");
  AddChoice(app, "--fit", options->fit, "HOW",
            "fill (default) crops pictures to the size, fit shows all of them", {"fill", "fit"});
  AddFlag(app, "--no-cut-lines", options->noCutLines, "Leave out the lines to cut along");
  SetFooter(app,
            "Prints are turned like their pictures, but not passport and ID sizes, and packed on "
            "as few sheets as possible. "
            "PhotoPrnMargin, PhotoPrnCutlineEnable and PhotoPrnCutlineColor set the defaults.",
            "fotomill pages photo anna.jpg --size 10x15cm --size 4:passport --out prints.pdf");
  context.run = [options, &context] { return RunPhoto(*options, context); };
}

void SetUpPagesPrint(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<PrintCommand>();
  AddPageOptions(app, *options, context);
  AddText(app, "--size", options->size, "SIZE",
          "fit, fill, actual, a percentage such as 50%, or the size to fit into: 10x15cm (default: "
          "PrintWorkshopSizeMode)");
  AddChoice(app, "--position", options->position, "WHERE", "Position on the page",
            {"center", "top", "bottom", "left", "right", "top-left", "top-right", "bottom-left",
             "bottom-right"});
  AddFlag(app, "--no-turn", options->noTurn, "Do not turn the page for wide pictures");
  AddFlag(app, "--names", options->names, "Print the file names");
  AddText(app, "--title", options->title, "TEXT", "Text above each picture; may contain macros");
  AddFlag(app, "--titles", options->titles, "Print the text of PrintTitleText above");
  AddText(app, "--comment", options->comment, "TEXT", "Text below each picture, as above");
  AddFlag(app, "--comments", options->comments, "Print the text of PrintWorkshopComment below");
  AddText(app, "--rule", options->rule, "WIDTH", "Line around pictures, such as 1pt or 0.5mm");
  AddText(app, "--matte", options->matte, "WIDTH",
          "Border around pictures in the color PrintWorkshopMattColor");
  AddFlag(app, "--crop-marks", options->cropMarks, "Print marks at the corners to cut along");
  SetFooter(app,
            "Macros are those of operations, such as %F for the file name. The keys Print... and "
            "PrintWorkshop... set fonts, colors and defaults.",
            "fotomill pages print sunset.jpg --size 13x18cm --crop-marks --out sunset.pdf");
  context.run = [options, &context] { return RunPrint(*options, context); };
}

void SetUpPagesPapers(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<PapersCommand>();
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {name, kind, width, height}, in millimeters");
  SetFooter(app, nullptr, "fotomill pages papers");
  context.run = [options, &context] { return RunPapers(*options, context); };
}

}  // namespace fotomill::cli
