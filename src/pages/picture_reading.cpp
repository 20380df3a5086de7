#include "pages/picture_reading.h"

#include <algorithm>
#include <cmath>

#include "metadata/exif/picture_exif.h"
#include "platform/paths.h"
#include "processing/color/point_effect.h"
#include "processing/geometry/scale.h"
#include "registry/registry.h"

namespace fotomill {

namespace {

constexpr double kMiddle = 127.5, kPercent = 100;

// Contrast about the middle gray, then brightness.
PointEffect ToneEffect(const PagePictureOptions& options) {
  const double slope = 1 + std::clamp(options.contrast, -100, 100) / kPercent,
               shift = 2 * kMiddle * std::clamp(options.brightness, -100, 100) / kPercent;
  return EffectOf([=](double value) { return (value - kMiddle) * slope + kMiddle + shift; });
}

}  // namespace

Status ReadPageFacts(const std::string& file, const PagePictureOptions& options,
                     PagePicture& picture, PicturePointer& record) {
  const ReadRequest request{.fileName = file, .stop = options.stop, .options = options.read};
  RETURN_IF_BAD(LoadPictureInfo(request, record));
  const bool swap = options.upright && SwapsSides(OrientationOf(*record));
  picture.file = file;
  picture.name = platform::FileNameOf(file);
  picture.width = swap ? record->height : record->width;
  picture.height = swap ? record->width : record->height;
  picture.dpi = swap ? record->metadata.dpiY : record->metadata.dpiX;
  picture.dpiDown = swap ? record->metadata.dpiX : record->metadata.dpiY;
  picture.bits = record->bitsPerPixel;
  return picture.width > 0 && picture.height > 0 ? Status::Ok : Status::DamagedFile;
}

Status ReadPagePicture(const PagePictureOptions& options, int32_t width, int32_t height,
                       PictureRecord& record) {
  const int32_t full = std::max(record.width, record.height);
  const int32_t side = std::max(width, height);
  const ReadRequest request{.fileName = std::string(record.fileName.view()),
                            .thumbnailSide = side < full ? side : 0,
                            .stop = options.stop,
                            .options = options.read};
  RETURN_IF_BAD(ReadPicture(request, record));
  if (options.upright) RETURN_IF_BAD(TurnUpright(record));
  const Size size = FullSizeOf(record);
  const Size reduced{std::min(size.width, std::max(width, 1)),
                     std::min(size.height, std::max(height, 1))};
  if (reduced.width < record.image.Width() || reduced.height < record.image.Height() ||
      record.reduction > 1)
    RETURN_IF_BAD(ScalePicture(record, reduced, ScaleFilter::Lanczos));
  if (!options.ChangesColors()) return Status::Ok;
  const PointEffect tone = ToneEffect(options);
  return ApplyPointEffects(record, {&tone, 1}, {});
}

}  // namespace fotomill
