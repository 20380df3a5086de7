#include <algorithm>

#include "pages/generators/photo.h"
#include "printing/kind_rows.h"
#include "printing/value_parsing.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr int32_t kMostCopies = 10000;
constexpr double kMargin = 5;
constexpr std::initializer_list<const char*> kFits{"fill", "fit"},
    kFitLabels{TrLater("Crop to the size"), TrLater("Show all of them")};

double Margin() { return settings.PhotoPrnMargin > 0 ? settings.PhotoPrnMargin : kMargin; }
std::vector<std::string> SizeNames() { return NamesOf(PrintSizes()); }

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

std::string ReadPhotos(const PageValues& values, PhotoOptions& photos) {
  std::vector<std::string> sizes = values.Texts("size");
  if (sizes.empty()) {
    const auto last = static_cast<int32_t>(PrintSizes().size()) - 1;
    sizes = {PrintSizes()[static_cast<size_t>(std::clamp(settings.PhotoPrnFormat, 0, last))].name};
  }
  for (const std::string& text : sizes) {
    if (!ReadPhotoSize(text, values.Number("copies", 1), photos.sizes.emplace_back()))
      return Tr("\"%1\" is not a print size such as 10x15cm or passport.", text);
  }
  if (std::string wrong = ReadLength(values.Text("gap"), photos.gap); !wrong.empty()) return wrong;
  photos.gap = std::min(photos.gap, kMostSide);  // more would be rounding errors of places
  return PhotosFit(photos) ? std::string()
                           : Tr("A print is larger than the paper without its margins.");
}

std::string Complete(const PageValues& values, const PageSetup& setup, PagePlan& plan) {
  PhotoOptions photos;
  photos.paper = setup.paper;
  photos.margin = setup.margin;
  photos.fit = values.Text("fit") == "fit" ? PictureFit::Inside : PictureFit::Cover;
  photos.cutLines = settings.PhotoPrnCutlineEnable != 0 && !values.Flag("no-cut-lines");
  photos.cutLineColor = static_cast<Color>(settings.PhotoPrnCutlineColor);
  if (std::string wrong = ReadPhotos(values, photos); !wrong.empty()) return wrong;
  plan.prefix = "Photo_";
  plan.leftOut = Tr("There are too many prints.");
  plan.run.generator = [photos](std::span<const PagePicture> pictures) {
    return PhotoPages(photos, pictures);
  };
  return {};
}

// clang-format off
constexpr PageOption kOptions[] = {
    {.name = "size", .kind = PageOptionKind::Texts, .label = TrLater("Sizes"), .shownAs = "SIZE",
     .help = TrLater("Size of the prints: 10x15cm, 4x6in or a name listed by \"pages papers\"; 4:SIZE "
                     "for four copies; may be repeated (default: PhotoPrnFormat)"),
     .examples = SizeNames},
    {.name = "copies", .kind = PageOptionKind::Number, .label = TrLater("Copies"), .shownAs = "N",
     .help = TrLater("Copies of each print"), .usual = "1", .least = 1, .most = kMostCopies},
    {.name = "gap", .kind = PageOptionKind::Text, .label = TrLater("Space between"), .shownAs = "LENGTH",
     .help = TrLater("Space between prints (default: none)"), .hint = "0mm"},
    {.name = "fit", .kind = PageOptionKind::Choice, .label = TrLater("Pictures"), .shownAs = "HOW",
     .help = TrLater("fill (default) crops pictures to the size, fit shows all of them"), .usual = "fill",
     .choices = kFits, .choiceLabels = kFitLabels},
    {.name = "no-cut-lines", .help = TrLater("Leave out the lines to cut along")},
};
// clang-format on

}  // namespace

constexpr PageKind kPhotoKind{"photo", TrLater("Photo prints"), Margin, kOptions, Complete};

}  // namespace fotomill
