#include "processing/flatten.h"
#include "registry/registry.h"

namespace fotomill {

Status LoadPictureInfo(const ReadRequest& request, PicturePointer& picture) {
  picture.reset();
  const int32_t index = FindFormatByName(request.fileName);
  if (index == kNoFormat) return Status::UnsupportedFormat;
  PicturePointer made = NewPictureRecord(request.options.alphaBackground);
  if (made == nullptr) return Status::MemoryAllocationError;
  if (!made->fileName.Assign(request.fileName)) return Status::FileOpenError;
  made->formatIndex = index;
  made->progress = request.progress;
  made->stop = request.stop;
  const FormatEntry& row = FormatRow(index);
  if (row.info != nullptr) RETURN_IF_BAD(row.info(*made, request));
  picture = std::move(made);
  return Status::Ok;
}

Status LoadPicture(const ReadRequest& request, PicturePointer& picture, void* window) {
  PicturePointer made;
  picture.reset();
  RETURN_IF_BAD(LoadPictureInfo(request, made));
  made->window = window;
  RETURN_IF_BAD(ReadPicture(request, *made));
  picture = std::move(made);
  return Status::Ok;
}

Status ReadPicture(const ReadRequest& request, PictureRecord& picture) {
  if (picture.formatIndex == kNoFormat) return Status::UnsupportedFormat;
  if (request.page < 0 || request.page >= picture.pageCount) return Status::NoImages;
  const FormatEntry& row = FormatRow(picture.formatIndex);
  if (row.read == nullptr || (row.flags & FMT_RENDERED) != 0) return Status::Ok;
  picture.page = request.page;
  picture.progress = request.progress;
  picture.stop = request.stop;
  return row.read(picture, request);
}

Status OpenAnimation(const ReadRequest& request, AnimationPointer& animation) {
  animation.reset();
  const int32_t index = FindFormatByName(request.fileName);
  if (index == kNoFormat) return Status::UnsupportedFormat;
  const AnimateOperation animate = FormatRow(index).animate;
  return animate == nullptr ? Status::UnsupportedFunction : animate(request, animation);
}

Status WritePicture(PictureRecord& picture, std::string_view destination,
                    const WriteOptions& options) {
  return WritePictureAs(picture, destination, FindFormatByName(destination), options);
}

Status WritePictureAs(PictureRecord& picture, std::string_view destination, int32_t formatIndex,
                      const WriteOptions& options) {
  if (formatIndex == kNoFormat) return Status::UnsupportedFormat;
  const FormatEntry& row = FormatRow(formatIndex);
  if (picture.bitsPerPixel > static_cast<int32_t>(row.maxBits)) return Status::TooManyColors;
  if (row.write == nullptr) return Status::UnsupportedFunction;
  if (picture.image.Empty() && picture.metafile.Empty()) return Status::EmptyImage;
  if (destination.size() > PathText::Capacity()) return Status::InvalidDestination;
  if ((row.flags & FMT_ALPHA) == 0) RETURN_IF_BAD(FlattenAlpha(picture));
  // flattened palette pictures
  if (picture.bitsPerPixel > static_cast<int32_t>(row.maxBits)) return Status::TooManyColors;
  picture.workName = picture.fileName;
  picture.fileName.AssignCut(destination);
  picture.lostMetadata = static_cast<uint8_t>(kAllMetadata & ~row.keepsMetadata);
  return row.write(picture, options);
}

}  // namespace fotomill
