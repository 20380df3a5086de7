#pragma once

#include <cstdint>
#include <utility>

#include "core/status.h"
#include "picture/packed_image.h"
#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "platform/file_view.h"

namespace fotomill {

// A codec of files that hold one picture without alpha: a header, and rows behind it. What such
// codecs have in common is in PlainInfo and PlainRead; what differs is here. `Header` is the
// codec's own struct, which `describe` fills for `decode`.
template <typename Header>
struct PlainCodec {
  uint64_t headSize;  // bytes from the beginning of the file that are enough for `describe`

  // Parses the header and fills the facts of the picture, SetPlainFacts among them. `file` may show
  // no more than its head. Any status, which ends the operation.
  Status (*describe)(const platform::FileView& file, const ReadRequest& request, Header& header,
                     PictureRecord& picture);

  // Checks that the file, of which all is visible, can hold what the header claims, then makes
  // `image` and fills it, reporting each row. Any status; after a bad one `image` does not matter.
  Status (*decode)(platform::FileView& file, const Header& header, const PictureRecord& picture,
                   PackedImage& image);
};

// Fills width, height, depth in bits and the estimate of bytes, and says that there is no alpha.
void SetPlainFacts(PictureRecord& picture, int32_t width, int32_t height, int32_t bitsPerPixel);

// The operation `info` of a codec. FileOpenError (1), or the status of `describe`.
template <typename Header>
Status PlainInfo(const PlainCodec<Header>& codec, PictureRecord& picture,
                 const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView file;
  if (!file.OpenHead(request.fileName.c_str(), codec.headSize)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  Header header;
  return codec.describe(file, request, header, picture);
}

// The operation `read` of a codec. FileOpenError (1), the statuses of `describe` and `decode`, or
// FileReadError (3) when another program cut the file short meanwhile.
template <typename Header>
Status PlainRead(const PlainCodec<Header>& codec, PictureRecord& picture,
                 const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  Header header;
  RETURN_IF_BAD(codec.describe(file, request, header, picture));
  PackedImage image;
  RETURN_IF_BAD(codec.decode(file, header, picture, image));
  if (!file.Intact()) return Status::FileReadError;
  picture.image = std::move(image);
  return Status::Ok;
}

}  // namespace fotomill
