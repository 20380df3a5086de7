#include "cli/commands/exif/exif.h"

#include <memory>
#include <string>
#include <vector>

#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/frame/tag_json.h"
#include "cli/selection/file_selection.h"
#include "cli/selection/output_place.h"
#include "core/shown_text.h"
#include "metadata/exif/exif_source.h"
#include "metadata/exif/exif_text.h"
#include "metadata/gps.h"
#include "metadata/tags/tag_lines.h"
#include "platform/files.h"
#include "platform/held_file.h"
#include "platform/output_file.h"
#include "registry/registry.h"
#include "settings/job_options.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct ExifOptions {
  SelectionOptions selection;
  bool json = false;
  std::string thumbnail;              // output file for the thumbnail; empty: do not extract
  std::string overwrite = "refuse";   // or "replace", for the thumbnail file
  std::vector<std::string> distance;  // two places, or none
};

// Collects the walk as JSON directories.
class JsonLines : public ExifSink {
 public:
  void Directory(int32_t, std::string_view label) override {
    directories_.push_back({{"label", label}, {"entries", Json::array()}});
  }
  void Line(const ExifLine& line) override {
    directories_.back()["entries"].push_back({{"tag", line.value.tag},
                                              {"name", line.name},
                                              {"type", line.value.type},
                                              {"count", line.value.count},
                                              {"text", line.text}});
  }
  Json Take() { return std::move(directories_); }

 private:
  Json directories_ = Json::array();
};

// The result for one file.
struct Outcome {
  Status status = Status::Ok;
  std::string hint;  // printed after the message
  std::string name;  // the file the message is about; empty: the picture
  bool hasExif = false;
  bool cutShort = false;  // not all entries are shown
};

Outcome WriteThumbnail(std::span<const uint8_t> bytes, const ExifOptions& options,
                       std::FILE* stream) {
  const std::string& path = options.thumbnail;
  if (bytes.empty()) return {Status::NoImages, Tr("This file has no embedded thumbnail."), {}};
  if (path == kStream) {
    std::fwrite(bytes.data(), 1, bytes.size(), stream);  // write errors show in the stream
    return {};
  }
  const bool replace = options.overwrite == "replace";
  const std::string taken = Tr("The file exists; use --overwrite replace to replace it.");
  if (!replace && platform::FileExists(path)) return {Status::ErrorCreatingFile, taken, path};
  platform::OutputFile file;
  platform::HeldFile held;
  if (replace && !held.Hold(path)) return {Status::ErrorCreatingFile, ReasonSentence(), path};
  if (!file.Create(path)) return {Status::ErrorCreatingFile, ReasonSentence(), path};
  if (!file.Write(bytes)) return {Status::ErrorWritingFile, ReasonSentence(), path};
  switch (file.Commit(replace ? platform::Existing::Replace : platform::Existing::Refuse)) {
    case platform::CommitResult::Done: return {};
    case platform::CommitResult::Taken: return {Status::ErrorCreatingFile, taken, path};
    case platform::CommitResult::Failed: break;
  }
  return {Status::ErrorWritingFile, ReasonSentence(), path};
}

// The block of a file of a plug-in format, in `picture`; empty if it has none or has another
// format.
std::span<const uint8_t> BlockFromPlugin(const std::string& name, PicturePointer& picture) {
  if (FindReaderByName(name) != kSpareRow ||
      LoadPictureInfo({.fileName = name}, picture) != Status::Ok)
    return {};
  return picture->metadata.exif;
}

// Walks the EXIF of a file into `sink` and extracts its thumbnail if requested; `stream` is
// standard output.
Outcome WalkFile(const SelectedFile& file, const ExifOptions& options, ExifSink& sink,
                 std::FILE* stream) {
  if (file.status != Status::Ok) return {file.status, file.hint, {}};
  ExifSource source;
  if (const Status status = source.Open(file.name.c_str()); status != Status::Ok)
    return {status, ReasonSentence(), {}};
  PicturePointer picture;
  const auto block = source.Block().empty() ? BlockFromPlugin(file.name, picture) : source.Block();
  ExifFindings findings;
  if (!block.empty() && !WalkExif(block, &sink, &findings)) {
    return {Status::DamagedFile, Tr("The EXIF block has no valid header."), {}};
  }
  Outcome outcome;
  if (!options.thumbnail.empty())
    outcome = WriteThumbnail(ExifThumbnail(block, findings), options, stream);
  outcome.hasExif = !block.empty();
  outcome.cutShort = findings.cutShort;
  if (!source.Intact())
    return {Status::FileReadError, Tr("The file was truncated while it was read."), {}};
  return outcome;
}

class ExifRun {
 public:
  ExifRun(const ExifOptions& options, const CommandContext& context)
      : options_(options),
        stream_(context.io.out),
        context_(options.thumbnail == kStream ? WithResultsOnError(context) : context),
        output_(context_, options.json) {}

  void ReportFiles(const Selection& selection) {
    output_.CloseWith(selection.leftOut);
    if (selection.input) output_.ShowAsStream(selection.input->Path());
    const std::vector<SelectedFile>& files = selection.files;
    for (const SelectedFile& file : files) {
      if (!output_.GoesOn()) return;
      const Outcome outcome =
          options_.json ? ReportJson(file) : ReportLines(file, files.size() > 1);
      if (outcome.status != Status::Ok) {
        output_.Failure(outcome.name.empty() ? file.name : outcome.name, outcome.status,
                        outcome.hint);
        continue;
      }
      output_.CountFile();
      if (!outcome.hasExif && !options_.json) {
        output_.Note(output_.ShownMessage(file.name) + ": " + Tr("This file has no EXIF."));
      }
      if (outcome.cutShort)
        output_.Note(output_.ShownMessage(file.name) + ": " +
                     Tr("Not all EXIF entries are shown."));
    }
  }

  void ReportDistance(const double (&degrees)[4]) {
    const choice::DistanceUnit unit = DistanceUnitFromSettings();
    const double distance = GpsDistance(degrees[0], degrees[1], degrees[2], degrees[3], unit);
    if (options_.json) {
      output_.Element({{"distance", distance}, {"unit", DistanceUnitName(unit)}});
      return;
    }
    char text[64];
    std::snprintf(text, sizeof text, "%.3f ", distance);
    output_.Line(text + Tr(DistanceUnitName(unit)));
  }

  int Finish() { return output_.Finish(); }

 private:
  static PictureTags TagsOf(const SelectedFile& file) {
    PictureTags tags;
    TagSources sources = TagSourcesFromSettings();
    sources.exif = false;
    (void)ReadPictureTags(file.name, sources, tags);  // the file could be read
    return tags;
  }
  // Titles, keywords and the like of XMP and IPTC, below the EXIF.
  void AddTags(const SelectedFile& file) {
    const std::vector<TagLine> lines = TagLines(TagsOf(file));
    if (!lines.empty()) text_.append(Tr(kTagsHeading)).append("\n");
    for (const TagLine& line : lines)
      text_.append("    ")
          .append(Tr(line.label))
          .append("\t")
          .append(EscapeControls(line.text))
          .append("\n");
  }

  Outcome ReportJson(const SelectedFile& file) {
    JsonLines lines;
    Json element;
    const Outcome outcome = WalkFile(file, options_, lines, stream_);
    PutName(element, "file", output_.NameOf(file.name));
    PutStatus(element, outcome.status);
    element["directories"] = lines.Take();
    if (outcome.status == Status::Ok) {
      Json tags = TagsAsJson(TagsOf(file));
      if (!tags.empty()) element["tags"] = std::move(tags);
    }
    output_.Element(element);
    return outcome;
  }

  // Writes the lines of one file at once; with several files, preceded by the name.
  Outcome ReportLines(const SelectedFile& file, bool named) {
    lines_.Clear();
    Outcome outcome = WalkFile(file, options_, lines_, stream_);
    if (outcome.status == Status::Ok && !lines_.Complete())
      outcome.status = Status::MemoryAllocationError;
    text_ = lines_.Text();
    if (outcome.status == Status::Ok) AddTags(file);
    if (text_.empty()) return outcome;
    if (named) text_.insert(0, output_.Shown(file.name) + "\n");
    text_.pop_back();  // added by Line
    output_.Line(text_);
    return outcome;
  }

  const ExifOptions& options_;
  std::FILE* const stream_;
  const CommandContext context_;  // keeps results apart from a thumbnail
  ResultOutput output_;
  ExifText lines_{ExifTextOptionsFromSettings()};
  std::string text_;
};

bool IsSameFile(const std::string& one, const std::string& other) {
  const platform::FileFacts a = platform::FactsOf(one), b = platform::FactsOf(other);
  return a.kind == platform::FileKind::Regular && b.kind == a.kind && a.device == b.device &&
         a.identity == b.identity;
}

int RunExif(const ExifOptions& options, const CommandContext& context) {
  double degrees[4] = {};
  const bool measures = !options.distance.empty();
  for (size_t i = 0; i < options.distance.size(); ++i) {
    if (!ParseGpsDegrees(options.distance[i], degrees[2 * i], degrees[2 * i + 1])) {
      return UsageError(context,
                        Tr("\"%1\" is not LAT,LON in decimal degrees.", options.distance[i]));
    }
  }
  const bool alone =
      measures && context.names.values.empty() && options.selection.filesFrom.empty();
  const auto selection = alone ? Selection() : SelectFiles(options.selection, context);
  if (!selection) return kExitUsage;
  if (options.thumbnail == kStream && context.io.outTerminal)
    return UsageError(
        context,
        Tr("Standard output is a terminal; redirect it, or name a file with --thumbnail."));
  if (!options.thumbnail.empty()) {
    if (selection->files.size() != 1)
      return UsageError(context, Tr("--thumbnail takes exactly one picture."));
    if (IsSameFile(selection->files.front().name, options.thumbnail)) {
      return UsageError(context, Tr("--thumbnail names the picture itself."));
    }
  }
  ExifRun run(options, context);
  run.ReportFiles(*selection);
  if (measures) run.ReportDistance(degrees);
  return alone ? kExitOk : run.Finish();
}

}  // namespace

void SetUpExif(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<ExifOptions>();
  options->selection.takesInput = true;
  AddSelection(app, options->selection, context);
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {file, status, message, directories: [{label, entries: [{tag, "
          "name, type, count, text}]}], tags}");
  AddName(app, "--thumbnail", options->thumbnail, "OUT|-",
          "Extract the embedded thumbnail to this file, unchanged; - is standard output");
  AddChoice(app, "--overwrite", options->overwrite, "HOW",
            "If the output exists: refuse (default) or replace", {"refuse", "replace"});
  AddTexts(app, "--distance", options->distance, 2, "LAT,LON LAT,LON",
           "Print the distance between two places in decimal degrees; ExifDistinceUnits sets the unit");
  SetFooter(app, "Reads JPEG, TIFF, HD Photo, PNG and WebP files and bare EXIF blocks.",
            "fotomill exif photo.jpg --thumbnail small.jpg");
  context.run = [options, &context] { return RunExif(*options, context); };
}

}  // namespace fotomill::cli
