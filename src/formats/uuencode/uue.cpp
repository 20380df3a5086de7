// UUEncoded graphics (UUE); for the text format see uuencode.h. The embedded file is decoded to a
// temporary file, which is then read by its own row.
#include "formats/uuencode/uue.h"

#include <string>
#include <string_view>

#include "formats/gif/gif.h"
#include "formats/inner_file.h"
#include "formats/jpeg/jpeg.h"
#include "formats/uuencode/uuencode.h"
#include "platform/file_view.h"
#include "platform/paths.h"
#include "platform/temporary_file.h"

namespace fotomill {

namespace {

Status Unwrap(const ReadRequest& request, uint64_t& fileSize, InnerFile& inner) {
  platform::FileView text;
  if (!text.Open(request.fileName)) return Status::FileOpenError;
  fileSize = text.FileSize();
  UuencodedFile decoded;
  RETURN_IF_BAD(DecodeUuencoded(text.Bytes(), request.options.relaxedUuencode, decoded));
  if (!text.Intact()) return Status::FileReadError;
  inner.name = decoded.name;
  RETURN_IF_BAD(CreateInnerFile(request, inner));
  if (!inner.file.Write(decoded.bytes)) return Status::ErrorCreatingFile;
  return FindInnerRow(inner);
}

void NameType(const InnerFile& inner, PictureRecord& picture) {
  std::string type("UUEncoded ");
  picture.typeName.AssignCut(type.append(inner.name));
}

}  // namespace

Status UueInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  InnerFile inner;
  uint64_t fileSize = 0;
  RETURN_IF_BAD(Unwrap(request, fileSize, inner));
  RETURN_IF_BAD(inner.row->info(picture, inner.request));
  picture.fileSize = fileSize;
  NameType(inner, picture);
  return Status::Ok;
}

Status UueRead(PictureRecord& picture, const ReadRequest& request) {
  picture.image.Free();
  picture.alpha.Free();
  InnerFile inner;
  uint64_t fileSize = 0;
  if (const Status status = Unwrap(request, fileSize, inner); status != Status::Ok) {
    const ProgressScope progress(picture);  // otherwise the inner row has one
    return status;
  }
  RETURN_IF_BAD(inner.row->read(picture, inner.request));
  NameType(inner, picture);
  return Status::Ok;
}

Status UueWrite(PictureRecord& picture, const WriteOptions& options) {
  const bool colors = picture.image.Bits() > 8;
  const std::string_view extension = colors ? ".jpg" : ".gif";
  platform::TemporaryFile file;
  if (picture.image.Empty() || !file.Create(extension)) {
    const ProgressScope progress(picture);  // otherwise the inner row has one
    return picture.image.Empty() ? Status::MemoryAllocationError : Status::ErrorCreatingFile;
  }
  const PathText destination = picture.fileName;
  WriteOptions inner = options;
  inner.existing = platform::Existing::Replace;
  inner.makeWay = {};
  picture.fileName.AssignCut(file.Path());
  const Status written = colors ? JpegWrite(picture, inner) : GifWrite(picture, inner);
  picture.fileName = destination;
  RETURN_IF_BAD(written);
  if (!colors) picture.lostMetadata = kAllMetadata;
  platform::FileView wrapped;
  if (!wrapped.Open(file.Path())) return Status::ErrorWritingFile;
  ByteWriter out;
  if (!out.Create(destination.c_str())) return Status::ErrorCreatingFile;
  std::string name(platform::SplitPath(destination.view()).base);
  EncodeUuencoded(wrapped.Bytes(), name.append(extension), out);
  if (!wrapped.Intact()) return Status::ErrorWritingFile;
  return CommitOutput(out, options);
}

}  // namespace fotomill
