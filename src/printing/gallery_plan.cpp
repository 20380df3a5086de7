#include "printing/gallery_plan.h"

#include <algorithm>
#include <charconv>
#include <utility>

#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "printing/kind_rows.h"
#include "printing/value_parsing.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr uint64_t kMostThemeBytes = 1 << 20;
constexpr int32_t kLeastSize = 16, kMostSize = 16384;
constexpr size_t kMostSizes = 3;

// "480,960,1920": one to three sizes, ascending.
bool ReadSizes(const std::string& text, std::vector<int32_t>& sides) {
  sides.clear();
  for (size_t start = 0; start <= text.size();) {
    const size_t end = std::min(text.find(',', start), text.size());
    int32_t side = 0;
    const auto [stop, error] = std::from_chars(text.data() + start, text.data() + end, side);
    if (error != std::errc() || stop != text.data() + end || side < kLeastSize || side > kMostSize)
      return false;
    if (!sides.empty() && side <= sides.back()) return false;
    sides.push_back(side);
    start = end + 1;
  }
  return sides.size() <= kMostSizes;
}

// Reads the files of a theme; the script may be missing. Returns an error message, empty on
// success.
std::string ReadTheme(const std::string& folder, GalleryTheme& theme) {
  const struct {
    const char* name;
    std::string* contents;
    bool optional;
  } parts[] = {{kThemePage, &theme.page, false},
               {kThemeStyle, &theme.style, false},
               {kThemeScript, &theme.script, true}};
  for (const auto& part : parts) {
    std::string contents;
    const std::string path = platform::JoinFolder(folder, part.name);
    const auto result = platform::ReadWholeFile(path, kMostThemeBytes, contents);
    if (result == platform::ReadResult::Missing && part.optional) continue;
    if (result != platform::ReadResult::Done) return WithReason(Tr("\"%1\" cannot be read.", path));
    *part.contents = std::move(contents);
  }
  if (theme.page.find("{{pictures}}") == std::string::npos)
    return Tr("\"%1\" has no place for {{pictures}}.", platform::JoinFolder(folder, kThemePage));
  return {};
}

GalleryTexts TextsFor(const std::string& title, const std::string& folder) {
  GalleryTexts texts;
  texts.language = TextLanguage();
  std::ranges::replace(texts.language, '_', '-');
  texts.title = title;
  if (title.empty()) texts.title = platform::FileNameOf(platform::AbsolutePath(folder));
  texts.viewer = Tr("Full-screen view");
  texts.close = Tr("Close");
  texts.previous = Tr("Previous picture");
  texts.next = Tr("Next picture");
  texts.original = Tr("Original file");
  texts.pages = Tr("Pages");
  return texts;
}

// Nothing is put on paper; only the values are checked.
std::string Check(const PageValues& values, const PageSetup&, PagePlan&) {
  GalleryOptions gallery;
  return PlanGallery(values, {}, gallery);
}

// clang-format off
constexpr PageOption kOptions[] = {
    {.name = "title", .kind = PageOptionKind::Text, .label = TrLater("Title"), .shownAs = "TEXT",
     .help = TrLater("Title (default: name of the folder)")},
    {.name = "caption", .kind = PageOptionKind::Text, .label = TrLater("Captions"), .shownAs = "TEXT",
     .help = TrLater("Text below each picture; may contain macros (default: %F, the file name)"), .usual = "%F"},
    {.name = "sizes", .kind = PageOptionKind::Text, .label = TrLater("Sizes"), .shownAs = "N,N,N",
     .help = TrLater("Longer sides of the pictures in pixels (default: 480,960,1920)"), .hint = "480,960,1920"},
    {.name = "quality", .kind = PageOptionKind::Number, .label = TrLater("Quality"), .shownAs = "N",
     .help = TrLater("Quality of the pictures (default: 82)"), .usual = "82", .least = 1, .most = 100},
    {.name = "no-webp", .help = TrLater("Write JPEG only, not WebP beside it")},
    {.name = "no-details", .help = TrLater("Leave out camera and exposure")},
    {.name = "originals", .help = TrLater("Link to the original files")},
    {.name = "per-page", .kind = PageOptionKind::Number, .label = TrLater("Per page"), .shownAs = "N",
     .help = TrLater("Pictures per page (default: 120)"), .usual = "120", .least = 1, .most = 10000},
    {.name = "theme", .kind = PageOptionKind::Text, .label = TrLater("Theme folder"), .shownAs = "DIR",
     .help = TrLater("Folder with template.html and gallery.css (default: the built-in theme)")},
};
// clang-format on

}  // namespace

constexpr PageKind kGalleryKind{"gallery", TrLater("Web gallery"), nullptr, kOptions, Check, false};

std::string PlanGallery(const PageValues& values, const std::string& folder,
                        GalleryOptions& gallery) {
  const std::string &sizes = values.Text("sizes"), &theme = values.Text("theme");
  gallery.theme = BuiltInTheme();
  if (!sizes.empty() && !ReadSizes(sizes, gallery.sides))
    return Tr("\"%1\" is not one to three increasing numbers such as 480,960,1920.", sizes);
  if (!theme.empty()) {
    if (std::string wrong = ReadTheme(theme, gallery.theme); !wrong.empty()) return wrong;
  }
  gallery.caption = values.Text("caption");
  if (std::string wrong = CheckMacros(gallery.caption); !wrong.empty()) return wrong;
  gallery.folder = folder;
  gallery.texts = TextsFor(values.Text("title"), folder);
  gallery.reading.upright = settings.ExifAdjustOrientation != 0;
  gallery.reading.read = ReadOptionsFromSettings();
  gallery.quality = values.Number("quality", gallery.quality);
  gallery.webp = !values.Flag("no-webp");
  gallery.details = !values.Flag("no-details");
  gallery.originals = values.Flag("originals");
  gallery.copyrightHolder = settings.ExifCopyrightHolder.view();
  gallery.perPage =
      static_cast<size_t>(values.Number("per-page", static_cast<int32_t>(gallery.perPage)));
  return {};
}

}  // namespace fotomill
