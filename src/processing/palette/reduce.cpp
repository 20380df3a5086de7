#include "processing/palette/reduce.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdlib>
#include <functional>

#include "picture/picture_record.h"
#include "processing/color/color_histogram.h"
#include "processing/color/mix.h"
#include "processing/color/nearest_color.h"
#include "processing/flatten.h"
#include "processing/palette/diffusion.h"
#include "processing/palette/dither.h"
#include "processing/palette/fit_palette.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr int32_t kWhole = 100;              // percent
// rounds of refining the palette with the pixels themselves
constexpr int kRefinements = 3;
constexpr int64_t kRefinedPixels = 200'000;  // approximate number of pixels sampled
// below this number of histogram cells, colors are counted exactly
constexpr int32_t kFewCells = 1024;

// Share of the quantization error that is diffused, in sixteenths. All of it preserves the mean of
// black and white. A palette fitted to the picture does not reach its outermost colors, and errors
// that can never be compensated would grow into noise; less is diffused there, the less the closer
// the colors are.
constexpr int32_t kHandedOnMono = 16, kHandedOnFew = 12, kHandedOnMany = 10;
constexpr int32_t kFew = 16;  // colors
constexpr int32_t kRowsUnasked = 32;  // between cancellation checks

// Luma, 0 to 255 (ITU-R BT.601); for grays the gray level itself.
constexpr uint8_t Brightness(const uint8_t* bgr) {
  return static_cast<uint8_t>((29 * bgr[0] + 150 * bgr[1] + 77 * bgr[2] + 128) >> 8);
}

// Luma as used by operations: rounded for dithers; for thresholds rounded down, which gives the
// same result as the exact value.
uint8_t RoundedLuma(const uint8_t* bgr) { return Luma(bgr[2], bgr[1], bgr[0]); }
uint8_t LumaBelow(const uint8_t* bgr) {
  return static_cast<uint8_t>(LumaThousandths(bgr[2], bgr[1], bgr[0]) / 1000);
}

// Source rows for the reduction: 24 bits, adjusted, and gray if requested.
class SourceRows {
 public:
  Status Open(const PackedImage& image, const ReduceOptions& options) {
    RETURN_IF_BAD(rows_.Open(image));
    width_ = image.Width();
    grays_ = options.grays;
    adjusted_ = options.brightness != 0 || options.contrast != 0;
    for (int32_t i = 0; i < 256; ++i) {
      const int32_t spread = (2 * i - 255) * (kWhole + options.contrast) / (2 * kWhole);
      levels_[static_cast<size_t>(i)] = static_cast<uint8_t>(
          std::clamp(spread + 128 + options.brightness * 255 / kWhole, 0, 255));
    }
    if (!adjusted_ && !grays_) return Status::Ok;
    return row_.Allocate(3 * static_cast<uint64_t>(width_)) ? Status::Ok
                                                            : Status::MemoryAllocationError;
  }

  const uint8_t* Row(int32_t y) {
    const uint8_t* source = rows_.Row(y);
    if (!adjusted_ && !grays_) return source;
    uint8_t* row = row_.Data();
    const size_t bytes = 3 * static_cast<size_t>(width_);
    for (size_t i = 0; i < bytes; ++i) row[i] = adjusted_ ? levels_[source[i]] : source[i];
    for (size_t i = 0; grays_ && i < bytes; i += 3)
      row[i] = row[i + 1] = row[i + 2] = Brightness(row + i);
    return row;
  }

  template <uint8_t (*brightnessOf)(const uint8_t* bgr) = Brightness>
  void BrightnessRow(int32_t y, uint8_t* brightness) {
    const uint8_t* row = Row(y);
    for (int32_t x = 0; x < width_; ++x)
      brightness[x] = brightnessOf(row + 3 * static_cast<size_t>(x));
  }

 private:
  BgrRows rows_;
  int32_t width_ = 0;
  bool grays_ = false, adjusted_ = false;
  std::array<uint8_t, 256> levels_{};
  platform::MemoryBlock row_;
};

// Otsu's threshold: minimizes the variance within the dark and the bright pixels.
int32_t BestThreshold(const std::array<uint64_t, 256>& counts) {
  double all = 0, sum = 0;
  for (size_t i = 0; i < 256; ++i) {
    all += static_cast<double>(counts[i]);
    sum += static_cast<double>(i) * static_cast<double>(counts[i]);
  }
  double below = 0, belowSum = 0, best = -1;
  int32_t threshold = 128;
  for (size_t i = 0; i < 255; ++i) {
    below += static_cast<double>(counts[i]);
    belowSum += static_cast<double>(i) * static_cast<double>(counts[i]);
    if (below <= 0 || below >= all) continue;
    const double difference = belowSum / below - (sum - belowSum) / (all - below);
    const double between = below * (all - below) * difference * difference;
    if (between > best) {
      best = between;
      threshold = static_cast<int32_t>(i) + 1;
    }
  }
  return threshold;
}

// The average distance between a color and its nearest neighbor, to be bridged by
// an ordered dither.
int32_t PaletteSpacing(const Palette& palette, int32_t count) {
  double sum = 0;
  for (int32_t i = 0; i < count; ++i) {
    int32_t least = 3 * 255 * 255;
    for (int32_t j = 0; j < count; ++j) {
      int32_t distance = 0;
      for (int32_t c = 0; c < 3; ++c) {
        const int32_t d =
            palette[static_cast<size_t>(3 * i + c)] - palette[static_cast<size_t>(3 * j + c)];
        distance += d * d;
      }
      if (j != i) least = std::min(least, distance);
    }
    sum += std::sqrt(static_cast<double>(least));
  }
  return static_cast<int32_t>(sum / count);
}

// As above, per channel, for palettes that are regular in each channel.
int32_t ChannelSpacing(const Palette& palette, int32_t count) {
  int32_t sum = 0;
  for (int32_t i = 0; i < count; ++i) {
    int32_t least = 255;
    for (int32_t j = 0; j < count; ++j) {
      int32_t distance = 0;
      for (int32_t c = 0; c < 3; ++c) {
        distance = std::max(distance, std::abs(palette[static_cast<size_t>(3 * i + c)] -
                                               palette[static_cast<size_t>(3 * j + c)]));
      }
      if (j != i) least = std::min(least, distance);
    }
    sum += least;
  }
  return sum / count;
}

Palette EvenGrays(int32_t count) {
  Palette palette{};
  for (int32_t i = 0; i < count; ++i) {
    const auto level = static_cast<uint8_t>((i * 255 + (count - 1) / 2) / (count - 1));
    std::fill_n(palette.begin() + 3 * i, 3, level);
  }
  return palette;
}

void SortByBrightness(ColorPoints& points) {
  const auto brightness = [](const auto& bgr) { return 29 * bgr[0] + 150 * bgr[1] + 77 * bgr[2]; };
  std::sort(points.channel.begin(), points.channel.begin() + points.count,
            [&](const auto& a, const auto& b) { return brightness(a) < brightness(b); });
}

// A reduction in progress: source rows and result.
struct Reduction {
  PictureRecord& picture;
  const ReduceOptions& options;
  int32_t bits;
  SourceRows source;
  platform::MemoryBlock indices;  // one row
  PackedImage made;
  Palette palette{};
  int32_t colors = 2;
  int32_t handedOn = kHandedOnMono;  // in sixteenths
  bool even = false;                 // the palette is not fitted
  const Work* work = nullptr;        // checked occasionally; may be null

  int32_t Width() const { return picture.image.Width(); }
  int32_t Height() const { return picture.image.Height(); }
  // FunctionCancelled if the work was stopped.
  Status StoreRow(int32_t y) {
    PackIndices(indices.Data(), Width(), bits, made.Row(y).data());
    RETURN_IF_BAD(picture.ReportRow(y + 1));
    return work != nullptr && y % kRowsUnasked == 0 && !work->GoesOn() ? Status::FunctionCancelled
                                                                       : Status::Ok;
  }
  Status OpenRows() {
    RETURN_IF_BAD(source.Open(picture.image, options));
    const auto width = static_cast<uint64_t>(Width());
    return indices.Allocate(width, platform::Fill::Unset) ? Status::Ok
                                                          : Status::MemoryAllocationError;
  }
  void Finish() {
    picture.image = std::move(made);
    picture.palette = palette;
    picture.bitsPerPixel = bits;
  }
};

// Writes the gray levels of row y.
using BrightnessRows = std::function<void(int32_t y, uint8_t* brightness)>;

Status DitherToMono(Reduction& work, const BrightnessRows& brightnessRow) {
  const int32_t width = work.Width(), height = work.Height();
  const Dither dither = work.options.monoDither;
  platform::MemoryBlock gray;
  if (!gray.Allocate(static_cast<uint64_t>(width), platform::Fill::Unset))
    return Status::MemoryAllocationError;
  ErrorDiffuser diffuser;
  RETURN_IF_BAD(diffuser.Open(width, work.options.serpentine, kHandedOnMono));
  WideDiffuser wide;
  if (IsWideDiffusion(dither))
    RETURN_IF_BAD(wide.Open(dither, width, work.options.serpentine, kHandedOnMono));
  int32_t threshold = work.options.threshold;
  if (dither == Dither::None && threshold == 0) {
    std::array<uint64_t, 256> counts{};
    for (int32_t y = 0; y < height; ++y) {
      brightnessRow(y, gray.Data());
      for (const uint8_t level : gray.Bytes()) ++counts[level];
    }
    threshold = BestThreshold(counts);
  }
  for (int32_t y = 0; y < height; ++y) {
    brightnessRow(y, gray.Data());
    uint8_t* const indices = work.indices.Data();
    if (dither == Dither::None) {
      CutGrayRow(gray.Data(), width, threshold, indices);
    } else if (const int32_t size = PatternSize(dither); size > 0) {
      OrderGrayRow(gray.Data(), width, y, size, indices);
    } else if (dither == Dither::FloydSteinberg) {
      diffuser.GrayRow(gray.Data(), indices);
    } else {
      wide.GrayRow(gray.Data(), indices);
    }
    RETURN_IF_BAD(work.StoreRow(y));
  }
  return Status::Ok;
}

template <typename Histogram>
Status GatherColors(Reduction& work, std::vector<ColorBin>& bins) {
  Histogram histogram;
  RETURN_IF_BAD(histogram.Open());
  for (int32_t y = 0; y < work.Height(); ++y) histogram.AddRow(work.source.Row(y), work.Width());
  bins = histogram.Bins();
  return Status::Ok;
}

// Assigns the pixels to their nearest colors, and moves the colors to their means.
Status RefineOnPixels(Reduction& work, NearestColor& nearest, ColorPoints& points) {
  const int64_t pixels = static_cast<int64_t>(work.Width()) * work.Height();
  const auto step = static_cast<int32_t>(pixels / kRefinedPixels + 1);
  for (int round = 0; round < kRefinements; ++round) {
    nearest.SetColors(PointsOf(PaletteOf(points), points.count));
    ColorMeans means;
    for (int32_t y = step / 2; y < work.Height(); y += step) {
      const uint8_t* row = work.source.Row(y);
      MapRow(row, work.Width(), nearest, work.indices.Data());
      means.AddRow(row, work.indices.Data(), work.Width());
    }
    means.Move(points);
  }
  return Status::Ok;
}

// A palette of at most `most` colors fitted to the picture.
Status FitToPicture(Reduction& work, int32_t most, NearestColor& nearest, ColorPoints& points) {
  std::vector<ColorBin> bins;
  RETURN_IF_BAD(GatherColors<ColorCells>(work, bins));
  if (bins.size() < kFewCells) RETURN_IF_BAD(GatherColors<ColorCounts>(work, bins));
  RETURN_IF_BAD(FitPalette(bins, most, points));
  RETURN_IF_BAD(RefineOnPixels(work, nearest, points));
  SortByBrightness(points);
  return Status::Ok;
}

// Stores the chosen palette in `work`, and its colors in `nearest`.
Status ChoosePalette(Reduction& work, const PaletteChoice& choice, NearestColor& nearest) {
  RETURN_IF_BAD(nearest.Open(true));
  ColorPoints points;
  switch (choice.kind) {
    case PaletteChoice::Kind::Fitted:
      RETURN_IF_BAD(FitToPicture(work, choice.colors, nearest, points));
      break;
    case PaletteChoice::Kind::Grays:
      points = PointsOf(EvenGrays(choice.colors), choice.colors);
      break;
    case PaletteChoice::Kind::Given: points = PointsOf(choice.given, choice.colors); break;
  }
  work.palette = PaletteOf(points);
  work.colors = points.count;
  nearest.SetColors(PointsOf(work.palette, points.count));
  return Status::Ok;
}

Status DitherToPalette(Reduction& work, NearestColor& nearest) {
  const Dither dither = work.options.colorDither;
  ErrorDiffuser diffuser;
  RETURN_IF_BAD(diffuser.Open(work.Width(), work.options.serpentine, work.handedOn));
  WideDiffuser wide;
  if (IsWideDiffusion(dither))
    RETURN_IF_BAD(wide.Open(dither, work.Width(), work.options.serpentine, work.handedOn));
  const int32_t spacing = work.even ? ChannelSpacing(work.palette, work.colors)
                                    : PaletteSpacing(work.palette, work.colors);
  for (int32_t y = 0; y < work.Height(); ++y) {
    const uint8_t* row = work.source.Row(y);
    uint8_t* const indices = work.indices.Data();
    if (dither == Dither::None) {
      MapRow(row, work.Width(), nearest, indices);
    } else if (const int32_t size = PatternSize(dither); size > 0) {
      OrderRow(row, work.Width(), y, size, spacing, nearest, indices);
    } else if (dither == Dither::FloydSteinberg) {
      diffuser.Row(row, nearest, indices);
    } else {
      wide.Row(row, nearest, indices);
    }
    RETURN_IF_BAD(work.StoreRow(y));
  }
  return Status::Ok;
}

int32_t HandedOn(int32_t colors) { return colors <= kFew ? kHandedOnFew : kHandedOnMany; }

constexpr int32_t DepthOf(int32_t colors) { return colors <= 2 ? 1 : colors <= 16 ? 4 : 8; }

// Counts the colors of a picture; stops at most + 1.
Status CountColors(const PackedImage& image, int32_t most, int32_t& colors) {
  BgrRows rows;
  RETURN_IF_BAD(rows.Open(image));
  ColorSet set;
  colors = most + 1;
  for (int32_t y = 0; y < image.Height(); ++y) {
    if (!set.AddRow(rows.Row(y), image.Width(), most)) return Status::Ok;
  }
  colors = set.Count();
  return Status::Ok;
}

// Keeps all colors if they fit without dithering, at the smallest depth possible.
Status KeepFewColors(PictureRecord& picture, int32_t most, bool& kept) {
  int32_t colors = 0;
  RETURN_IF_BAD(CountColors(picture.image, most, colors));
  kept = colors <= most;
  bool packed = false;
  return kept ? PackFewColors(picture, DepthOf(colors), packed) : Status::Ok;
}

}  // namespace

Status ReduceColors(PictureRecord& picture, int32_t maxBits, const ReduceOptions& options) {
  if (picture.image.Empty()) return Status::EmptyImage;
  const int32_t bits = maxBits >= 24 ? 24 : maxBits >= 8 ? 8 : maxBits >= 4 ? 4 : 1;
  if (picture.image.Bits() <= bits) return Status::Ok;
  RETURN_IF_BAD(FlattenAlpha(picture));
  if (picture.image.Bits() <= bits) return Status::Ok;
  bool packed = false;
  if (!options.grays) RETURN_IF_BAD(PackFewColors(picture, bits, packed));
  if (packed) return Status::Ok;

  const ProgressScope progress(picture);
  Reduction work{picture, options, bits, {}, {}, {}};
  RETURN_IF_BAD(work.OpenRows());
  NearestColor nearest;
  if (bits == 1) {
    work.palette = EvenGrays(2);
  } else {
    const int32_t most = 1 << bits;
    const bool fewer = options.grays && options.grayLevels != 0;
    const PaletteChoice choice{
        .kind = options.grays ? PaletteChoice::Kind::Grays : PaletteChoice::Kind::Fitted,
        .colors = fewer ? std::min(most, options.grayLevels) : most};
    RETURN_IF_BAD(ChoosePalette(work, choice, nearest));
    work.handedOn = HandedOn(work.colors);
  }
  RETURN_IF_BAD(NewPackedImage(work.Width(), work.Height(), &work.palette, bits, work.made));
  const auto brightness = [&](int32_t y, uint8_t* row) { work.source.BrightnessRow(y, row); };
  RETURN_IF_BAD(bits == 1 ? DitherToMono(work, brightness) : DitherToPalette(work, nearest));
  work.Finish();
  return Status::Ok;
}

Status ReduceToPalette(PictureRecord& picture, const PaletteChoice& choice,
                       const ReduceOptions& options, const Work& goingOn) {
  if (picture.image.Empty()) return Status::EmptyImage;
  const bool fitted = choice.kind == PaletteChoice::Kind::Fitted,
             adjusted = options.brightness != 0 || options.contrast != 0;
  bool kept = false;
  if (fitted && !adjusted) RETURN_IF_BAD(KeepFewColors(picture, choice.colors, kept));
  if (kept) return Status::Ok;

  const ProgressScope progress(picture);
  ReduceOptions wanted = options;
  wanted.grays = choice.kind == PaletteChoice::Kind::Grays;
  Reduction work{picture, wanted, 8, {}, {}, {}};
  work.work = &goingOn;
  RETURN_IF_BAD(work.OpenRows());
  NearestColor nearest;
  RETURN_IF_BAD(ChoosePalette(work, choice, nearest));
  work.bits = DepthOf(work.colors);
  work.even = !fitted;
  if (fitted) work.handedOn = HandedOn(work.colors);
  RETURN_IF_BAD(NewPackedImage(work.Width(), work.Height(), &work.palette, work.bits, work.made));
  RETURN_IF_BAD(DitherToPalette(work, nearest));
  work.Finish();
  return Status::Ok;
}

Status ReduceToMono(PictureRecord& picture, const ReduceOptions& options, const Work& goingOn) {
  if (picture.image.Empty()) return Status::EmptyImage;
  const ProgressScope progress(picture);
  ReduceOptions wanted = options;
  wanted.grays = false;
  Reduction work{picture, wanted, 1, {}, {}, {}};
  work.work = &goingOn;
  RETURN_IF_BAD(work.OpenRows());
  work.palette = EvenGrays(2);
  RETURN_IF_BAD(NewPackedImage(work.Width(), work.Height(), &work.palette, 1, work.made));
  const bool cut = options.monoDither == Dither::None;
  RETURN_IF_BAD(DitherToMono(work, [&](int32_t y, uint8_t* row) {
    cut ? work.source.BrightnessRow<LumaBelow>(y, row)
        : work.source.BrightnessRow<RoundedLuma>(y, row);
  }));
  work.Finish();
  return Status::Ok;
}

}  // namespace fotomill
