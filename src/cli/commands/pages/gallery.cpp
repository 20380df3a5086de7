#include "cli/commands/pages/gallery.h"

#include <memory>

#include "cli/commands/pages/option_variables.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/selection/file_selection.h"
#include "pages/gallery/gallery_build.h"
#include "platform/existence.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "printing/gallery_plan.h"
#include "printing/page_kind.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct GalleryCommand {
  SelectionOptions selection;
  OptionVariables variables;
  std::string dest;
  int32_t jobs = 0;
  bool dryRun = false, json = false;
};

struct ThemeCommand {
  std::string dest;
};

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
  if (const std::string wrong = PlanGallery(options.variables.Values(), options.dest, gallery);
      !wrong.empty())
    return UsageError(context, wrong);
  if (platform::ExistenceOf(options.dest) == platform::Existence::Yes &&
      !platform::IsFolder(options.dest))
    return UsageError(context, Tr("\"%1\" is not a folder.", options.dest));
  auto selection = SelectFiles(options.selection, context);
  if (!selection) return kExitUsage;
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
  } parts[] = {{kThemePage, theme.page}, {kThemeStyle, theme.style}, {kThemeScript, theme.script}};
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
  options->variables.Add(app, PageKindOf("gallery").options);
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
