#include "processing/color/histogram_effects.h"

#include <mutex>
#include <numeric>

#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr int32_t kLeastRows = 64;  // per band

// Two alternating sets of counters: adjacent pixels are often equal, and incrementing the same
// counter twice in a row would stall.
using RowCounts = std::array<std::array<std::array<uint32_t, 256>, 3>, 2>;

void CountRow(const uint8_t* bgr, int32_t width, RowCounts& counts) {
  for (int32_t x = 0; x < width; ++x, bgr += 3) {
    auto& set = counts[static_cast<size_t>(x & 1)];
    for (size_t c = 0; c < 3; ++c) ++set[c][bgr[c]];
  }
}

void CountVisible(const uint8_t* bgr, const uint8_t* alpha, int32_t width, RowCounts& counts) {
  for (int32_t x = 0; x < width; ++x, bgr += 3) {
    const uint32_t seen = alpha[x] != 0;
    for (size_t c = 0; c < 3; ++c) counts[0][c][bgr[c]] += seen;
  }
}

int32_t Lowest(const std::array<uint64_t, 256>& counts, uint64_t cut) {
  uint64_t sum = 0;
  for (int32_t v = 0; v < 256; ++v) {
    sum += counts[static_cast<size_t>(v)];
    if (sum > cut) return v;
  }
  return 255;
}

int32_t Highest(const std::array<uint64_t, 256>& counts, uint64_t cut) {
  uint64_t sum = 0;
  for (int32_t v = 255; v >= 0; --v) {
    sum += counts[static_cast<size_t>(v)];
    if (sum > cut) return v;
  }
  return 0;
}

uint64_t SumOf(const std::array<uint64_t, 256>& counts) {
  return std::accumulate(counts.begin(), counts.end(), uint64_t{0});
}

}  // namespace

Status CountLevels(const PictureRecord& picture, const Work& work, LevelCounts& counts) {
  if (picture.image.Empty()) return Status::EmptyImage;
  counts = {};
  std::mutex adding;
  return ForBands(picture.image.Height(), kLeastRows, work, [&](int32_t first, int32_t end) {
    BgrRows rows;
    RETURN_IF_BAD(rows.Open(picture.image));
    RowCounts own{};
    for (int32_t y = first; y < end; ++y) {
      const uint8_t* bgr = rows.Row(y);
      if (picture.alpha.Empty()) {
        CountRow(bgr, picture.image.Width(), own);
      } else {
        CountVisible(bgr, picture.alpha.Row(y).data(), picture.image.Width(), own);
      }
    }
    const std::scoped_lock lock(adding);
    for (size_t c = 0; c < 3; ++c) {
      for (size_t v = 0; v < 256; ++v) counts[c][v] += uint64_t{own[0][c][v]} + own[1][c][v];
    }
    return Status::Ok;
  });
}

LevelCounts TogetherCounts(const LevelCounts& counts) {
  LevelCounts together;
  for (size_t v = 0; v < 256; ++v) {
    together[0][v] = together[1][v] = together[2][v] = counts[0][v] + counts[1][v] + counts[2][v];
  }
  return together;
}

PointEffect StretchEffect(const LevelCounts& counts, double clip) {
  PointEffect effect;
  for (size_t c = 0; c < 3; ++c) {
    const auto cut = static_cast<uint64_t>(static_cast<double>(SumOf(counts[c])) * clip / 100);
    const int32_t low = Lowest(counts[c], cut), high = Highest(counts[c], cut);
    const bool spread = high > low;
    effect.tables[c] =
        EffectOf([=](double v) { return spread ? 255 * (v - low) / (high - low) : v; }).tables[c];
  }
  return effect;
}

PointEffect EqualizeEffect(const LevelCounts& counts) {
  PointEffect effect;
  for (size_t c = 0; c < 3; ++c) {
    const uint64_t all = SumOf(counts[c]) - counts[c][static_cast<size_t>(Highest(counts[c], 0))];
    uint64_t below = 0;
    for (size_t v = 0; v < 256; ++v) {
      effect.tables[c][v] =
          all == 0 ? static_cast<uint8_t>(v)
                   : RoundedLevel(255 * static_cast<double>(below) / static_cast<double>(all));
      below += counts[c][v];
    }
  }
  return effect;
}

}  // namespace fotomill
