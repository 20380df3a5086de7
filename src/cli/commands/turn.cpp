#include "cli/commands/turn.h"

#include <algorithm>
#include <memory>
#include <string>

#include "batch/new_job.h"
#include "batch/turn_run.h"
#include "cli/frame/file_selection.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/frame/terminal_box.h"
#include "platform/files.h"
#include "settings/settings.h"

namespace fotomill::cli {

namespace {

struct TurnOptions {
  SelectionOptions selection;
  std::string rotate, flip;
  std::string dest;
  std::string overwrite = "keep-both";
  int32_t jobs = 0;
  bool byExif = false;
  bool inPlace = false;
  bool trim = false;
  bool keepTree = false;
  bool keepTimes = false;
  bool dryRun = false;
  bool json = false;
};

struct NamedTurn {
  const char* name;
  Orientation turn;
};
constexpr NamedTurn kTurnNames[] = {{"right", Orientation::QuarterRight},
                                    {"left", Orientation::QuarterLeft},
                                    {"180", Orientation::HalfTurn},
                                    {"horizontal", Orientation::MirrorAcross},
                                    {"vertical", Orientation::MirrorDown}};

Orientation TurnNamed(const std::string& name) {
  const auto* found = std::ranges::find_if(kTurnNames, [&](const NamedTurn& turn) { return name == turn.name; });
  return found == std::end(kTurnNames) ? Orientation::Upright : found->turn;
}

// What is wrong with the options, as a sentence; empty when nothing is.
std::string CheckOptions(const TurnOptions& options) {
  if (options.rotate.empty() && options.flip.empty() && !options.byExif) return "Say how to turn: --rotate, --flip or --by-exif.";
  if (!options.inPlace && options.dest.empty()) return "Say where the turned files go: --dest DIR, or --in-place.";
  if (options.keepTree && options.dest.empty()) return "--keep-tree needs --dest.";
  if (!options.dest.empty() && platform::FileExists(options.dest) && !platform::IsFolder(options.dest)) {
    return "\"" + options.dest + "\" is not a folder.";
  }
  return {};
}

int RunTurnCommand(const TurnOptions& options, const CommandContext& context) {
  if (const std::string wrong = CheckOptions(options); !wrong.empty()) return UsageError(context, wrong);
  const auto files = SelectFiles(options.selection, context);
  if (!files) return kExitUsage;
  TurnFunction function{.request = {.turn = Composed(TurnNamed(options.rotate), TurnNamed(options.flip)),
                                    .seenByExif = options.byExif || settings.ExifAdjustOrientation != 0,
                                    .trim = options.trim,
                                    .keepTime = options.keepTimes},
                        .inPlace = options.inPlace,
                        .keepTree = options.keepTree,
                        .jobs = static_cast<uint32_t>(options.jobs),
                        .dryRun = options.dryRun};
  BatchJob job = NewBatchJob();
  job.destinationFolder = options.dest;
  job.overwrite.prompt = options.overwrite != "replace";
  job.overwrite.skip = options.overwrite == "skip";
  ResultOutput output(context, options.json);
  TerminalBox box(output, true, false);
  job.box = &box;
  (void)RunTurn(*files, function, job);  // this box always opens
  return FinishBatch(job);
}

}  // namespace

void SetUpTurn(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<TurnOptions>();
  AddSelection(app, options->selection, context);
  AddChoice(app, "--rotate", options->rotate, "WAY", {"left", "right", "180"},
            "Rotate by a quarter to the left or right, or by half");
  AddChoice(app, "--flip", options->flip, "WAY", {"horizontal", "vertical"},
            "Exchange left and right, or top and bottom; after --rotate where both are given");
  AddFlag(app, "--by-exif", options->byExif, "Turn upright as EXIF says, in front of --rotate and --flip");
  CLI::Option* dest = AddName(app, "-d,--dest", options->dest, "DIR", "Folder of the turned files, made with its parents");
  Exclude(AddFlag(app, "--in-place", options->inPlace, "Replace each file"), dest);
  AddChoice(app, "--overwrite", options->overwrite, "HOW", {"keep-both", "replace", "skip"},
            "keep-both (the way unless given), replace or skip files of an output's name in --dest");
  AddFlag(app, "--trim", options->trim, "Cut off edges that a JPEG picture cannot turn without loss");
  AddFlag(app, "--keep-tree", options->keepTree, "Rebuild the folders of named folders in --dest");
  AddFlag(app, "--keep-times", options->keepTimes, "Give turned files the times they had");
  AddNumber(app, "-j,--jobs", options->jobs, "N", 0, INT32_MAX, "Files at work at a time; 0, the default, is one a core");
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only print what would be done");
  AddFlag(app, "--json", options->json, "One JSON array of {file, destination, status, message}");
  SetFooter(
      app,
      "JPEG pictures turn without loss. One whose size is no multiple of its blocks (8 or 16 pixels) keeps its pixels and gets\n"
      "an EXIF orientation instead, unless --trim is given; a message says so. Files of other formats are written anew, if\n"
      "every pixel stays as it is.\n\n"
      "Example: fotomill turn --by-exif --in-place holiday -r");
  context.run = [options, &context] { return RunTurnCommand(*options, context); };
}

}  // namespace fotomill::cli
