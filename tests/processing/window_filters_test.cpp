#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <functional>

#include "processing/filters/box_blur.h"
#include "processing/filters/median_kernel.h"
#include "processing/filters/rank.h"
#include "processing/pictures.h"
#include "support/pictures.h"

namespace fotomill::test {
namespace {

using Levels = std::vector<uint32_t>;  // the samples of one channel in a window

uint32_t Middle(Levels levels) {
  std::ranges::sort(levels);
  return levels[levels.size() / 2];
}
uint32_t Smallest(const Levels& levels) { return *std::ranges::min_element(levels); }
uint32_t Largest(const Levels& levels) { return *std::ranges::max_element(levels); }
uint32_t Mean(const Levels& levels) {
  uint32_t sum = 0;
  for (const uint32_t level : levels) sum += level;
  return static_cast<uint32_t>((sum + levels.size() / 2) / levels.size());
}

struct Filter {
  const char* name;
  uint32_t (*of)(const Levels& levels);
  std::function<Status(PictureRecord&, int32_t radius, const Work&)> apply;
};

const Filter kFilters[] = {
    {"median", [](const Levels& levels) { return Middle(levels); },
     [](PictureRecord& p, int32_t r, const Work& w) { return RankPicture(p, Rank::Median, r, w); }},
    {"minimum", Smallest, [](PictureRecord& p, int32_t r, const Work& w) { return RankPicture(p, Rank::Minimum, r, w); }},
    {"maximum", Largest, [](PictureRecord& p, int32_t r, const Work& w) { return RankPicture(p, Rank::Maximum, r, w); }},
    {"mean", Mean, BoxBlurPicture},
};

// Reference result, directly from the filter's definition.
std::vector<uint32_t> Expected(const Filter& filter, const PictureRecord& picture, int32_t radius) {
  const int32_t width = picture.image.Width(), height = picture.image.Height();
  std::vector<uint32_t> colors;
  for (int32_t y = 0; y < height; ++y) {
    for (int32_t x = 0; x < width; ++x) {
      uint32_t color = 0;
      for (int shift = 0; shift < 24; shift += 8) {
        Levels levels;
        for (int32_t j = y - radius; j <= y + radius; ++j) {
          for (int32_t i = x - radius; i <= x + radius; ++i) {
            levels.push_back(
                ColorAt(picture, std::clamp(i, 0, width - 1), std::clamp(j, 0, height - 1)) >>
                    shift &
                255);
          }
        }
        color |= filter.of(levels) << shift;
      }
      colors.push_back(color);
    }
  }
  return colors;
}

TEST(WindowFilters, MatchTheirDefinition) {
  struct Row {
    int32_t width, height, radius;
  };
  constexpr Row kRows[] = {{1, 1, 3},  {2, 1, 0},    {7, 5, 1},    {40, 3, 2},
                           {3, 90, 4}, {33, 21, 12}, {300, 70, 1}, {3, 2, 127}};
  for (const Row& row : kRows) {
    for (const bool noise : {true, false}) {
      const auto colorAt = [&](int32_t x, int32_t y) {
        return noise ? Scatter(x, y) & 0xffffff
                     : static_cast<uint32_t>(x / 9 * 0x160B05 + y / 4 * 0x010203) & 0xffffff;
      };
      for (const Filter& filter : kFilters) {
        SCOPED_TRACE(std::string(filter.name) + " " + std::to_string(row.width) + " " + std::to_string(row.radius));
        const PicturePointer picture = MakePicture(row.width, row.height, colorAt);
        const std::vector<uint32_t> expected = Expected(filter, *picture, row.radius);
        ASSERT_EQ(filter.apply(*picture, row.radius, {}), Status::Ok);
        EXPECT_EQ(Colors(*picture), expected);
      }
    }
  }
}

// The colors of transparent pixels must not bleed.
TEST(WindowFilters, WeightColorsByAlpha) {
  for (const Filter& filter : kFilters) {
    SCOPED_TRACE(filter.name);
    const auto isSeen = [](int32_t x) { return x < 10; };
    const PicturePointer picture =
        MakePicture(20, 8, [&](int32_t x, int32_t) { return isSeen(x) ? 0x306090u : 0xffffffu; });
    AddAlpha(*picture, [&](int32_t x, int32_t) { return isSeen(x) ? 200 : 0; });
    ASSERT_EQ(filter.apply(*picture, 3, {}), Status::Ok);
    for (int32_t x = 0; x < 20; ++x) {
      const int32_t alpha = picture->alpha.PixelAt(x, 4);
      if (alpha == 0) continue;
      for (int shift = 0; shift < 24; shift += 8) {
        EXPECT_NEAR(static_cast<double>(ColorAt(*picture, x, 4) >> shift & 255), 0x306090 >> shift & 255, 1) << x;
      }
    }
    EXPECT_EQ(picture->alpha.PixelAt(2, 4), 200);
    EXPECT_EQ(picture->alpha.PixelAt(17, 4), 0);
  }
}

TEST(WindowFilters, MediansAreTheSameOnEveryProcessor) {
  constexpr size_t kColumns = 300;
  for (const int32_t window : {1, 3, 255}) {
    std::vector<uint16_t> groups(kColumns * kCountsInGroup), levels(kCountsInGroup * groups.size());
    const auto bytes = RandomBytes(kColumns * static_cast<size_t>(window), 11);
    for (size_t i = 0; i < bytes.size(); ++i) {
      const size_t column = i % kColumns, level = window == 255 ? bytes[i] & 31u : bytes[i];
      ++groups[column * kCountsInGroup + level / kCountsInGroup];
      ++levels[level / kCountsInGroup * groups.size() + column * kCountsInGroup +
               level % kCountsInGroup];
    }
    const ColumnCounts columns{groups.data(), levels.data(), kCountsInGroup, groups.size()};
    const auto count = static_cast<int32_t>(kColumns) - window + 1;
    std::vector<uint8_t> here(static_cast<size_t>(count)), plain(here.size());
    MedianRowHere()(columns, window, count, here.data(), 1);
    BaselineMedianRow()(columns, window, count, plain.data(), 1);
    EXPECT_EQ(here, plain);
  }
}

TEST(WindowFilters, CanBeCanceled) {
  for (const Filter& filter : kFilters) {
    const PicturePointer picture = MakePicture(50, 1600, Scatter);
    const std::vector<uint32_t> before = Colors(*picture);
    int32_t asked = 0;
    EXPECT_EQ(filter.apply(*picture, 2, {.goesOn = [&] { return ++asked < 3; }}), Status::FunctionCancelled);
    EXPECT_EQ(Colors(*picture), before);
  }
}

}  // namespace
}  // namespace fotomill::test
