#include "cli/commands/turn.h"

#include <algorithm>
#include <memory>
#include <string>

#include "batch/new_job.h"
#include "batch/turn_run.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/frame/terminal_box.h"
#include "cli/selection/file_selection.h"
#include "cli/selection/output_place.h"
#include "platform/existence.h"
#include "platform/files.h"
#include "registry/registry.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct TurnOptions {
  SelectionOptions selection;
  std::string rotate, flip;
  std::string dest, out;
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
  const auto* found =
      std::ranges::find_if(kTurnNames, [&](const NamedTurn& turn) { return name == turn.name; });
  return found == std::end(kTurnNames) ? Orientation::Upright : found->turn;
}

// What is wrong with the options, a whole sentence; empty if nothing is.
std::string CheckOptions(const TurnOptions& options) {
  if (options.rotate.empty() && options.flip.empty() && !options.byExif) {
    return Tr("Choose --rotate, --flip or --by-exif.");
  }
  if (!options.inPlace && options.dest.empty() && options.out.empty())
    return Tr("Choose --dest DIR, --out FILE or --in-place.");
  if (options.keepTree && options.dest.empty()) return Tr("--keep-tree needs --dest.");
  if (!options.dest.empty() && platform::ExistenceOf(options.dest) == platform::Existence::Yes &&
      !platform::IsFolder(options.dest)) {
    return Tr("\"%1\" is not a folder.", options.dest);
  }
  return {};
}

// What is wrong with --out for these files; empty if nothing is.
std::string CheckOut(const std::string& out, const std::vector<SelectedFile>& files) {
  if (out.empty()) return {};
  if (files.size() != 1) return Tr("--out takes exactly one picture.");
  const bool sameFormat = FindFormatByName(out) == FindFormatByName(files.front().name);
  return sameFormat
             ? std::string()
             : Tr("\"%1\" must have the extension of its source: turn keeps the format.", out);
}

int RunTurnCommand(TurnOptions options, const CommandContext& context) {
  TakeFolder(options.out, options.dest);
  if (const std::string wrong = CheckOptions(options); !wrong.empty())
    return UsageError(context, wrong);
  const auto selection = SelectFiles(options.selection, context);
  if (!selection) return kExitUsage;
  if (const std::string wrong = CheckOut(options.out, selection->files); !wrong.empty())
    return UsageError(context, wrong);
  TurnFunction function{
      .request = {.turn = Composed(TurnNamed(options.rotate), TurnNamed(options.flip)),
                  .seenByExif = options.byExif || settings.ExifAdjustOrientation != 0,
                  .trim = options.trim,
                  .keepTime = options.keepTimes,
                  .dryRun = options.dryRun},
      .inPlace = options.inPlace,
      .out = options.out,
      .keepTree = options.keepTree,
      .jobs = static_cast<uint32_t>(options.jobs)};
  BatchJob job = NewBatchJob();
  job.destinationFolder = options.dest;
  job.overwrite.prompt = options.overwrite != "replace";
  job.overwrite.skip = options.overwrite == "skip";
  ResultOutput output(context, options.json);
  output.CloseWith(selection->leftOut);
  TerminalBox box(output, true, false);
  job.box = &box;
  (void)RunTurn(selection->files, function, job);  // this box always opens
  return FinishBatch(job, context);
}

}  // namespace

void SetUpTurn(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<TurnOptions>();
  AddSelection(app, options->selection, context);
  AddChoice(app, "--rotate", options->rotate, "HOW",
            "Rotate by 90 degrees left or right, or by 180", {"left", "right", "180"});
  AddChoice(app, "--flip", options->flip, "HOW",
            "Mirror: horizontal or vertical; applied after --rotate", {"horizontal", "vertical"});
  AddFlag(app, "--by-exif", options->byExif,
          "Rotate upright by EXIF orientation, before --rotate and --flip");
  CLI::Option* dest =
      AddName(app, "-d,--dest", options->dest, "DIR", "Output folder, created if needed");
  CLI::Option* out = AddName(app, "-o,--out", options->out, "FILE",
                             "Output file, for a single picture; FOLDER/ is --dest FOLDER");
  CLI::Option* inPlace = AddFlag(app, "--in-place", options->inPlace, "Replace each file");
  Exclude(inPlace, dest);
  Exclude(inPlace, out);
  Exclude(out, dest);
  AddChoice(app, "--overwrite", options->overwrite, "HOW",
            "If the output exists in --dest: keep-both (default), replace or skip", {"keep-both", "replace", "skip"});
  AddFlag(app, "--trim", options->trim, "Crop JPEG edges that cannot be rotated losslessly");
  AddFlag(app, "--keep-tree", options->keepTree, "Recreate the source folders in --dest");
  AddFlag(app, "--keep-times", options->keepTimes, "Keep the modification times of the sources");
  AddNumber(app, "-j,--jobs", options->jobs, "N", 0, INT32_MAX,
            "Number of parallel jobs (default: 0, one per core)");
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only show what would be done");
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {file, destination, status, message}");
  SetFooter(app,
            "JPEG pictures are rotated losslessly. If the size is not a multiple of the block size "
            "(8 or 16 pixels), only the\nEXIF orientation is changed and a message says so; --trim "
            "crops the edges instead. Files of other formats are\nrewritten if no pixel changes.",
            "fotomill turn --by-exif --in-place holiday -r");
  context.run = [options, &context] { return RunTurnCommand(*options, context); };
}

}  // namespace fotomill::cli
