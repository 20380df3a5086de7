#include "catalog/similar/picture_hash.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <numbers>

#include "core/md5.h"
#include "processing/flatten.h"
#include "processing/geometry/scale.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr int32_t kSide = 32, kFrequencies = 8;
// Coefficients are compared in steps of 1/16, so that rounding errors do not separate equal ones.
constexpr double kSteps = 16;

using Levels = std::array<double, static_cast<size_t>(kSide) * kSide>;
using Coefficients = std::array<int64_t, static_cast<size_t>(kFrequencies) * kFrequencies>;

Coefficients Transformed(const Levels& levels) {
  static const auto wave = [] {
    std::array<std::array<double, kSide>, kFrequencies> table{};
    for (size_t u = 0; u < kFrequencies; ++u) {
      for (size_t x = 0; x < kSide; ++x)
        table[u][x] = std::cos((2.0 * static_cast<double>(x) + 1) * static_cast<double>(u) *
                               std::numbers::pi / (2 * kSide));
    }
    return table;
  }();
  Coefficients result{};
  for (size_t v = 0; v < kFrequencies; ++v) {
    for (size_t u = 0; u < kFrequencies; ++u) {
      double sum = 0;
      for (size_t y = 0; y < kSide; ++y) {
        double row = 0;
        for (size_t x = 0; x < kSide; ++x) row += levels[y * kSide + x] * wave[u][x];
        sum += row * wave[v][y];
      }
      result[v * kFrequencies + u] = std::llround(sum * kSteps / kSide);
    }
  }
  return result;
}

// The first coefficient is the mean brightness, which is irrelevant for similarity.
PictureHash BitsOf(const Coefficients& coefficients) {
  Coefficients sorted = coefficients;
  const auto middle = sorted.begin() + 1 + (sorted.size() - 1) / 2;
  std::nth_element(sorted.begin() + 1, middle, sorted.end());
  PictureHash hash = 0;
  for (size_t i = 1; i < coefficients.size(); ++i) {
    if (coefficients[i] > *middle) hash |= PictureHash{1} << i;
  }
  return hash;
}

// Mirroring changes the sign of every other frequency.
Coefficients Turned(const Coefficients& own, bool across, bool down, bool swapped) {
  Coefficients turned{};
  for (size_t v = 0; v < kFrequencies; ++v) {
    for (size_t u = 0; u < kFrequencies; ++u) {
      const bool negative = (across && u % 2 != 0) != (down && v % 2 != 0);
      const int64_t value = swapped ? own[u * kFrequencies + v] : own[v * kFrequencies + u];
      turned[v * kFrequencies + u] = negative ? -value : value;
    }
  }
  return turned;
}

Levels LevelsOf(const PackedImage& image, const PackedImage& alpha, Color background) {
  Levels levels{};
  for (int32_t y = 0; y < kSide; ++y) {
    const uint8_t* pixel = image.Row(y).data();
    for (int32_t x = 0; x < kSide; ++x, pixel += 3) {
      double level = 0.114 * pixel[0] + 0.587 * pixel[1] + 0.299 * pixel[2];
      if (!alpha.Empty()) {
        const double opaque = alpha.Row(y)[static_cast<size_t>(x)] / 255.0;
        const double behind = 0.114 * (background >> 16 & 0xff) + 0.587 * (background >> 8 & 0xff) +
                              0.299 * (background & 0xff);
        level = level * opaque + behind * (1 - opaque);
      }
      levels[static_cast<size_t>(y * kSide + x)] = level;
    }
  }
  return levels;
}

}  // namespace

Status HashPicture(const PictureRecord& picture, PictureHashes& hashes) {
  if (picture.image.Empty()) return Status::EmptyImage;
  PackedImage small, alpha;
  RETURN_IF_BAD(ScaleFiltered(picture.image, picture.alpha, ReachOf(picture), {kSide, kSide},
                              ScaleOptions{.filter = ScaleFilter::Bilinear}, small, alpha));
  const Coefficients own = Transformed(LevelsOf(small, alpha, picture.defaultColour));
  for (size_t i = 0; i < hashes.size(); ++i)
    hashes[i] = BitsOf(Turned(own, (i & 1) != 0, (i & 2) != 0, (i & 4) != 0));
  return Status::Ok;
}

int32_t HashDistance(PictureHash a, PictureHash b) { return std::popcount(a ^ b); }

Status DigestPixels(const PictureRecord& picture, std::string& digest) {
  if (picture.image.Empty()) return Status::EmptyImage;
  const auto width = static_cast<size_t>(picture.image.Width());
  const bool alpha = !picture.alpha.Empty() && !IsOpaque(picture.alpha);
  BgrRows rows;
  RETURN_IF_BAD(rows.Open(picture.image));
  // Hashes the digests of the rows.
  std::string all = std::to_string(width) + (alpha ? "a" : "");
  for (int32_t y = 0; y < picture.image.Height(); ++y) {
    all += Md5Text({rows.Row(y), width * 3});
    if (alpha) all += Md5Text(picture.alpha.Row(y).first(width));
  }
  digest = Md5Text({reinterpret_cast<const uint8_t*>(all.data()), all.size()});
  return Status::Ok;
}

}  // namespace fotomill
