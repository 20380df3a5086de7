#include "batch/output_writer.h"

#include "batch/fit_picture.h"
#include "batch/picture_failure.h"
#include "core/text.h"
#include "metadata/exif/picture_exif.h"
#include "platform/files.h"
#include "platform/output_file.h"
#include "platform/paths.h"
#include "platform/reason.h"
#include "platform/temporary_file.h"
#include "platform/volumes.h"
#include "processing/palette/reduce.h"
#include "registry/registry.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// The best quality whose file is small enough, found by writing temporary files.
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
    hint = Tr("At the lowest quality it has %1 bytes.", ThousandsText(smallest));
  return status;
}

}  // namespace

Status OutputWriter::Prepare(PictureRecord& picture, const OutputTarget& target,
                             std::string& hint) const {
  if (target.output->transform) RETURN_IF_BAD(target.output->transform(picture));
  const FitRequest fit{.keepsMetadata = function_.keepMetadata && job_.encode.preserveMetadata,
                       .turnsUpright = job_.turnsUpright,
                       .profile = function_.profile};
  RETURN_IF_BAD(FitPicture(picture, FormatRow(target.formatIndex), fit, hint));
  RETURN_IF_BAD(Plan(picture, target, hint));
  const auto deepest = static_cast<int32_t>(FormatRow(target.formatIndex).maxBits);
  return picture.bitsPerPixel <= deepest ? Status::Ok
                                         : ReduceColors(picture, deepest, job_.reduction);
}

Status OutputWriter::Plan(const PictureRecord& picture, const OutputTarget& target,
                          std::string& hint) const {
  const auto deepest = static_cast<int32_t>(FormatRow(target.formatIndex).maxBits);
  if (picture.bitsPerPixel <= deepest || Reduces(target)) return Status::Ok;
  hint = function_.reduceHint;
  return Status::TooManyColors;
}

Status OutputWriter::Write(PictureRecord& picture, const Destination& destination,
                           const OutputTarget& target, std::string& hint) const {
  const Status status = WriteFile(picture, destination, target, hint);
  if (status != Status::Ok && hint.empty()) hint = Hint(destination, status, picture, target);
  return status;
}

bool OutputWriter::MakesFolder(const Destination& destination, const OutputTarget& target) const {
  const bool beside =
      (job_.naming.beside || job_.destinationFolder.empty()) && target.output->folder.empty();
  return !beside && function_.out.empty() && !destination.elsewhere;
}

Status OutputWriter::PlanFile(const PictureRecord& picture, const Destination& destination,
                              const OutputTarget& target, std::string& hint) const {
  const std::string folder = platform::FolderOf(destination.path);
  const bool there =
      MakesFolder(destination, target) || folder.empty() || platform::IsFolder(folder);
  if (there && platform::MayCreate(destination.path)) return Status::Ok;
  hint = Hint(destination, Status::ErrorCreatingFile, picture, target);
  return Status::ErrorCreatingFile;
}

Status OutputWriter::WriteFile(PictureRecord& picture, const Destination& destination,
                               const OutputTarget& target, std::string& hint) const {
  if (MakesFolder(destination, target) &&
      !platform::MakeFolders(platform::FolderOf(destination.path)))
    return Status::ErrorCreatingFile;
  WriteOptions write{.encode = job_.encode};
  write.existing = destination.replace ? platform::Existing::Replace : platform::Existing::Refuse;
  write.keepMetadata = function_.keepMetadata;
  write.comment = job_.writeComments;
  write.password = destination.password;
  if (target.output->quality > 0) write.encode.SetQuality(target.output->quality);
  if (destination.recycle) {
    write.makeWay = [&] {
      return !platform::FileExists(destination.path) || platform::MoveToTrash(destination.path);
    };
  }
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

RecordedText OutputWriter::Note(const PictureRecord& picture,
                                const Destination& destination) const {
  const PictureMetadata& metadata = picture.metadata;
  std::string lost;
  if (!metadata.exif.empty() && (picture.lostMetadata & kLostExif) != 0) lost += ", EXIF";
  if (!metadata.xmp.empty() && (picture.lostMetadata & kLostXmp) != 0) lost += ", XMP";
  if (!metadata.icc.empty() && (picture.lostMetadata & kLostIcc) != 0) lost += ", color profile";
  if (!function_.keepMetadata || lost.empty()) return {};
  return TrRecorded("%1 cannot store: %2.", UpperCase(destination.extension), lost.substr(2));
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
