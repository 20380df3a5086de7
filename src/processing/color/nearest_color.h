#pragma once

#include <algorithm>
#include <array>
#include <cfloat>
#include <cstdint>

#include "core/status.h"
#include "picture/palette.h"
#include "platform/memory.h"

namespace fotomill {

// Colors with fractional levels: blue, green and red in sixteenths of a level.
struct ColorPoints {
  static constexpr int32_t kUnits = 16;  // per level
  int32_t count = 0;
  std::array<std::array<int32_t, 3>, 256> channel{};
};

// Converts the first `count` colors of a palette, and back with rounding.
ColorPoints PointsOf(const Palette& palette, int32_t count);
Palette PaletteOf(const ColorPoints& points);  // rounds to whole levels

// Weights of squared differences in blue, green and red: roughly perceptual, yet even enough to
// keep the plain squared error small as well.
inline constexpr int32_t kChannelWeight[3] = {5, 10, 7};

// Finds the nearest of up to 256 colors exactly. The color cube is divided into cells of 16 levels,
// and these into cells of 4; each cell lists the few colors that can be nearest to a point in it,
// computed when the cell is first used.
class NearestColor {
 public:
  // If only FindPoint is needed, the fine cells are omitted. MemoryAllocationError.
  Status Open(bool fine);
  // Sets the colors, at least one. Find uses them rounded to whole levels.
  void SetColors(const ColorPoints& points);

  // The index of the color nearest to blue, green, red, 0 to 255.
  uint8_t Find(int32_t blue, int32_t green, int32_t red) {
    const uint32_t cell = static_cast<uint32_t>((red >> 2) << 12 | (green >> 2) << 6 | blue >> 2);
    const uint32_t known = fine_[cell] != kUnknown ? fine_[cell] : FillFine(cell);
    return known < 256 ? static_cast<uint8_t>(known) : Search(blue, green, red, known >> 8);
  }
  // The index of the color nearest to a point.
  uint8_t FindPoint(const std::array<int32_t, 3>& point);
  // A color rounded to whole levels.
  const int16_t* ColorOf(uint8_t index) const { return levels_[index]; }

 private:
  static constexpr uint32_t kUnknown = 0xffffffff;
  // 16 MB; beyond that, cells use the color nearest to their center
  static constexpr uint32_t kMostGroups = 200'000;
  static constexpr size_t kCoarseList = 257;        // the count minus one, and up to 256 indices

  // Four colors of a fine cell's list. A color's squared distance from a point, minus terms common
  // to all colors, is linear in the point: constant - factor x channel. Four times that, plus the
  // color's position in the group, is an integer below 2^24, so the minimum is exact in a float and
  // identifies the nearest color.
  struct Group {
    using Four [[gnu::vector_size(16)]] = float;
    Four factor[3], constant;
    uint8_t index[4];
    uint32_t groupsLeft;  // groups after this one in the list
    uint64_t unused;
  };

  uint8_t Search(int32_t blue, int32_t green, int32_t red, uint32_t place) const {
    const Group* group = groups_ + place;
    float best = FLT_MAX;
    uint8_t index = 0;
    for (uint32_t left = group->groupsLeft + 1; left > 0; --left, ++group) {
      const Group::Four four = group->constant - group->factor[0] * static_cast<float>(blue) -
                               group->factor[1] * static_cast<float>(green) -
                               group->factor[2] * static_cast<float>(red);
      const Group::Four crossed = __builtin_shufflevector(four, four, 2, 3, 0, 1);
      const Group::Four two = four < crossed ? four : crossed;
      const float least = two[0] < two[1] ? two[0] : two[1];
      if (least < best) {
        best = least;
        index = group->index[static_cast<int32_t>(least) & 3];
      }
    }
    return index;
  }
  const uint8_t* CoarseList(uint32_t cell);
  uint32_t FillFine(uint32_t cell);
  uint32_t StoreGroups(const uint8_t* list, uint32_t groups);

  ColorPoints points_;
  int16_t levels_[256][4] = {};
  platform::MemoryBlock fineBlock_, coarseBlock_, groupBlock_;
  uint32_t* fine_ = nullptr;  // the single index, or (index in `groups_`) << 8
  Group* groups_ = nullptr;
  uint32_t groupsUsed_ = 0;
  std::array<bool, 4096> coarseKnown_{};
};

}  // namespace fotomill
