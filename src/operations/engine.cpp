#include "operations/engine.h"

#include <algorithm>
#include <vector>

#include "metadata/exif/exif_edit.h"
#include "metadata/exif/picture_exif.h"
#include "processing/geometry/cut.h"

namespace fotomill {

namespace {

OperationContext ContextOf(const EngineOptions& options) {
  return {.work = options.work,
          .expand = [&options](const std::string& text, const PictureRecord& picture) {
            return ExpandMacros(text, options.facts, picture);
          },
          .faces = options.faces};
}

// The number of leading point operations.
size_t PointsAhead(std::span<const Step> steps) {
  const auto end = std::ranges::find_if(
      steps, [](const Step& step) { return step.operation->works != Works::Point; });
  return static_cast<size_t>(end - steps.begin());
}

Status ApplyPoints(PictureRecord& picture, std::span<const Step> steps, const Work& work) {
  std::vector<PointEffect> effects(steps.size());
  for (size_t i = 0; i < steps.size(); ++i)
    steps[i].operation->point(steps[i].arguments, effects[i]);
  return ApplyPointEffects(picture, effects, work);
}

// Runs steps without updating metadata. `part`: the picture is only part of the whole, at the
// position in `context`.
Status Run(PictureRecord& picture, std::span<const Step> steps, OperationContext& context,
           bool part) {
  while (!steps.empty()) {
    if (picture.image.Empty()) return Status::EmptyImage;
    if (!context.work.GoesOn()) return Status::FunctionCancelled;
    const size_t points = PointsAhead(steps);
    if (points > 0) {
      RETURN_IF_BAD(ApplyPoints(picture, steps.first(points), context.work));
    } else {
      if (!part) context.whole = {picture.image.Width(), picture.image.Height()};
      RETURN_IF_BAD(steps[0].operation->apply(picture, steps[0].arguments, context));
    }
    steps = steps.subspan(std::max<size_t>(points, 1));
  }
  return Status::Ok;
}

bool IsLocal(const Operation& operation) {
  return operation.works == Works::Point || operation.works == Works::Neighborhood;
}

}  // namespace

Status ApplySteps(PictureRecord& picture, std::span<const Step> steps,
                  const EngineOptions& options) {
  if (picture.image.Empty()) return Status::EmptyImage;
  OperationContext context = ContextOf(options);
  RETURN_IF_BAD(Run(picture, steps, context, false));
  if (picture.image.Empty()) return Status::EmptyImage;
  picture.width = picture.image.Width();
  picture.height = picture.image.Height();
  picture.bitsPerPixel = picture.image.Bits();
  if (!steps.empty()) DropExifThumbnail(picture.metadata.exif);
  RefreshExif(picture);
  return Status::Ok;
}

Status CopyPicture(const PictureRecord& picture, PictureRecord& copy) {
  if (picture.image.Empty()) return Status::EmptyImage;
  const Rectangle all{0, 0, picture.image.Width(), picture.image.Height()};
  RETURN_IF_BAD(CutImage(picture.image, all, copy.image));
  if (!picture.alpha.Empty()) RETURN_IF_BAD(CutImage(picture.alpha, all, copy.alpha));
  copy.fileName = picture.fileName;
  copy.typeName = picture.typeName;
  const Size size = FullSizeOf(picture);
  copy.width = size.width;
  copy.height = size.height;
  copy.reduction = picture.reduction;
  copy.bitsPerPixel = picture.image.Bits();
  copy.defaultColour = picture.defaultColour;
  copy.fileSize = picture.fileSize;
  copy.imageBytes = picture.imageBytes;
  copy.palette = picture.palette;
  copy.formatIndex = picture.formatIndex;
  copy.context = picture.context;
  copy.remap = picture.remap;
  copy.background = picture.background;
  copy.alphaFlags = picture.alphaFlags;
  copy.metadata = picture.metadata;
  copy.comment = picture.comment;
  copy.warning = picture.warning;
  copy.unread = picture.unread;
  copy.shortfall = picture.shortfall;
  copy.jpegCoding = picture.jpegCoding;
  copy.pageCount = picture.pageCount;
  copy.page = picture.page;
  copy.hotSpotX = picture.hotSpotX;
  copy.hotSpotY = picture.hotSpotY;
  return Status::Ok;
}

Status ApplyStepsToArea(const PictureRecord& picture, std::span<const Step> steps,
                        const Rectangle& area, const EngineOptions& options, PictureRecord& part) {
  if (picture.image.Empty()) return Status::EmptyImage;
  // The trailing steps that can be computed for part of a picture, and their total reach.
  size_t local = steps.size();
  int64_t reach = 0;
  while (local > 0 && IsLocal(*steps[local - 1].operation)) {
    const Operation& operation = *steps[--local].operation;
    if (operation.reach != nullptr) reach += operation.reach(steps[local].arguments);
  }
  PictureRecord whole;
  const PictureRecord* source = &picture;
  OperationContext context = ContextOf(options);
  if (local > 0) {
    RETURN_IF_BAD(CopyPicture(picture, whole));
    RETURN_IF_BAD(Run(whole, steps.first(local), context, false));
    if (whole.image.Empty()) return Status::EmptyImage;
    source = &whole;
  }
  const Size size{source->image.Width(), source->image.Height()};
  const Rectangle wanted = Clipped(area, size.width, size.height);
  if (wanted.width == 0) return Status::EmptyImage;
  const auto grow =
      static_cast<int32_t>(std::min<int64_t>(reach, std::max(size.width, size.height)));
  const Rectangle needed =
      Clipped({wanted.x - grow, wanted.y - grow, wanted.width + 2 * grow, wanted.height + 2 * grow},
              size.width, size.height);
  RETURN_IF_BAD(CutImage(source->image, needed, part.image));
  part.alpha.Free();
  if (!source->alpha.Empty()) RETURN_IF_BAD(CutImage(source->alpha, needed, part.alpha));
  part.palette = source->palette;
  part.alphaFlags = source->alphaFlags;
  part.background = source->background;
  part.defaultColour = source->defaultColour;
  part.metadata.dpiX = source->metadata.dpiX;
  part.metadata.dpiY = source->metadata.dpiY;
  part.width = needed.width;
  part.height = needed.height;
  part.bitsPerPixel = part.image.Bits();
  context.left = needed.x;
  context.top = needed.y;
  context.whole = size;
  RETURN_IF_BAD(Run(part, steps.subspan(local), context, true));
  RETURN_IF_BAD(CutPicture(part, {wanted.x - needed.x, wanted.y - needed.y, wanted.width, wanted.height}));
  part.bitsPerPixel = part.image.Bits();
  return Status::Ok;
}

}  // namespace fotomill
