#include "processing/filters/box_blur.h"

#include <algorithm>
#include <array>

#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr int32_t kLeastRows = 64;  // per band: its first row costs as much as the window height
constexpr size_t kChannels = 4;     // blue, green, red times alpha, and alpha

// Division by a constant, rounded to nearest. Exact for dividends below 2^24 and odd divisors below
// 2^16: rounding up the reciprocal adds less than 2^-16, the minimum distance to the next integer.
class Divider {
 public:
  explicit Divider(uint32_t by) : half_(by / 2), inverse_(((uint64_t{1} << 40) + by - 1) / by) {}
  uint8_t operator()(uint32_t number) const {
    return static_cast<uint8_t>((number + half_) * inverse_ >> 40);
  }

 private:
  uint64_t half_, inverse_;
};

struct BoxBlur {
  const PackedImage& image;
  const PackedImage* alpha;  // null if none
  int32_t radius;
  size_t samples = 0;  // per row

  int32_t Inside(int32_t y) const { return std::clamp(y, 0, image.Height() - 1); }

  // Adds a source row to the column sums, or subtracts it.
  template <bool subtract>
  void Gather(int32_t y, std::span<uint32_t> sums) const {
    const uint8_t* bgr = image.Row(Inside(y)).data();
    if (alpha == nullptr) {
      for (size_t i = 0; i < samples; ++i) sums[i] = subtract ? sums[i] - bgr[i] : sums[i] + bgr[i];
      return;
    }
    const uint8_t* opacity = alpha->Row(Inside(y)).data();
    for (size_t i = 0; i < samples; i += kChannels, bgr += 3, ++opacity) {
      const uint32_t a = *opacity, weighed[kChannels] = {bgr[0] * a, bgr[1] * a, bgr[2] * a, a};
      for (size_t c = 0; c < kChannels; ++c)
        sums[i + c] = subtract ? sums[i + c] - weighed[c] : sums[i + c] + weighed[c];
    }
  }

  // Window sums along a row, from column sums.
  template <size_t channels, typename Put>
  void Along(std::span<const uint32_t> sums, Put put) const {
    const int32_t last = image.Width() - 1;
    const auto column = [&](int32_t x) {
      return &sums[static_cast<size_t>(std::clamp(x, 0, last)) * channels];
    };
    std::array<uint32_t, channels> window{};
    for (int32_t x = -radius; x < radius; ++x) {
      for (size_t c = 0; c < channels; ++c) window[c] += column(x)[c];
    }
    for (int32_t x = 0; x <= last; ++x) {
      const uint32_t *come = column(x + radius), *go = column(x - radius);
      for (size_t c = 0; c < channels; ++c) window[c] += come[c];
      put(x, window);
      for (size_t c = 0; c < channels; ++c) window[c] -= go[c];
    }
  }

  Status Band(int32_t first, int32_t end, PackedImage& target, PackedImage& targetAlpha) const {
    platform::MemoryBlock room;
    if (!room.Allocate(samples * sizeof(uint32_t))) return Status::MemoryAllocationError;
    const std::span<uint32_t> sums = room.Items<uint32_t>();
    const Divider divide((2 * static_cast<uint32_t>(radius) + 1) *
                         (2 * static_cast<uint32_t>(radius) + 1));
    for (int32_t y = first - radius; y < first + radius; ++y) Gather<false>(y, sums);
    for (int32_t y = first; y < end; ++y) {
      Gather<false>(y + radius, sums);
      uint8_t* row = target.Row(y).data();
      if (alpha == nullptr) {
        Along<3>(sums, [&](int32_t, const std::array<uint32_t, 3>& window) {
          for (const uint32_t sum : window) *row++ = divide(sum);
        });
      } else {
        uint8_t* opacity = targetAlpha.Row(y).data();
        Along<kChannels>(sums, [&](int32_t, const std::array<uint32_t, kChannels>& window) {
          const uint64_t weight = window[3];
          for (size_t c = 0; c < 3; ++c)
            *row++ =
                weight == 0 ? uint8_t{0} : static_cast<uint8_t>((window[c] + weight / 2) / weight);
          *opacity++ = divide(window[3]);
        });
      }
      Gather<true>(y - radius, sums);
    }
    return Status::Ok;
  }
};

}  // namespace

Status BoxBlurPicture(PictureRecord& picture, int32_t radius, const Work& work) {
  if (picture.image.Empty()) return Status::EmptyImage;
  RETURN_IF_BAD(PromotePicture(picture));
  if (radius == 0) return Status::Ok;
  const int32_t width = picture.image.Width(), height = picture.image.Height();
  PackedImage image, alpha;
  RETURN_IF_BAD(NewPackedImage(width, height, nullptr, 24, image));
  if (!picture.alpha.Empty()) RETURN_IF_BAD(NewAlphaPlane(width, height, alpha));
  const bool hasAlpha = !picture.alpha.Empty();
  const BoxBlur blur{picture.image, hasAlpha ? &picture.alpha : nullptr, radius,
                     static_cast<size_t>(width) * (hasAlpha ? kChannels : 3)};
  RETURN_IF_BAD(
      ForBands(height, std::max(kLeastRows, 4 * radius), work,
               [&](int32_t first, int32_t end) { return blur.Band(first, end, image, alpha); }));
  picture.image = std::move(image);
  picture.alpha = std::move(alpha);
  return Status::Ok;
}

}  // namespace fotomill
