#include "cli/commands/pages/gallery.h"

#include <algorithm>
#include <charconv>
#include <memory>

#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/selection/file_selection.h"
#include "operations/macros.h"
#include "pages/gallery/gallery_build.h"
#include "platform/existence.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct GalleryCommand {
  SelectionOptions selection;
  std::string dest, title, theme, caption = "%F", sizes;
  int32_t quality = 82, perPage = 120, jobs = 0;
  bool noWebp = false, noDetails = false, originals = false;
  bool dryRun = false, json = false;
};

struct ThemeCommand {
  std::string dest;
};

constexpr uint64_t kMostThemeBytes = 1 << 20;
constexpr int32_t kLeastSide = 16, kMostSide = 16384;
constexpr size_t kMostSizes = 3;
constexpr const char *kPageFile = "template.html", *kStyleFile = "gallery.css",
                     *kScriptFile = "gallery.js";

// "480,960,1920": one to three sizes, ascending.
bool ReadSizes(const std::string& text, std::vector<int32_t>& sides) {
  sides.clear();
  for (size_t start = 0; start <= text.size();) {
    const size_t end = std::min(text.find(',', start), text.size());
    int32_t side = 0;
    const auto [stop, error] = std::from_chars(text.data() + start, text.data() + end, side);
    if (error != std::errc() || stop != text.data() + end || side < kLeastSide || side > kMostSide)
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
  } parts[] = {{kPageFile, &theme.page, false},
               {kStyleFile, &theme.style, false},
               {kScriptFile, &theme.script, true}};
  for (const auto& part : parts) {
    std::string contents;
    const std::string path = platform::JoinFolder(folder, part.name);
    const auto result = platform::ReadWholeFile(path, kMostThemeBytes, contents);
    if (result == platform::ReadResult::Missing && part.optional) continue;
    if (result != platform::ReadResult::Done) return WithReason(Tr("\"%1\" cannot be read.", path));
    *part.contents = std::move(contents);
  }
  if (theme.page.find("{{pictures}}") == std::string::npos)
    return Tr("\"%1\" has no place for {{pictures}}.", platform::JoinFolder(folder, kPageFile));
  return {};
}

GalleryTexts TextsFor(const GalleryCommand& options) {
  GalleryTexts texts;
  texts.language = TextLanguage();
  std::ranges::replace(texts.language, '_', '-');
  texts.title = options.title;
  if (texts.title.empty()) texts.title = platform::FileNameOf(platform::AbsolutePath(options.dest));
  texts.viewer = Tr("Full-screen view");
  texts.close = Tr("Close");
  texts.previous = Tr("Previous picture");
  texts.next = Tr("Next picture");
  texts.original = Tr("Original file");
  texts.pages = Tr("Pages");
  return texts;
}

// `built`: the pages were written; else only failed files are reported.
void Report(const Selection& selection, const std::vector<GalleryOutcome>& outcomes, bool built,
            ResultOutput& output) {
  for (size_t i = 0; i < outcomes.size(); ++i) {
    const std::string& name = selection.files[i].name;
    const GalleryOutcome& outcome = outcomes[i];
    if (outcome.status != Status::Ok) {
      output.FileFailed(name, outcome.status, outcome.hint);
    } else if (!built) {
      continue;
    } else if (!output.IsJson()) {
      output.FileDone(name, outcome.destination);
    } else {
      output.CountFile();
      Json element;
      PutName(element, "file", name);
      PutName(element, "destination", outcome.destination);
      element["unchanged"] = outcome.kept;
      PutStatus(element, Status::Ok);
      output.Element(element);
    }
  }
}

int RunGallery(const GalleryCommand& options, const CommandContext& context) {
  GalleryOptions gallery;
  gallery.theme = BuiltInTheme();
  if (!options.sizes.empty() && !ReadSizes(options.sizes, gallery.sides)) {
    return UsageError(context, Tr("--sizes takes one to three increasing numbers, such as "
                                  "480,960,1920."));
  }
  if (!options.theme.empty()) {
    if (const std::string wrong = ReadTheme(options.theme, gallery.theme); !wrong.empty())
      return UsageError(context, wrong);
  }
  if (platform::ExistenceOf(options.dest) == platform::Existence::Yes &&
      !platform::IsFolder(options.dest))
    return UsageError(context, Tr("\"%1\" is not a folder.", options.dest));
  if (const RecordedText problem = MacroProblem(options.caption); !problem.empty())
    return UsageError(context, "\"" + options.caption + "\" " + problem.shown);
  auto selection = SelectFiles(options.selection, context);
  if (!selection) return kExitUsage;
  gallery.folder = options.dest;
  gallery.texts = TextsFor(options);
  gallery.reading.upright = settings.ExifAdjustOrientation != 0;
  gallery.reading.read = ReadOptionsFromSettings();
  gallery.quality = options.quality;
  gallery.webp = !options.noWebp;
  gallery.details = !options.noDetails;
  gallery.originals = options.originals;
  gallery.caption = options.caption;
  gallery.copyrightHolder = settings.ExifCopyrightHolder.view();
  gallery.perPage = static_cast<size_t>(options.perPage);
  gallery.jobs = static_cast<uint32_t>(options.jobs);
  gallery.dryRun = options.dryRun;
  LeaveOutRepeated(options.dest, selection->files);
  if (const std::string path = ForeignFile(gallery, selection->files.size()); !path.empty()) {
    return UsageError(context, Tr("\"%1\" already exists and does not belong to a gallery.", path));
  }

  ResultOutput output(context, options.json);
  output.CloseWith(selection->leftOut);
  output.KeepGoing();
  const GalleryHost host{
      .progress = [&](size_t done, size_t total) { output.ShowProgress(done, total); },
      .goesOn = [&] { return output.GoesOn(); },
      .tick = [&] { output.Tick(); },
      .countText = [](size_t count) { return TrCount("%1 picture", "%1 pictures", count, count); }};
  std::vector<GalleryOutcome> outcomes;
  std::string failed;
  const Status status = BuildGallery(selection->files, gallery, host, outcomes, failed);
  if (status == Status::FunctionCancelled) return output.Finish();
  if (status != Status::Ok) output.Failure(failed, status, ReasonSentence());
  Report(*selection, outcomes, status == Status::Ok, output);
  return output.Finish();
}

int RunGalleryTheme(const ThemeCommand& options, const CommandContext& context) {
  const GalleryTheme theme = BuiltInTheme();
  const struct {
    const char* name;
    const std::string& contents;
  } parts[] = {{kPageFile, theme.page}, {kStyleFile, theme.style}, {kScriptFile, theme.script}};
  ResultOutput output(context, false);
  for (const auto& part : parts) {
    const std::string path = platform::JoinFolder(options.dest, part.name);
    if (platform::ExistenceOf(path) != platform::Existence::No)
      return UsageError(context, Tr("\"%1\" already exists.", path));
  }
  for (const auto& part : parts) {
    const std::string path = platform::JoinFolder(options.dest, part.name);
    if (!platform::MakeFolders(options.dest) || !platform::WriteWholeFile(path, part.contents)) {
      output.Failure(path, Status::ErrorCreatingFile, ReasonSentence());
      return kExitFailed;
    }
    output.Line(output.Shown(path));
  }
  return kExitOk;
}

}  // namespace

void SetUpGallery(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<GalleryCommand>();
  AddSelection(app, options->selection, context);
  Require(
      AddName(app, "-d,--dest", options->dest, "DIR", "Folder of the gallery, created if needed"));
  AddText(app, "--title", options->title, "TEXT", "Title (default: name of the folder)");
  AddText(app, "--caption", options->caption, "TEXT",
          "Text below each picture; may contain macros (default: %F, the file name)");
  AddText(app, "--sizes", options->sizes, "N,N,N",
          "Longer sides of the pictures in pixels (default: 480,960,1920)");
  AddNumber(app, "--quality", options->quality, "N", 1, 100,
            "Quality of the pictures (default: 82)");
  AddFlag(app, "--no-webp", options->noWebp, "Write JPEG only, not WebP beside it");
  AddFlag(app, "--no-details", options->noDetails, "Leave out camera and exposure");
  AddFlag(app, "--originals", options->originals, "Link to the original files");
  AddNumber(app, "--per-page", options->perPage, "N", 1, 10000, "Pictures per page (default: 120)");
  AddName(app, "--theme", options->theme, "DIR",
          "Folder with template.html and gallery.css (default: the built-in theme)");
  AddNumber(app, "-j,--jobs", options->jobs, "N", 0, INT32_MAX,
            "Number of parallel jobs (default: 0, one per core)");
  AddDryRunAndJson(app, options->dryRun, options->json,
                   "Print a JSON array of {file, destination, unchanged, status, message}");
  SetFooter(app,
            "The folder works from disk and from any web server. Pictures carry no metadata. A "
            "second build writes only what has changed and deletes pictures that are no longer "
            "used.",
            "fotomill gallery holiday -r --dest web --title \"Summer 2026\"");
  context.run = [options, &context] { return RunGallery(*options, context); };
}

void SetUpGalleryTheme(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<ThemeCommand>();
  Require(
      AddName(app, "-d,--dest", options->dest, "DIR", "Folder of the theme, created if needed"));
  SetFooter(app,
            "Writes template.html, gallery.css and gallery.js for you to change; existing files "
            "are never replaced.",
            "fotomill gallery theme --dest mytheme");
  context.run = [options, &context] { return RunGalleryTheme(*options, context); };
}

}  // namespace fotomill::cli
