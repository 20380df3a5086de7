#include "processing/filters/gaussian.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstring>
#include <functional>
#include <numbers>
#include <vector>

#include "processing/flatten.h"
#include "processing/geometry/resample_kernels.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr double kCut = 4;          // sigmas
constexpr double kGrid = 0.7;       // spacing of the coarse grid, in sigmas
constexpr int32_t kMostShift = 15;  // precision of weights: keeps sums of samples below 2^31
constexpr size_t kSpare = 8;        // samples that a pass may write past the end of a row
// samples that a pass may read past the end of a row, with weight 0
constexpr size_t kReadAhead = 64;
constexpr int32_t kLeastRows = 32;  // per band
constexpr int32_t kOpaque = 255 << kFraction;

constexpr int32_t RoundUp(int32_t number, int32_t group) {
  return (number + group - 1) / group * group;
}
constexpr size_t RoundUp(size_t number, size_t group) {
  return (number + group - 1) / group * group;
}

// The weights of a Gaussian at integer positions around `center`, out to 4 sigma, normalized to 1.
struct Shares {
  int32_t first = 0;  // position of the first weight
  std::vector<double> shares;

  // `step` is the distance between adjacent positions.
  Shares(double center, double sigma, double step) {
    first = static_cast<int32_t>(std::ceil((center - kCut * sigma) / step));
    const auto last =
        std::max(first, static_cast<int32_t>(std::floor((center + kCut * sigma) / step)));
    double sum = 0;
    for (int32_t i = first; i <= last; ++i) {
      const double away = (i * step - center) / sigma;
      sum += shares.emplace_back(std::exp(-0.5 * away * away));
    }
    for (double& share : shares) share /= sum;
  }
};

// Several sets of weights, rounded to integers that add up to exactly 2^shift, each
// padded with zeros.
class WeightSets {
 public:
  void Make(const std::vector<Shares>& sets) {
    double largest = 0;
    size_t longest = 0;
    for (const Shares& set : sets) {
      largest = std::max(largest, *std::ranges::max_element(set.shares));
      longest = std::max(longest, set.shares.size());
    }
    longest_ = static_cast<int32_t>(longest);
    taps_ = RoundUp(longest_, kTapGroup);
    shift_ = kMostShift;
    while (std::ldexp(largest, shift_) > INT16_MAX - 1) --shift_;
    weights_.assign(sets.size() * static_cast<size_t>(taps_), 0);
    for (size_t s = 0; s < sets.size(); ++s) {
      double sum = 0;
      long given = 0;
      int16_t* weights = weights_.data() + s * static_cast<size_t>(taps_);
      for (const double share : sets[s].shares) {
        sum += share;
        const long upToHere =
            &share == &sets[s].shares.back() ? 1L << shift_ : std::lround(std::ldexp(sum, shift_));
        *weights++ = static_cast<int16_t>(upToHere - given);
        given = upToHere;
      }
      firsts_.push_back(sets[s].first);
    }
  }
  int32_t Taps() const { return taps_; }
  int32_t Longest() const { return longest_; }  // taps without the padding
  int32_t Shift() const { return shift_; }
  // The window of set `s`, shifted by `move` positions.
  FilterWindow Window(size_t s, int32_t move) const {
    return {firsts_[s] + move, taps_, weights_.data() + s * static_cast<size_t>(taps_)};
  }

 private:
  std::vector<int16_t> weights_;
  std::vector<int32_t> firsts_;
  int32_t taps_ = 0, longest_ = 0, shift_ = 0;
};

// One axis of the picture: its pixels, and the cells of the coarse grid. Cell g is centered at (g +
// 1/2) d - 1/2, in pixels of the whole picture.
struct Axis {
  int32_t count = 0, offset = 0;      // pixels, and position of the first one in the whole picture
  int32_t grid = 1;                   // d; 1: pixels are blurred directly, without cells
  int32_t firstCell = 0, cells = 0;   // the cells that the pixels use
  // from pixels to a cell; from cells to a pixel, one set for each position within a cell
  WeightSets down, up;

  void Make(int32_t pixels, int32_t place, double sigma) {
    count = pixels;
    offset = place;
    grid = std::max(1, static_cast<int32_t>(kGrid * sigma));
    if (grid == 1) {
      down.Make({Shares(0, sigma, 1)});
      return;
    }
    const double half = sigma * std::numbers::sqrt2 / 2;
    const double middle = 0.5 * grid - 0.5;
    down.Make({Shares(middle, half, 1)});
    std::vector<Shares> phases;
    for (int32_t p = 0; p < grid; ++p) phases.emplace_back(p - middle, half, grid);
    up.Make(phases);
    firstCell = CellsOf(0).first;
    // the padding beyond is not computed: its pixels may be far outside
    cells = 0;
    for (int32_t x = std::max(0, count - grid); x < count; ++x)
      cells = std::max(cells, CellsOf(x).first + up.Longest() - firstCell);
    const int32_t least = firstCell;
    for (int32_t x = 0; x < std::min(grid, count); ++x)
      firstCell = std::min(firstCell, CellsOf(x).first);
    cells += least - firstCell;
  }
  // The pixels of a cell, or around pixel i; relative to the first pixel.
  FilterWindow PixelsOf(int32_t i) const {
    return down.Window(0, grid == 1 ? i : i * grid - offset);
  }
  // The cells around pixel x.
  FilterWindow CellsOf(int32_t x) const {
    const int32_t place = x + offset;
    return up.Window(static_cast<size_t>(place % grid), place / grid);
  }
};

// Shared by all bands.
struct GaussianPlan {
  const PackedImage* image = nullptr;
  const PackedImage* alpha = nullptr;  // null if none
  size_t channels = 3, samples = 0;
  Axis across, down;
  int32_t padding = 0;  // edge pixels repeated on both sides of a row
  std::vector<FilterWindow> toCells, toPixels;  // horizontal; `toPixels` is empty without a grid

  void Make(const PictureRecord& picture, double sigma, const GaussianPlace& place) {
    image = &picture.image;
    alpha = picture.alpha.Empty() ? nullptr : &picture.alpha;
    channels = alpha != nullptr ? 4 : 3;
    samples = static_cast<size_t>(image->Width()) * channels;
    across.Make(image->Width(), place.left, sigma);
    down.Make(image->Height(), place.top, sigma);
    padding = GaussianReach(sigma) + across.grid + kTapGroup;
    if (across.grid == 1) {
      for (int32_t x = 0; x < across.count; ++x)
        toCells.push_back(Moved(across.PixelsOf(x), padding));
      return;
    }
    for (int32_t g = 0; g < across.cells; ++g)
      toCells.push_back(Moved(across.PixelsOf(across.firstCell + g), padding));
    for (int32_t x = 0; x < across.count; ++x)
      toPixels.push_back(Moved(across.CellsOf(x), -across.firstCell));
  }
  static FilterWindow Moved(FilterWindow window, int32_t by) {
    window.first += by;
    return window;
  }
};

// Computes the blurred rows of a band, as samples.
class GaussianRows {
 public:
  Status Open(const GaussianPlan& plan) {
    plan_ = &plan;
    const size_t padded = plan.samples + 2 * static_cast<size_t>(plan.padding) * plan.channels;
    const size_t cellRow = static_cast<size_t>(plan.across.cells + kTapGroup) * plan.channels;
    stride_ = RoundUp(plan.samples + kSpare, static_cast<size_t>(kWeighedAtOnce));
    held_ = plan.down.grid == 1 ? 0 : plan.down.up.Taps();
    const auto pointers = static_cast<size_t>(std::max(plan.down.down.Taps(), held_));
    const bool room = padded_.Allocate((padded + kWeighedAtOnce + kReadAhead) * sizeof(int16_t)) &&
                      cells_.Allocate((cellRow + kWeighedAtOnce + kReadAhead) * sizeof(int16_t)) &&
                      ring_.Allocate(stride_ * static_cast<size_t>(held_) * sizeof(int16_t) + 1) &&
                      rows_.Allocate(stride_ * sizeof(int16_t)) &&
                      sums_.Allocate(plan.samples * sizeof(int32_t)) &&
                      pointers_.Allocate(pointers * sizeof(void*));
    return room ? Status::Ok : Status::MemoryAllocationError;
  }

  // Samples in a buffer for `Row`.
  size_t Stride() const { return stride_; }

  // Row y; must be called in ascending order.
  void Row(int32_t y, int16_t* row) {
    if (plan_->down.grid == 1) return BlurSource(y, row);
    const FilterWindow window = plan_->down.CellsOf(y);
    if (!begun_) filled_ = window.first;
    begun_ = true;
    for (; filled_ < window.first + window.taps; ++filled_) BlurSource(filled_, Slot(filled_));
    const int16_t** rows = pointers_.Items<const int16_t*>().data();
    for (int32_t t = 0; t < window.taps; ++t) rows[t] = Slot(window.first + t);
    kernels_.weighShorts(rows, window, plan_->down.up.Shift(), stride_, row);
  }

 private:
  int16_t* Slot(int32_t cell) {
    const int32_t slot = (cell % held_ + held_) % held_;
    return ring_.Items<int16_t>().data() + static_cast<size_t>(slot) * stride_;
  }

  // Sums up weighted source rows for a cell, or around a row, and blurs the result horizontally.
  void BlurSource(int32_t cell, int16_t* row) {
    int16_t* padded = padded_.Items<int16_t>().data();
    const size_t channels = plan_->channels,
                 padding = static_cast<size_t>(plan_->padding) * channels;
    WeighSource(plan_->down.PixelsOf(cell), padded + padding);
    int16_t *start = padded + padding, *end = start + plan_->samples;
    for (size_t i = 0; i < padding; i += channels) {
      std::memcpy(padded + i, start, channels * sizeof(int16_t));
      std::memcpy(end + i, end - channels, channels * sizeof(int16_t));
    }
    const auto scale = channels == 3 ? kernels_.scaleThree : kernels_.scaleFour;
    const auto pixels = static_cast<int32_t>(plan_->toCells.size());
    if (plan_->toPixels.empty())
      return scale(padded, plan_->toCells.data(), pixels, plan_->across.down.Shift(), row);
    int16_t* cells = cells_.Items<int16_t>().data();
    scale(padded, plan_->toCells.data(), pixels, plan_->across.down.Shift(), cells);
    scale(cells, plan_->toPixels.data(), plan_->across.count, plan_->across.up.Shift(), row);
  }

  void WeighSource(const FilterWindow& window, int16_t* row) {
    const PackedImage& image = *plan_->image;
    const int32_t shift = plan_->down.down.Shift(), last = image.Height() - 1;
    if (plan_->alpha == nullptr && plan_->samples >= kWeighedAtOnce) {
      const uint8_t** rows = pointers_.Items<const uint8_t*>().data();
      for (int32_t t = 0; t < window.taps; ++t)
        rows[t] = image.Row(std::clamp(window.first + t, 0, last)).data();
      return kernels_.weighBytes(rows, window, shift - kFraction, plan_->samples, row);
    }
    int32_t* sums = sums_.Items<int32_t>().data();
    int16_t* samples = rows_.Items<int16_t>().data();
    std::fill_n(sums, plan_->samples, 1 << (shift - 1));
    for (int32_t t = 0; t < window.taps; ++t) {
      const int32_t weight = window.weights[t];
      if (weight == 0) continue;
      Convert(std::clamp(window.first + t, 0, last), samples);
      for (size_t i = 0; i < plan_->samples; ++i) sums[i] += weight * samples[i];
    }
    for (size_t i = 0; i < plan_->samples; ++i) row[i] = static_cast<int16_t>(sums[i] >> shift);
  }

  void Convert(int32_t y, int16_t* samples) const {
    const uint8_t* bgr = plan_->image->Row(y).data();
    if (plan_->alpha == nullptr) return kernels_.widen(bgr, plan_->samples, samples);
    kernels_.multiply(bgr, plan_->alpha->Row(y).data(), static_cast<size_t>(plan_->image->Width()),
                      samples);
  }

  const ResampleKernels& kernels_ = ResampleKernelsHere();
  const GaussianPlan* plan_ = nullptr;
  size_t stride_ = 0;
  int32_t held_ = 0, filled_ = 0;
  bool begun_ = false;
  platform::MemoryBlock padded_, cells_, ring_, rows_, sums_, pointers_;
};

// Divides colors by their alpha. Fully transparent pixels become black.
void SplitAlpha(const int16_t* samples, int32_t width, uint8_t* bgr, uint8_t* alpha) {
  for (int32_t x = 0; x < width; ++x, samples += 4, bgr += 3) {
    const int32_t level = std::clamp((samples[3] + (1 << (kFraction - 1))) >> kFraction, 0, 255);
    alpha[x] = static_cast<uint8_t>(level);
    const float scale = level == 0 ? 0 : 255.0f / static_cast<float>(samples[3]);
    for (int c = 0; c < 3; ++c) {
      bgr[c] = static_cast<uint8_t>(
          std::clamp(static_cast<float>(samples[c]) * scale + 0.5f, 0.0f, 255.0f));
    }
  }
}

// Converts a row of blurred samples to the result; `y` is its row in the picture.
using FinishRow = std::function<void(int32_t y, int16_t* samples)>;

// Replaces the rows of a picture with ones computed from blurred rows.
Status FilterPicture(PictureRecord& picture, double sigma, const GaussianPlace& place,
                     const Work& work, const FinishRow& finish) {
  if (picture.image.Empty()) return Status::EmptyImage;
  RETURN_IF_BAD(PromotePicture(picture));
  const int32_t width = picture.image.Width(), height = picture.image.Height();
  GaussianPlan plan;
  plan.Make(picture, sigma, place);
  PackedImage image, alpha;
  RETURN_IF_BAD(NewPackedImage(width, height, nullptr, 24, image));
  if (plan.alpha != nullptr) RETURN_IF_BAD(NewAlphaPlane(width, height, alpha));
  const int32_t least = std::max(kLeastRows, plan.down.grid * plan.down.up.Taps());
  const auto filterBand = [&](int32_t first, int32_t end) {
    GaussianRows rows;
    RETURN_IF_BAD(rows.Open(plan));
    platform::MemoryBlock block;
    if (!block.Allocate(rows.Stride() * sizeof(int16_t))) return Status::MemoryAllocationError;
    int16_t* samples = block.Items<int16_t>().data();
    for (int32_t y = first; y < end; ++y) {
      if (!work.GoesOn()) return Status::FunctionCancelled;  // bands of a wide blur take long
      rows.Row(y, samples);
      if (finish) finish(y, samples);
      if (plan.alpha != nullptr) {
        SplitAlpha(samples, width, image.Row(y).data(), alpha.Row(y).data());
      } else {
        ResampleKernelsHere().narrow(samples, plan.samples, image.Row(y).data());
      }
    }
    return Status::Ok;
  };
  RETURN_IF_BAD(ForBands(height, least, work, filterBand));
  picture.image = std::move(image);
  picture.alpha = std::move(alpha);
  return Status::Ok;
}

}  // namespace

int32_t GaussianReach(double sigma) {
  // Both passes, plus one cell for each.
  const auto grid = std::max(1, static_cast<int32_t>(kGrid * sigma));
  const double reach = grid == 1 ? kCut * sigma : kCut * sigma * std::numbers::sqrt2 + grid;
  return static_cast<int32_t>(std::ceil(reach)) + 1;
}

Status BlurPicture(PictureRecord& picture, double sigma, const GaussianPlace& place,
                   const Work& work) {
  return FilterPicture(picture, sigma, place, work, {});
}

Status UnsharpPicture(PictureRecord& picture, double sigma, double amount, double threshold,
                      const GaussianPlace& place, const Work& work) {
  const auto factor = static_cast<int32_t>(std::lround(std::ldexp(amount, kSharpenBits)));
  const auto least = static_cast<int32_t>(std::ceil(threshold * (1 << kFraction)));
  if (picture.image.Empty()) return Status::EmptyImage;
  RETURN_IF_BAD(PromotePicture(picture));
  const auto width = static_cast<size_t>(picture.image.Width());
  const bool hasAlpha = !picture.alpha.Empty();
  const auto sharpen = [=, &picture](int32_t y, int16_t* samples) {
    const uint8_t* bgr = picture.image.Row(y).data();
    const uint8_t* alpha = hasAlpha ? picture.alpha.Row(y).data() : nullptr;
    const auto sharpened = [=](int32_t v, int32_t blurred) {
      const int32_t difference = v - blurred;
      const int32_t more =
          std::abs(difference) >= least ? (factor * difference) >> kSharpenBits : 0;
      return static_cast<int16_t>(std::clamp(v + more, 0, kOpaque));
    };
    if (!hasAlpha) return ResampleKernelsHere().sharpen(bgr, 3 * width, factor, least, samples);
    std::array<int16_t, 4> own;
    for (size_t x = 0; x < width; ++x, samples += 4) {
      ResampleKernelsHere().multiply(bgr + 3 * x, alpha + x, 1, own.data());
      for (size_t c = 0; c < 4; ++c) samples[c] = sharpened(own[c], samples[c]);
    }
  };
  return FilterPicture(picture, sigma, place, work, sharpen);
}

}  // namespace fotomill
