#include "batch/rewrite/exif_file.h"

#include <functional>
#include <utility>

#include "batch/picture_failure.h"
#include "metadata/edit/strip.h"
#include "platform/file_view.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// Makes the new file from the old one; `changed` is false if they are identical.
using Maker = std::function<Status(std::span<const uint8_t> file, FilePieces& made, bool& changed,
                                   std::string& reason)>;

Status Make(FileRewrite& rewrite, const std::string& source, const Maker& maker, FilePieces& made,
            platform::FileView& file) {
  RETURN_IF_BAD(rewrite.Begin());
  if (!file.Open(source)) return rewrite.Fail(Status::FileOpenError, ReasonSentence());
  bool changed = false;
  std::string reason;
  if (const Status status = maker(file.Bytes(), made, changed, reason); status != Status::Ok)
    return rewrite.Fail(status, reason.empty() ? OpenHint(source, status) : std::move(reason));
  if (!file.Intact()) return Status::FileReadError;
  const auto whole = file.Bytes();
  return changed ? rewrite.Write(made.Parts(), false) : rewrite.Write({&whole, 1}, true);
}

RecordedText LeftIn(std::span<const uint8_t> file) {
  const std::vector<const char*> names = MetadataLeft(file);
  if (names.empty()) return TrRecorded("Nothing is left beside the picture.");
  RecordedText list;
  for (const char* name : names) {
    list.english.append(list.english.empty() ? "" : ", ").append(name);
    list.shown.append(list.shown.empty() ? "" : ", ").append(Tr(name));
  }
  RecordedText note = TrRecorded("Left in the file: %1.", list.shown);
  note.english = "Left in the file: " + list.english + ".";
  return note;
}

}  // namespace

RewrittenFile EditExifFile(const std::string& source, const std::string& destination,
                           const ExifChanger& changer, const RewriteRequest& request,
                           const WriteOptions& options) {
  FileRewrite rewrite(source, destination, request, options);
  FilePieces made;
  platform::FileView file;
  const Maker maker = [&](std::span<const uint8_t> bytes, FilePieces& pieces, bool& changed,
                          std::string& reason) {
    return EditPictureExif(bytes, changer, pieces, changed, reason);
  };
  const Status status = Make(rewrite, source, maker, made, file);
  rewrite.result.status = status;
  return std::move(rewrite.result);
}

RewrittenFile StripFile(const std::string& source, const std::string& destination,
                        const StripRequest& strip, const RewriteRequest& request,
                        const WriteOptions& options) {
  FileRewrite rewrite(source, destination, request, options);
  FilePieces made;
  platform::FileView file;
  const Maker maker = [&](std::span<const uint8_t> bytes, FilePieces& pieces, bool& changed,
                          std::string& reason) {
    const Status status = strip.placesOnly ? StripPlaces(bytes, pieces, reason)
                                           : StripPicture(bytes, strip.kept, pieces, reason);
    changed = status == Status::Ok && !pieces.Are(bytes);
    return status;
  };
  Status status = Make(rewrite, source, maker, made, file);
  if (status == Status::Ok && rewrite.result.changed) {
    platform::FileView written;
    if (request.dryRun) {
      rewrite.result.note = LeftIn(made.Joined());
    } else if (written.Open(destination)) {
      rewrite.result.note = LeftIn(written.Bytes());
    } else {
      status = rewrite.Fail(Status::FileOpenError, ReasonSentence());
    }
  }
  rewrite.result.status = status;
  return std::move(rewrite.result);
}

}  // namespace fotomill
