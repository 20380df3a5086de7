#include "cli/commands/thumbs.h"

#include <algorithm>
#include <atomic>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "batch/picture_failure.h"
#include "catalog/thumbnails/thumbnail_file.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/frame/used_files.h"
#include "cli/selection/file_selection.h"
#include "core/workers/folder_scope.h"
#include "core/workers/guarded.h"
#include "core/workers/ordered_run.h"
#include "metadata/exif/picture_exif.h"
#include "platform/existence.h"
#include "platform/files.h"
#include "platform/output_file.h"
#include "platform/paths.h"
#include "platform/process.h"
#include "platform/volumes.h"
#include "processing/geometry/scale.h"
#include "registry/registry.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct ThumbsOptions {
  SelectionOptions selection;
  std::string out;
  std::string overwrite = "refuse";
  int32_t jobs = 0;
  int32_t side = 256;
  bool force = false;
  bool dryRun = false;
  bool json = false;
};

// State of a thumbnail file; the names are part of the output of "thumbs list".
enum class ThumbnailState { Current, Stale, Missing, Broken };

ThumbnailState StateOf(const std::string& picture) {
  const std::string path = ThumbnailPathFor(picture);
  const platform::FileFacts facts = platform::FactsOf(path);
  if (facts.kind == platform::FileKind::Missing) return ThumbnailState::Missing;
  ThumbnailRecord record;
  if (!ReadThumbnailFile(record, path)) return ThumbnailState::Broken;
  return facts.modified < platform::FactsOf(picture).modified ? ThumbnailState::Stale
                                                              : ThumbnailState::Current;
}

const char* NameOf(ThumbnailState state) {
  switch (state) {
    case ThumbnailState::Current: return "current";
    case ThumbnailState::Stale: return "stale";
    case ThumbnailState::Missing: return "missing";
    case ThumbnailState::Broken: break;
  }
  return "broken";
}

// A dry run does everything but write. Write-protected thumbnail files can be replaced.
Status MakeThumbnail(const std::string& name, const ThumbnailOptions& options, bool dryRun,
                     Status& shortfall) {
  ThumbnailRecord record;
  RETURN_IF_BAD(MakeThumbnailOfFile(name, options, record, &shortfall));
  const std::string path = ThumbnailPathFor(name);
  const bool made = dryRun ? platform::MayCreate(platform::IsRegularFile(path) ? path + "~" : path)
                           : WriteThumbnailFile(record, path, options.hidden);
  return made ? Status::Ok : Status::ErrorCreatingFile;
}

// A selected file with its result.
struct Making {
  Status status = Status::Ok;
  Status shortfall = Status::Ok;  // why the thumbnail is incomplete
  std::string hint = {};         // printed after the error message
  bool wanted = false;           // has no current thumbnail
  // for the first file using a thumbnail file: all wanted files using it, in order
  std::vector<size_t> together;
};

std::vector<Making> PlanMaking(const std::vector<SelectedFile>& files, bool force) {
  std::vector<Making> makings(files.size());
  std::map<std::string, size_t> firsts;
  for (size_t i = 0; i < files.size(); ++i) {
    makings[i].status = files[i].status;
    makings[i].hint = files[i].hint;
    makings[i].wanted = files[i].status == Status::Ok &&
                        (force || StateOf(files[i].name) != ThumbnailState::Current);
    if (makings[i].wanted)
      makings[firsts.try_emplace(ThumbnailPathFor(files[i].name), i).first->second]
          .together.push_back(i);
  }
  return makings;
}

// Prints that a picture is incomplete.
void NotePart(const std::string& name, Status shortfall, ResultOutput& output) {
  if (shortfall == Status::Ok) return;
  output.Note(output.ShownMessage(name) + ": " +
              Tr("The file is incomplete; only a part is shown."));
}

void ReportMaking(const SelectedFile& file, const Making& making, ResultOutput& output,
                  UsedFiles& used) {
  const std::string thumbnail = ThumbnailPathFor(file.name);
  const bool made = making.wanted && making.status == Status::Ok;
  if (output.IsJson()) {
    Json element;
    PutName(element, "file", file.name);
    PutName(element, "thumbnail", thumbnail);
    element["made"] = made;
    PutStatus(element, making.status);
    output.Element(element);
  }
  if (making.status != Status::Ok) {
    output.Failure(file.name, making.status, making.hint);
  } else if (!made) {
    output.Note(output.ShownMessage(file.name) + ": " + Tr("already has a current thumbnail."));
  } else {
    output.CountFile();
    used.Add(file.name);
    if (!output.IsJson()) output.Line(output.Shown(file.name) + " -> " + output.Shown(thumbnail));
    NotePart(file.name, making.shortfall, output);
  }
}

// Uses several threads; output and thumbnail files do not depend on their number.
int RunMake(const ThumbsOptions& options, const CommandContext& context) {
  const auto selection = SelectFiles(options.selection, context);
  if (!selection) return kExitUsage;
  const std::vector<SelectedFile>& files = selection->files;
  std::vector<Making> makings = PlanMaking(files, options.force);
  const ThumbnailOptions thumbnails = ThumbnailOptionsFromSettings();
  ResultOutput output(context, options.json);
  output.CloseWith(selection->leftOut);
  output.KeepGoing();
  UsedFiles used(FileFunction::Catalog, !options.dryRun && !context.global.noHistory);
  std::atomic<bool> goesOn = true;
  OrderedRun run({
      .work =
          [&](size_t item) {
            const FolderScope folder(files[item].name);
            for (const size_t i : makings[item].together) {
              Making& making = makings[i];
              const std::string& name = files[i].name;
              making.status = Guarded([&] {
                return MakeThumbnail(name, thumbnails, options.dryRun, making.shortfall);
              });
              if (making.status == Status::Ok) continue;
              making.hint = making.status == Status::ErrorCreatingFile
                                ? ReasonSentence()
                                : OpenHint(name, making.status);
            }
            return Status::Ok;
          },
      .deliver =
          [&](size_t item, Status) {
            ReportMaking(files[item], makings[item], output, used);
            output.ShowProgress(item + 1, files.size());
            goesOn = output.GoesOn();
          },
      .goesOn = [&] { return goesOn && platform::PendingExit() == 0; },
      .tick = [&] { output.Tick(); },
  });
  run.Run(files.size(),
          options.jobs == 0 ? platform::CoreCount() : static_cast<uint32_t>(options.jobs));
  return output.Finish();
}

// Writes a picture; replaces an existing file only with --overwrite replace.
int WriteDrawing(PictureRecord& picture, const std::string& name, const ThumbsOptions& options,
                 ResultOutput& output) {
  WriteOptions write{.encode = EncodeOptionsFromSettings()};
  write.existing =
      options.overwrite == "replace" ? platform::Existing::Replace : platform::Existing::Refuse;
  const Status status = WritePicture(picture, options.out, write);
  if (status != Status::Ok) {
    const bool taken =
        write.existing == platform::Existing::Refuse && platform::FileExists(options.out);
    output.FileFailed(
        options.out, status,
        taken ? Tr("The file exists; use --overwrite replace to replace it.") : ReasonSentence());
    return output.Finish();
  }
  output.FileDone(name, options.out);
  return output.Finish();
}

int RunShow(const ThumbsOptions& options, const CommandContext& context) {
  const std::string& name = context.names.values[0];
  ResultOutput output(context, options.json);
  const auto fail = [&](const std::string& file, Status status, std::string_view hint) {
    output.FileFailed(file, status, hint);
    return output.Finish();
  };
  if (!platform::IsRegularFile(name)) return fail(name, Status::FileOpenError, {});
  ThumbnailRecord record;
  if (!ReadThumbnailFile(record, name)) {
    const std::string reason = ReasonSentence();
    return reason.empty() ? fail(name, Status::DamagedFile, Tr("Not a thumbnail file."))
                          : fail(name, Status::FileOpenError, reason);
  }
  const PicturePointer picture = NewPictureRecord(ReadOptionsFromSettings().alphaBackground);
  if (picture == nullptr) return fail(name, Status::MemoryAllocationError, {});
  if (const Status status = ThumbnailRecordToBitmap(record, picture->image); status != Status::Ok)
    return fail(name, status, {});
  picture->width = picture->image.Width();
  picture->height = picture->image.Height();
  picture->bitsPerPixel = picture->image.Bits();
  return WriteDrawing(*picture, name, options, output);
}

// Scales a picture down to fit a square, upright; small ones are not enlarged.
Status DrawPicture(const std::string& name, int32_t side, PicturePointer& picture) {
  const ReadRequest request{.fileName = name,
                            .thumbnailSide = side,
                            .partial = true,
                            .options = ReadOptionsFromSettings()};
  RETURN_IF_BAD(LoadPicture(request, picture));
  RETURN_IF_BAD(TurnUpright(*picture));
  picture->metadata = {};
  const int32_t width = picture->image.Width(), height = picture->image.Height();
  if (width <= side && height <= side) return Status::Ok;
  return ScalePicture(*picture, FitSize(width, height, side), ScaleFilter::Bicubic);
}

int RunDraw(const ThumbsOptions& options, const CommandContext& context) {
  const std::string& name = context.names.values[0];
  ResultOutput output(context, options.json);
  PicturePointer picture;
  if (const Status status = DrawPicture(name, options.side, picture); status != Status::Ok) {
    output.FileFailed(name, status, OpenHint(name, status));
    return output.Finish();
  }
  NotePart(name, picture->shortfall, output);
  return WriteDrawing(*picture, name, options, output);
}

// Lists the pictures in a folder; nullopt if it cannot be read.
std::optional<std::vector<std::string>> PicturesIn(const std::string& folder) {
  const auto entries = platform::ListFolder(folder);
  if (!entries) return std::nullopt;
  std::vector<std::string> pictures;
  for (const platform::FolderEntry& entry : *entries) {
    const bool picture =
        entry.kind == platform::FileKind::Regular && FindFormatByName(entry.name) != kNoFormat;
    if (picture) pictures.push_back(platform::JoinFolder(folder, entry.name));
  }
  return pictures;
}

int FailFolder(ResultOutput& output, const std::string& folder) {
  output.FileFailed(folder, Status::FileOpenError,
                    platform::FileExists(folder) ? WithReason(Tr("Not a readable folder.")) : "");
  return output.Finish();
}

int RunList(const ThumbsOptions& options, const CommandContext& context) {
  const std::string& folder = context.names.values[0];
  ResultOutput output(context, options.json);
  const auto pictures = PicturesIn(folder);
  const auto orphans = pictures ? OrphanThumbnails(folder, *pictures) : std::nullopt;
  if (!orphans) return FailFolder(output, folder);
  const auto print = [&](const std::string& file, const std::string& thumbnail, const char* state) {
    if (!output.IsJson())
      return output.Line(std::string(state) + "\t" + output.Shown(file.empty() ? thumbnail : file));
    Json element;
    PutName(element, "file", file);
    PutName(element, "thumbnail", thumbnail);
    element["status"] = state;
    output.Element(element);
  };
  for (const std::string& picture : *pictures) {
    if (!output.GoesOn()) break;
    print(picture, ThumbnailPathFor(picture), NameOf(StateOf(picture)));
  }
  for (const std::string& orphan : *orphans) print({}, orphan, "orphan");
  return kExitOk;
}

int RunClean(const ThumbsOptions& options, const CommandContext& context) {
  const std::string& folder = context.names.values[0];
  ResultOutput output(context, options.json);
  const auto pictures = PicturesIn(folder);
  const auto orphans = pictures ? OrphanThumbnails(folder, *pictures) : std::nullopt;
  if (!orphans) return FailFolder(output, folder);
  const bool optical = platform::VolumeOf(folder).kind == platform::DriveKind::Optical;
  for (const std::string& orphan : *orphans) {
    if (!output.GoesOn()) break;
    if (!options.dryRun && (optical || !platform::DeleteFile(orphan))) {
      // deleted by another process meanwhile
      if (platform::ExistenceOf(orphan) == platform::Existence::No) continue;
      output.FileFailed(orphan, Status::ErrorWritingFile,
                        WithReason(Tr("It could not be deleted.")));
      continue;
    }
    output.FileDone(orphan);
  }
  return output.Finish();
}

using Run = int (*)(const ThumbsOptions& options, const CommandContext& context);

std::shared_ptr<ThumbsOptions> SetUp(CLI::App& app, CommandContext& context, Run run,
                                     const char* notes, const char* example) {
  auto options = std::make_shared<ThumbsOptions>();
  SetFooter(app, notes, example);
  context.run = [options, &context, run] { return run(*options, context); };
  return options;
}

}  // namespace

void SetUpThumbsMake(CLI::App& app, CommandContext& context) {
  const auto options =
      SetUp(app, context, RunMake,
            TrLater("Pictures with a current thumbnail file are skipped. Pictures whose names "
                    "differ only in the\n"
                    "extension share a thumbnail file; the last one written wins."),
            "fotomill thumbs make holiday --recursive");
  AddSelection(app, options->selection, context);
  AddFlag(app, "--force", options->force, "Also recreate thumbnails that are current");
  AddNumber(app, "-j,--jobs", options->jobs, "N", 0, 256,
            "Number of parallel jobs (default: 0, one per core)");
  AddDryRunAndJson(app, options->dryRun, options->json,
                   "Print a JSON array of {file, thumbnail, made, status, message}");
}

void SetUpThumbsShow(CLI::App& app, CommandContext& context) {
  const auto options = SetUp(app, context, RunShow, nullptr,
                             "fotomill thumbs show holiday/beach.THN --out beach.bmp");
  context.names.Declare("FILE.THN", "The thumbnail file", 1, 1);
  Require(AddName(app, "-o,--out", options->out, "FILE",
                  "Picture to write; its extension selects the format"));
  AddChoice(app, "--overwrite", options->overwrite, "HOW",
            "If the output exists: refuse (default) or replace", {"refuse", "replace"});
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {file, destination, status, message}");
}

void SetUpThumbsDraw(CLI::App& app, CommandContext& context) {
  const auto options = SetUp(app, context, RunDraw,
                             TrLater("The picture is rotated upright by EXIF orientation. File "
                                     "managers can use this command as a\n"
                                     "thumbnailer."),
                             "fotomill thumbs draw scan.pcx --side 128 --out scan.png");
  context.names.Declare("FILE", "The picture", 1, 1);
  Require(AddName(app, "-o,--out", options->out, "FILE",
                  "Picture to write; its extension selects the format"));
  AddNumber(app, "--side", options->side, "N", 1, 4096, "Longest side in pixels (default: 256)");
  AddChoice(app, "--overwrite", options->overwrite, "HOW",
            "If the output exists: refuse (default) or replace", {"refuse", "replace"});
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {file, destination, status, message}");
}

void SetUpThumbsList(CLI::App& app, CommandContext& context) {
  const auto options = SetUp(
      app, context, RunList,
      TrLater(
          "A thumbnail is current, stale (older than its picture), missing, broken, or an orphan\n"
          "(without a picture)."),
      "fotomill thumbs list holiday --json");
  context.names.Declare("DIR", "A folder of pictures", 1, 1);
  AddFlag(app, "--json", options->json, "Print a JSON array of {file, thumbnail, status}");
}

void SetUpThumbsClean(CLI::App& app, CommandContext& context) {
  const auto options =
      SetUp(app, context, RunClean, nullptr, "fotomill thumbs clean holiday --dry-run");
  context.names.Declare("DIR", "A folder of pictures", 1, 1);
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only show what would be deleted");
  AddFlag(app, "--json", options->json, "Print a JSON array of {file, status, message}");
}

}  // namespace fotomill::cli
