#include "desktop/models/view/view_list.h"

#include <gtest/gtest.h>

namespace fotomill::desktop {
namespace {

using Files = std::vector<std::string>;

TEST(ViewList, StaysAtItsFile) {
  ViewList list({"a", "b", "c", "d"}, "c");
  EXPECT_EQ(list.Place(), 2u);
  EXPECT_EQ(list.PlaceAfter(2), 0u);
  EXPECT_EQ(list.PlaceAfter(-7), 3u);
  list.Remove("a");
  EXPECT_EQ(list.File(), "c");
  list.Remove("missing");
  list.Remove("c");
  EXPECT_EQ(list.File(), "d");
  list.Remove("d");  // the last one: the one before it
  EXPECT_EQ(list.File(), "b");
  list.Remove("b");
  EXPECT_EQ(list.Files(), Files{"b"});
  EXPECT_FALSE(list.Replace({"x", "y"}));
  EXPECT_TRUE(list.Replace({"x", "y", "b"}));
  EXPECT_EQ(list.Place(), 2u);
  EXPECT_EQ(ViewList({"a", "b"}, "other").Files(), Files{"other"});
}

TEST(ViewList, LoadsNeighborsOnce) {
  using Places = std::vector<size_t>;
  ViewList list({"a", "b", "c", "d", "e", "f"}, "a");
  EXPECT_EQ(list.PlacesToLoad({}), (Places{0, 1, 5, 2, 4}));
  EXPECT_EQ(list.PlacesToLoad(3), (Places{0, 3, 1, 5, 2, 4}));
  EXPECT_EQ(list.PlacesToLoad(6), (Places{0, 1, 5, 2, 4}));
  EXPECT_EQ(ViewList({"a", "b"}, "b").PlacesToLoad(0), (Places{1, 0}));
}

}  // namespace
}  // namespace fotomill::desktop
