#include "batch/rewrite/rewrite_file.h"

#include <utility>

#include "batch/picture_failure.h"
#include "core/byte_writer.h"
#include "platform/output_file.h"
#include "registry/registry.h"
#include "texts/system_reason.h"

namespace fotomill {

std::string ObstacleToRewriting(const PictureRecord& picture) {
  if (!CanWrite(FormatRow(picture.formatIndex)))
    return Tr("Files of this format cannot be written.");
  if (picture.pageCount > 1) return Tr("The file has several pictures; all but one would be lost.");
  if (picture.simplified) return Tr("The file has data that would be lost.");
  if (!picture.warning.empty()) return Tr("The file is damaged, although it can be shown.");
  return {};
}

Status FileRewrite::Fail(Status status, std::string hint) {
  result.hint = std::move(hint);
  return status;
}

Status FileRewrite::Begin() {
  if (source_ == destination_ && !request_.dryRun && !held_.Hold(source_))
    return Fail(Status::ErrorCreatingFile, ReasonSentence());
  stamp_ = source_ == destination_ && !request_.dryRun ? held_.Stamp() : platform::StampOf(source_);
  if (request_.keepTime) time_ = platform::ModificationTime(source_);
  return Status::Ok;
}

Status FileRewrite::Make(const FileMaker& maker, FilePieces& made, platform::FileView& file) {
  if (!file.Open(source_)) return Fail(Status::FileOpenError, ReasonSentence());
  bool changed = false;
  std::string reason;
  if (const Status status = maker(file.Bytes(), made, changed, reason); status != Status::Ok)
    return Fail(status, reason.empty() ? OpenHint(source_, status) : std::move(reason));
  if (!file.Intact()) return Status::FileReadError;
  const auto whole = file.Bytes();
  return changed ? Write(made.Parts(), false) : Write({&whole, 1}, true);
}

Status FileRewrite::Write(std::span<const std::span<const uint8_t>> parts, bool same) {
  if (same && source_ == destination_) return Status::Ok;
  if (request_.dryRun) {
    result.changed = platform::MayCreate(destination_);
    return result.changed ? Status::Ok : Fail(Status::ErrorCreatingFile, CannotCreate());
  }
  ByteWriter out;
  const bool replaces = source_ != destination_ && options_.existing == platform::Existing::Replace;
  if (replaces && !held_.Hold(destination_))
    return Fail(Status::ErrorCreatingFile, ReasonSentence());
  if (!out.Create(destination_)) return Fail(Status::ErrorCreatingFile, CannotCreate());
  for (const auto& part : parts) {
    if (request_.stop.Asked()) return Status::FunctionCancelled;
    out.Bytes(part);
  }
  WriteOptions options = options_;
  bool unchanged = true;  // do not replace a file modified by another program
  options.makeWay = [&] {
    return (!options_.makeWay || options_.makeWay()) &&
           (unchanged = platform::StampOf(source_) == stamp_);
  };
  const Status status = CommitOutput(out, options);
  if (!unchanged || held_.Changed())
    return Fail(Status::FileReadError, Tr("The file was changed by another program."));
  if (status != Status::Ok) return Fail(status, ReasonSentence());
  result.changed = true;
  return KeepTime();
}

Status FileRewrite::KeepTime() {
  if (!time_ || platform::SetModificationTime(destination_, *time_)) return Status::Ok;
  return Fail(Status::ErrorWritingFile, Tr("The file was written, but its time could not be set."));
}

std::string FileRewrite::CannotCreate() const {
  return WithReason(Tr("\"%1\" cannot be created.", destination_));
}

}  // namespace fotomill
