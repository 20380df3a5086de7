#include "desktop/models/metadata/place_list.h"

#include <gtest/gtest.h>

#include <filesystem>

#include "settings/settings.h"
#include "support/faults.h"
#include "support/files.h"
#include "support/scoped_settings.h"

namespace fotomill::desktop {
namespace {

class PlaceList : public testing::Test {
 protected:
  PlaceList() {
    settings.ExifDefaultLocation.AssignCut("");
    settings.ExifLocationsFile.AssignCut(path_);
  }
  std::string Text() const { return test::ReadText(path_); }

  const test::ScopedSettings keep_;
  const test::TemporaryFolder folder_;
  const std::string path_ = folder_.Path("places.txt");
};

constexpr const char* kList = "# mine\r\nHome = 48.5,11.25\nnot a place\n\nLake=45.5,-79.25";

TEST_F(PlaceList, EditsLeaveOtherLinesAlone) {
  const GpsPlace rome{.latitude = 41.9, .longitude = 12.5};
  const struct {
    const char* what;
    std::string (*edit)(const GpsPlace&);
    const char* made;  // null: refused, and nothing changes
  } rows[] = {
      {"add", [](const GpsPlace& place) { return AddPlace("Rome", place); },
       "# mine\r\nHome = 48.5,11.25\nnot a place\n\nLake=45.5,-79.25\nRome = 41.90000,12.50000\n"},
      {"add a known name", [](const GpsPlace& place) { return AddPlace("LAKE", place); }, nullptr},
      {"add a comment", [](const GpsPlace& place) { return AddPlace("# x", place); }, nullptr},
      {"add two lines", [](const GpsPlace& place) { return AddPlace("x\ny", place); }, nullptr},
      {"add nothing", [](const GpsPlace& place) { return AddPlace("", place); }, nullptr},
      {"rename", [](const GpsPlace&) { return RenamePlace("home", "Old home"); },
       "# mine\r\nOld home = 48.5,11.25\nnot a place\n\nLake=45.5,-79.25"},
      {"rename the case", [](const GpsPlace&) { return RenamePlace("Home", "HOME"); },
       "# mine\r\nHOME = 48.5,11.25\nnot a place\n\nLake=45.5,-79.25"},
      {"rename the last", [](const GpsPlace&) { return RenamePlace("Lake", "a = b"); },
       "# mine\r\nHome = 48.5,11.25\nnot a place\n\na = b =45.5,-79.25"},
      {"rename to a known name", [](const GpsPlace&) { return RenamePlace("Home", "Lake"); },
       nullptr},
      {"rename a stranger", [](const GpsPlace&) { return RenamePlace("Rome", "x"); }, nullptr},
      {"remove", [](const GpsPlace&) { return RemovePlace("Home"); },
       "# mine\r\nnot a place\n\nLake=45.5,-79.25"},
      {"remove the last", [](const GpsPlace&) { return RemovePlace("lake"); },
       "# mine\r\nHome = 48.5,11.25\nnot a place\n\n"},
      {"remove a stranger", [](const GpsPlace&) { return RemovePlace("not a place"); }, nullptr},
  };
  for (const auto& row : rows) {
    test::WriteText(path_, kList);
    EXPECT_EQ(row.edit(rome).empty(), row.made != nullptr) << row.what;
    EXPECT_EQ(Text(), row.made != nullptr ? row.made : kList) << row.what;
  }
}

TEST_F(PlaceList, OffersTheDefaultLocationAndTheList) {
  EXPECT_TRUE(OfferedPlaces().empty());
  ASSERT_EQ(AddPlace("Rome", {.latitude = 41.9, .longitude = -12.5}), "");  // makes the file
  settings.ExifDefaultLocation.AssignCut("45,30,00.000,N,79,15,00.000,W");
  const std::vector<OfferedPlace> places = OfferedPlaces();
  ASSERT_EQ(places.size(), 2u);
  EXPECT_FALSE(places[0].listed);
  EXPECT_NEAR(places[0].place.latitude, 45.5, 1e-9);
  EXPECT_TRUE(places[1].listed);
  EXPECT_EQ(places[1].name, "Rome");
  EXPECT_NEAR(places[1].place.longitude, -12.5, 1e-9);
}

// Whatever operation on the system fails, the list is the old or the new one.
TEST_F(PlaceList, FaultsLoseNothing) {
  const std::string made = "Home = 48.5,11.25\nRome = 41.90000,12.50000\n";
  const int64_t faults = test::ForEachFault([&] {
    test::WriteText(path_, "Home = 48.5,11.25\n");
    const std::string problem = AddPlace("Rome", {.latitude = 41.9, .longitude = 12.5});
    const int64_t left = platform::faultCountdown.exchange(0);
    EXPECT_EQ(Text(), problem.empty() ? made : "Home = 48.5,11.25\n");
    platform::faultCountdown = left;
  });
  EXPECT_GT(faults, 2);
}

}  // namespace
}  // namespace fotomill::desktop
