#include "processing/color/nearest_color.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>

namespace fotomill {

namespace {

using Point = std::array<int32_t, 3>;

int32_t Distance(const Point& a, const Point& b) {
  int32_t sum = 0;  // at most 22 x 4080 x 4080
  for (size_t c = 0; c < 3; ++c) sum += kChannelWeight[c] * (a[c] - b[c]) * (a[c] - b[c]);
  return sum;
}

// Picks those of `count` colors that can be nearest to any point in the cell of `width` levels with
// lowest corner `corner`, starting with the one nearest to its center. Returns how many.
//
// Color j beats color m where its distance is smaller; the difference of the two squared distances
// is linear in the point. Its minimum over the cell is the difference at the center, minus twice
// the weighted half width times the distance of the two colors, per channel.
int32_t PickCandidates(const ColorPoints& points, const uint8_t* from, int32_t count,
                       const Point& corner, int32_t width, uint8_t* picked) {
  const int32_t half = (width - 1) * ColorPoints::kUnits / 2;
  Point middle;
  for (size_t c = 0; c < 3; ++c) middle[c] = corner[c] * ColorPoints::kUnits + half;
  int32_t distances[256];
  int32_t best = 0;
  for (int32_t i = 0; i < count; ++i) {
    distances[i] = Distance(points.channel[from[i]], middle);
    if (distances[i] < distances[best]) best = i;
  }
  const Point& nearest = points.channel[from[best]];
  int32_t found = 0;
  picked[found++] = from[best];
  for (int32_t i = 0; i < count; ++i) {
    const Point& point = points.channel[from[i]];
    int32_t gain = 0;
    for (size_t c = 0; c < 3; ++c)
      gain += 2 * kChannelWeight[c] * half * std::abs(point[c] - nearest[c]);
    if (i != best && distances[i] - distances[best] <= gain) picked[found++] = from[i];
  }
  return found;
}

}  // namespace

ColorPoints PointsOf(const Palette& palette, int32_t count) {
  ColorPoints points;
  points.count = count;
  for (size_t i = 0; i < static_cast<size_t>(count); ++i) {
    for (size_t c = 0; c < 3; ++c)
      points.channel[i][c] = palette[3 * i + 2 - c] * ColorPoints::kUnits;
  }
  return points;
}

Palette PaletteOf(const ColorPoints& points) {
  Palette palette{};
  for (size_t i = 0; i < static_cast<size_t>(points.count); ++i) {
    for (size_t c = 0; c < 3; ++c) {
      palette[3 * i + 2 - c] = static_cast<uint8_t>(
          (points.channel[i][c] + ColorPoints::kUnits / 2) / ColorPoints::kUnits);
    }
  }
  return palette;
}

Status NearestColor::Open(bool fine) {
  const bool room =
      coarseBlock_.Allocate(coarseKnown_.size() * kCoarseList, platform::Fill::Unset) &&
      (!fine || (fineBlock_.Allocate(sizeof(uint32_t) << 18, platform::Fill::Unset) &&
                 groupBlock_.Allocate(4096 * sizeof(Group), platform::Fill::Unset)));
  if (!room) return Status::MemoryAllocationError;
  if (fine) fine_ = fineBlock_.Items<uint32_t>().data();
  groups_ = groupBlock_.Items<Group>().data();
  return Status::Ok;
}

void NearestColor::SetColors(const ColorPoints& points) {
  points_ = points;
  coarseKnown_.fill(false);
  if (fine_ != nullptr) std::memset(fineBlock_.Data(), 0xff, fineBlock_.Bytes().size());
  groupsUsed_ = 1;  // index 0 would look like a single color
  const Palette palette = PaletteOf(points);
  for (size_t i = 0; i < 256; ++i) {
    for (size_t c = 0; c < 3; ++c) levels_[i][c] = palette[3 * i + 2 - c];
  }
}

const uint8_t* NearestColor::CoarseList(uint32_t cell) {
  uint8_t* list = coarseBlock_.Data() + cell * kCoarseList;
  if (!coarseKnown_[cell]) {
    uint8_t all[256];
    for (int i = 0; i < 256; ++i) all[i] = static_cast<uint8_t>(i);
    const Point corner = {static_cast<int32_t>(cell & 15) << 4,
                          static_cast<int32_t>(cell >> 4 & 15) << 4,
                          static_cast<int32_t>(cell >> 8) << 4};
    // One level wider than the cell, for points between its last level and the next cell's first.
    list[0] =
        static_cast<uint8_t>(PickCandidates(points_, all, points_.count, corner, 17, list + 1) - 1);
    coarseKnown_[cell] = true;
  }
  return list;
}

uint8_t NearestColor::FindPoint(const Point& point) {
  const auto cell = [&](size_t c) {
    return static_cast<uint32_t>(point[c] / (16 * ColorPoints::kUnits));
  };
  const uint8_t* list = CoarseList(cell(2) << 8 | cell(1) << 4 | cell(0));
  int32_t best = list[1], bestDistance = Distance(points_.channel[list[1]], point);
  for (int32_t i = 2; i <= list[0] + 1; ++i) {
    const int32_t distance = Distance(points_.channel[list[i]], point);
    best = distance < bestDistance ? list[i] : best;
    bestDistance = std::min(distance, bestDistance);
  }
  return static_cast<uint8_t>(best);
}

uint32_t NearestColor::FillFine(uint32_t cell) {
  const uint32_t blue = cell & 63, green = cell >> 6 & 63, red = cell >> 12;
  const uint8_t* coarse = CoarseList((red >> 2) << 8 | (green >> 2) << 4 | blue >> 2);
  uint8_t list[256 + 3];
  const Point corner = {static_cast<int32_t>(blue) << 2, static_cast<int32_t>(green) << 2,
                        static_cast<int32_t>(red) << 2};
  const int32_t count = PickCandidates(points_, coarse + 1, coarse[0] + 1, corner, 4, list);
  std::fill(list + count, list + 256 + 3, list[0]);
  return fine_[cell] =
             list[0] |
             (count > 1 ? StoreGroups(list, (static_cast<uint32_t>(count) + 3) / 4) << 8 : 0);
}

// Stores a list of colors in groups of four; returns its index, 0 if there is no room.
uint32_t NearestColor::StoreGroups(const uint8_t* list, uint32_t groups) {
  const uint32_t place = groupsUsed_;
  if (place + groups > kMostGroups) return 0;
  if (place + groups > groupBlock_.Items<Group>().size()) {
    if (!groupBlock_.Resize(2 * groupBlock_.Size())) return 0;
    groups_ = groupBlock_.Items<Group>().data();
  }
  groupsUsed_ += groups;
  for (uint32_t g = 0; g < groups; ++g, list += 4) {
    Group& group = groups_[place + g];
    group.groupsLeft = groups - 1 - g;
    for (size_t i = 0; i < 4; ++i) {
      const int16_t* color = levels_[group.index[i] = list[i]];
      int32_t square = 0;
      for (size_t c = 0; c < 3; ++c) {
        square += kChannelWeight[c] * color[c] * color[c];
        group.factor[c][i] = static_cast<float>(4 * 2 * kChannelWeight[c] * color[c]);
      }
      group.constant[i] = static_cast<float>(4 * square + static_cast<int32_t>(i));
    }
  }
  return place;
}

}  // namespace fotomill
