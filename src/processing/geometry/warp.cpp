#include "processing/geometry/warp.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstring>

#include "processing/geometry/sample_kernel.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

// columns: the source rows below them fit in the processor's cache
constexpr int32_t kTile = 512;
constexpr int32_t kLeastRows = 16;
constexpr int32_t kPhaseBits = 10;
constexpr size_t kPhases = size_t{1} << kPhaseBits;
constexpr int32_t kTaps = 4;

using WeightTable = std::array<Weights, kPhases>;

double Cubic(double x) {
  x = std::abs(x);
  if (x < 1) return (1.5 * x - 2.5) * x * x + 1;
  return x < 2 ? ((-0.5 * x + 2.5) * x - 4) * x + 2 : 0;
}

double WeightOf(WarpFilter filter, double distance) {
  switch (filter) {
    case WarpFilter::Bicubic: return Cubic(distance);
    case WarpFilter::Bilinear: return std::max(0.0, 1 - std::abs(distance));
    case WarpFilter::Nearest: break;
  }
  return distance > -0.5 && distance <= 0.5 ? 1 : 0;
}

// The weights of the pixels at -1, 0, 1 and 2 for a position between 0 and 1. Rounding errors go to
// the nearer of the middle two.
WeightTable WeightsOf(WarpFilter filter) {
  WeightTable table;
  for (size_t phase = 0; phase < kPhases; ++phase) {
    const double place = static_cast<double>(phase) / kPhases;
    int32_t left = kWeightOne;
    for (int32_t i = 0; i < kTaps; ++i) {
      table[phase][i] =
          static_cast<int16_t>(std::lround(WeightOf(filter, i - 1 - place) * kWeightOne));
      left -= table[phase][i];
    }
    table[phase][place < 0.5 ? 1 : 2] =
        static_cast<int16_t>(table[phase][place < 0.5 ? 1 : 2] + left);
  }
  return table;
}

// A position rounded to the nearest phase.
struct Phased {
  int64_t first;  // first of the four pixels around it
  size_t phase;

  explicit Phased(int64_t place) {
    const int64_t phases =
        (place + (int64_t{1} << (kPlaceBits - kPhaseBits - 1))) >> (kPlaceBits - kPhaseBits);
    first = (phases >> kPhaseBits) - 1;
    phase = static_cast<size_t>(phases) % kPhases;
  }
};

// 4 x 4 pixels, with or without alpha.
struct Patch {
  uint8_t bgr[kTaps][16];
  uint8_t alpha[kTaps][kTaps];
};

// Samples a patch with colors weighted by alpha.
void SampleAlpha(const Patch& patch, const Weights& across, const Weights& down, uint8_t* bgr,
                 uint8_t* opacity) {
  int64_t sums[3] = {}, weight = 0;
  for (int j = 0; j < kTaps; ++j) {
    for (int i = 0; i < kTaps; ++i) {
      const int64_t own = static_cast<int64_t>(down[j]) * across[i] * patch.alpha[j][i];
      weight += own;
      for (int c = 0; c < 3; ++c) sums[c] += own * patch.bgr[j][3 * i + c];
    }
  }
  constexpr int32_t kBits = 2 * kWeightBits;
  for (int c = 0; c < 3; ++c) {
    bgr[c] = weight <= 0 || sums[c] <= 0
                 ? uint8_t{0}
                 : static_cast<uint8_t>(std::min<int64_t>(255, (sums[c] + weight / 2) / weight));
  }
  *opacity =
      static_cast<uint8_t>(std::clamp<int64_t>((weight + (1 << (kBits - 1))) >> kBits, 0, 255));
}

struct Warp {
  const PackedImage& image;
  const PackedImage* alpha;  // null if none
  const WarpOptions& options;
  WeightTable weights;
  std::ptrdiff_t down;  // address offset to the row below
  // Maximum offset of a patch from the left and from the top at which all bytes read are
  // inside the picture.
  uint64_t mostLeft, mostTop;

  Warp(const PackedImage& source, const PackedImage* plane, const WarpOptions& how)
      : image(source),
        alpha(plane),
        options(how),
        weights(WeightsOf(how.filter)),
        down(-static_cast<std::ptrdiff_t>(source.Stride())),
        mostLeft(static_cast<uint64_t>(std::max(source.Width() - 5, 0))),
        mostTop(static_cast<uint64_t>(std::max(source.Height() - 3, 0))) {}

  const uint8_t* Pixel(int64_t x, int64_t y) const {
    return image.Row(static_cast<int32_t>(y)).data() + 3 * x;
  }

  bool IsFarOutside(int64_t left, int64_t top) const {
    return left + kTaps <= 0 || top + kTaps <= 0 || left >= image.Width() || top >= image.Height();
  }

  // Collects 4 x 4 pixels, some of which may be outside; `opaque` is the alpha of
  // pixels without alpha.
  void Collect(int64_t left, int64_t top, Patch& patch) const {
    const int64_t width = image.Width(), height = image.Height();
    for (int64_t j = 0; j < kTaps; ++j) {
      const int64_t y = std::clamp<int64_t>(top + j, 0, height - 1);
      for (int64_t i = 0; i < kTaps; ++i) {
        const int64_t x = std::clamp<int64_t>(left + i, 0, width - 1);
        const bool isInside = options.edgesRepeat || (x == left + i && y == top + j);
        uint8_t* pixel = patch.bgr[j] + 3 * i;
        if (isInside) {
          std::memcpy(pixel, Pixel(x, y), 3);
        } else {
          pixel[0] = options.backdrop.blue;
          pixel[1] = options.backdrop.green;
          pixel[2] = options.backdrop.red;
        }
        const uint8_t own = alpha == nullptr
                                ? uint8_t{255}
                                : alpha->Row(static_cast<int32_t>(y))[static_cast<size_t>(x)];
        patch.alpha[j][i] = isInside ? own : options.backdrop.alpha;
      }
    }
  }

  void OpaqueRow(std::span<const SourcePlace> places, uint8_t* bgr) const {
    const uint8_t* corner = image.Row(0).data();
    Patch patch = {};
    for (const SourcePlace& place : places) {
      const Phased x(place.x), y(place.y);
      const int64_t left = x.first, top = y.first;
      const Weights &across = weights[x.phase], &along = weights[y.phase];
      if (static_cast<uint64_t>(left) < mostLeft && static_cast<uint64_t>(top) < mostTop) {
        const uint8_t* first = corner + top * down + 3 * left;
        const uint8_t* rows[kTaps] = {first, first + down, first + 2 * down, first + 3 * down};
        SampleBgr(rows, across, along, bgr);
      } else if (!options.edgesRepeat && IsFarOutside(left, top)) {
        bgr[0] = options.backdrop.blue;
        bgr[1] = options.backdrop.green;
        bgr[2] = options.backdrop.red;
      } else {
        Collect(left, top, patch);
        const uint8_t* rows[kTaps] = {patch.bgr[0], patch.bgr[1], patch.bgr[2], patch.bgr[3]};
        SampleBgr(rows, across, along, bgr);
      }
      bgr += 3;
    }
  }

  void AlphaRow(std::span<const SourcePlace> places, uint8_t* bgr, uint8_t* opacity) const {
    Patch patch = {};
    for (const SourcePlace& place : places) {
      const Phased x(place.x), y(place.y);
      const int64_t left = x.first, top = y.first;
      if (!options.edgesRepeat && IsFarOutside(left, top)) {
        bgr[0] = options.backdrop.blue;
        bgr[1] = options.backdrop.green;
        bgr[2] = options.backdrop.red;
        *opacity = options.backdrop.alpha;
      } else {
        Collect(left, top, patch);
        SampleAlpha(patch, weights[x.phase], weights[y.phase], bgr, opacity);
      }
      bgr += 3;
      ++opacity;
    }
  }
};

int64_t Fixed(double pixels) {
  constexpr double kFar = 1 << 30;
  return static_cast<int64_t>(
      std::floor(std::clamp(pixels, -kFar, kFar) * (int64_t{1} << kPlaceBits) + 0.5));
}

}  // namespace

SourcePlace PlaceAt(double x, double y) { return {Fixed(x), Fixed(y)}; }

PlaceRow LinearPlaces(const LinearMap& map) {
  const int64_t stepX = Fixed(map.xx), stepY = Fixed(map.yx);
  return [=](int32_t left, int32_t y, std::span<SourcePlace> places) {
    SourcePlace place = PlaceAt(map.xy * y + map.x0, map.yy * y + map.y0);
    place.x += left * stepX;
    place.y += left * stepY;
    for (SourcePlace& wanted : places) {
      wanted = place;
      place.x += stepX;
      place.y += stepY;
    }
  };
}

LinearMap MapAboutCenter(Size from, Size to, double xx, double xy, double yx, double yy) {
  const double x = (to.width - 1) / 2.0, y = (to.height - 1) / 2.0;
  return {xx, xy, (from.width - 1) / 2.0 - xx * x - xy * y,
          yx, yy, (from.height - 1) / 2.0 - yx * x - yy * y};
}

Status WarpPicture(PictureRecord& picture, Size size, const WarpOptions& options,
                   const PlaceRow& places, const Work& work) {
  if (picture.image.Empty()) return Status::EmptyImage;
  PackedImage image, alpha;
  RETURN_IF_BAD(CheckPackedSize(size.width, size.height, 24));
  RETURN_IF_BAD(PromotePicture(picture));
  const bool hasAlpha = !picture.alpha.Empty(),
             getsAlpha = hasAlpha || (!options.edgesRepeat && options.backdrop.alpha < 255);
  RETURN_IF_BAD(NewPackedImage(size.width, size.height, nullptr, 24, image));
  if (getsAlpha) RETURN_IF_BAD(NewAlphaPlane(size.width, size.height, alpha));
  const Warp warp(picture.image, hasAlpha ? &picture.alpha : nullptr, options);
  RETURN_IF_BAD(ForBands(size.height, kLeastRows, work, [&](int32_t first, int32_t end) {
    std::array<SourcePlace, kTile> tile;
    for (int32_t left = 0; left < size.width; left += kTile) {
      const std::span<SourcePlace> wanted(tile.data(),
                                          static_cast<size_t>(std::min(kTile, size.width - left)));
      for (int32_t y = first; y < end; ++y) {
        places(left, y, wanted);
        uint8_t* bgr = image.Row(y).data() + 3 * static_cast<size_t>(left);
        if (getsAlpha) {
          warp.AlphaRow(wanted, bgr, alpha.Row(y).data() + left);
        } else {
          warp.OpaqueRow(wanted, bgr);
        }
      }
    }
    return Status::Ok;
  }));
  picture.image = std::move(image);
  if (getsAlpha) {
    picture.alpha = std::move(alpha);
    picture.alphaFlags |= kHasAlpha;
  }
  picture.width = size.width;
  picture.height = size.height;
  picture.bitsPerPixel = 24;
  return Status::Ok;
}

}  // namespace fotomill
