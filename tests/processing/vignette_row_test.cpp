#include "processing/color/vignette_row.h"

#include "processing/pictures.h"

namespace fotomill::test {
namespace {

TEST(VignetteRow, IsTheSameOnEveryProcessor) {
  std::vector<double> across(203);
  for (size_t x = 0; x < across.size(); ++x) across[x] = static_cast<double>(x * x) / 82000;
  for (const size_t pixels : {size_t{0}, size_t{3}, size_t{4}, size_t{101}, size_t{203}}) {
    for (const double size : {0.0, 0.3, 0.9}) {
      SCOPED_TRACE(testing::Message() << pixels << " pixels, size " << size);
      const VignetteRow row{across.data(), 0.1, size, 0.7, {20, 255, 0}};
      std::vector<uint8_t> here(3 * pixels + 8);  // the last eight must not be written
      for (size_t i = 0; i < here.size(); ++i)
        here[i] = static_cast<uint8_t>(Scatter(int32_t(i), 3));
      std::vector<uint8_t> baseline = here;
      ShadeRowHere()(row, here.data(), pixels);
      BaselineShadeRow()(row, baseline.data(), pixels);
      EXPECT_EQ(here, baseline);
    }
  }
}

}  // namespace
}  // namespace fotomill::test
