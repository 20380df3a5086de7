#include "printing/page_kind.h"

#include <algorithm>

#include "printing/kind_rows.h"
#include "printing/value_parsing.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr double kLeastRoom = 5;

std::vector<std::string> PaperNames() { return NamesOf(Papers()); }

// clang-format off
constexpr PageOption kShared[] = {
    {.name = "paper", .kind = PageOptionKind::Text, .label = TrLater("Paper"), .shownAs = "SIZE",
     .help = TrLater("Paper: a name listed by \"pages papers\", or WxH such as 210x297mm (default: A4)"),
     .usual = "A4", .examples = PaperNames},
    {.name = "landscape", .label = TrLater("Landscape"), .help = TrLater("Turn the paper")},
    {.name = "margin", .kind = PageOptionKind::Text, .label = TrLater("Margins"), .shownAs = "LENGTH",
     .help = TrLater("Margin on all sides, such as 10mm or 0.5in"), .hint = "10mm"},
    {.name = "brightness", .kind = PageOptionKind::Number, .label = TrLater("Brightness"), .shownAs = "N",
     .help = TrLater("Brighten or darken the pictures"), .usual = "0", .least = -100, .most = 100},
    {.name = "contrast", .kind = PageOptionKind::Number, .label = TrLater("Contrast"), .shownAs = "N",
     .help = TrLater("Change the contrast of the pictures"), .usual = "0", .least = -100, .most = 100},
};
// clang-format on

constexpr const PageKind* kKinds[] = {&kContactKind,      &kCatalogKind, &kPhotoKind,
                                      &kPrintKind,        &kPosterKind,  &kCubeKind,
                                      &kDodecahedronKind, &kGalleryKind};

std::string ReadSetup(const PageKind& kind, const PageValues& values, PageSetup& setup) {
  const std::string& name = values.Text("paper");
  const auto paper = ParseSize(name.empty() ? "A4" : name, Papers());
  if (!paper) return Tr("\"%1\" is not a paper size such as A4, Letter or 210x297mm.", name);
  setup.paper = values.Flag("landscape") ? paper->Turned() : *paper;
  setup.margin = kind.margin();
  if (std::string wrong = ReadLength(values.Text("margin"), setup.margin); !wrong.empty())
    return wrong;
  if (std::min(setup.paper.width, setup.paper.height) - 2 * setup.margin < kLeastRoom)
    return Tr("The margins leave no room on the paper.");
  return {};
}

}  // namespace

std::span<const PageKind* const> PageKinds() { return kKinds; }

const PageKind& PageKindOf(std::string_view name) {
  return **std::ranges::find_if(kKinds,
                                [name](const PageKind* kind) { return kind->name == name; });
}

std::span<const PageOption> SharedPageOptions() { return kShared; }

std::string PlanPages(const PageKind& kind, const PageValues& values, PagePlan& plan) {
  PageSetup setup;
  if (!kind.onPaper) return kind.complete(values, setup, plan);
  if (std::string wrong = ReadSetup(kind, values, setup); !wrong.empty()) return wrong;
  plan = {};
  plan.run.reading.upright = settings.ExifAdjustOrientation != 0;
  plan.run.reading.read = ReadOptionsFromSettings();
  plan.run.reading.brightness = values.Number("brightness");
  plan.run.reading.contrast = values.Number("contrast");
  plan.run.copyrightHolder = settings.ExifCopyrightHolder.view();
  if (std::string wrong = kind.complete(values, setup, plan); !wrong.empty()) return wrong;
  if (const int32_t dpi = values.Number("dpi"); dpi > 0) plan.run.dpi = dpi;
  return {};
}

}  // namespace fotomill
