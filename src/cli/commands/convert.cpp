#include "cli/commands/convert.h"

#include <algorithm>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "batch/new_job.h"
#include "batch/recipe_function.h"
#include "batch/run.h"
#include "cli/frame/destination_format.h"
#include "cli/frame/options.h"
#include "cli/frame/recipe_text.h"
#include "cli/frame/result_output.h"
#include "cli/frame/terminal_box.h"
#include "cli/frame/terminal_prompts.h"
#include "cli/selection/file_selection.h"
#include "cli/selection/output_place.h"
#include "core/plain_name.h"
#include "core/text.h"
#include "core/whole_number.h"
#include "platform/existence.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/process.h"
#include "processing/color/color_profile.h"
#include "registry/registry.h"
#include "settings/settings.h"
#include "texts/status_text.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct ConvertOptions {
  bool apply = false;  // for `apply`: operations are required, a format is not
  SelectionOptions selection;
  std::string to;
  std::string dest;
  std::string out;
  std::vector<std::string> prefix;  // all occurrences; the last one applies
  std::string steps, recipe;        // --do, --recipe
  std::string overwrite;  // empty: ask if possible, else keep both
  std::string metadata = "keep";
  std::string profile = "keep";  // "keep", "srgb", or a file name
  std::string quality;           // "keep" or 1 to 100; empty: use settings
  std::string page;              // "all" or a number from 1; empty: not given
  int32_t jobs = 0;
  bool reduce = false;
  bool salvage = false;
  bool autoOrient = false;
  bool keepTree = false;
  bool keepTimes = false;
  bool dryRun = false;
  bool json = false;
};

constexpr size_t kLongestPrefix = SettingPrefix::Capacity();
constexpr uint64_t kMostProfileBytes = 8 << 20;

// The option overrides the settings. If the settings say ask but prompting is not possible, both
// files are kept.
void SetOverwritePolicy(const ConvertOptions& options, const CommandContext& context,
                        BatchJob& job) {
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
                         .jobs = static_cast<uint32_t>(options.jobs),
                         .reduce = options.reduce,
                         .reduceHint = Tr("Use --reduce to reduce them."),
                         .salvage = options.salvage,
                         .salvageHint = options.salvage
                                            ? std::string()
                                            : Tr("Use --salvage to convert what is there."),
                         .autoOrient = options.autoOrient,
                         .keepMetadata = options.metadata == "keep",
                         .keepTimes = options.keepTimes,
                         .keepTree = options.keepTree,
                         .dryRun = options.dryRun};
  if (!options.prefix.empty() || !options.apply)
    function.prefix = options.prefix.empty() ? std::string() : options.prefix.back();
  if (options.apply && recipe != nullptr && recipe->HasSteps())
    function.history = FunctionOfFamily(recipe->First()->family);
  return function;
}

// Parses --quality and --page. Returns an error message, empty on success.
std::string ReadNumbers(const ConvertOptions& options, const Recipe* recipe,
                        BatchFunction& function, BatchJob& job) {
  const std::string& quality = options.quality;
  const std::optional<int32_t> number = ParseNumber(quality);
  const bool moves =
      recipe != nullptr && recipe->HasSteps() ? recipe->OnlyMovesPixels() : options.autoOrient;
  if (quality == "keep" || (quality.empty() && moves)) {
    job.encode.jpegAsSource = true;
  } else if (number && *number >= 1 && *number <= 100) {
    job.encode.jpegQuality = job.encode.webpQuality = *number;
    function.encodesAnew = true;
  } else if (!quality.empty()) {
    return Tr("--quality: \"%1\" is neither keep nor a whole number from 1 to 100.", quality);
  }
  const std::optional<int32_t> page = ParseNumber(options.page);
  if (options.page == "all") {
    function.page = kAllPages;
  } else if (page && *page >= 1) {
    function.page = *page;
  } else if (!options.page.empty()) {
    return Tr("--page: \"%1\" is neither all nor a whole number of at least 1.", options.page);
  }
  return {};
}

// Parses --profile. Returns an error message, empty on success.
std::string ReadProfile(const ConvertOptions& options, const BatchJob& job,
                        ProfileRequest& request) {
  if (options.profile == "keep") return {};
  request.use = ProfileRequest::Use::Srgb;
  if (options.profile == "srgb") return {};
  std::string bytes;
  const auto read = platform::ReadWholeFile(options.profile, kMostProfileBytes, bytes);
  if (read != platform::ReadResult::Done)
    return WithReason(Tr("The color profile \"%1\" cannot be read.", options.profile));
  request.use = ProfileRequest::Use::Given;
  request.profile = std::make_shared<const std::vector<uint8_t>>(bytes.begin(), bytes.end());
  if (ColorsOfProfile(*request.profile) != ProfileColors::Rgb)
    return Tr("\"%1\" is not an ICC profile of RGB colors.", options.profile);
  if (job.formatIndex != kNoFormat && !HoldsProfile(FormatRow(job.formatIndex)))
    return Tr("%1 files cannot hold a color profile.", FormatRow(job.formatIndex).extension.view());
  return {};
}

// Sets the output format in `job`; none if files keep their format. Returns an error message, empty
// on success.
std::string ReadFormat(const ConvertOptions& options, bool mayKeep, BatchJob& job) {
  if (options.to.empty() && (options.out.empty() || options.out == kStream))
    return mayKeep ? std::string() : Tr("Name the output format with --to.");
  const std::string extension =
      options.to.empty() ? std::string(platform::ExtensionOf(options.out)) : options.to;
  const std::string wrong = ReadDestinationFormat(extension, job);
  const bool fromName = job.formatIndex == kNoFormat && options.to.empty();
  return fromName ? Tr("\"%1\" selects no format; name one with --to.", options.out) : wrong;
}

// Returns an error message, empty if the options are valid. Sets the format in `job`.
std::string CheckOptions(const ConvertOptions& options, const CommandContext& context,
                         const Recipe* recipe, BatchJob& job) {
  const bool saves =
      recipe != nullptr && std::ranges::all_of(recipe->outputs, [](const RecipeOutput& output) {
        return !output.save.to.empty();
      });
  if (const std::string wrong = ReadFormat(options, options.apply || saves, job); !wrong.empty())
    return wrong;
  if (recipe != nullptr && recipe->outputs.size() > 1 && !options.out.empty())
    return Tr("--out takes a recipe with one output.");
  const std::string prefix = options.prefix.empty() ? std::string() : options.prefix.back();
  if (prefix.size() > kLongestPrefix) {
    return Tr("The prefix is longer than %1 characters.", kLongestPrefix);
  }
  if (!IsPlainName(prefix)) return Tr("The prefix must be part of a file name, not a path.");
  if (options.keepTree && options.dest.empty()) return Tr("--keep-tree needs --dest.");
  if (options.overwrite == "ask" && !context.MayAsk())
    return Tr("--overwrite ask needs a terminal.");
  if (!options.dest.empty() && platform::ExistenceOf(options.dest) == platform::Existence::Yes &&
      !platform::IsFolder(options.dest)) {
    return Tr("\"%1\" is not a folder.", options.dest);
  }
  if (!options.out.empty() && options.out != kStream && platform::IsFolder(options.out))
    return Tr("\"%1\" is a folder; end its name with / to write into it.", options.out);
  return {};
}

// Passes the recipe to the function. Returns an error message, empty on success.
std::string TakeRecipe(const ConvertOptions& options, const std::shared_ptr<const Recipe>& recipe,
                       const BatchJob& job, BatchFunction& function) {
  if (recipe == nullptr) return {};
  BatchJob fallback;
  const std::string extension(settings.DefaultFileExtension.view());
  if (!ReadDestinationFormat(extension, fallback).empty())
    (void)ReadDestinationFormat("png", fallback);
  function.fallback = {fallback.formatIndex, fallback.extension};
  const FormatLookup lookup = [](const std::string& name, int32_t& index, std::string& format) {
    BatchJob found;
    std::string wrong = ReadDestinationFormat(name, found);
    index = found.formatIndex;
    format = found.extension;
    return wrong;
  };
  if (std::string wrong = SetRecipe(recipe, std::string(settings.ExifCopyrightHolder.view()), job,
                                    lookup, function);
      !wrong.empty()) {
    return wrong;
  }
  if (!options.quality.empty()) {  // the command line overrides the recipe
    for (BatchOutput& output : function.outputs) {
      output.quality = 0;
      output.mostBytes = 0;
    }
  }
  return {};
}

// Handles standard input and output. Returns an error message, empty on success.
std::string TakeStreams(ConvertOptions& options, const CommandContext& context) {
  TakeFolder(options.out, options.dest);
  if (NamesInput(context)) {
    if (!options.dest.empty()) return Tr("Standard input needs --out FILE.");
    if (options.out.empty()) options.out = kStream;
  }
  return options.out == kStream && context.io.outTerminal
             ? Tr("Standard output is a terminal; redirect it, or name a file with --out.")
             : std::string();
}

// Runs the batch; copies the output to standard output if `stream` has a file.
int RunInto(const StreamedOutput& stream, const Selection& selection, const BatchFunction& function,
            BatchJob& job, ResultOutput& output, const CommandContext& context) {
  const Status status = RunBatch(selection.files, function, job);
  if (status != Status::Ok) {
    output.Message(output.ShownMessage(job.destinationFolder) + ": " + StatusText(status));
    return kExitFailed;
  }
  if (selection.input) job.uses.clear();  // the temporary file is deleted
  const bool written = !job.errors && job.writeAborts == 0 && platform::PendingExit() == 0;
  if (!stream.Path().empty() && written && !function.dryRun && !stream.Deliver(context)) {
    output.Message(std::string(kStream) + ": " + StatusText(Status::FileReadError));
    return kExitFailed;
  }
  return FinishBatch(job, context);
}

int RunConvert(ConvertOptions options, const CommandContext& context) {
  if (const std::string wrong = TakeStreams(options, context); !wrong.empty())
    return UsageError(context, wrong);
  BatchJob job = NewBatchJob();
  job.remember = nullptr;
  std::shared_ptr<const Recipe> recipe;
  if (!ReadRecipeOptions({options.steps, options.recipe, options.apply}, context, recipe))
    return kExitUsage;
  if (const std::string wrong = CheckOptions(options, context, recipe.get(), job); !wrong.empty())
    return UsageError(context, wrong);
  BatchFunction function = FunctionOf(options, recipe.get());
  if (const std::string wrong = ReadNumbers(options, recipe.get(), function, job); !wrong.empty())
    return UsageError(context, wrong);
  if (const std::string wrong = ReadProfile(options, job, function.profile); !wrong.empty())
    return UsageError(context, wrong);
  if (const std::string wrong = TakeRecipe(options, recipe, job, function); !wrong.empty())
    return UsageError(context, wrong);
  const auto selection = SelectFiles(options.selection, context);
  if (!selection) return kExitUsage;
  if (!options.out.empty() && selection->files.size() != 1)
    return UsageError(context, Tr("--out takes exactly one picture."));

  const bool streams = options.out == kStream;
  const CommandContext shown = streams ? WithResultsOnError(context) : context;
  ResultOutput output(shown, options.json);
  output.CloseWith(selection->leftOut);
  if (selection->input) output.ShowAsStream(selection->input->Path());
  TerminalPrompts prompts(shown, output);
  job.destinationFolder = options.dest;
  job.prompts = context.MayAsk() ? &prompts : nullptr;
  SetOverwritePolicy(options, context, job);
  TerminalBox box(output, context.global.verbose,
                  !streams && options.overwrite.empty() && !job.overwrite.prompt);
  job.box = &box;
  StreamedOutput stream;
  if (streams) {
    const std::string_view source = platform::ExtensionOf(selection->files.front().name);
    if (!stream.Create(LowerCase(job.extension.empty() ? source : job.extension))) {
      output.Message("fotomill: " + WithReason(Tr("No temporary file can be created.")));
      return kExitFailed;
    }
    output.ShowAsStream(stream.Path());
    function.out = stream.Path();
    function.oneFile = true;
  }
  return RunInto(stream, *selection, function, job, output, context);
}

}  // namespace

namespace {

void SetUp(CLI::App& app, CommandContext& context, const std::shared_ptr<ConvertOptions>& options) {
  options->selection.takesInput = true;
  AddSelection(app, options->selection, context);
  AddName(app, "-t,--to", options->to, "EXT", "Output format, by extension");
  CLI::Option* dest = AddName(app, "-d,--dest", options->dest, "DIR",
                              "Output folder, created if needed (default: beside each source)");
  CLI::Option* out =
      AddName(app, "-o,--out", options->out, "FILE|-",
              "Output file, for a single picture; FOLDER/ is --dest FOLDER, - is standard output");
  Exclude(out, dest);
  Exclude(AddRepeatedText(app, "--prefix", options->prefix, "TEXT", "Prefix for output names"),
          out);
  CLI::Option* steps =
      AddText(app, "--do", options->steps, "TEXT",
              "Operations to apply, separated by \";\": 'resize 50%; sharpen 0.5'");
  Exclude(AddName(app, "--recipe", options->recipe, "FILE|NAME",
                  "Recipe to apply (see \"fotomill recipe list\")"),
          steps);
  AddChoice(app, "--overwrite", options->overwrite, "HOW",
            "If the output exists: ask (default on a terminal), replace, keep-both (default otherwise) or skip",
            {"ask", "replace", "keep-both", "skip"});
  AddFlag(app, "--keep-tree", options->keepTree, "Recreate the source folders in --dest");
  AddFlag(app, "--keep-times", options->keepTimes, "Keep the modification times of the sources");
  AddChoice(app, "--metadata", options->metadata, "HOW",
            "Keep (default) or strip EXIF, XMP and comments", {"keep", "strip"});
  AddName(app, "--profile", options->profile, "keep|srgb|FILE",
          "Color profile: keep (default), convert to sRGB, or convert to the profile in FILE");
  AddFlag(app, "--auto-orient", options->autoOrient, "Rotate pictures upright by EXIF orientation");
  AddFlag(app, "--salvage", options->salvage,
          "Convert what can be read of files that end early, such as broken downloads");
  AddFlag(app, "--reduce", options->reduce, "Reduce colors if the format supports fewer");
  AddName(app, "--quality", options->quality, "N|keep",
          "JPEG and WebP quality, 1 to 100; keep: that of a JPEG source");
  AddName(app, "--page", options->page, "N|all",
          "Page to convert, from 1; all: every page, into one file if the format holds several");
  AddNumber(app, "-j,--jobs", options->jobs, "N", 0, INT32_MAX,
            "Number of parallel jobs (default: 0, one per core)");
  AddDryRunAndJson(app, options->dryRun, options->json,
                   "Print a JSON array of {file, destination, status, message}");
  context.run = [options, &context] { return RunConvert(*options, context); };
}

}  // namespace

void SetUpConvert(CLI::App& app, CommandContext& context) {
  SetUp(app, context, std::make_shared<ConvertOptions>());
  SetFooter(app, nullptr, "fotomill convert holiday -r --to png --dest out --keep-tree");
}

void SetUpApply(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<ConvertOptions>();
  options->apply = true;
  SetUp(app, context, options);
  SetFooter(app,
            "Without --to and without \"save\" in the recipe, each output has the format of its source. \"fotomill operations\" lists\n"
            "the operations, \"fotomill operations NAME\" explains one.",
            "fotomill apply holiday --do 'resize 1600x1600 only=shrink; sharpen 0.5' --to jpg --dest out");
}

}  // namespace fotomill::cli
