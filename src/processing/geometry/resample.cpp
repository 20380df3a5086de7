#include <algorithm>
#include <array>
#include <cmath>
#include <cstring>

#include "platform/memory.h"
#include "processing/geometry/filter_windows.h"
#include "processing/geometry/resample_kernels.h"
#include "processing/geometry/scale.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

// reductions by at least twice this factor first average blocks of pixels
constexpr double kLeftToFilter = 4;
constexpr int32_t kMostByteShift = 20;   // precision of the weights for 8-bit levels
constexpr int32_t kMostShortShift = 15;  // and for samples: keeps sums below 2^31

// Block averaging along an axis: blocks of `block` pixels, the first of which starts `overhang`
// pixels before the edge, so that an uneven rest is split between both ends.
struct Blocks {
  int32_t block = 1, count = 0, overhang = 0;

  Blocks() = default;
  Blocks(int32_t sourceCount, int32_t resultCount, bool wanted) {
    const double scale = static_cast<double>(sourceCount) / resultCount;
    if (wanted && scale >= 2 * kLeftToFilter) block = static_cast<int32_t>(scale / kLeftToFilter);
    count = (sourceCount - 1) / block + 1;
    overhang = static_cast<int32_t>((static_cast<int64_t>(count) * block - sourceCount) / 2);
  }
  int32_t First(int32_t i) const { return std::max(i * block - overhang, 0); }
  int32_t End(int32_t i, int32_t sourceCount) const {
    return std::min(i * block - overhang + block, sourceCount);
  }
  // The axis in blocks, for the filter; `reach` pixels belong to the picture.
  SourceEdge Edge(double reach) const {
    return {count, static_cast<double>(overhang) / block, reach / block};
  }
};

bool IsOpaque(const PackedImage& alpha) {
  for (int32_t y = 0; y < alpha.Height(); ++y) {
    const auto row = alpha.Row(y).first(static_cast<size_t>(alpha.Width()));
    if (!std::all_of(row.begin(), row.end(), [](uint8_t a) { return a == 255; })) return false;
  }
  return true;
}

// The sRGB transfer curve, with linear light as samples. Source: IEC 61966-2-1, section 5.2.
struct LightCurve {
  static constexpr int32_t kMost = 255 << kFraction;
  std::array<int16_t, 256> light;               // by level
  std::array<uint8_t, kMost + 1> level;         // by amount of light
  LightCurve() {
    for (size_t v = 0; v < light.size(); ++v) {
      const double c = static_cast<double>(v) / 255;
      const double linear = c <= 0.04045 ? c / 12.92 : std::pow((c + 0.055) / 1.055, 2.4);
      light[v] = static_cast<int16_t>(std::lround(linear * kMost));
    }
    for (size_t l = 0; l < level.size(); ++l) {
      const double linear = static_cast<double>(l) / kMost;
      const double c =
          linear <= 0.0031308 ? linear * 12.92 : 1.055 * std::pow(linear, 1 / 2.4) - 0.055;
      level[l] = static_cast<uint8_t>(std::lround(c * 255));
    }
  }
  uint8_t LevelOf(float amount) const {
    return level[static_cast<size_t>(std::clamp(amount + 0.5f, 0.0f, float{kMost}))];
  }
};
const LightCurve& Light() {
  static const LightCurve curve;
  return curve;
}

// Delivers the rows of a picture as samples, block-averaged for large reductions. Rows must be
// requested in order.
class SampleSource {
 public:
  // `alpha` and `light` may be null.
  Status Open(const PackedImage& image, const PackedImage* alpha, const LightCurve* light,
              const Blocks& across, const Blocks& down) {
    image_ = &image;
    alpha_ = alpha;
    light_ = light;
    across_ = across;
    down_ = down;
    channels_ = alpha != nullptr ? 4 : 3;
    samples_ = static_cast<size_t>(image.Width()) * channels_;
    RETURN_IF_BAD(rows_.Open(image));
    if (across.block == 1 && down.block == 1) return Status::Ok;
    const bool room = wide_.Allocate(samples_ * sizeof(int16_t), platform::Fill::Unset) &&
                      sums_.Allocate(samples_ * sizeof(int32_t), platform::Fill::Unset);
    return room ? Status::Ok : Status::MemoryAllocationError;
  }

  void Read(int32_t y, int16_t* samples) {
    if (across_.block == 1 && down_.block == 1) {
      Convert(y, samples);
      return;
    }
    const int32_t first = down_.First(y), end = down_.End(y, image_->Height());
    int32_t* sums = sums_.Items<int32_t>().data();
    std::memset(sums, 0, sums_.Bytes().size());
    for (int32_t source = first; source < end; ++source) {
      int16_t* wide = wide_.Items<int16_t>().data();
      Convert(source, wide);
      kernels_.add(wide, samples_, sums);
    }
    const auto average = channels_ == 4 ? AverageBlocks<4> : AverageBlocks<3>;
    average(sums, image_->Width(), across_, end - first, samples);
  }

 private:
  void Convert(int32_t y, int16_t* samples) {
    if (light_ != nullptr) {
      ConvertToLight(y, samples);
    } else if (alpha_ != nullptr) {
      kernels_.multiply(rows_.Row(y), alpha_->Row(y).data(), static_cast<size_t>(image_->Width()),
                        samples);
    } else {
      kernels_.widen(rows_.Row(y), samples_, samples);
    }
  }

  void ConvertToLight(int32_t y, int16_t* samples) {
    const uint8_t* bgr = rows_.Row(y);
    if (alpha_ == nullptr) {
      for (size_t i = 0; i < samples_; ++i) samples[i] = light_->light[bgr[i]];
      return;
    }
    const uint8_t* alpha = alpha_->Row(y).data();
    for (int32_t x = 0; x < image_->Width(); ++x, bgr += 3, samples += 4) {
      for (int c = 0; c < 3; ++c)
        samples[c] = static_cast<int16_t>((light_->light[bgr[c]] * alpha[x] + 127) / 255);
      samples[3] = static_cast<int16_t>(alpha[x] << kFraction);
    }
  }

  template <int channels>
  static void AverageBlocks(const int32_t* sums, int32_t width, const Blocks& across, int32_t rows,
                            int16_t* averages) {
    for (int32_t i = 0; i < across.count; ++i, averages += channels) {
      const int32_t here = across.End(i, width) - across.First(i);
      int64_t total[channels] = {};
      for (int32_t x = 0; x < here; ++x, sums += channels) {
        for (int c = 0; c < channels; ++c) total[c] += sums[c];
      }
      const double share = 1.0 / (static_cast<double>(here) * rows);
      for (int c = 0; c < channels; ++c)
        averages[c] = static_cast<int16_t>(static_cast<double>(total[c]) * share + 0.5);
    }
  }

  const ResampleKernels& kernels_ = ResampleKernelsHere();
  const PackedImage* image_ = nullptr;
  const PackedImage* alpha_ = nullptr;
  const LightCurve* light_ = nullptr;
  Blocks across_, down_;
  int32_t channels_ = 3;
  size_t samples_ = 0;
  BgrRows rows_;
  platform::MemoryBlock wide_, sums_;
};

// Divides colors by their alpha. Fully transparent pixels become black.
void SplitAlpha(const int16_t* pixels, int32_t width, const LightCurve* light, uint8_t* bgr,
                uint8_t* alpha) {
  for (int32_t x = 0; x < width; ++x, pixels += 4, bgr += 3) {
    const int32_t level = std::clamp((pixels[3] + (1 << (kFraction - 1))) >> kFraction, 0, 255);
    alpha[x] = static_cast<uint8_t>(level);
    const float scale = level == 0 ? 0 : 255.0f / static_cast<float>(pixels[3]);
    for (int c = 0; c < 3; ++c) {
      const float value = static_cast<float>(pixels[c]) * scale;
      bgr[c] = light != nullptr ? light->LevelOf(value * (1 << kFraction))
                                : static_cast<uint8_t>(std::clamp(value + 0.5f, 0.0f, 255.0f));
    }
  }
}

void SplitLight(const int16_t* samples, size_t count, const LightCurve& light, uint8_t* levels) {
  for (size_t i = 0; i < count; ++i)
    levels[i] =
        light.level[static_cast<size_t>(std::clamp<int32_t>(samples[i], 0, LightCurve::kMost))];
}

// Shared by all bands of a resampling operation.
struct ResamplePlan {
  const PackedImage* image = nullptr;
  const PackedImage* alpha = nullptr;   // null if none, or opaque
  const LightCurve* light = nullptr;    // null: levels are averaged as stored
  Blocks columns, rows;
  Size size{0, 0};
  int32_t channels = 3;
  bool acrossFirst = false;
  bool direct = false;  // rows of a 24-bit picture can be used without a copy
  size_t samples = 0;   // per source row
  mutable FilterWindows across, down;

  Status Make(const PackedImage& source, const PackedImage* plane, Reach reach, Size target,
              const ScaleOptions& options) {
    image = &source;
    alpha = plane;
    light = options.linear ? &Light() : nullptr;
    columns = Blocks(source.Width(), target.width, options.blocks);
    rows = Blocks(source.Height(), target.height, options.blocks);
    size = target;
    channels = plane != nullptr ? 4 : 3;
    acrossFirst = target.height > rows.count;
    samples = static_cast<size_t>(acrossFirst ? target.width : columns.count) *
              static_cast<size_t>(channels);
    direct = !acrossFirst && source.Bits() == 24 && plane == nullptr && light == nullptr &&
             columns.block == 1 && rows.block == 1 && samples >= kWeighedAtOnce;
    RETURN_IF_BAD(across.Make(columns.Edge(reach.width), target.width, options.filter, kMostShortShift));
    return down.Make(rows.Edge(reach.height), target.height, options.filter,
                     direct ? kMostByteShift : kMostShortShift);
  }
};

// Computes a band of result rows in two passes: vertical, a weighted sum of rows, and horizontal,
// scaling a row. When reducing the height, the vertical pass runs first, leaving fewer rows to
// scale; when enlarging, the horizontal pass does.
class Resampling {
 public:
  // Starts at row `first` of the result. The plan must outlive it.
  Status Open(const ResamplePlan& plan, int32_t first) {
    plan_ = &plan;
    lastRow_ = plan.rows.count - 1;
    filled_ = plan.down.Window(first).first;
    if (!plan.direct)
      RETURN_IF_BAD(source_.Open(*plan.image, plan.alpha, plan.light, plan.columns, plan.rows));
    held_ = plan.down.MostTaps();
    stride_ = plan.direct
                  ? plan.samples
                  : (plan.samples + kSpare + kWeighedAtOnce - 1) / kWeighedAtOnce * kWeighedAtOnce;
    const auto channels = static_cast<uint64_t>(plan.channels);
    const uint64_t columnRow =
        static_cast<uint64_t>(plan.columns.count + kTapGroup) * channels + kWeighedAtOnce + kSpare;
    const uint64_t pixelRow =
        static_cast<uint64_t>(plan.size.width) * channels + kWeighedAtOnce + kSpare;
    const bool room =
        columns_.Allocate(columnRow * sizeof(int16_t)) &&
        pixels_.Allocate(pixelRow * sizeof(int16_t)) &&
        pointers_.Allocate(static_cast<uint64_t>(held_) * sizeof(void*)) &&
        (plan.direct || ring_.Allocate(stride_ * static_cast<uint64_t>(held_) * sizeof(int16_t)));
    return room ? Status::Ok : Status::MemoryAllocationError;
  }

  // Row y of the result; must be called in order.
  void ScaleRow(int32_t y, std::span<uint8_t> bgr, std::span<uint8_t> alpha) {
    int16_t* columns = columns_.Items<int16_t>().data();
    int16_t* pixels = pixels_.Items<int16_t>().data();
    if (plan_->acrossFirst) {
      Down(y, pixels);
    } else {
      Down(y, columns);
      Across(columns, pixels);
    }
    const size_t samples = 3 * static_cast<size_t>(plan_->size.width);
    if (plan_->channels == 4) {
      SplitAlpha(pixels, plan_->size.width, plan_->light, bgr.data(), alpha.data());
    } else if (plan_->light != nullptr) {
      SplitLight(pixels, samples, *plan_->light, bgr.data());
    } else {
      kernels_.narrow(pixels, samples, bgr.data());
    }
  }

 private:
  static constexpr size_t kSpare = 8;  // samples that a pass may write past the end of a row

  void Across(const int16_t* columns, int16_t* pixels) {
    const auto scale = plan_->channels == 3 ? kernels_.scaleThree : kernels_.scaleFour;
    scale(columns, plan_->across.Windows().data(), plan_->size.width, plan_->across.Shift(),
          pixels);
  }

  void Down(int32_t y, int16_t* row) {
    const FilterWindow& window = plan_->down.Window(y);
    if (plan_->direct) {
      const auto rows =
          RowsOf<uint8_t>(window, [&](int32_t r) { return plan_->image->Row(r).data(); });
      kernels_.weighBytes(rows, window, plan_->down.Shift() - kFraction, stride_, row);
      return;
    }
    for (const int32_t end = std::min(window.first + window.taps, lastRow_ + 1); filled_ < end;
         ++filled_)
      Fill(filled_);
    const auto rows = RowsOf<int16_t>(window, [&](int32_t r) { return Slot(r); });
    kernels_.weighShorts(rows, window, plan_->down.Shift(), stride_, row);
  }

  int16_t* Slot(int32_t y) {
    return ring_.Items<int16_t>().data() + static_cast<size_t>(y % held_) * stride_;
  }
  void Fill(int32_t y) {
    if (plan_->acrossFirst) {
      source_.Read(y, columns_.Items<int16_t>().data());
      Across(columns_.Items<int16_t>().data(), Slot(y));
    } else {
      source_.Read(y, Slot(y));
    }
  }

  // The rows of a window. Padding taps past the last row use the last row.
  template <typename Sample, typename RowAt>
  const Sample* const* RowsOf(const FilterWindow& window, RowAt rowAt) {
    const Sample** rows = pointers_.Items<const Sample*>().data();
    for (int32_t t = 0; t < window.taps; ++t) rows[t] = rowAt(std::min(window.first + t, lastRow_));
    return rows;
  }

  const ResampleKernels& kernels_ = ResampleKernelsHere();
  const ResamplePlan* plan_ = nullptr;
  SampleSource source_;
  int32_t lastRow_ = 0;
  int32_t held_ = 0, filled_ = 0;
  size_t stride_ = 0;              // samples per source row, padded
  platform::MemoryBlock ring_;     // the last `held_` source rows
  platform::MemoryBlock columns_;  // one row of source width, zero-padded
  platform::MemoryBlock pixels_;   // one row of result width
  platform::MemoryBlock pointers_;
};

constexpr int32_t kLeastRows = 32;  // per band, to limit duplicate work

Status ScaleInBands(const ResamplePlan& plan, const ScaleOptions& options, PackedImage& made,
                    PackedImage& madeAlpha) {
  ProgressSink* const progress = options.work.threads != 1 ? nullptr : options.progress;
  return ForBands(plan.size.height, kLeastRows, options.work, [&](int32_t first, int32_t end) {
    Resampling work;
    RETURN_IF_BAD(work.Open(plan, first));
    for (int32_t y = first; y < end; ++y) {
      work.ScaleRow(y, made.Row(y),
                    plan.alpha != nullptr ? madeAlpha.Row(y) : std::span<uint8_t>());
      if (progress != nullptr) progress->Step(y + 1, plan.size.height);
    }
    return Status::Ok;
  });
}

}  // namespace

Status ScaleFiltered(const PackedImage& image, const PackedImage& alpha, Size size,
                     ScaleFilter filter, PackedImage& scaled, PackedImage& scaledAlpha,
                     ProgressSink* progress) {
  const Reach all{static_cast<double>(image.Width()), static_cast<double>(image.Height())};
  return ScaleFiltered(image, alpha, all, size, filter, scaled, scaledAlpha, progress);
}

Status ScaleFiltered(const PackedImage& image, const PackedImage& alpha, Reach reach, Size size,
                     ScaleFilter filter, PackedImage& scaled, PackedImage& scaledAlpha,
                     ProgressSink* progress) {
  return ScaleFiltered(image, alpha, reach, size, {.filter = filter, .progress = progress}, scaled,
                       scaledAlpha);
}

Status ScaleFiltered(const PackedImage& image, const PackedImage& alpha, Reach reach, Size size,
                     const ScaleOptions& options, PackedImage& scaled, PackedImage& scaledAlpha) {
  scaled.Free();
  scaledAlpha.Free();
  if (image.Empty()) return Status::DamagedFile;
  PackedImage made, madeAlpha;
  if (options.filter == ScaleFilter::Nearest) {
    RETURN_IF_BAD(ScaleNearest(image, size, made));
    if (!alpha.Empty()) RETURN_IF_BAD(ScaleNearest(alpha, size, madeAlpha));
  } else {
    RETURN_IF_BAD(NewPackedImage(size.width, size.height, nullptr, 24, made));
    if (!alpha.Empty()) RETURN_IF_BAD(NewAlphaPlane(size.width, size.height, madeAlpha));
    const bool blended = !alpha.Empty() && !IsOpaque(alpha);
    if (!alpha.Empty() && !blended)
      std::memset(madeAlpha.Rows().data(), 255, madeAlpha.Rows().size());
    ResamplePlan plan;
    RETURN_IF_BAD(plan.Make(image, blended ? &alpha : nullptr, reach, size, options));
    RETURN_IF_BAD(ScaleInBands(plan, options, made, madeAlpha));
  }
  scaled = std::move(made);
  scaledAlpha = std::move(madeAlpha);
  return Status::Ok;
}

}  // namespace fotomill
