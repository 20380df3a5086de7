#include "processing/geometry/scale.h"

#include <algorithm>
#include <cstring>
#include <iterator>

#include "core/choice_lists.h"
#include "platform/memory.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

// Indexed by choice::ResampleFilter.
constexpr ScaleFilter kFilterOfKey[] = {ScaleFilter::Bicubic, ScaleFilter::Lanczos,
                                        ScaleFilter::Bilinear, ScaleFilter::Nearest};
static_assert(kFilterOfKey[choice::kBicubic] == ScaleFilter::Bicubic &&
              kFilterOfKey[choice::kLanczos] == ScaleFilter::Lanczos &&
              kFilterOfKey[choice::kBilinear] == ScaleFilter::Bilinear &&
              kFilterOfKey[choice::kNearest] == ScaleFilter::Nearest);

// The source pixel at the center of pixel `i` of `count`.
constexpr int32_t SourcePixel(int32_t i, int32_t count, int32_t sourceCount) {
  return static_cast<int32_t>((2 * static_cast<int64_t>(i) + 1) * sourceCount /
                              (2 * static_cast<int64_t>(count)));
}

template <int bytes>
void PickPixels(const uint8_t* row, const int32_t* columns, int32_t count, uint8_t* picked) {
  for (int32_t x = 0; x < count; ++x) {
    std::memcpy(picked + static_cast<size_t>(x) * bytes,
                row + static_cast<size_t>(columns[x]) * bytes, bytes);
  }
}

int32_t AtPercentage(int32_t edge, int32_t percentage) {
  const int64_t scaled = static_cast<int64_t>(edge) * percentage / 100;
  return static_cast<int32_t>(std::clamp<int64_t>(scaled, 1, INT32_MAX));
}

// Replaces a picture's images with scaled ones.
void Replace(PictureRecord& picture, PackedImage& image, PackedImage& alpha) {
  picture.image = std::move(image);
  picture.alpha = std::move(alpha);
  picture.width = picture.image.Width();
  picture.height = picture.image.Height();
  picture.bitsPerPixel = picture.image.Bits();
  picture.reduction = 1;
}

// Whether an edge of a picture became that edge of its image.
bool IsReduced(int32_t edge, int32_t imageEdge, int32_t reduction) {
  return reduction > 1 && (int64_t{edge} + reduction - 1) / reduction == imageEdge;
}

bool IsReduced(const PictureRecord& picture) {
  return IsReduced(picture.width, picture.image.Width(), picture.reduction) &&
         IsReduced(picture.height, picture.image.Height(), picture.reduction);
}

}  // namespace

Reach ReachOf(const PictureRecord& picture) {
  if (!IsReduced(picture)) {
    return {static_cast<double>(picture.image.Width()),
            static_cast<double>(picture.image.Height())};
  }
  return {static_cast<double>(picture.width) / picture.reduction,
          static_cast<double>(picture.height) / picture.reduction};
}

Size FullSizeOf(const PictureRecord& picture) {
  return IsReduced(picture) ? Size{picture.width, picture.height}
                            : Size{picture.image.Width(), picture.image.Height()};
}

Size FitSize(int32_t width, int32_t height, int32_t side) {
  const int64_t longer = std::max({width, height, 1});
  const auto fit = [=](int64_t edge) {
    return static_cast<int32_t>(std::max<int64_t>(1, (2 * edge * side + longer) / (2 * longer)));
  };
  return {fit(width), fit(height)};
}

Size SizeAtPercentage(int32_t width, int32_t height, int32_t percentage) {
  return {AtPercentage(width, percentage), AtPercentage(height, percentage)};
}

ScaleFilter ScaleFilterFromKey(int32_t value) {
  return kFilterOfKey[std::clamp<int32_t>(value, 0, std::size(kFilterOfKey) - 1)];
}

Status ScaleNearest(const PackedImage& image, Size size, PackedImage& scaled) {
  scaled.Free();
  if (image.Empty()) return Status::DamagedFile;
  if (image.Bits() < 8) {
    // Several pixels per byte: unpacked to bytes, scaled, and packed again.
    PackedImage deep, deepScaled, made;
    RETURN_IF_BAD(PromoteImage(image, 8, deep));
    RETURN_IF_BAD(ScaleNearest(deep, size, deepScaled));
    RETURN_IF_BAD(NewPackedImage(size.width, size.height, nullptr, image.Bits(), made));
    std::copy(image.ColorTable().begin(), image.ColorTable().end(), made.ColorTable().begin());
    for (int32_t r = 0; r < size.height; ++r) {
      PackIndices(deepScaled.StoredRow(r).data(), size.width, image.Bits(),
                  made.StoredRow(r).data());
    }
    scaled = std::move(made);
    return Status::Ok;
  }
  PackedImage made;
  RETURN_IF_BAD(NewPackedImage(size.width, size.height, nullptr, image.Bits(), made));
  std::copy(image.ColorTable().begin(), image.ColorTable().end(), made.ColorTable().begin());
  platform::MemoryBlock block;
  if (!block.Allocate(static_cast<uint64_t>(size.width) * sizeof(int32_t), platform::Fill::Unset)) {
    return Status::MemoryAllocationError;
  }
  int32_t* columns = block.Items<int32_t>().data();
  for (int32_t x = 0; x < size.width; ++x) columns[x] = SourcePixel(x, size.width, image.Width());
  const auto pick = image.Bits() == 24 ? PickPixels<3> : PickPixels<1>;
  int32_t last = -1;
  for (int32_t y = 0; y < size.height; ++y) {
    const int32_t source = SourcePixel(y, size.height, image.Height());
    if (source == last) {
      std::memcpy(made.Row(y).data(), made.Row(y - 1).data(), made.Stride());
    } else {
      pick(image.Row(source).data(), columns, size.width, made.Row(y).data());
    }
    last = source;
  }
  scaled = std::move(made);
  return Status::Ok;
}

Status ScalePictureByPercentage(PictureRecord& picture, int32_t percentage) {
  if (picture.image.Empty()) return Status::EmptyImage;
  return ScalePicture(picture,
                      SizeAtPercentage(picture.image.Width(), picture.image.Height(), percentage),
                      ScaleFilter::Nearest);
}

Status ScalePicture(PictureRecord& picture, Size size, const ScaleOptions& options) {
  if (picture.image.Empty()) return Status::EmptyImage;
  PackedImage image, alpha;
  RETURN_IF_BAD(ScaleFiltered(picture.image, picture.alpha, ReachOf(picture), size, options, image,
                              alpha));
  Replace(picture, image, alpha);
  return Status::Ok;
}

Status ScalePicture(PictureRecord& picture, Size size, ScaleFilter filter) {
  return ScalePicture(picture, size, {.filter = filter, .progress = picture.progress});
}

}  // namespace fotomill
