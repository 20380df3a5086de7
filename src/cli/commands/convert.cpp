#include "cli/commands/convert.h"

#include <algorithm>
#include <memory>
#include <string>
#include <vector>

#include "batch/new_job.h"
#include "batch/recipe_function.h"
#include "batch/run.h"
#include "cli/frame/destination_format.h"
#include "cli/frame/file_selection.h"
#include "cli/frame/recipe_text.h"
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
  bool apply = false;  // the command is `apply`: operations are needed, a format is not
  SelectionOptions selection;
  std::string to;
  std::string dest;
  std::string out;
  std::vector<std::string> prefix;  // as often as it is given; the last one counts
  std::string steps, recipe;        // --do, --recipe
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

BatchFunction FunctionOf(const ConvertOptions& options, const Recipe* recipe) {
  BatchFunction function{.history = FileFunction::Convert,
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
  if (!options.prefix.empty() || !options.apply) function.prefix = options.prefix.empty() ? std::string() : options.prefix.back();
  if (options.apply && recipe != nullptr && recipe->HasSteps()) function.history = FunctionOfFamily(recipe->First()->family);
  return function;
}

// Reads the format that is asked for into `job`; none where every file keeps its own. What is wrong, or empty.
std::string ReadFormat(const ConvertOptions& options, bool mayKeep, BatchJob& job) {
  if (options.to.empty() && options.out.empty()) return mayKeep ? std::string() : "Say with --to which format to convert to.";
  const std::string extension = options.to.empty() ? std::string(platform::ExtensionOf(options.out)) : options.to;
  const std::string wrong = ReadDestinationFormat(extension, job);
  const bool fromName = job.formatIndex == kNoFormat && options.to.empty();
  return fromName ? "\"" + options.out + "\" selects no format; name one with --to." : wrong;
}

// What is wrong with the options, as a sentence; empty when nothing is. Takes the format into `job`.
std::string CheckOptions(const ConvertOptions& options, const CommandContext& context, const Recipe* recipe, BatchJob& job) {
  const bool saves = recipe != nullptr && std::ranges::all_of(recipe->outputs, [](const RecipeOutput& output) {
                       return !output.save.to.empty();
                     });
  if (const std::string wrong = ReadFormat(options, options.apply || saves, job); !wrong.empty()) return wrong;
  if (recipe != nullptr && recipe->outputs.size() > 1 && !options.out.empty()) return "--out takes a recipe with one output.";
  const std::string prefix = options.prefix.empty() ? std::string() : options.prefix.back();
  if (prefix.size() > kLongestPrefix) {
    return "The prefix is longer than " + std::to_string(kLongestPrefix) + " characters.";
  }
  if (!IsPlainName(prefix)) return "The prefix is a part of a name and cannot lead to a folder.";
  if (options.keepTree && options.dest.empty()) return "--keep-tree needs --dest.";
  if (options.overwrite == "ask" && !context.MayAsk()) return "--overwrite ask needs a terminal to ask on.";
  if (!options.dest.empty() && platform::FileExists(options.dest) && !platform::IsFolder(options.dest)) {
    return "\"" + options.dest + "\" is not a folder.";
  }
  return {};
}

// Hands the recipe to the function. What is wrong, or empty.
std::string TakeRecipe(const ConvertOptions& options, const std::shared_ptr<const Recipe>& recipe, const BatchJob& job,
                       BatchFunction& function) {
  if (recipe == nullptr) return {};
  BatchJob fallback;
  const std::string extension(settings.DefaultFileExtension.view());
  if (!ReadDestinationFormat(extension, fallback).empty()) (void)ReadDestinationFormat("png", fallback);
  function.fallback = {fallback.formatIndex, fallback.extension};
  const FormatLookup lookup = [](const std::string& name, int32_t& index, std::string& format) {
    BatchJob found;
    std::string wrong = ReadDestinationFormat(name, found);
    index = found.formatIndex;
    format = found.extension;
    return wrong;
  };
  if (std::string wrong = SetRecipe(recipe, std::string(settings.ExifCopyrightHolder.view()), job, lookup, function); !wrong.empty()) {
    return wrong;
  }
  if (options.quality > 0) {  // an option of the command line wins over the recipe
    for (BatchOutput& output : function.outputs) {
      output.quality = 0;
      output.mostBytes = 0;
    }
  }
  return {};
}

int RunConvert(const ConvertOptions& options, const CommandContext& context) {
  BatchJob job = NewBatchJob();
  job.remember = nullptr;
  std::shared_ptr<const Recipe> recipe;
  if (!ReadRecipeOptions({options.steps, options.recipe, options.apply}, context, recipe)) return kExitUsage;
  if (const std::string wrong = CheckOptions(options, context, recipe.get(), job); !wrong.empty()) return UsageError(context, wrong);
  BatchFunction function = FunctionOf(options, recipe.get());
  if (const std::string wrong = TakeRecipe(options, recipe, job, function); !wrong.empty()) return UsageError(context, wrong);
  const auto files = SelectFiles(options.selection, context);
  if (!files) return kExitUsage;
  if (!options.out.empty() && files->size() != 1) return UsageError(context, "--out takes exactly one picture.");
  if (options.quality > 0) job.encode.jpegQuality = job.encode.webpQuality = options.quality;

  ResultOutput output(context, options.json);
  TerminalPrompts prompts(context, output);
  job.destinationFolder = options.dest;
  job.prompts = context.MayAsk() ? &prompts : nullptr;
  SetOverwritePolicy(options, context, job);
  TerminalBox box(output, options.verbose, options.overwrite.empty() && !job.overwrite.prompt);
  job.box = &box;
  if (const Status status = RunBatch(*files, function, job); status != Status::Ok) {
    output.Message(output.ShownMessage(options.dest) + ": " + std::string(StatusMessage(status)));
    return kExitFailed;
  }
  return FinishBatch(job);
}

}  // namespace

namespace {

void SetUp(CLI::App& app, CommandContext& context, const std::shared_ptr<ConvertOptions>& options) {
  AddSelection(app, options->selection, context);
  AddName(app, "-t,--to", options->to, "EXT", "Format to convert to, by its extension");
  CLI::Option* dest = AddName(app, "-d,--dest", options->dest, "DIR",
                              "Folder of the outputs, made with its parents; else they lie beside their sources");
  CLI::Option* out = AddName(app, "-o,--out", options->out, "FILE", "Name of the output, for one picture");
  Exclude(out, dest);
  Exclude(AddRepeatedText(app, "--prefix", options->prefix, "TEXT", "Put in front of every name"), out);
  CLI::Option* steps = AddText(app, "--do", options->steps, "TEXT", "Operations to apply, separated by \";\": 'resize 50%; sharpen 0.5'");
  Exclude(AddName(app, "--recipe", options->recipe, "FILE|NAME", "Recipe to apply (see \"fotomill recipe list\")"), steps);
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
  context.run = [options, &context] { return RunConvert(*options, context); };
}

}  // namespace

void SetUpConvert(CLI::App& app, CommandContext& context) {
  SetUp(app, context, std::make_shared<ConvertOptions>());
  SetFooter(app, "Example: fotomill convert holiday -r --to png --dest out --keep-tree");
}

void SetUpApply(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<ConvertOptions>();
  options->apply = true;
  SetUp(app, context, options);
  SetFooter(app,
            "Without --to and without \"save\" in the recipe, each output has the format of its source. \"fotomill operations\" lists\n"
            "the operations, \"fotomill operations NAME\" explains one.\n\n"
            "Example: fotomill apply holiday --do 'resize 1600x1600 only=shrink; sharpen 0.5' --to jpg --dest out");
}

}  // namespace fotomill::cli
