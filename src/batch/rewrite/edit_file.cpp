#include "batch/rewrite/edit_file.h"

#include <string_view>
#include <utility>
#include <vector>

#include "batch/fit_picture.h"
#include "batch/left_out.h"
#include "batch/picture_failure.h"
#include "core/byte_writer.h"
#include "files/cropped_jpeg.h"
#include "metadata/exif/picture_exif.h"
#include "operations/area.h"
#include "operations/engine.h"
#include "platform/file_view.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/temporary_file.h"
#include "processing/flatten.h"
#include "processing/geometry/cut.h"
#include "processing/palette/reduce.h"
#include "registry/registry.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr int32_t kMostBackups = 1000;  // of one file

// Edits one file.
class Editing {
 public:
  Editing(const std::string& source, const std::string& destination, const EditRequest& edit,
          const RewriteRequest& request, const ReadOptions& read, const WriteOptions& options)
      : source_(source),
        edit_(edit),
        request_(request),
        read_(read),
        options_(options),
        rewrite_(source, destination, request_, options) {}

  RewrittenFile Run() {
    rewrite_.result.status = Edit();
    return std::move(rewrite_.result);
  }

 private:
  Status Fail(Status status, std::string hint) { return rewrite_.Fail(status, std::move(hint)); }

  Status Edit() {
    RETURN_IF_BAD(rewrite_.Begin());
    const ReadRequest reading{.fileName = source_, .stop = request_.stop, .options = read_};
    PicturePointer picture;
    if (const Status status = LoadPictureInfo(reading, picture); status != Status::Ok)
      return Fail(status, OpenHint(source_, status));
    if (std::string obstacle = ObstacleToRewriting(*picture); !obstacle.empty())
      return Fail(Status::UnsuitableImage, std::move(obstacle));
    Rectangle area;
    if (FormatRow(picture->formatIndex).turnsWithoutLoss && OnlyCrops(*picture, area)) {
      bool cropped = false;
      RETURN_IF_BAD(CropWithoutLoss(area, cropped));
      if (cropped) return Status::Ok;
    }
    RETURN_IF_BAD(ReadPicture(reading, *picture));
    if (std::string obstacle = ObstacleToRewriting(*picture); !obstacle.empty())
      return Fail(Status::UnsuitableImage, std::move(obstacle));
    RETURN_IF_BAD(TurnUpright(*picture));
    RETURN_IF_BAD(Apply(*picture));
    return Write(*picture);
  }

  // Whether the recipe only crops to an area in pixels.
  bool OnlyCrops(const PictureRecord& picture, Rectangle& area) const {
    if (edit_.recipe->common.size() != 1) return false;
    const Step& step = edit_.recipe->common.front();
    if (std::string_view(step.operation->name) != "crop") return false;
    const Value& wanted = step.arguments.Of("area");
    if (!wanted.hasPlace) return false;
    Size size{picture.width, picture.height};
    if (SwapsSides(OrientationOf(picture))) std::swap(size.width, size.height);
    area = Clipped(AreaOf(wanted, size, picture.metadata), size.width, size.height);
    return area.width > 0;
  }

  // Crops a JPEG file between its blocks, if the area allows.
  Status CropWithoutLoss(const Rectangle& area, bool& cropped) {
    platform::FileView file;
    if (!file.Open(source_)) return Fail(Status::FileOpenError, ReasonSentence());
    std::vector<uint8_t> made;
    RecordedText obstacle;
    RETURN_IF_BAD(MakeCroppedJpeg(file.Bytes(), area, request_.stop, made, obstacle));
    if (made.empty()) return Status::Ok;
    if (!file.Intact()) return Status::FileReadError;
    cropped = true;
    rewrite_.result.note = TrRecorded("Cropped losslessly.");
    const std::span<const uint8_t> bytes = made;
    return rewrite_.Write({&bytes, 1}, false);
  }

  Status Apply(PictureRecord& picture) {
    const EngineOptions engine{
        .work = {.threads = edit_.threads, .goesOn = [this] { return !request_.stop.Asked(); }},
        .facts = {.fileName = source_,
                  .copyrightHolder = edit_.copyrightHolder,
                  .modified = platform::FactsOf(source_).modified},
        .faces = edit_.faces};
    const Status status = ApplySteps(picture, edit_.recipe->common, engine);
    return status == Status::Ok ? status : Fail(status, WorkHint(status));
  }

  // Makes the picture fit its format, then writes it to a temporary file, whose bytes replace the
  // old ones.
  Status Write(PictureRecord& picture) {
    const FormatEntry& row = FormatRow(picture.formatIndex);
    std::string hint;
    const FitRequest fit{.keepsMetadata = options_.KeepsMetadata(),
                         .turnsUpright = edit_.turnsUpright};
    if (const Status status = FitPicture(picture, row, fit, hint); status != Status::Ok)
      return Fail(status, hint);
    const bool transparency =
        (row.flags & FMT_ALPHA) == 0 && !picture.alpha.Empty() && !IsOpaque(picture.alpha);
    const auto deepest = static_cast<int32_t>(row.maxBits);
    if (picture.bitsPerPixel > deepest)
      RETURN_IF_BAD(ReduceColors(picture, deepest, edit_.reduction));
    RefreshExif(picture);
    platform::TemporaryFile working;
    if (!working.Create(std::string(".").append(platform::ExtensionOf(source_))))
      return Fail(Status::ErrorCreatingFile, ReasonSentence());
    RETURN_IF_BAD(WriteWorking(picture, working.Path()));
    rewrite_.result.note.Append(LeftOut(
        picture, {.metadataWanted = options_.KeepsMetadata(), .transparency = transparency}));
    platform::FileView file;
    if (!file.Open(working.Path())) return Status::FileOpenError;
    const std::span<const uint8_t> bytes = file.Bytes();
    return rewrite_.Write({&bytes, 1}, false);
  }

  Status WriteWorking(PictureRecord& picture, const std::string& path) {
    WriteOptions plain{.encode = options_.encode};
    plain.encode.jpegAsSource = true;
    plain.comment = options_.comment;
    const FormatEntry& row = FormatRow(picture.formatIndex);
    Status status = WritePictureAs(picture, path, picture.formatIndex, plain);
    for (const int32_t bits : {8, 4, 1}) {
      if (status != Status::TooManyColors || picture.bitsPerPixel <= bits) continue;
      RETURN_IF_BAD(ReduceColors(picture, bits, edit_.reduction));
      status = WritePictureAs(picture, path, picture.formatIndex, plain);
    }
    return status == Status::UnsuitableImage ? Fail(status, SizeHint(picture, row)) : status;
  }

  const std::string& source_;
  const EditRequest& edit_;
  const RewriteRequest& request_;
  const ReadOptions& read_;
  const WriteOptions& options_;
  FileRewrite rewrite_;
};

}  // namespace

RewrittenFile EditPictureFile(const std::string& source, const std::string& destination,
                              const EditRequest& edit, const RewriteRequest& request,
                              const ReadOptions& read, const WriteOptions& options) {
  return Editing(source, destination, edit, request, read, options).Run();
}

bool KeepBackup(const std::string& path) {
  platform::FileView file;
  if (!file.Open(path)) return false;
  for (int32_t number = 1; number <= kMostBackups; ++number) {
    const std::string backup = path + ".bak" + (number > 1 ? std::to_string(number) : "");
    if (platform::FileExists(backup)) continue;
    ByteWriter out;
    if (!out.Create(backup)) return false;
    out.Bytes(file.Bytes());
    const platform::CommitResult result = out.Commit(platform::Existing::Refuse);
    if (result == platform::CommitResult::Taken) continue;
    return result == platform::CommitResult::Done && file.Intact() &&
           platform::CopyTimes(path, backup);
  }
  return false;
}

}  // namespace fotomill
