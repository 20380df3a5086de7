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
#include "cli/frame/file_selection.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/frame/used_files.h"
#include "core/workers/folder_scope.h"
#include "core/workers/guarded.h"
#include "core/workers/ordered_run.h"
#include "metadata/exif/picture_exif.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/process.h"
#include "platform/volumes.h"
#include "processing/geometry/scale.h"
#include "registry/registry.h"
#include "settings/job_options.h"
#include "settings/settings.h"

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

// What a picture's thumbnail file is worth.
enum class ThumbnailState { Current, Stale, Missing, Broken };

ThumbnailState StateOf(const std::string& picture) {
  const std::string path = ThumbnailPathFor(picture);
  const platform::FileFacts facts = platform::FactsOf(path);
  if (facts.kind == platform::FileKind::Missing) return ThumbnailState::Missing;
  ThumbnailRecord record;
  if (!ReadThumbnailFile(record, path)) return ThumbnailState::Broken;
  return facts.modified < platform::FactsOf(picture).modified ? ThumbnailState::Stale : ThumbnailState::Current;
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

Status MakeThumbnail(const std::string& name, const ThumbnailOptions& options) {
  ThumbnailRecord record;
  RETURN_IF_BAD(MakeThumbnailOfFile(name, options, record));
  return WriteThumbnailFile(record, ThumbnailPathFor(name), options.hidden) ? Status::Ok : Status::ErrorCreatingFile;
}

// A file of the selection, and what became of it.
struct Making {
  Status status = Status::Ok;
  bool wanted = false;           // it lacks a current thumbnail
  std::vector<size_t> together;  // of the first of those that share a thumbnail file: all of them that are wanted, in order
};

std::vector<Making> PlanMaking(const std::vector<SelectedFile>& files, bool force) {
  std::vector<Making> makings(files.size());
  std::map<std::string, size_t> firsts;
  for (size_t i = 0; i < files.size(); ++i) {
    makings[i].status = files[i].status;
    makings[i].wanted = files[i].status == Status::Ok && (force || StateOf(files[i].name) != ThumbnailState::Current);
    if (makings[i].wanted) makings[firsts.try_emplace(ThumbnailPathFor(files[i].name), i).first->second].together.push_back(i);
  }
  return makings;
}

void ReportMaking(const SelectedFile& file, const Making& making, ResultOutput& output, UsedFiles& used) {
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
    output.Failure(file.name, making.status, file.hint.empty() ? OpenHint(file.name, making.status) : file.hint);
  } else if (!made) {
    output.Note(output.ShownMessage(file.name) + ": has a thumbnail.");
  } else {
    output.CountFile();
    used.Add(file.name);
    if (!output.IsJson()) output.Line(output.Shown(file.name) + " -> " + output.Shown(thumbnail));
  }
}

// On several threads; what is printed, and which of the pictures that share a thumbnail file has it in the end, is as if they
// were made one after the other.
int RunMake(const ThumbsOptions& options, const CommandContext& context) {
  const auto files = SelectFiles(options.selection, context);
  if (!files) return kExitUsage;
  std::vector<Making> makings = PlanMaking(*files, options.force);
  const ThumbnailOptions thumbnails = ThumbnailOptionsFromSettings();
  ResultOutput output(context, options.json);
  UsedFiles used(options.dryRun ? std::nullopt : std::optional(FileFunction::Catalog));
  std::atomic<bool> goesOn = true;
  OrderedRun run({
      .work =
          [&](size_t item) {
            if (options.dryRun) return Status::Ok;
            const FolderScope folder((*files)[item].name);
            for (const size_t i : makings[item].together) {
              makings[i].status = Guarded([&] { return MakeThumbnail((*files)[i].name, thumbnails); });
            }
            return Status::Ok;
          },
      .deliver =
          [&](size_t item, Status) {
            ReportMaking((*files)[item], makings[item], output, used);
            output.ShowProgress(item + 1, files->size());
            goesOn = output.GoesOn();
          },
      .goesOn = [&] { return goesOn && platform::PendingExit() == 0; },
      .tick = [&] { output.Tick(); },
  });
  run.Run(files->size(), options.jobs == 0 ? platform::CoreCount() : static_cast<uint32_t>(options.jobs));
  return output.Finish();
}

// Writes what a command drew; a file of that name stays unless it may be replaced.
int WriteDrawing(PictureRecord& picture, const std::string& name, const ThumbsOptions& options, ResultOutput& output) {
  WriteOptions write{.encode = EncodeOptionsFromSettings()};
  write.existing = options.overwrite == "replace" ? platform::Existing::Replace : platform::Existing::Refuse;
  const Status status = WritePicture(picture, options.out, write);
  if (status != Status::Ok) {
    const bool taken = write.existing == platform::Existing::Refuse && platform::FileExists(options.out);
    output.Failure(options.out, status, taken ? "The file is there; --overwrite replace replaces it." : "");
    return output.Finish();
  }
  output.CountFile();
  output.Line(output.Shown(name) + " -> " + output.Shown(options.out));
  return output.Finish();
}

int RunShow(const ThumbsOptions& options, const CommandContext& context) {
  const std::string& name = context.names.values[0];
  ResultOutput output(context, false);
  const auto fail = [&](const std::string& file, Status status, std::string_view hint) {
    output.Failure(file, status, hint);
    return output.Finish();
  };
  if (!platform::IsRegularFile(name)) return fail(name, Status::FileOpenError, {});
  ThumbnailRecord record;
  if (!ReadThumbnailFile(record, name)) return fail(name, Status::DamagedFile, "It is no thumbnail file.");
  const PicturePointer picture = NewPictureRecord(ReadOptionsFromSettings().alphaBackground);
  if (picture == nullptr) return fail(name, Status::MemoryAllocationError, {});
  if (const Status status = ThumbnailRecordToBitmap(record, picture->image); status != Status::Ok) return fail(name, status, {});
  picture->width = picture->image.Width();
  picture->height = picture->image.Height();
  picture->bitsPerPixel = picture->image.Bits();
  return WriteDrawing(*picture, name, options, output);
}

// A picture upright and in a square; smaller ones keep their size.
Status DrawPicture(const std::string& name, int32_t side, PicturePointer& picture) {
  RETURN_IF_BAD(LoadPicture({.fileName = name, .thumbnailSide = side, .options = ReadOptionsFromSettings()}, picture));
  RETURN_IF_BAD(TurnUpright(*picture));
  picture->metadata = {};
  const int32_t width = picture->image.Width(), height = picture->image.Height();
  if (width <= side && height <= side) return Status::Ok;
  return ScalePicture(*picture, FitSize(width, height, side), ScaleFilter::Bicubic);
}

int RunDraw(const ThumbsOptions& options, const CommandContext& context) {
  const std::string& name = context.names.values[0];
  ResultOutput output(context, false);
  PicturePointer picture;
  if (const Status status = DrawPicture(name, options.side, picture); status != Status::Ok) {
    output.Failure(name, status, OpenHint(name, status));
    return output.Finish();
  }
  return WriteDrawing(*picture, name, options, output);
}

// The pictures of a folder, or a failure of the whole command.
std::optional<std::vector<std::string>> PicturesIn(const std::string& folder) {
  const auto entries = platform::ListFolder(folder);
  if (!entries) return std::nullopt;
  std::vector<std::string> pictures;
  for (const platform::FolderEntry& entry : *entries) {
    const bool picture = entry.kind == platform::FileKind::Regular && FindFormatByName(entry.name) != kNoFormat;
    if (picture) pictures.push_back(platform::JoinFolder(folder, entry.name));
  }
  return pictures;
}

int FailFolder(ResultOutput& output, const std::string& folder) {
  output.Failure(folder, Status::FileOpenError, platform::FileExists(folder) ? "It is no folder that can be read." : "");
  return output.Finish();
}

int RunList(const ThumbsOptions& options, const CommandContext& context) {
  const std::string& folder = context.names.values[0];
  ResultOutput output(context, options.json);
  const auto pictures = PicturesIn(folder);
  const auto orphans = pictures ? OrphanThumbnails(folder, *pictures) : std::nullopt;
  if (!orphans) return FailFolder(output, folder);
  const auto print = [&](const std::string& file, const std::string& thumbnail, const char* state) {
    if (!output.IsJson()) return output.Line(std::string(state) + "\t" + output.Shown(file.empty() ? thumbnail : file));
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
  ResultOutput output(context, false);
  const auto pictures = PicturesIn(folder);
  const auto orphans = pictures ? OrphanThumbnails(folder, *pictures) : std::nullopt;
  if (!orphans) return FailFolder(output, folder);
  const bool optical = platform::VolumeOf(folder).kind == platform::DriveKind::Optical;
  for (const std::string& orphan : *orphans) {
    if (!output.GoesOn()) break;
    if (!options.dryRun && (optical || !platform::DeleteFile(orphan))) {
      output.Failure(orphan, Status::ErrorWritingFile, "It could not be deleted.");
      continue;
    }
    output.CountFile();
    output.Line(output.Shown(orphan));
  }
  return output.Finish();
}

using Run = int (*)(const ThumbsOptions& options, const CommandContext& context);

std::shared_ptr<ThumbsOptions> SetUp(CLI::App& app, CommandContext& context, Run run, const char* text) {
  auto options = std::make_shared<ThumbsOptions>();
  SetFooter(app, text);
  context.run = [options, &context, run] { return run(*options, context); };
  return options;
}

}  // namespace

void SetUpThumbsMake(CLI::App& app, CommandContext& context) {
  const auto options = SetUp(app, context, RunMake,
                             "A picture whose thumbnail file is as new as itself is left out. Pictures that differ in their "
                             "extension only share a thumbnail file; the last one has it.\n\n"
                             "Example: fotomill thumbs make holiday --recursive");
  AddSelection(app, options->selection, context);
  AddFlag(app, "--force", options->force, "Make thumbnails that are there and current again");
  AddNumber(app, "-j,--jobs", options->jobs, "N", 0, 256, "Pictures in work at once; 0, the default, is one a core");
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only print what would be made");
  AddFlag(app, "--json", options->json, "One JSON array of {file, thumbnail, made, status, message}");
}

void SetUpThumbsShow(CLI::App& app, CommandContext& context) {
  const auto options = SetUp(app, context, RunShow, "Example: fotomill thumbs show holiday/beach.THN --out beach.bmp");
  context.names.Declare("FILE.THN", "The thumbnail file", 1, 1);
  Require(AddName(app, "-o,--out", options->out, "FILE", "The picture to write, in the format of its extension"));
  AddChoice(app, "--overwrite", options->overwrite, "HOW", {"refuse", "replace"},
            "When FILE is there: refuse (the default) or replace");
}

void SetUpThumbsDraw(CLI::App& app, CommandContext& context) {
  const auto options = SetUp(app, context, RunDraw,
                             "The picture is turned upright by its EXIF. Programs that show folders call this for thumbnails "
                             "of their own.\n\nExample: fotomill thumbs draw scan.pcx --side 128 --out scan.png");
  context.names.Declare("FILE", "The picture", 1, 1);
  Require(AddName(app, "-o,--out", options->out, "FILE", "The picture to write, in the format of its extension"));
  AddNumber(app, "--side", options->side, "N", 1, 4096, "Pixels of the longer side at most; 256 is the default");
  AddChoice(app, "--overwrite", options->overwrite, "HOW", {"refuse", "replace"},
            "When the file to write is there: refuse (the default) or replace");
}

void SetUpThumbsList(CLI::App& app, CommandContext& context) {
  const auto options = SetUp(app, context, RunList,
                             "A thumbnail is current, stale (older than its picture), missing, broken, or an orphan (there is "
                             "no picture of its name).\n\nExample: fotomill thumbs list holiday --json");
  context.names.Declare("DIR", "A folder of pictures", 1, 1);
  AddFlag(app, "--json", options->json, "One JSON array of {file, thumbnail, status}");
}

void SetUpThumbsClean(CLI::App& app, CommandContext& context) {
  const auto options = SetUp(app, context, RunClean, "Example: fotomill thumbs clean holiday --dry-run");
  context.names.Declare("DIR", "A folder of pictures", 1, 1);
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only print what would be deleted");
}

}  // namespace fotomill::cli
