#include "metadata/gps.h"

#include <gtest/gtest.h>

#include "settings/job_options.h"

namespace fotomill::test {
namespace {

TEST(Gps, ReadsLocations) {
  GpsLocation location;
  ASSERT_TRUE(GpsLocationFromSettings(location));
  EXPECT_NEAR(GpsDegrees(location.latitude), 45.33, 1e-9);
  EXPECT_NEAR(GpsDegrees(location.longitude), -79.22, 1e-9);
  ASSERT_TRUE(ParseGpsLocation("33, 51,35.9,s,151,12,40,e", location));
  EXPECT_NEAR(GpsDegrees(location.latitude), -33.8599722, 1e-6);
  EXPECT_NEAR(GpsDegrees(location.longitude), 151.2111111, 1e-6);
  for (const char* bad :
       {"", "45,19,48.000,N", "45;19;48;N;7;1;1;W", "45,19,48,,79,13,12,W,", "45,19,48,N,79,13,12,",
        "x,19,48,N,79,13,12,W", "45,19,nan,N,79,13,12,W", "9999999999,1,4,N,79,13,12,W"}) {
    EXPECT_FALSE(ParseGpsLocation(bad, location)) << bad;
    EXPECT_EQ(location.latitude.degrees, 0);
  }
}

TEST(Gps, MeasuresDistances) {
  EXPECT_NEAR(GpsDistance(60, 179.5, 60, -179.5, choice::kKilometres), 55.56, 0.01) << "across the date line";
  EXPECT_EQ(GpsDistance(45.33, -79.22, 45.33, -79.22, choice::kKilometres), 0);
  EXPECT_NEAR(GpsDistance(78.6, -104, -78.6, 76, choice::kKilometres), 20002.5, 0.1) << "opposite places";
}

}  // namespace
}  // namespace fotomill::test
