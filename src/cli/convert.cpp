#include "cli/convert.h"

#include <map>
#include <memory>
#include <string>

#include "cli/file_selection.h"
#include "cli/options.h"
#include "cli/output_names.h"
#include "cli/overwrite_question.h"
#include "batch/picture_failure.h"
#include "cli/result_output.h"
#include "cli/used_files.h"
#include "core/nearest_name.h"
#include "core/plain_name.h"
#include "core/settings.h"
#include "core/text.h"
#include "metadata/picture_exif.h"
#include "picture/registry.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "processing/reduce.h"

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
constexpr int kMostLostRaces = 100;

// The row that an extension names in full; the looser rules for reading would make an AVI of "x.avif". Other spellings
// of a format's name are taken as well.
int32_t RowOfExtension(std::string_view extension) {
  constexpr std::pair<std::string_view, std::string_view> kSpellings[] = {
      {"tiff", "TIF"}, {"fits", "FIT"}, {"targa", "TGA"}, {"pict", "PCT"}};
  if (extension.starts_with('.')) extension.remove_prefix(1);
  for (const auto& [spelling, row] : kSpellings) {
    if (EqualIgnoringCase(extension, spelling)) extension = row;
  }
  for (int32_t i = 0; i < formatCount; ++i) {
    const FormatEntry& row = FormatRow(i);
    const bool named = (row.flags & (FMT_SPARE | FMT_CLIPBOARD)) == 0 && EqualIgnoringCase(row.extension, extension);
    if (named) return i;
  }
  if (extension.empty() || extension.find_first_of("./\\") != std::string_view::npos) return kNoFormat;
  return FindPluginFormat("x." + std::string(extension));
}

std::string UnknownFormat(const std::string& extension) {
  std::vector<std::string> known;
  for (int32_t i = 0; i < formatCount; ++i) {
    if (CanWrite(FormatRow(i))) known.push_back(LowerCase(FormatRow(i).extension));
  }
  for (const PluginFormatFacts& format : PluginFormats()) known.push_back(LowerCase(format.extension));
  const std::vector<std::string_view> names(known.begin(), known.end());
  return "There is no format \"" + extension + "\"." + NearestNameHint(extension, names);
}

// What a run converts to.
struct Target {
  int32_t row = kNoFormat;
  std::string extension;  // a plug-in format's has to be kept, as its row may serve another one meanwhile
};

// One run of the command over its selection.
class Conversion {
 public:
  Conversion(const ConvertOptions& options, const CommandContext& context, const Target& target,
             const std::vector<SelectedFile>& files)
      : options_(options),
        context_(context),
        rowIndex_(target.row),
        row_(FormatRow(target.row)),
        extension_(target.extension),
        files_(files),
        names_(files),
        output_(context, options.json) {
    const std::map<std::string, Overwrite> policies{{"ask", Overwrite::Ask},
                                                    {"replace", Overwrite::Replace},
                                                    {"keep-both", Overwrite::KeepBoth},
                                                    {"skip", Overwrite::Skip}};
    const auto chosen = policies.find(options.overwrite);
    policy_ = chosen != policies.end() ? chosen->second : context.MayAsk() ? Overwrite::Ask : Overwrite::KeepBoth;
  }

  int Run() {
    for (const SelectedFile& file : files_) {
      if (!output_.GoesOn()) break;
      Convert(file);
    }
    return output_.Finish();
  }

 private:
  struct Outcome {
    Status status = Status::Ok;
    std::string hint;
    std::string destination;
    bool skipped = false;
  };

  void Convert(const SelectedFile& file) {
    Outcome outcome{file.status, file.hint, {}, false};
    if (outcome.status == Status::Ok) outcome = ConvertFile(file);
    if (output_.IsJson()) {
      Json element;
      PutName(element, "file", file.name);
      PutName(element, "destination", outcome.status == Status::Ok ? outcome.destination : std::string());
      PutStatus(element, outcome.status);
      if (outcome.skipped) element["skipped"] = true;
      output_.Element(element);
    }
    if (outcome.status != Status::Ok) {
      output_.Failure(file.name, outcome.status, outcome.hint);
    } else if (outcome.skipped) {
      output_.Note(output_.ShownMessage(file.name) + ": skipped, " + output_.ShownMessage(outcome.destination) +
                   " exists.");
    } else {
      output_.CountFile();
      if (!options_.dryRun) used_.Add(file.name);
      if (!output_.IsJson()) {
        output_.Line(output_.Shown(file.name) + " -> " + output_.Shown(outcome.destination));
      }
    }
  }

  // The name of the output before anyone looks whether it is free.
  std::string PlannedName(const SelectedFile& file) const {
    if (!options_.out.empty()) return options_.out;
    const platform::PathParts parts = platform::SplitPath(file.name);
    const std::string name = options_.prefix + std::string(parts.base) + "." +
                             CasedExtension(extension_, platform::ExtensionOf(file.name), settings.ExtensionCaseStyle);
    if (options_.dest.empty()) return platform::JoinPath({parts.drive, parts.folder, name, {}});
    std::string folder = options_.dest;
    if (options_.keepTree && !file.below.empty()) folder = platform::JoinFolder(folder, file.below);
    return platform::JoinFolder(folder, name);
  }

  Outcome ConvertFile(const SelectedFile& file) {
    const std::string planned = PlannedName(file);
    if (planned.size() > PathText::Capacity()) {
      return {Status::InvalidDestination, "Its path would be longer than 260 characters.", {}, false};
    }
    // A file that is only going to be skipped need not be decoded.
    if (policy_ == Overwrite::Skip && Exists(planned)) return {Status::Ok, {}, planned, true};
    PicturePointer picture;
    if (const Status status = Load(file.name, picture); status != Status::Ok) {
      return {status, LoadHint(file.name, status, picture.get()), {}, false};
    }
    // The source may have bound its own plug-in format to the row that the destination's had.
    if (rowIndex_ == kSpareRow) (void)FindPluginFormat("x." + extension_);
    if (const Status status = FitColors(*picture); status != Status::Ok) {
      return {status, status == Status::TooManyColors ? kReduceHint : "", {}, false};
    }
    return WriteUnderFreeName(file, planned, *picture);
  }

  Status Load(const std::string& name, PicturePointer& picture) const {
    RETURN_IF_BAD(LoadPictureInfo(name.c_str(), picture));
    picture->page = options_.page - 1;
    if (options_.dryRun) return options_.page > picture->pageCount ? Status::NoImages : Status::Ok;
    RETURN_IF_BAD(ReadPicture(*picture));
    return options_.autoOrient ? TurnUpright(*picture) : Status::Ok;
  }

  std::string LoadHint(const std::string& name, Status status, const PictureRecord* picture) const {
    if (picture == nullptr || status != Status::NoImages || options_.page <= picture->pageCount) {
      return OpenHint(name, status);
    }
    return picture->pageCount == 1 ? "It has one page." : "It has " + std::to_string(picture->pageCount) + " pages.";
  }

  Status FitColors(PictureRecord& picture) const {
    if (picture.bitsPerPixel <= static_cast<int32_t>(row_.maxBits)) return Status::Ok;
    if (!options_.reduce) return Status::TooManyColors;
    return options_.dryRun ? Status::Ok : ReduceColors(picture, static_cast<int32_t>(row_.maxBits));
  }

  bool Exists(const std::string& path) const { return platform::FileExists(path) || names_.TakenByRun(path, path); }

  Outcome WriteUnderFreeName(const SelectedFile& file, const std::string& planned, PictureRecord& picture) {
    Overwrite policy = policy_;
    if (policy == Overwrite::Ask && platform::FileExists(planned) && !names_.TakenByRun(planned, file.name)) {
      const OverwriteAnswer answer = AskAboutOverwriting(context_, planned);
      policy = answer.choice;
      if (answer.forAll) policy_ = policy;
    }
    if (policy == Overwrite::Skip && Exists(planned)) return {Status::Ok, {}, planned, true};
    const bool replace = policy == Overwrite::Replace;
    for (int attempt = 0; attempt < kMostLostRaces; ++attempt) {
      const auto destination = names_.FreeName(planned, file.name, replace);
      if (!destination) return {Status::ErrorCreatingFile, kNoNumberHint, {}, false};
      if (destination->size() > PathText::Capacity()) {
        return {Status::InvalidDestination, "Its path would be longer than 260 characters.", {}, false};
      }
      const Status status = options_.dryRun ? Status::Ok : Write(picture, *destination, replace);
      const bool lostRace = status == Status::ErrorCreatingFile && !replace && platform::FileExists(*destination);
      if (lostRace) continue;  // someone else took the name since it was found free
      if (status != Status::Ok) return {status, WriteHint(*destination, status), {}, false};
      names_.Remember(*destination);
      NoteLostMetadata(file, picture);
      return AfterWriting(file, *destination);
    }
    return {Status::ErrorCreatingFile, kNoNumberHint, {}, false};
  }

  // Metadata that the format cannot hold are not lost in silence, for who wants to know.
  void NoteLostMetadata(const SelectedFile& file, const PictureRecord& picture) {
    if (!options_.verbose || options_.metadata != "keep" || picture.lostMetadata == 0) return;
    const PictureMetadata& metadata = picture.metadata;
    std::string lost;
    if (!metadata.exif.empty() && (picture.lostMetadata & kLostExif) != 0) lost += ", EXIF";
    if (!metadata.xmp.empty() && (picture.lostMetadata & kLostXmp) != 0) lost += ", XMP";
    if (!metadata.icc.empty() && (picture.lostMetadata & kLostIcc) != 0) lost += ", color profile";
    if (lost.empty()) return;
    output_.Note(output_.ShownMessage(file.name) + ": " + std::string(row_.extension.view()) + " cannot hold its " +
                 lost.substr(2) + ".");
  }

  Outcome AfterWriting(const SelectedFile& file, const std::string& destination) const {
    if (options_.keepTimes && !options_.dryRun && !platform::CopyTimes(file.name, destination)) {
      return {Status::ErrorWritingFile, destination + " was written, but its time could not be set.", {}, false};
    }
    return {Status::Ok, {}, destination, false};
  }

  // Codecs may take less than their row says; colours are then reduced further, step by step.
  Status Write(PictureRecord& picture, const std::string& destination, bool replace) const {
    if (!options_.dest.empty() && !platform::MakeFolders(FolderOf(destination))) return Status::ErrorCreatingFile;
    WriteOptions write;
    write.existing = replace ? platform::Existing::Replace : platform::Existing::Refuse;
    write.keepMetadata = options_.metadata == "keep";
    const PathText source = picture.fileName;
    RefreshExif(picture);
    Status status = WritePictureAs(picture, destination, rowIndex_, write);
    for (const int32_t bits : {8, 4, 1}) {
      if (status != Status::TooManyColors || !options_.reduce) break;
      if (picture.bitsPerPixel <= bits) continue;
      RETURN_IF_BAD(ReduceColors(picture, bits));
      status = WritePictureAs(picture, destination, rowIndex_, write);
    }
    picture.fileName = source;
    return status;
  }

  static std::string FolderOf(const std::string& path) {
    const platform::PathParts parts = platform::SplitPath(path);
    return std::string(parts.drive) + std::string(parts.folder);
  }

  std::string WriteHint(const std::string& destination, Status status) const {
    if (status == Status::TooManyColors) return options_.reduce ? "" : kReduceHint;
    if (status != Status::ErrorCreatingFile) return {};
    const std::string folder = FolderOf(destination);
    if (platform::IsFolder(destination)) return "\"" + destination + "\" is a folder.";
    if (!folder.empty() && !platform::IsFolder(folder)) return "There is no folder \"" + folder + "\".";
    return "\"" + destination + "\" cannot be made.";
  }

  static constexpr const char* kReduceHint = "Use --reduce to have them reduced.";
  static constexpr const char* kNoNumberHint = "Unable to create a new file - write aborted.";

  const ConvertOptions& options_;
  const CommandContext& context_;
  const int32_t rowIndex_;
  const FormatEntry& row_;
  const std::string extension_;
  const std::vector<SelectedFile>& files_;
  OutputNames names_;
  ResultOutput output_;
  Overwrite policy_;
  UsedFiles used_{FileFunction::Convert};
};

// What is wrong with the options, as a sentence; empty when nothing is. Fills `target`.
std::string CheckOptions(const ConvertOptions& options, const CommandContext& context, Target& target) {
  if (options.to.empty() && options.out.empty()) return "Say with --to which format to convert to.";
  const int32_t row = RowOfExtension(options.to.empty() ? platform::ExtensionOf(options.out) : options.to);
  if (row == kNoFormat) {
    return options.to.empty() ? "\"" + options.out + "\" selects no format; name one with --to."
                              : UnknownFormat(options.to);
  }
  target = {row, std::string(FormatRow(row).extension)};
  if (!CanWrite(FormatRow(row))) {
    return std::string(FormatRow(row).extension) + " cannot be written. " + std::string(WhyNot(FormatRow(row)));
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
  Target target;
  if (const std::string wrong = CheckOptions(options, context, target); !wrong.empty())
    return UsageError(context, wrong);
  const auto files = SelectFiles(options.selection, context);
  if (!files) return kExitUsage;
  if (!options.out.empty() && files->size() != 1) return UsageError(context, "--out takes exactly one picture.");
  if (options.quality > 0) settings.JpegCompression = settings.WebPQualityFactor = options.quality;
  return Conversion(options, context, target, *files).Run();
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
  AddChoice(app, "--metadata", options->metadata, "HOW", {"keep", "strip"},
            "Keep or strip EXIF, XMP and colour profiles");
  AddFlag(app, "--auto-orient", options->autoOrient, "Turn pictures upright as their EXIF says");
  AddFlag(app, "--reduce", options->reduce, "Reduce the colours of pictures that are too deep for the format");
  AddNumber(app, "--quality", options->quality, "N", 1, 100, "Of JPEG and WebP, 1 to 100");
  AddNumber(app, "--page", options->page, "N", 1, INT32_MAX, "Page to take of files with several, from 1");
  AddNumber(app, "-j,--jobs", options->jobs, "N", 0, INT32_MAX,
            "Pictures at work at a time; 0, the default, is one a core");
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only print what would be done");
  AddFlag(app, "-v,--verbose", options->verbose, "Say when a format cannot hold a picture's metadata");
  AddFlag(app, "--json", options->json, "One JSON array of {file, destination, status, message}");
  SetFooter(app, "Example: fotomill convert holiday -r --to png --dest out --keep-tree");
  context.run = [options, &context] { return RunConvert(*options, context); };
}

}  // namespace fotomill::cli
