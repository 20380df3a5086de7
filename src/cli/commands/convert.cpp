#include "cli/commands/convert.h"

#include <memory>
#include <string>

#include "batch/new_job.h"
#include "batch/run.h"
#include "cli/frame/destination_format.h"
#include "cli/frame/file_selection.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/frame/terminal_box.h"
#include "cli/frame/terminal_prompts.h"
#include "core/plain_name.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "settings/settings.h"

namespace fotomill::cli {

namespace {

struct ConvertOptions {
  SelectionOptions selection;
  std::string to;
  std::string dest;
  std::string out;
  std::string prefix;
  std::string overwrite;  // empty: ask where someone can answer, else keep both
  std::string metadata = "keep";
  int32_t quality = 0;  // 1 to 100; 0: as configured
  int32_t page = 1;     // from 1
  int32_t jobs = 0;
  bool reduce = false;
  bool autoOrient = false;
  bool verbose = false;
  bool keepTree = false;
  bool keepTimes = false;
  bool dryRun = false;
  bool json = false;
};

constexpr size_t kLongestPrefix = SettingPrefix::Capacity();

constexpr const char* kReduceHint = "Use --reduce to have them reduced.";

// The option decides where it is given. Without it the settings do, and where nobody can be asked, nothing is replaced that
// they would ask about.
void SetOverwritePolicy(const ConvertOptions& options, const CommandContext& context, BatchJob& job) {
  const std::string& how = options.overwrite;
  if (how == "ask") job.overwrite.prompt = true;
  if (how == "replace") job.overwrite.prompt = false;
  if (how == "skip") job.overwrite.skip = true;
  if (how == "keep-both" || (how.empty() && job.overwrite.prompt && !context.MayAsk())) {
    job.overwrite.prompt = job.overwrite.keepBoth = job.applyToRest = true;
  }
}

BatchFunction FunctionOf(const ConvertOptions& options) {
  return {.transform = {},
          .history = FileFunction::Convert,
          .prefix = options.prefix,
          .out = options.out,
          .page = options.page,
          .jobs = static_cast<uint32_t>(options.jobs),
          .reduce = options.reduce,
          .reduceHint = kReduceHint,
          .autoOrient = options.autoOrient,
          .keepMetadata = options.metadata == "keep",
          .keepTimes = options.keepTimes,
          .keepTree = options.keepTree,
          .dryRun = options.dryRun};
}

// What is wrong with the options, as a sentence; empty when nothing is. Takes the format into `job`.
std::string CheckOptions(const ConvertOptions& options, const CommandContext& context, BatchJob& job) {
  if (options.to.empty() && options.out.empty()) return "Say with --to which format to convert to.";
  const std::string extension = options.to.empty() ? std::string(platform::ExtensionOf(options.out)) : options.to;
  if (const std::string wrong = ReadDestinationFormat(extension, job); !wrong.empty()) {
    return job.formatIndex != kNoFormat || !options.to.empty() ? wrong
                                                               : "\"" + options.out + "\" selects no format; name one with --to.";
  }
  if (options.prefix.size() > kLongestPrefix) {
    return "The prefix is longer than " + std::to_string(kLongestPrefix) + " characters.";
  }
  if (!IsPlainName(options.prefix)) return "The prefix is a part of a name and cannot lead to a folder.";
  if (options.keepTree && options.dest.empty()) return "--keep-tree needs --dest.";
  if (options.overwrite == "ask" && !context.MayAsk()) return "--overwrite ask needs a terminal to ask on.";
  if (!options.dest.empty() && platform::FileExists(options.dest) && !platform::IsFolder(options.dest)) {
    return "\"" + options.dest + "\" is not a folder.";
  }
  return {};
}

int RunConvert(const ConvertOptions& options, const CommandContext& context) {
  BatchJob job = NewBatchJob();
  job.remember = nullptr;
  if (const std::string wrong = CheckOptions(options, context, job); !wrong.empty()) return UsageError(context, wrong);
  const auto files = SelectFiles(options.selection, context);
  if (!files) return kExitUsage;
  if (!options.out.empty() && files->size() != 1) return UsageError(context, "--out takes exactly one picture.");
  if (options.quality > 0) settings.JpegCompression = settings.WebPQualityFactor = options.quality;

  ResultOutput output(context, options.json);
  TerminalPrompts prompts(context, output);
  job.destinationFolder = options.dest;
  job.prompts = context.MayAsk() ? &prompts : nullptr;
  SetOverwritePolicy(options, context, job);
  TerminalBox box(output, options.verbose, options.overwrite.empty() && !job.overwrite.prompt);
  job.box = &box;
  if (const Status status = RunBatch(*files, FunctionOf(options), job); status != Status::Ok) {
    output.Message(output.ShownMessage(options.dest) + ": " + std::string(StatusMessage(status)));
    return kExitFailed;
  }
  return FinishBatch(job);
}

}  // namespace

void SetUpConvert(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<ConvertOptions>();
  AddSelection(app, options->selection, context);
  AddName(app, "-t,--to", options->to, "EXT", "Format to convert to, by its extension");
  CLI::Option* dest = AddName(app, "-d,--dest", options->dest, "DIR",
                              "Folder of the outputs, made with its parents; else they lie beside their sources");
  CLI::Option* out = AddName(app, "-o,--out", options->out, "FILE", "Name of the output, for one picture");
  Exclude(out, dest);
  Exclude(AddText(app, "--prefix", options->prefix, "TEXT", "Put in front of every name"), out);
  AddChoice(app, "--overwrite", options->overwrite, "HOW", {"ask", "replace", "keep-both", "skip"},
            "ask (the way on a terminal), replace, keep-both (elsewhere) or skip files of an output's name");
  AddFlag(app, "--keep-tree", options->keepTree, "Rebuild the folders of named folders in --dest");
  AddFlag(app, "--keep-times", options->keepTimes, "Give outputs the times of their sources");
  AddChoice(app, "--metadata", options->metadata, "HOW", {"keep", "strip"}, "Keep or strip EXIF, XMP and color profiles");
  AddFlag(app, "--auto-orient", options->autoOrient, "Turn pictures upright as their EXIF says");
  AddFlag(app, "--reduce", options->reduce, "Reduce the colors of pictures that are too deep for the format");
  AddNumber(app, "--quality", options->quality, "N", 1, 100, "Of JPEG and WebP, 1 to 100");
  AddNumber(app, "--page", options->page, "N", 1, INT32_MAX, "Page to take of files with several, from 1");
  AddNumber(app, "-j,--jobs", options->jobs, "N", 0, INT32_MAX, "Pictures at work at a time; 0, the default, is one a core");
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only print what would be done");
  AddFlag(app, "-v,--verbose", options->verbose, "Say when a format cannot hold a picture's metadata");
  AddFlag(app, "--json", options->json, "One JSON array of {file, destination, status, message}");
  SetFooter(app, "Example: fotomill convert holiday -r --to png --dest out --keep-tree");
  context.run = [options, &context] { return RunConvert(*options, context); };
}

}  // namespace fotomill::cli
