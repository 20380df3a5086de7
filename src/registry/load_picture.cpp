#include <algorithm>
#include <string>

#include "core/text.h"
#include "platform/paths.h"
#include "processing/flatten.h"
#include "registry/registry.h"
#include "registry/signature.h"

namespace fotomill {

namespace {

// The row with exactly this extension, not a prefix match; else the plug-in's row, which
// is then bound.
int32_t RowOf(std::string_view extension) {
  for (int32_t i = 0; i < kSpareRow; ++i) {
    if (FormatRow(i).extension.view() == extension) return i;
  }
  return FindPluginFormat(std::string("x.").append(extension));
}

bool IsExcepted(std::string_view fileName, std::string_view exceptions) {
  const std::string_view extension = platform::ExtensionOf(fileName);
  while (!exceptions.empty()) {
    const std::string_view item = exceptions.substr(0, exceptions.find(';'));
    if (!item.empty() && EqualIgnoringCase(item, extension)) return true;
    exceptions.remove_prefix(std::min(item.size() + 1, exceptions.size()));
  }
  return false;
}

// Whether a status may mean that the file is in another format.
bool IsRefusal(Status status) {
  return status != Status::Ok && status != Status::FileOpenError &&
         status != Status::MemoryAllocationError && status != Status::FunctionCancelled;
}

// Opens a file with the row of its name or, if that fails, with one that matches its contents.
// `open` receives a row's index and succeeds by returning Ok.
template <class Open>
Status OpenByNameOrContents(const ReadRequest& request, const Open& open) {
  const int32_t named = FindReaderByName(request.fileName);
  const Status status = named == kNoFormat ? Status::UnsupportedFormat : open(named);
  const IdentifyOptions& identify = request.options.identify;
  if (!IsRefusal(status) || !identify.on || IsExcepted(request.fileName, identify.exceptions))
    return status;
  for (const std::string_view extension : KindBehindName(request.fileName, named).extensions) {
    const int32_t index = RowOf(extension);
    if (index == kNoFormat || FormatRow(index).enabled == 0 || !CanRead(FormatRow(index))) continue;
    if (open(index) == Status::Ok) return Status::Ok;
  }
  return status;
}

Status DescribeAs(int32_t index, const ReadRequest& request, PicturePointer& picture) {
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

}  // namespace

Status LoadPictureInfo(const ReadRequest& request, PicturePointer& picture) {
  picture.reset();
  return OpenByNameOrContents(request, [&](int32_t index) {
    PicturePointer made;
    RETURN_IF_BAD(DescribeAs(index, request, made));
    const bool tooLarge = std::max(made->width, made->height) > request.options.identify.mostSide;
    if (tooLarge && OpenedByContents(*made)) return Status::UnsuitableImage;
    picture = std::move(made);
    return Status::Ok;
  });
}

bool OpenedByContents(const PictureRecord& picture) {
  if (picture.formatIndex != kSpareRow)
    return picture.formatIndex != FindFormatByName(picture.fileName);
  // A lookup by name could bind the spare row to another plug-in.
  return !EqualIgnoringCase(FormatRow(kSpareRow).extension,
                            platform::ExtensionOf(picture.fileName));
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
  picture.shortfall = Status::Ok;
  return row.read(picture, request);
}

Status OpenAnimation(const ReadRequest& request, AnimationPointer& animation) {
  animation.reset();
  return OpenByNameOrContents(request, [&](int32_t index) {
    const AnimateOperation animate = FormatRow(index).animate;
    return animate == nullptr ? Status::UnsupportedFunction : animate(request, animation);
  });
}

Status WritePicture(PictureRecord& picture, std::string_view destination,
                    const WriteOptions& options) {
  return WritePictureAs(picture, destination, FindWriterByName(destination), options);
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
  if (!row.limits.Allow(picture.image.Width(), picture.image.Height()))
    return Status::UnsuitableImage;
  picture.workName = picture.fileName;
  picture.fileName.AssignCut(destination);
  picture.lostMetadata = static_cast<uint8_t>(kAllMetadata & ~row.keepsMetadata);
  return row.write(picture, options);
}

}  // namespace fotomill
