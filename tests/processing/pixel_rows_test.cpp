#include "processing/pixel_rows.h"

#include <gtest/gtest.h>

#include "support/pictures.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

// Bytes `first`, `first` + `step`, ... of `from`.
Bytes Every(size_t step, size_t first, const Bytes& from) {
  Bytes picked;
  for (size_t i = first; i < from.size(); i += step) picked.push_back(from[i]);
  return picked;
}

TEST(PixelRows, TakeApartAndPutTogether) {
  for (size_t count = 0; count < 100; ++count) {
    SCOPED_TRACE(count);
    const Bytes colors = RandomBytes(3 * count, 1), four = RandomBytes(4 * count, 2);
    Bytes blue(count), green(count), red(count), alpha(count), merged(3 * count), three(3 * count),
        back(4 * count);

    SplitColors(colors.data(), count, blue.data(), green.data(), red.data());
    EXPECT_EQ(blue, Every(3, 0, colors));
    EXPECT_EQ(green, Every(3, 1, colors));
    EXPECT_EQ(red, Every(3, 2, colors));
    MergeColors(blue.data(), green.data(), red.data(), count, merged.data());
    EXPECT_EQ(merged, colors);
    SwapColors(colors.data(), count, merged.data());
    for (size_t i = 0; i < 3; ++i) EXPECT_EQ(Every(3, i, merged), Every(3, 2 - i, colors));

    SplitAlpha(four.data(), count, three.data(), alpha.data());
    for (size_t i = 0; i < 3; ++i) EXPECT_EQ(Every(3, i, three), Every(4, i, four));
    EXPECT_EQ(alpha, Every(4, 3, four));
    MergeAlpha(three.data(), alpha.data(), count, back.data());
    EXPECT_EQ(back, four);
  }
}

TEST(PixelRows, BitPlanes) {
  for (size_t count = 1; count < 40; ++count) {
    for (int planes = 1; planes <= 4; ++planes) {
      SCOPED_TRACE(std::to_string(count) + " pixels, " + std::to_string(planes) + " planes");
      const size_t planeSize = (count + 7) / 8, rowSize = (count + 7) / 8 * 4;
      const Bytes row = RandomBytes(rowSize, 3);
      Bytes bits(static_cast<size_t>(planes) * planeSize), back(rowSize, 0xEE);
      SplitBitPlanes(row.data(), count, planes, planeSize, bits.data());
      MergeBitPlanes(bits.data(), count, planes, planeSize, back.data());
      for (size_t x = 0; x < rowSize * 2; ++x) {
        const int shift = x % 2 == 0 ? 4 : 0, pixel = row[x / 2] >> shift & ((1 << planes) - 1);
        EXPECT_EQ(back[x / 2] >> shift & 15, x < count ? pixel : 0);
        for (int p = 0; p < planes && x / 8 < planeSize; ++p) {
          const int bit = bits[static_cast<size_t>(p) * planeSize + x / 8] >> (7 - x % 8) & 1;
          EXPECT_EQ(bit, x < count ? pixel >> p & 1 : 0);
        }
      }
    }
  }
}

}  // namespace
}  // namespace fotomill::test
