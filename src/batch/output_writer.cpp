#include "batch/output_writer.h"

#include <algorithm>
#include <span>
#include <utility>

#include "batch/bare_output.h"
#include "batch/fit_picture.h"
#include "batch/left_out.h"
#include "batch/page_source.h"
#include "batch/picture_failure.h"
#include "core/byte_writer.h"
#include "metadata/exif/picture_exif.h"
#include "platform/files.h"
#include "platform/output_file.h"
#include "platform/paths.h"
#include "platform/reason.h"
#include "platform/temporary_file.h"
#include "platform/volumes.h"
#include "processing/color/color_profile.h"
#include "processing/flatten.h"
#include "processing/palette/reduce.h"
#include "registry/registry.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// Passes on the status of operations, setting the reason if known.
Status Worked(Status status, std::string& hint) {
  if (status != Status::Ok) hint = WorkHint(status);
  return status;
}

// Finds the best quality that is small enough by writing temporary files.
Status ChooseQuality(PictureRecord& picture, const OutputTarget& target, WriteOptions& write,
                     std::string& hint) {
  const PathText source = picture.fileName;
  uint64_t smallest = 0;
  const auto trial = [&](int32_t quality, uint64_t& bytes) {
    platform::TemporaryFile file;
    if (!file.Create("." + target.extension)) return Status::ErrorCreatingFile;
    WriteOptions attempt = write;
    attempt.existing = platform::Existing::Replace;
    attempt.makeWay = {};
    attempt.encode.SetQuality(quality);
    const Status status = WritePictureAs(picture, file.Path(), target.formatIndex, attempt);
    bytes = platform::FactsOf(file.Path()).size;
    return status;
  };
  int32_t best = 0;
  const Status status = FindQuality(target.output->mostBytes, trial, best, smallest);
  if (status == Status::Ok) write.encode.SetQuality(best);
  picture.fileName = source;
  if (status == Status::UnsuitableImage)
    hint = Tr("Even at the lowest quality it has %1 bytes.", ThousandsText(smallest));
  return status;
}

// The number of readable pictures in a truncated file.
size_t CountReadable(const ReadRequest& request) {
  PageSource source;
  if (source.Open(request) != Status::Ok) return 0;
  PicturePointer page;
  int32_t delayMs = 0;
  size_t count = 0;
  while (source.Next(page, delayMs) == Status::Ok) ++count;
  return count;
}

Status WriteWhole(std::span<const uint8_t> bytes, const std::string& path,
                  const WriteOptions& options) {
  ByteWriter out;
  if (!out.Create(path)) return Status::ErrorCreatingFile;
  out.Bytes(bytes);
  return CommitOutput(out, options);
}

}  // namespace

Status OutputWriter::Prepare(PreparedOutput& output, std::string& hint) const {
  PictureRecord& picture = output.picture;
  const OutputTarget& target = output.target;
  if (OnlyDropsMetadata(picture, target)) {
    BareOutput bare = MakeBareOutput(picture, TurnsUpright());
    output.file = std::move(bare.file);
    output.asSource = bare.asSource;
    output.note = std::move(bare.note);
    output.allPages = !output.file.empty();
    if (!output.file.empty()) {
      output.detail = TrRecorded("Copied without encoding.");
      return Status::Ok;
    }
  }
  if (target.output->transform) RETURN_IF_BAD(Worked(target.output->transform(picture), hint));
  const FormatEntry& row = FormatRow(target.formatIndex);
  const FitRequest fit{.keepsMetadata = KeepsMetadata(),
                       .turnsUpright = TurnsUpright(),
                       .profile = function_.profile};
  const bool upright = OrientationOf(picture) == Orientation::Upright;
  const bool profile = !picture.metadata.icc.empty();
  const ProfileColors colors = ColorsOfProfile(picture.metadata.icc);
  RETURN_IF_BAD(FitPicture(picture, row, fit, hint));
  if (!upright && OrientationOf(picture) == Orientation::Upright)
    output.detail.Append(TrRecorded("Rotated upright."));
  if (profile && picture.metadata.icc.empty()) {
    if (colors == ProfileColors::Rgb || colors == ProfileColors::Gray) {
      output.detail.Append(TrRecorded("Colors converted to sRGB."));
    } else {  // the wrong kind of profile, or not a profile
      output.note.Append(
          TrRecorded("Its color profile does not match the picture and was left out."));
    }
  }
  // frames keep transparency that is flattened in a single picture
  const uint32_t keeps = target.sequence ? FMT_ALPHA | FMT_TRANSPARENT : FMT_ALPHA;
  output.transparency =
      (row.flags & keeps) == 0 && !picture.alpha.Empty() && !IsOpaque(picture.alpha);
  output.allPages = target.sequence;
  if (target.sequence) return Status::Ok;  // pages are prepared when written
  RETURN_IF_BAD(Plan(picture, target, hint));
  const auto deepest = static_cast<int32_t>(row.maxBits);
  return picture.bitsPerPixel <= deepest ? Status::Ok
                                         : ReduceColors(picture, deepest, job_.reduction);
}

bool OutputWriter::TurnsItself() const {
  return !function_.keepMetadata && !function_.transform &&
         std::ranges::none_of(function_.outputs, [](const BatchOutput& output) {
           return static_cast<bool>(output.transform);
         });
}

// Whether the only change is to remove metadata, keeping the format.
bool OutputWriter::OnlyDropsMetadata(const PictureRecord& picture,
                                     const OutputTarget& target) const {
  if (function_.keepMetadata || function_.transform || target.output->transform) return false;
  if (function_.encodesAnew || target.output->quality > 0 || target.output->mostBytes > 0)
    return false;
  if (function_.page > 0 && picture.pageCount > 1) return false;
  if (picture.shortfall != Status::Ok || target.page > 0) return false;
  const bool converts =
      function_.profile.use == ProfileRequest::Use::Given ||
      (function_.profile.use == ProfileRequest::Use::Srgb && !picture.metadata.icc.empty());
  if (converts || picture.formatIndex == kNoFormat) return false;
  // formats of the same codec share its settings
  const FormatEntry &from = FormatRow(picture.formatIndex), &to = FormatRow(target.formatIndex);
  return from.bare != nullptr && from.settings == to.settings;
}

Status OutputWriter::Plan(const PictureRecord& picture, const OutputTarget& target,
                          std::string& hint) const {
  const auto deepest = static_cast<int32_t>(FormatRow(target.formatIndex).maxBits);
  if (picture.bitsPerPixel <= deepest || Reduces(target) || target.sequence) return Status::Ok;
  hint = function_.reduceHint;
  return Status::TooManyColors;
}

Status OutputWriter::Write(const PreparedOutput& output, const Destination& destination,
                           std::string& hint) const {
  const Status status = WriteFile(output, destination, hint);
  if (status != Status::Ok && hint.empty())
    hint = Hint(destination, status, output.picture, output.target);
  return status;
}

bool OutputWriter::MakesFolder(const Destination& destination, const OutputTarget& target) const {
  const bool beside =
      (job_.naming.beside || job_.destinationFolder.empty()) && target.output->folder.empty();
  return !beside && function_.out.empty() && !destination.elsewhere;
}

Status OutputWriter::PlanFile(const PreparedOutput& output, const Destination& destination,
                              std::string& hint) const {
  const std::string folder = platform::FolderOf(destination.path);
  const bool there =
      MakesFolder(destination, output.target) || folder.empty() || platform::IsFolder(folder);
  if (there && platform::MayCreate(destination.path)) return Status::Ok;
  hint = Hint(destination, Status::ErrorCreatingFile, output.picture, output.target);
  return Status::ErrorCreatingFile;
}

WriteOptions OutputWriter::OptionsFor(const PreparedOutput& output,
                                      const Destination& destination) const {
  WriteOptions write{.encode = job_.encode};
  write.existing = destination.replace ? platform::Existing::Replace : platform::Existing::Refuse;
  write.keepMetadata = function_.keepMetadata;
  write.comment = job_.writeComments;
  write.password = destination.password;
  if (output.asSource) write.encode.jpegAsSource = true;
  const int32_t quality = output.target.output->quality;
  if (quality > 0) write.encode.SetQuality(quality);
  if (destination.recycle) {
    const std::string path = destination.path;
    write.makeWay = [path] { return !platform::FileExists(path) || platform::MoveToTrash(path); };
  }
  return write;
}

Status OutputWriter::WriteFile(const PreparedOutput& output, const Destination& destination,
                               std::string& hint) const {
  PictureRecord& picture = output.picture;
  const OutputTarget& target = output.target;
  if (MakesFolder(destination, target) &&
      !platform::MakeFolders(platform::FolderOf(destination.path)))
    return Status::ErrorCreatingFile;
  WriteOptions write = OptionsFor(output, destination);
  if (!output.file.empty()) return WriteWhole(output.file, destination.path, write);
  if (target.sequence) return WriteSequence(output, destination, write, hint);
  const PathText source = picture.fileName;
  RefreshExif(picture);
  if (target.output->mostBytes > 0) RETURN_IF_BAD(ChooseQuality(picture, target, write, hint));
  Status status = WritePictureAs(picture, destination.path, target.formatIndex, write);
  for (const int32_t bits : {8, 4, 1}) {
    if (status != Status::TooManyColors || !Reduces(target)) break;
    if (picture.bitsPerPixel <= bits) continue;
    RETURN_IF_BAD(ReduceColors(picture, bits, job_.reduction));
    status = WritePictureAs(picture, destination.path, target.formatIndex, write);
  }
  picture.fileName = source;
  return status;
}

// Prepares a single picture.
Status OutputWriter::FitPage(PictureRecord& picture, const OutputTarget& target,
                             std::string& hint) const {
  if (function_.autoOrient) RETURN_IF_BAD(TurnUpright(picture));
  if (function_.transform) RETURN_IF_BAD(Worked(function_.transform(picture), hint));
  if (target.output->transform) RETURN_IF_BAD(Worked(target.output->transform(picture), hint));
  const FormatEntry& row = FormatRow(target.formatIndex);
  const FitRequest fit{.keepsMetadata = KeepsMetadata(),
                       .turnsUpright = TurnsUpright(),
                       .profile = function_.profile};
  RETURN_IF_BAD(FitPicture(picture, row, fit, hint));
  if ((row.flags & (FMT_ALPHA | FMT_TRANSPARENT)) == 0) RETURN_IF_BAD(FlattenAlpha(picture));
  RefreshExif(picture);
  const bool allowed = row.limits.Allow(picture.image.Width(), picture.image.Height());
  if (!allowed) hint = SizeHint(picture, row);
  return allowed ? Status::Ok : Status::UnsuitableImage;
}

Status OutputWriter::AddPage(SequenceWriter& sequence, PictureRecord& picture, int32_t delayMs,
                             const OutputTarget& target, std::string& hint) const {
  Status status = sequence.Add(picture, delayMs);
  if (status == Status::TooManyColors && Reduces(target)) {
    // reserve one entry for transparency
    const PaletteChoice choice{.colors = 255};
    RETURN_IF_BAD(ReduceToPalette(picture, choice, job_.reduction, {}));
    status = sequence.Add(picture, delayMs);
  }
  if (status == Status::TooManyColors) hint = function_.reduceHint;
  if (status == Status::UnsuitableImage && hint.empty())
    hint = Tr("The frames have different sizes; choose one with --page.");
  return status;
}

Status OutputWriter::WriteSequence(const PreparedOutput& output, const Destination& destination,
                                   const WriteOptions& options, std::string& hint) const {
  const ReadRequest request{.fileName = std::string(output.picture.fileName.view()),
                            .partial = function_.salvage,
                            .stop = job_.stop.Token(),
                            .options = job_.read};
  PageSource source;
  RETURN_IF_BAD(source.Open(request));
  size_t count = source.Count();
  if (function_.salvage) {
    count = CountReadable(request);
    if (count < source.Count()) output.picture.shortfall = Status::FileReadError;
  }
  if (count == 0) return Status::FileReadError;
  SequencePointer sequence;
  const SequenceFacts facts{
      .count = count, .animated = source.Animated(), .rounds = source.Rounds()};
  BindPluginRow(output.target);  // opening the source may have bound it to another format
  const FormatEntry& row = FormatRow(output.target.formatIndex);
  const uint32_t kept = row.keepsMetadata;
  RETURN_IF_BAD(row.sequence(destination.path, facts, options, sequence));
  PicturePointer page;
  int32_t delayMs = 0;
  for (size_t i = 0; i < count; ++i) {
    const Status status = source.Next(page, delayMs);
    if (status == Status::FileReadError) hint = function_.salvageHint;
    RETURN_IF_BAD(status);
    if (page->shortfall != Status::Ok) output.picture.shortfall = page->shortfall;
    BindPluginRow(output.target);
    RETURN_IF_BAD(FitPage(*page, output.target, hint));
    RETURN_IF_BAD(AddPage(*sequence, *page, delayMs, output.target, hint));
    if (job_.stop.Token().Asked()) return Status::FunctionCancelled;
  }
  output.picture.lostMetadata = static_cast<uint8_t>(kAllMetadata & ~kept);
  return sequence->Finish();
}

RecordedText OutputWriter::Note(const PreparedOutput& output) const {
  const PictureRecord& picture = output.picture;
  RecordedText note = output.note;
  if (picture.shortfall != Status::Ok)
    note.Append(TrRecorded("The file is incomplete; what is missing is blank."));
  if (!output.file.empty()) return note;
  const bool frames =
      picture.formatIndex != kNoFormat && FormatRow(picture.formatIndex).animate != nullptr;
  const OutputTarget& target = output.target;
  // a dry run does not create the output
  const bool all = output.allPages || target.sequence || OnlyDropsMetadata(picture, target);
  const bool chosen = function_.page > 0 || target.page > 0 || all;
  note.Append(LeftOut(picture, {.metadataWanted = KeepsMetadata(),
                                .pages = chosen ? 0 : picture.pageCount - 1,
                                .frames = frames,
                                .transparency = output.transparency}));
  return note;
}

std::string OutputWriter::Hint(const Destination& destination, Status status,
                               const PictureRecord& picture, const OutputTarget& target) const {
  if (status == Status::TooManyColors)
    return Reduces(target) ? std::string() : function_.reduceHint;
  if (status == Status::UnsuitableImage) return SizeHint(picture, FormatRow(target.formatIndex));
  const std::string& path = destination.path;
  const std::string folder = platform::FolderOf(path);
  if (status == Status::ErrorWritingFile && !platform::SystemReason().empty())
    return ReasonSentence();
  const bool full = status == Status::ErrorWritingFile &&
                    platform::FreeSpace(folder) < picture.image.Bytes().size();
  if (full) return Tr("Not enough disk space at the destination.");
  if (status != Status::ErrorCreatingFile) return {};
  if (platform::IsFolder(path)) return Tr("\"%1\" is a folder.", path);
  if (!folder.empty() && !platform::IsFolder(folder))
    return WithReason(Tr("The folder \"%1\" does not exist.", folder));
  if (destination.recycle && !platform::HasTrash(path))
    return Tr("There is no recycle bin for \"%1\".", path);
  return WithReason(Tr("\"%1\" cannot be created.", path));
}

}  // namespace fotomill
