#include "desktop/models/browser/reread_pace.h"

#include <gtest/gtest.h>

namespace fotomill::desktop {
namespace {

TEST(RereadPace, RestsAfterLongReadings) {
  struct {
    const char* name;
    double took, changeAfter, delay;
  } const rows[] = {
      {"a small folder", 0.01, 0, 0.3},   {"a large one at once", 0.1, 0, 1.9},
      {"a large one later", 0.1, 1, 0.9}, {"a large one much later", 0.1, 100, 0.3},
      {"a slow one", 10, 0, 60},
  };
  for (const auto& row : rows) {
    RereadPace pace;
    pace.Ended(3);  // not begun
    EXPECT_DOUBLE_EQ(pace.DelayAt(3), RereadPace::kSoon);
    pace.Began(5);
    EXPECT_TRUE(pace.Reading());
    pace.Ended(5 + row.took);
    EXPECT_FALSE(pace.Reading());
    EXPECT_NEAR(pace.DelayAt(5 + row.took + row.changeAfter), row.delay, 1e-6) << row.name;
  }
}

}  // namespace
}  // namespace fotomill::desktop
