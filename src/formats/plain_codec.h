#pragma once

#include <cstdint>
#include <utility>

#include "core/status.h"
#include "picture/packed_image.h"
#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "platform/file_view.h"

namespace fotomill {

// A simple codec: files with one picture without alpha, stored as a header and rows. The common
// part is in PlainInfo and PlainRead; the differences are here. `Header` is the codec's own struct,
// set by `describe` and used by `decode`.
template <typename Header>
struct PlainCodec {
  uint64_t headSize;  // bytes from the start of the file that `describe` needs

  // Parses the header and fills in the picture, calling SetPlainFacts. Only the head of `file` may
  // be visible. Any status but Ok ends the operation.
  Status (*describe)(const platform::FileView& file, const ReadRequest& request, Header& header,
                     PictureRecord& picture);

  // Checks that the file, which is fully visible, is large enough for the header's claims, then
  // allocates and fills `image`, reporting each row. Any status; on failure `image` is discarded.
  Status (*decode)(platform::FileView& file, const Header& header, const PictureRecord& picture,
                   PackedImage& image);
};

// Sets width, height, depth in bits and the size estimate, with no alpha.
void SetPlainFacts(PictureRecord& picture, int32_t width, int32_t height, int32_t bitsPerPixel);

// A codec's `info` operation. FileOpenError (1), or the status of `describe`.
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

// A codec's `read` operation. FileOpenError (1), the statuses of `describe` and `decode`, or
// FileReadError (3) if another program truncated the file meanwhile.
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
