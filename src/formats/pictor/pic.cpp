#include "formats/pictor/pic.h"

#include <utility>

#include "formats/jpeg/jpeg.h"
#include "formats/pictor/pegasus.h"
#include "formats/pictor/pictor.h"
#include "platform/file_view.h"

namespace fotomill {

namespace {

void NamePegasus(const PegasusStream& stream, PictureRecord& picture) {
  if (!stream.bare || stream.hasTables) picture.typeName.AssignCut("Pegasus JPEG");
}

}  // namespace

Status PicInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  if (IsPictor(file.Bytes())) return PictorInfo(picture, file.Bytes());
  PegasusStream stream;
  RETURN_IF_BAD(FindPegasusStream(file.Bytes(), stream));
  RETURN_IF_BAD(JpegStreamInfo(picture, {stream.data, stream.Tables()}));
  NamePegasus(stream, picture);
  return Status::Ok;
}

Status PicRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  if (IsPictor(file.Bytes())) {
    PackedImage image;
    RETURN_IF_BAD(PictorRead(picture, file.Bytes(), image));
    if (!file.Intact()) return Status::FileReadError;
    picture.image = std::move(image);
    return Status::Ok;
  }
  PegasusStream stream;
  RETURN_IF_BAD(FindPegasusStream(file.Bytes(), stream));
  RETURN_IF_BAD(JpegStreamRead(picture, request, {stream.data, stream.Tables()}, file));
  NamePegasus(stream, picture);
  return Status::Ok;
}

Status PicDetails(PictureRecord& picture) {
  picture.detailLines.Clear();
  platform::FileView file;
  if (!file.Open(picture.fileName.c_str())) return Status::FileOpenError;
  if (IsPictor(file.Bytes())) return PictorDetails(picture.detailLines, file.Bytes());
  PegasusStream stream;
  RETURN_IF_BAD(FindPegasusStream(file.Bytes(), stream));
  if (stream.hasTables)
    picture.detailLines.AddFormat("    Quantizer: %u/32, %u/32", unsigned{stream.lumaCode},
                                  unsigned{stream.chromaCode});
  return JpegStreamDetails(picture, {stream.data, stream.Tables()});
}

}  // namespace fotomill
