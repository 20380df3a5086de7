#include "batch/rewrite/turn_file.h"

#include <algorithm>
#include <vector>

#include "batch/picture_failure.h"
#include "files/turned_jpeg.h"
#include "metadata/exif/picture_exif.h"
#include "platform/file_view.h"
#include "platform/paths.h"
#include "platform/temporary_file.h"
#include "registry/registry.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// Whether both have the same pixels, regardless of depth.
bool LookTheSame(const PictureRecord& a, const PictureRecord& b) {
  if (a.image.Width() != b.image.Width() || a.image.Height() != b.image.Height()) return false;
  if (a.alpha.Empty() != b.alpha.Empty()) return false;
  const auto color = [](const PictureRecord& picture, int32_t x, int32_t y) {
    const int32_t pixel = picture.image.PixelAt(x, y);
    if (picture.image.Bits() == 24) return pixel;
    const uint8_t* entry = &picture.palette[3 * static_cast<size_t>(pixel)];
    return entry[0] << 16 | entry[1] << 8 | entry[2];
  };
  for (int32_t y = 0; y < a.image.Height(); ++y) {
    if (!a.alpha.Empty() &&
        !std::ranges::equal(a.alpha.Row(y).first(static_cast<size_t>(a.alpha.Width())),
                            b.alpha.Row(y).first(static_cast<size_t>(b.alpha.Width())))) {
      return false;
    }
    if (a.image.Bits() == 24 && b.image.Bits() == 24) {
      const size_t bytes = 3 * static_cast<size_t>(a.image.Width());
      if (!std::ranges::equal(a.image.Row(y).first(bytes), b.image.Row(y).first(bytes)))
        return false;
      continue;
    }
    for (int32_t x = 0; x < a.image.Width(); ++x) {
      if (color(a, x, y) != color(b, x, y)) return false;
    }
  }
  return true;
}

// Turns one file.
class Turning {
 public:
  Turning(const std::string& source, const std::string& destination, const TurnRequest& request,
          const ReadOptions& read, const WriteOptions& options)
      : source_(source),
        request_(request),
        read_(read),
        options_(options),
        rewriting_{request.keepTime, request.dryRun, request.stop},
        rewrite_(source, destination, rewriting_, options) {}

  RewrittenFile Run() {
    rewrite_.result.status = Turn();
    return std::move(rewrite_.result);
  }

 private:
  Status Fail(Status status, std::string hint) { return rewrite_.Fail(status, std::move(hint)); }

  ReadRequest Reading(const std::string& file) const {
    return {.fileName = file, .stop = request_.stop, .options = read_};
  }

  Status Turn() {
    RETURN_IF_BAD(rewrite_.Begin());
    PicturePointer picture;
    if (const Status status = LoadPictureInfo(Reading(source_), picture);
        status != Status::Ok) {
      return Fail(status, OpenHint(source_, status));
    }
    return FormatRow(picture->formatIndex).turnsWithoutLoss ? TurnAsJpeg()
                                                            : TurnDecoded(std::move(picture));
  }

  Status TurnAsJpeg() {
    platform::FileView file;
    if (!file.Open(source_)) return Fail(Status::FileOpenError, ReasonSentence());
    std::vector<uint8_t> made;
    JpegTurnResult turned;
    const JpegTurnRequest request{.turn = request_.turn,
                                  .seenByExif = request_.seenByExif,
                                  .trim = request_.trim,
                                  .stop = request_.stop,
                                  .encode = options_.encode};
    if (const Status status = MakeTurnedJpeg(file.Bytes(), request, made, turned);
        status != Status::Ok) {
      return Fail(status, turned.obstacle.shown);
    }
    if (!file.Intact()) return Status::FileReadError;
    if (turned.method == JpegTurnMethod::Trimmed)
      rewrite_.result.note = TrRecorded("An edge was cropped.");
    if (!turned.obstacle.empty()) {
      const bool tag = turned.method == JpegTurnMethod::Tag;
      rewrite_.result.note = tag ? TrRecorded("Only the EXIF orientation was changed.")
                         : TrRecorded("Left unchanged.");
      rewrite_.result.note.Append(turned.obstacle);
    }
    return WriteUnlessThere(turned.method == JpegTurnMethod::Nothing ? file.Bytes() : made,
                            turned.method == JpegTurnMethod::Nothing);
  }

  // Two pictures are in memory at a time: the old and the turned one, then the turned one and the
  // one read back.
  static Status CheckMemory(const PictureRecord& picture) {
    const uint64_t rows = PackedRowBytes(picture.width, picture.height, picture.bitsPerPixel);
    const bool alpha = (picture.alphaFlags & kHasAlpha) != 0;
    return CheckFileMemory(2 * (alpha ? rows + rows / 3 : rows));
  }

  Status TurnDecoded(PicturePointer picture) {
    if (std::string obstacle = ObstacleToRewriting(*picture); !obstacle.empty())
      return Fail(Status::UnsuitableImage, std::move(obstacle));
    RETURN_IF_BAD(CheckMemory(*picture));
    RETURN_IF_BAD(ReadPicture(Reading(source_), *picture));
    if (std::string obstacle = ObstacleToRewriting(*picture); !obstacle.empty())
      return Fail(Status::UnsuitableImage, std::move(obstacle));
    const Orientation told = OrientationOf(*picture);
    const Orientation turn =
        Composed(request_.seenByExif ? told : Orientation::Upright, request_.turn);
    if (turn == Orientation::Upright && told == Orientation::Upright) {
      platform::FileView file;
      if (!file.Open(source_)) return Status::FileOpenError;
      return WriteUnlessThere(file.Bytes(), true);
    }
    RETURN_IF_BAD(TurnPicture(*picture, turn));
    if (request_.stop.Asked()) return Status::FunctionCancelled;
    return WriteDecoded(*picture);
  }

  // Writes a temporary file first; it replaces the old file only if it reads back identically.
  Status WriteDecoded(PictureRecord& picture) {
    platform::TemporaryFile working;
    if (!working.Create(std::string(".").append(platform::ExtensionOf(source_)))) {
      return Fail(Status::ErrorCreatingFile, ReasonSentence());
    }
    RefreshExif(picture);
    WriteOptions plain{.encode = options_.encode};
    plain.lossless = true;
    plain.comment = options_.comment;
    RETURN_IF_BAD(WritePictureAs(picture, working.Path(), picture.formatIndex, plain));
    PicturePointer back;
    RETURN_IF_BAD(LoadPicture(Reading(working.Path()), back));
    const PictureMetadata& metadata = picture.metadata;
    const bool kept = metadata.exif.empty() == back->metadata.exif.empty() &&
                      metadata.xmp == back->metadata.xmp && metadata.icc == back->metadata.icc;
    if (!LookTheSame(picture, *back))
      return Fail(Status::UnsuitableImage, Tr("The format would change the colors."));
    if (!kept)
      return Fail(Status::UnsuitableImage, Tr("EXIF, XMP or the color profile would be lost."));
    if (picture.comment != back->comment)
      return Fail(Status::UnsuitableImage, Tr("The comment would be lost."));
    platform::FileView file;
    if (!file.Open(working.Path())) return Status::FileOpenError;
    return WriteUnlessThere(file.Bytes(), false);
  }

  Status WriteUnlessThere(std::span<const uint8_t> bytes, bool same) {
    return rewrite_.Write({&bytes, 1}, same);
  }

  const std::string& source_;
  const TurnRequest& request_;
  const ReadOptions& read_;
  const WriteOptions& options_;
  const RewriteRequest rewriting_;
  FileRewrite rewrite_;
};

}  // namespace

RewrittenFile TurnPictureFile(const std::string& source, const std::string& destination,
                           const TurnRequest& request, const ReadOptions& read,
                           const WriteOptions& options) {
  return Turning(source, destination, request, read, options).Run();
}

}  // namespace fotomill
