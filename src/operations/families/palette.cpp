#include <algorithm>
#include <string>

#include "core/data_folder.h"
#include "operations/operations.h"
#include "platform/files.h"
#include "processing/palette/color_table.h"
#include "processing/palette/reduce.h"

// Operations that choose new colors for a whole picture.
namespace fotomill {

namespace {

using enum ParameterKind;

constexpr const char* kDitherWords =
    "none|floyd-steinberg|atkinson|stucki|burkes|sierra|bayer2|bayer4|bayer8";
constexpr Dither kDithers[] = {Dither::None,     Dither::FloydSteinberg, Dither::Atkinson,
                               Dither::Stucki,   Dither::Burkes,         Dither::Sierra,
                               Dither::Ordered2, Dither::Ordered4,       Dither::Ordered};
// values of FXColorDither and FXMonoDither
constexpr const char* kDitherKeyWords = "none|bayer8|floyd-steinberg";

// clang-format off
constexpr Parameter kBidirectional =
    {.name = "bidirectional", .kind = kFlag, .preset = "yes", .label = "Alternate direction of rows",
     .help = "Error diffusion processes every other row from right to left.", .key = "FXBidirectional"};
constexpr Parameter kDitherBrightness =
    {.name = "brightness", .kind = kInteger, .unit = "%", .preset = "0", .least = -100, .most = 100, .label = "Brightness",
     .help = "Percent of white to add before reducing.", .key = "DitherBrightness"};
constexpr Parameter kDitherContrast =
    {.name = "contrast", .kind = kInteger, .unit = "%", .preset = "0", .least = -100, .most = 100, .label = "Contrast",
     .help = "Contrast to add before reducing: -100 makes everything gray, 100 doubles the distance from middle gray.",
     .key = "DitherContrast"};

constexpr Parameter kReduce[] = {
    {.name = "colors", .kind = kInteger, .preset = "256", .least = 2, .most = 256, .label = "Colors",
     .help = "Maximum number of colors."},
    {.name = "palette", .kind = kFile, .preset = "optimized", .most = 4096, .label = "Palette",
     .help = "optimized: computed for the picture; fixed: a standard palette; gray: even shades; file: the color table given by file; or the name of a color table."},
    {.name = "dither", .kind = kChoice, .preset = "floyd-steinberg", .choices = kDitherWords, .label = "Dithering",
     .help = "How missing colors are approximated.", .key = "FXColorDither", .keyWords = kDitherKeyWords},
    kBidirectional,
    {.name = "file", .kind = kFile, .preset = "fmwpro.ccl", .most = 4096, .label = "Color table",
     .help = "Color table (.ccl, .act, .gpl or .pal) for palette=file; also searched for in the data folder.",
     .key = "ColourTableFile"},
    kDitherBrightness,
    kDitherContrast,
};

constexpr Parameter kMono[] = {
    {.name = "threshold", .kind = kInteger, .unit = "levels", .preset = "0", .least = 0, .most = 255, .label = "White threshold",
     .help = "Without dithering, the lowest brightness that becomes white; 0 finds the best value.", .key = "FXThreshold"},
    {.name = "dither", .kind = kChoice, .preset = "floyd-steinberg", .choices = kDitherWords, .label = "Dithering",
     .help = "How gray is approximated.", .key = "FXMonoDither", .keyWords = kDitherKeyWords},
    kBidirectional,
    kDitherBrightness,
    kDitherContrast,
};
// clang-format on

// The largest standard palette with at most `colors` colors.
PaletteChoice FixedPalette(int32_t colors) {
  struct Standard {
    int32_t colors, kind;  // of MakeDefaultPalette
  };
  constexpr Standard kStandards[] = {{256, 8}, {216, 6}, {128, 5}, {64, 4},
                                     {32, 3},  {16, 2},  {8, 1},   {2, 0}};
  const auto* fits = std::ranges::find_if(
      kStandards, [=](const Standard& standard) { return standard.colors <= colors; });
  PaletteChoice choice{.kind = PaletteChoice::Kind::Given, .colors = fits->colors};
  MakeDefaultPalette(&choice.given, nullptr, fits->kind);
  return choice;
}

// The color table file named by the arguments; empty if none.
std::string ColorTableFile(const Arguments& arguments) {
  const std::string& palette = arguments.Text("palette");
  for (const char* word : {"optimized", "fixed", "gray"}) {
    if (palette == word) return {};
  }
  const std::string& name = palette == "file" ? arguments.Text("file") : palette;
  const bool plain = name.find('/') == std::string::npos && name.find('\\') == std::string::npos;
  return plain && !platform::FileExists(name) ? DataFile(name) : name;
}

// Returns an error, empty on success.
RecordedText LoadColorTable(const std::string& path, PaletteChoice& choice) {
  std::string contents;
  if (!platform::IsRegularFile(path) ||
      platform::ReadWholeFile(path, kMostColorTableBytes, contents) != platform::ReadResult::Done) {
    return TrRecorded(
        "is not optimized, fixed, gray, file or a readable color table");
  }
  choice.kind = PaletteChoice::Kind::Given;
  return ReadColorTable(contents, choice.given, choice.colors) == Status::Ok
             ? RecordedText()
             : TrRecorded("names a file that is not a color table");
}

ArgumentProblem CheckReduce(const Arguments& arguments) {
  const std::string path = ColorTableFile(arguments);
  const std::string& palette = arguments.Text("palette");
  if (path.empty() && (palette == "optimized" || palette == "fixed" || palette == "gray"))
    return {};
  PaletteChoice choice;
  const RecordedText problem = LoadColorTable(path, choice);
  if (problem.empty()) return {};
  if (palette == "file")
    return {"file",
            TrRecorded("names a color table that cannot be read: %1", arguments.Text("file"))};
  return {"palette", problem};
}

Dither DitherOf(const Arguments& arguments) { return kDithers[arguments.Choice("dither")]; }

Status Reduce(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  const int32_t colors = arguments.Integer("colors");
  const std::string& palette = arguments.Text("palette");
  PaletteChoice choice{.colors = colors};
  if (const std::string path = ColorTableFile(arguments); !path.empty()) {
    if (!LoadColorTable(path, choice).empty()) return Status::FileReadError;
    choice.colors = std::min(choice.colors, colors);
  } else if (palette == "fixed") {
    choice = FixedPalette(colors);
  } else if (palette == "gray") {
    choice.kind = PaletteChoice::Kind::Grays;
  }
  const ReduceOptions options{.colorDither = DitherOf(arguments),
                              .serpentine = arguments.Flag("bidirectional"),
                              .brightness = arguments.Integer("brightness"),
                              .contrast = arguments.Integer("contrast")};
  return ReduceToPalette(picture, choice, options, context.work);
}

Status Mono(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  const ReduceOptions options{.monoDither = DitherOf(arguments),
                              .serpentine = arguments.Flag("bidirectional"),
                              .threshold = arguments.Integer("threshold"),
                              .brightness = arguments.Integer("brightness"),
                              .contrast = arguments.Integer("contrast")};
  return ReduceToMono(picture, options, context.work);
}

constexpr Operation kOperations[] = {
    {.name = "reduce",
     .family = Family::Effects,
     .label = "Reduce colors",
     .help =
         "Reduces a picture to a palette of at most 256 colors, at 1, 4 or 8 bits per pixel.",
     .example = "reduce 16 dither=stucki",
     .parameters = kReduce,
     .works = Works::Colors,
     .apply = Reduce,
     .check = CheckReduce},
    {.name = "mono",
     .family = Family::Effects,
     .label = "Black and white",
     .help = "Reduces a picture to black and white at 1 bit per pixel.",
     .example = "mono dither=atkinson",
     .parameters = kMono,
     .works = Works::Colors,
     .apply = Mono},
};

}  // namespace

std::span<const Operation> PaletteOperations() { return kOperations; }

}  // namespace fotomill
