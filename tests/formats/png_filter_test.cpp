#include "formats/png/png_filter.h"

#include <gtest/gtest.h>

#include <cstdlib>

namespace fotomill::test {
namespace {

// Reference implementation of the filters, byte by byte.
uint8_t Predicted(PngFilter filter, int left, int above, int corner) {
  const int estimate = left + above - corner;
  const int distances[] = {std::abs(estimate - left), std::abs(estimate - above),
                           std::abs(estimate - corner)};
  switch (filter) {
    case PngFilter::None: return 0;
    case PngFilter::Sub: return static_cast<uint8_t>(left);
    case PngFilter::Up: return static_cast<uint8_t>(above);
    case PngFilter::Average: return static_cast<uint8_t>((left + above) / 2);
    case PngFilter::Paeth:
      if (distances[0] <= distances[1] && distances[0] <= distances[2])
        return static_cast<uint8_t>(left);
      return static_cast<uint8_t>(distances[1] <= distances[2] ? above : corner);
  }
  return 0;
}

std::vector<uint8_t> Filtered(PngFilter filter, const std::vector<uint8_t>& row,
                              const std::vector<uint8_t>& above, size_t step) {
  std::vector<uint8_t> result;
  for (size_t i = 0; i < row.size(); ++i) {
    const bool first = i < step;
    const uint8_t predicted =
        Predicted(filter, first ? 0 : row[i - step], above[i], first ? 0 : above[i - step]);
    result.push_back(static_cast<uint8_t>(row[i] - predicted));
  }
  return result;
}

uint64_t Sum(const std::vector<uint8_t>& row) {
  uint64_t sum = 0;
  for (const uint8_t value : row) sum += value < 128 ? value : 256u - value;
  return sum;
}

TEST(PngFilter, MatchesTheDefinition) {
  uint32_t state = 7;
  const auto next = [&state] { return (state = state * 1664525 + 1013904223) >> 16; };
  for (const size_t step : {1, 2, 3, 4, 6, 8}) {
    for (const size_t pixels : {1, 2, 3, 5, 17, 100}) {
      SCOPED_TRACE(std::to_string(pixels) + " pixels of " + std::to_string(step));
      std::vector<uint8_t> above(pixels * step), row(pixels * step);
      for (size_t i = 0; i < row.size(); ++i) {  // noise, then a slope
        above[i] = static_cast<uint8_t>(pixels % 2 == 0 ? next() : 3 * i + next() % 4);
        row[i] = static_cast<uint8_t>(pixels % 2 == 0 ? next() : above[i] + next() % 4);
      }
      uint64_t least = UINT64_MAX;
      for (uint8_t number = 0; number <= 4; ++number) {
        std::vector<uint8_t> filtered = Filtered(static_cast<PngFilter>(number), row, above, step);
        least = std::min(least, Sum(filtered));
        filtered.resize(filtered.size() + kPngSlack, 0xEE);
        std::vector<uint8_t> roomyAbove = above;
        roomyAbove.resize(filtered.size());
        ASSERT_TRUE(UndoPngFilter(number, filtered.data(), roomyAbove.data(), row.size(), step));
        EXPECT_EQ(std::vector<uint8_t>(filtered.begin() + row.size(), filtered.end()), std::vector<uint8_t>(kPngSlack, 0xEE));
        filtered.resize(row.size());
        EXPECT_EQ(filtered, row) << "filter " << int{number};
      }
      std::vector<uint8_t> chosen(1 + row.size());
      PngFilterChooser(row.size(), step).FilterRow(row.data(), above.data(), chosen.data());
      const auto filter = static_cast<PngFilter>(chosen[0]);
      chosen.erase(chosen.begin());
      EXPECT_EQ(chosen, Filtered(filter, row, above, step));
      EXPECT_EQ(Sum(chosen), least);
    }
  }
  uint8_t bytes[16] = {};
  EXPECT_FALSE(UndoPngFilter(5, bytes, bytes, 4, 1));
}

}  // namespace
}  // namespace fotomill::test
