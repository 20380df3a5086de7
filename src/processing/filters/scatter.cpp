#include "processing/filters/scatter.h"

#include <algorithm>
#include <cmath>
#include <cstring>

#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr int32_t kLeastRows = 64;

uint64_t Mixed(uint64_t bits) {
  bits = (bits ^ bits >> 30) * 0xbf58476d1ce4e5b9u;
  bits = (bits ^ bits >> 27) * 0x94d049bb133111ebu;
  return bits ^ bits >> 31;
}

// Approximates a normal distribution: the sum of eight random bytes averages 1020, with a variance
// of 8 (256^2 - 1) / 12.
constexpr int32_t kMeanOfBytes = 1020;
const double kDeviationOfBytes = std::sqrt(8 * 65535 / 12.0);

int32_t SumOfBytes(uint64_t bits) {
  int32_t sum = 0;
  for (; bits != 0; bits >>= 8) sum += static_cast<int32_t>(bits & 255);
  return sum;
}

// Change of a level, in 1 / 65536, per unit of a random number.
struct Deviation {
  NoiseKind kind;
  int64_t step;

  explicit Deviation(const NoiseOptions& options) : kind(options.kind) {
    const double levels = options.amount * 2.55 * 65536;
    step = std::llround(kind == NoiseKind::Uniform ? levels / 32768 * 256
                                                   : levels / kDeviationOfBytes * 256);
  }
  int64_t Of(uint64_t bits) const {
    const int64_t chance = kind == NoiseKind::Uniform ? static_cast<int64_t>(bits >> 48) - 32768
                                                      : SumOfBytes(bits) - kMeanOfBytes;
    return chance * step;
  }
};
constexpr int32_t kDeviationBits = 24;

void Change(uint8_t& level, int64_t by) {
  const int64_t sum =
      (static_cast<int64_t>(level) << kDeviationBits) + by + (int64_t{1} << (kDeviationBits - 1));
  level = static_cast<uint8_t>(std::clamp<int64_t>(sum >> kDeviationBits, 0, 255));
}

void NoiseRow(const NoiseOptions& options, const Deviation& deviation, int32_t y, int32_t width,
              uint8_t* bgr) {
  const auto share = static_cast<uint64_t>(std::llround(options.amount / 100 * 4294967296.0));
  for (int32_t x = 0; x < width; ++x, bgr += 3) {
    uint64_t bits = RandomAt(options.seed, x + options.left, y + options.top);
    if (options.kind == NoiseKind::SaltPepper) {
      if ((bits >> 32) < share) std::memset(bgr, (bits & 1) != 0 ? 255 : 0, 3);
      continue;
    }
    for (int c = 0; c < 3; ++c) {
      Change(bgr[c], deviation.Of(bits));
      if (!options.gray) bits = Mixed(bits + 0x9e3779b97f4a7c15u);
    }
  }
}

}  // namespace

uint64_t RandomAt(uint64_t seed, int32_t x, int32_t y) {
  const uint64_t place =
      static_cast<uint64_t>(static_cast<uint32_t>(y)) << 32 | static_cast<uint32_t>(x);
  return Mixed(Mixed(place + 0x9e3779b97f4a7c15u) + Mixed(seed + 0x9e3779b97f4a7c15u));
}

Status AddNoise(PictureRecord& picture, const NoiseOptions& options, const Work& work) {
  if (picture.image.Empty()) return Status::EmptyImage;
  RETURN_IF_BAD(PromotePicture(picture));
  const Deviation deviation(options);
  return ForBands(picture.image.Height(), kLeastRows, work, [&](int32_t first, int32_t end) {
    for (int32_t y = first; y < end; ++y)
      NoiseRow(options, deviation, y, picture.image.Width(), picture.image.Row(y).data());
    return Status::Ok;
  });
}

Status SpreadPicture(PictureRecord& picture, int32_t radius, uint32_t seed, int32_t left,
                     int32_t top, const Work& work) {
  if (picture.image.Empty()) return Status::EmptyImage;
  RETURN_IF_BAD(PromotePicture(picture));
  const int32_t width = picture.image.Width(), height = picture.image.Height();
  PackedImage image, alpha;
  RETURN_IF_BAD(NewPackedImage(width, height, nullptr, 24, image));
  if (!picture.alpha.Empty()) RETURN_IF_BAD(NewAlphaPlane(width, height, alpha));
  const auto choices = static_cast<uint64_t>(2 * radius + 1);
  // Maps 32 random bits to one of the choices.
  const auto way = [&](uint64_t bits) {
    return static_cast<int32_t>((bits & 0xffffffff) * choices >> 32) - radius;
  };
  RETURN_IF_BAD(ForBands(height, kLeastRows, work, [&](int32_t first, int32_t end) {
    for (int32_t y = first; y < end; ++y) {
      uint8_t* bgr = image.Row(y).data();
      for (int32_t x = 0; x < width; ++x) {
        const uint64_t bits = RandomAt(seed, x + left, y + top);
        const auto column = static_cast<size_t>(std::clamp(x + way(bits), 0, width - 1));
        const int32_t row = std::clamp(y + way(bits >> 32), 0, height - 1);
        std::memcpy(bgr + 3 * static_cast<size_t>(x), picture.image.Row(row).data() + 3 * column,
                    3);
        if (!alpha.Empty()) alpha.Row(y)[static_cast<size_t>(x)] = picture.alpha.Row(row)[column];
      }
    }
    return Status::Ok;
  }));
  picture.image = std::move(image);
  picture.alpha = std::move(alpha);
  return Status::Ok;
}

}  // namespace fotomill
