#include "files/turned_jpeg.h"

#include "catalog/thumbnails/exif_thumbnail.h"
#include "containers/jpeg_segments.h"
#include "formats/jpeg/jpeg_turn.h"
#include "metadata/exif/exif_edit.h"
#include "metadata/exif/exif_walk.h"
#include "metadata/xmp/xmp_edit.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// Re-encodes the thumbnail if its pixels cannot be turned losslessly.
Status TurnThumbnail(std::span<const uint8_t> bytes, Orientation orientation,
                     const EncodeOptions& encode, std::vector<uint8_t>& made) {
  TurnedJpeg turned;
  if (TurnJpeg(bytes, orientation, false, {}, turned) == Status::Ok && !turned.file.empty()) {
    JpegHead head;
    RETURN_IF_BAD(ParseJpegHead(bytes, head));
    return AssembleJpeg(bytes, head, {.pixels = turned.file, .swapSides = SwapsSides(orientation)},
                        made);
  }
  PicturePointer picture;
  RETURN_IF_BAD(DecodeExifThumbnail(bytes, picture));
  picture->metadata = {};  // its orientation must not apply as well
  RETURN_IF_BAD(OrientPicture(*picture, orientation));
  return EncodeExifThumbnail(*picture, encode, made);
}

// Updates EXIF size, orientation and thumbnail.
void TurnExif(std::vector<uint8_t>& exif, Orientation orientation, const TurnedJpeg& turned,
              const EncodeOptions& encode) {
  if (exif.empty()) return;
  ExifFindings findings;
  std::vector<uint8_t> thumbnail;
  WalkExif(exif, nullptr, &findings);
  const Status made = TurnThumbnail(ExifThumbnail(exif, findings), orientation, encode, thumbnail);
  if (made != Status::Ok || !ReplaceExifThumbnail(exif, thumbnail, kMostExif))
    DropExifThumbnail(exif);
  SetExifPictureFacts(exif, {.width = turned.width, .height = turned.height, .orientation = 1});
}

// Builds the turned file.
class TurnedFile {
 public:
  TurnedFile(std::span<const uint8_t> file, const JpegTurnRequest& request)
      : file_(file), request_(request) {}

  Status Make(std::vector<uint8_t>& made, JpegTurnResult& result) {
    RETURN_IF_BAD(ParseJpegHead(file_, head_));
    exif_.assign(head_.Exif().begin(), head_.Exif().end());
    xmp_.assign(head_.Xmp().begin(), head_.Xmp().end());
    const auto told = static_cast<Orientation>(ExifOrientation(exif_));
    const Orientation wanted =
        Composed(request_.seenByExif ? told : Orientation::Upright, request_.turn);
    TurnedJpeg turned;
    if (wanted != Orientation::Upright) RETURN_IF_BAD(TurnPixels(wanted, turned));
    result.obstacle = turned.obstacle;
    if (!turned.file.empty()) {
      result.method = turned.trimmed ? JpegTurnMethod::Trimmed : JpegTurnMethod::Pixels;
      return WithPixels(wanted, turned, made);
    }
    if (wanted == told) return Status::Ok;
    result.method = JpegTurnMethod::Tag;
    return WithOrientation(wanted, made);
  }

 private:
  Status TurnPixels(Orientation wanted, TurnedJpeg& turned) const {
    if (head_.HasMorePictures()) {
      turned.obstacle =
          TrRecorded("The file has embedded pictures that depend on its orientation.");
    } else if (head_.HasSplitExif()) {
      turned.obstacle = TrRecorded("The EXIF block is too large for one segment.");
    } else {
      return TurnJpeg(file_, wanted, request_.trim, request_.stop, turned);
    }
    return Status::Ok;
  }

  Status WithPixels(Orientation wanted, const TurnedJpeg& turned, std::vector<uint8_t>& made) {
    TurnExif(exif_, wanted, turned, request_.encode);
    SetXmpOrientation(xmp_, 1);
    return AssembleJpeg(
        file_, head_,
        {.exif = exif_, .xmp = xmp_, .pixels = turned.file, .rest = file_.subspan(turned.end), .swapSides = SwapsSides(wanted)},
        made);
  }

  Status WithOrientation(Orientation wanted, std::vector<uint8_t>& made) {
    if (!PutExifOrientation(exif_, static_cast<int32_t>(wanted))) return Status::UnsuitableImage;
    if (head_.HasSplitExif() && exif_.size() != head_.Exif().size()) return Status::UnsuitableImage;
    SetXmpOrientation(xmp_, static_cast<int32_t>(wanted));
    return AssembleJpeg(file_, head_, {.exif = exif_, .xmp = xmp_}, made);
  }

  const std::span<const uint8_t> file_;
  const JpegTurnRequest& request_;
  JpegHead head_;
  std::vector<uint8_t> exif_, xmp_;
};

}  // namespace

Status MakeTurnedJpeg(std::span<const uint8_t> file, const JpegTurnRequest& request,
                      std::vector<uint8_t>& made, JpegTurnResult& result) {
  made.clear();
  result = {};
  return TurnedFile(file, request).Make(made, result);
}

}  // namespace fotomill
