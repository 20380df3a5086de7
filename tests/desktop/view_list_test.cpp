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

TEST(ViewList, FollowsItsFolder) {
  ViewList list({"/f/a", "/f/b", "/f/d"}, "/f/b");
  list.Follow({"/f/b", "/f/c", "/f/d"});
  EXPECT_EQ(list.Place(), 0u);
  // A file that is gone stays until another one is chosen.
  list.Follow({"/f/c", "/f/d"});
  EXPECT_EQ(list.Files(), (Files{"/f/b", "/f/c", "/f/d"}));
  list.Follow({"/f/a", "/f/c", "/f/d"});
  EXPECT_EQ(list.Files(), (Files{"/f/b", "/f/a", "/f/c", "/f/d"}));
  list.GoTo(list.PlaceAfter(-1));
  EXPECT_EQ(list.Files(), (Files{"/f/a", "/f/c", "/f/d"}));
  EXPECT_EQ(list.File(), "/f/d");
  list.GoTo(0);
  EXPECT_EQ(list.Count(), 3u);
  list.Follow({});
  EXPECT_EQ(list.Files(), Files{"/f/a"});
  list.Follow({"/f/a", "/f/d"});  // it is back
  list.GoTo(1);
  EXPECT_EQ(list.Files(), (Files{"/f/a", "/f/d"}));
  list.Follow({"/f/a", "/f/b", "/f/d"});
  list.Follow({"/f/a"});
  EXPECT_EQ(list.Files(), (Files{"/f/a", "/f/d"}));
  list.Follow({"/f/a", "/f/b", "/f/c"});
  list.Remove("/f/d");  // the program deleted it
  list.GoTo(2);
  EXPECT_EQ(list.Files(), (Files{"/f/a", "/f/b", "/f/c"}));
  list.Remove("/f/c");
  EXPECT_TRUE(list.FollowRename("/f/b", "/f/e"));
  EXPECT_FALSE(list.FollowRename("/f/a", "/f/x"));
  EXPECT_TRUE(list.FollowRename("/f", "/g"));
  EXPECT_EQ(list.Files(), (Files{"/g/x", "/g/e"}));
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
