#include "picture/registry.h"
#include "processing/flatten.h"

namespace fotomill {

Status LoadPictureInfo(const char* fileName, PicturePointer& picture, uint32_t flags) {
  picture.reset();
  const int32_t index = FindFormatByName(fileName);
  if (index == kNoFormat) return Status::UnsupportedFormat;
  PicturePointer made = NewPictureRecord();
  if (made == nullptr) return Status::MemoryAllocationError;
  if (!made->fileName.Assign(fileName)) return Status::FileOpenError;
  made->formatIndex = index;
  const FormatEntry& row = FormatRow(index);
  if (row.info != nullptr) RETURN_IF_BAD(row.info(*made, fileName, flags));
  picture = std::move(made);
  return Status::Ok;
}

Status LoadPicture(const char* fileName, PicturePointer& picture, void* window) {
  PicturePointer made;
  picture.reset();
  RETURN_IF_BAD(LoadPictureInfo(fileName, made));
  made->window = window;
  const FormatEntry& row = FormatRow(made->formatIndex);
  if (row.read != nullptr && (row.flags & FMT_RENDERED) == 0) RETURN_IF_BAD(row.read(*made, fileName));
  picture = std::move(made);
  return Status::Ok;
}

Status WritePicture(PictureRecord& picture, std::string_view destination, const WriteOptions& options) {
  return WritePictureAs(picture, destination, FindFormatByName(destination), options);
}

Status WritePictureAs(PictureRecord& picture, std::string_view destination, int32_t formatIndex,
                      const WriteOptions& options) {
  if (formatIndex == kNoFormat) return Status::UnsupportedFormat;
  const FormatEntry& row = FormatRow(formatIndex);
  if (picture.bitsPerPixel > static_cast<int32_t>(row.maxBits)) return Status::TooManyColors;
  if (row.write == nullptr) return Status::UnsupportedFunction;
  if ((row.flags & FMT_ALPHA) == 0) RETURN_IF_BAD(FlattenAlpha(picture));
  const PathText source = picture.fileName;
  if (!picture.fileName.Assign(destination)) return Status::InvalidDestination;
  picture.workName = source;
  return row.write(picture, options);
}

}  // namespace fotomill
