#include "batch/rewrite/exif_file.h"

#include <utility>

#include "metadata/edit/strip.h"
#include "metadata/tags/sidecar.h"
#include "platform/file_view.h"
#include "platform/paths.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

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
  const FileMaker maker = [&](std::span<const uint8_t> bytes, FilePieces& pieces, bool& changed,
                          std::string& reason) {
    return EditPictureExif(bytes, changer, pieces, changed, reason);
  };
  Status status = rewrite.Begin();
  if (status == Status::Ok) status = rewrite.Make(maker, made, file);
  rewrite.result.status = status;
  return std::move(rewrite.result);
}

RewrittenFile StripFile(const std::string& source, const std::string& destination,
                        const StripRequest& strip, const RewriteRequest& request,
                        const WriteOptions& options) {
  FileRewrite rewrite(source, destination, request, options);
  FilePieces made;
  platform::FileView file;
  const FileMaker maker = [&](std::span<const uint8_t> bytes, FilePieces& pieces, bool& changed,
                          std::string& reason) {
    const Status status = strip.placesOnly ? StripPlaces(bytes, pieces, reason)
                                           : StripPicture(bytes, strip.kept, pieces, reason);
    changed = status == Status::Ok && !pieces.Are(bytes);
    return status;
  };
  Status status = rewrite.Begin();
  if (status == Status::Ok) status = rewrite.Make(maker, made, file);
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
  if (const std::string sidecar = FindSidecar(destination);
      status == Status::Ok && !sidecar.empty()) {
    rewrite.result.note.Append(
        TrRecorded("Its sidecar %1 still has metadata.", platform::FileNameOf(sidecar)));
  }
  rewrite.result.status = status;
  return std::move(rewrite.result);
}

}  // namespace fotomill
