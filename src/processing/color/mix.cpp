#include "processing/color/mix.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstring>
#include <memory>
#include <utility>

#ifdef __SSE2__
#include <emmintrin.h>
#endif

namespace fotomill {

namespace {

// Sums are fixed-point: 11 integer bits cover the range of a sum, 20 bits are the fraction.
constexpr int32_t kFraction = 20;
// Compensates for rounding of the three terms, so that ties still round up.
constexpr double kTieBias = 2;

using Four [[gnu::vector_size(16)]] = int32_t;

// Contribution of each old channel value to the new blue, green and red; the fourth number is 0.
struct MixTables {
  std::array<std::array<Four, 256>, 3> parts;  // for old blue, green, red
};

// The integer part of each sum, clamped to 0 to 255, lowest byte first.
uint32_t Packed(Four sums) {
  const Four levels = sums >> kFraction;
#ifdef __SSE2__
  __m128i packed;
  std::memcpy(&packed, &levels, sizeof packed);
  packed = _mm_packs_epi32(packed, packed);
  return static_cast<uint32_t>(_mm_cvtsi128_si32(_mm_packus_epi16(packed, packed)));
#else
  uint32_t packed = 0;
  for (int i = 0; i < 3; ++i)
    packed |= static_cast<uint32_t>(std::clamp(levels[i], 0, 255)) << (8 * i);
  return packed;
#endif
}

void ApplyMix(const MixTables& tables, uint8_t* bgr, size_t pixels) {
  const Four *blue = tables.parts[0].data(), *green = tables.parts[1].data(),
             *red = tables.parts[2].data();
  const auto mixed = [&](const uint8_t* from) {
    return Packed(blue[from[0]] + green[from[1]] + red[from[2]]);
  };
  const auto store = [](uint8_t* to, uint32_t value) { std::memcpy(to, &value, sizeof value); };
  constexpr bool kLowestFirst = std::endian::native == std::endian::little;
  // four pixels are three 32-bit words
  for (; kLowestFirst && pixels >= 4; pixels -= 4, bgr += 12) {
    const uint32_t a = mixed(bgr), b = mixed(bgr + 3), c = mixed(bgr + 6), d = mixed(bgr + 9);
    store(bgr, a | b << 24);
    store(bgr + 4, b >> 8 | c << 16);
    store(bgr + 8, c >> 16 | d << 8);
  }
  for (; pixels > 0; --pixels, bgr += 3) {
    const uint32_t color = mixed(bgr);
    for (int c = 0; c < 3; ++c) bgr[c] = static_cast<uint8_t>(color >> (8 * c));
  }
}

PointEffect EffectOfTables(std::shared_ptr<const MixTables> tables) {
  PointEffect effect;
  effect.colors = [tables](uint8_t* bgr, size_t pixels) { ApplyMix(*tables, bgr, pixels); };
  effect.after = [tables](const std::array<ChannelTable, 3>& first) {
    const auto both = std::make_shared<MixTables>();
    for (size_t c = 0; c < 3; ++c) {
      for (size_t v = 0; v < 256; ++v) both->parts[c][v] = tables->parts[c][first[c][v]];
    }
    return EffectOfTables(both);
  };
  return effect;
}

constexpr MixMatrix kSame = {{{1, 0, 0, 0}, {0, 1, 0, 0}, {0, 0, 1, 0}}};
constexpr MixMatrix kGray = {
    {{0.299, 0.587, 0.114, 0}, {0.299, 0.587, 0.114, 0}, {0.299, 0.587, 0.114, 0}}};
constexpr MixMatrix kSepia = {
    {{0.393, 0.769, 0.189, 0}, {0.349, 0.686, 0.168, 0}, {0.272, 0.534, 0.131, 0}}};

// from + (to - from) share.
MixMatrix Between(const MixMatrix& from, const MixMatrix& to, double share) {
  MixMatrix matrix;
  for (size_t row = 0; row < 3; ++row) {
    for (size_t i = 0; i < 4; ++i)
      matrix[row][i] = from[row][i] + (to[row][i] - from[row][i]) * share;
  }
  return matrix;
}

// Applies a function from color to color to each pixel.
template <typename Function>
PointEffect EachColor(Function function) {
  PointEffect effect;
  effect.colors = [=](uint8_t* bgr, size_t pixels) {
    for (size_t i = 0; i < pixels; ++i, bgr += 3) function(bgr);
  };
  return effect;
}

// A hue is a position on a circle of six sectors. In each sector, one channel is the maximum,
// one the minimum, and one rises or falls between them. Indices of those channels: blue 0, green
// 1, red 2.
struct Sector {
  uint8_t largest, between, smallest;
  bool rises;
};
constexpr Sector kSectors[6] = {{2, 1, 0, true}, {1, 2, 0, false}, {1, 0, 2, true},
                                {0, 1, 2, false}, {0, 2, 1, true}, {2, 0, 1, false}};

uint32_t SectorOf(const uint8_t* bgr) {
  // indexed by the bits red >= green, green >= blue, blue > red; 0 and 7 are impossible
  constexpr uint8_t kSectorOf[] = {0, 3, 1, 2, 5, 4, 0, 0};
  const uint8_t b = bgr[0], g = bgr[1], r = bgr[2];
  return kSectorOf[(r >= g) << 2 | (g >= b) << 1 | static_cast<int>(b > r)];
}

// The effect of rotating all hues by 0 to 6 sectors on a position within a sector. Positions are in
// units of the pixel's own chroma, which avoids division.
class HueTurn {
 public:
  explicit HueTurn(double turn) : sectors_(static_cast<uint32_t>(turn)) {
    for (int32_t rising = 0; rising < 2; ++rising) {
      for (int32_t chroma = 0; chroma < 256; ++chroma) {
        for (int32_t place = 0; place <= chroma; ++place)
          At(rising != 0, chroma, place) = Place(turn, rising != 0, chroma, place);
      }
    }
  }

  void Apply(uint8_t* bgr) {
    const uint32_t from = SectorOf(bgr);
    const Sector& old = kSectors[from];
    const int32_t most = bgr[old.largest], least = bgr[old.smallest], between = bgr[old.between];
    const NewPlace& place =
        At(old.rises, most - least, old.rises ? between - least : most - between);
    const uint32_t to = from + sectors_ + place.further;
    const Sector& next = kSectors[to < 6 ? to : to - 6];
    bgr[next.largest] = static_cast<uint8_t>(most);
    bgr[next.smallest] = static_cast<uint8_t>(least);
    bgr[next.between] = static_cast<uint8_t>(least + place.level);
  }

 private:
  struct NewPlace {
    uint8_t level;    // of the middle channel, above the minimum
    uint8_t further;  // 1: one sector beyond the rotation's
  };

  NewPlace& At(bool rising, int32_t chroma, int32_t place) {
    return places_[static_cast<size_t>((rising ? 1 << 16 : 0) | chroma << 8 | place)];
  }

  static NewPlace Place(double turn, bool rising, int32_t chroma, int32_t place) {
    const double turned = turn * chroma + place;
    auto sectors = static_cast<int32_t>(turn);
    const uint8_t further = turned >= (sectors + 1) * chroma && chroma > 0 ? 1 : 0;
    sectors += further;
    const double rest = turned - sectors * chroma;
    const bool rises = rising == (sectors % 2 == 0);
    return {RoundedLevel((rises ? rest : chroma - rest) + 1e-9), further};
  }

  const uint32_t sectors_;
  std::array<NewPlace, 2 << 16> places_{};
};

}  // namespace

PointEffect MixEffect(const MixMatrix& matrix) {
  const auto tables = std::make_shared<MixTables>();
  const double one = 1 << kFraction;
  for (size_t old = 0; old < 3; ++old) {
    for (int32_t v = 0; v < 256; ++v) {
      Four& part = tables->parts[old][static_cast<size_t>(v)];
      part = Four{};
      for (size_t made = 0; made < 3; ++made) {
        const std::array<double, 4>& row = matrix[2 - made];
        const double rounding = old == 0 ? (row[3] + 0.5) * one + kTieBias : 0;
        part[static_cast<int>(made)] =
            static_cast<int32_t>(std::lround(row[2 - old] * v * one + rounding));
      }
    }
  }
  return EffectOfTables(tables);
}

PointEffect GrayEffect() { return MixEffect(kGray); }
PointEffect SaturationEffect(double share) { return MixEffect(Between(kGray, kSame, share)); }
PointEffect SepiaEffect(double share) { return MixEffect(Between(kSame, kSepia, share)); }

PointEffect KeepEffect(KeptChannel channel) {
  MixMatrix matrix{};
  for (auto& row : matrix) row[static_cast<size_t>(channel)] = 1;
  return MixEffect(matrix);
}

PointEffect SwapEffect(SwappedChannels channels) {
  constexpr std::pair<uint8_t, uint8_t> kPlaces[] = {{2, 1}, {2, 0}, {1, 0}};
  const std::pair<uint8_t, uint8_t> places = kPlaces[static_cast<size_t>(channels)];
  return EachColor([=](uint8_t* bgr) { std::swap(bgr[places.first], bgr[places.second]); });
}

PointEffect ThresholdEffect(int32_t t) {
  return EachColor([limit = 1000 * t](uint8_t* bgr) {
    bgr[0] = bgr[1] = bgr[2] = LumaThousandths(bgr[2], bgr[1], bgr[0]) >= limit ? 255 : 0;
  });
}

PointEffect HueEffect(double degrees) {
  double turn = std::fmod(degrees / 60, 6);
  if (turn < 0) turn += 6;
  const auto table = std::make_shared<HueTurn>(turn);
  return EachColor([table](uint8_t* bgr) { table->Apply(bgr); });
}

PointEffect ColorizeEffect(const BgrColor& color, const BgrColor& dark, const BgrColor& light) {
  constexpr double kMiddle = 127.5;
  std::array<BgrColor, 256> colors;
  for (size_t v = 0; v < 256; ++v) {
    for (size_t c = 0; c < 3; ++c) {
      const auto level = static_cast<double>(v);
      colors[v][c] = RoundedLevel(
          level <= kMiddle ? dark[c] + (color[c] - dark[c]) * level / kMiddle
                           : color[c] + (light[c] - color[c]) * (level - kMiddle) / kMiddle);
    }
  }
  return EachColor(
      [colors](uint8_t* bgr) { std::memcpy(bgr, colors[Luma(bgr[2], bgr[1], bgr[0])].data(), 3); });
}

}  // namespace fotomill
