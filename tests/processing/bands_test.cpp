#include "processing/bands.h"

#include <gtest/gtest.h>

#include <vector>

namespace fotomill {
namespace {

TEST(Bands, CoverEveryRowOnce) {
  for (const uint32_t threads : {1u, 0u}) {
    for (const int32_t rows : {1, 15, 16, 1000}) {
      for (const int32_t least : {1, 7, 300}) {
        SCOPED_TRACE(testing::Message() << threads << " threads, " << rows << ", least " << least);
        std::vector<int32_t> done(static_cast<size_t>(rows));
        const auto band = [&](int32_t first, int32_t end) {
          for (int32_t y = first; y < end; ++y) ++done[static_cast<size_t>(y)];
          EXPECT_TRUE(end - first >= std::min(least, rows) || end == rows);
          return Status::Ok;
        };
        ASSERT_EQ(ForBands(rows, least, {.threads = threads}, band), Status::Ok);
        EXPECT_EQ(done, std::vector<int32_t>(static_cast<size_t>(rows), 1));
      }
    }
  }
}

// If stopped halfway through a picture, it skips the rest.
TEST(Bands, StopWithinAPicture) {
  int32_t done = 0;
  const Work work{.threads = 1, .goesOn = [&] { return done < 500; }};
  const auto band = [&](int32_t first, int32_t end) {
    done += end - first;
    return Status::Ok;
  };
  EXPECT_EQ(ForBands(1000, 1, work, band), Status::FunctionCancelled);
  EXPECT_GE(done, 500);
  EXPECT_LE(done, 600);
}

}  // namespace
}  // namespace fotomill
