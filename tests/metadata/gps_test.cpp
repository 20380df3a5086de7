#include "metadata/gps.h"

#include <gtest/gtest.h>

#include "metadata/exif/exif_places.h"
#include "settings/job_options.h"
#include "support/exif_blocks.h"

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
  EXPECT_NEAR(GpsDistance(60, 179.5, 60, -179.5, choice::kKilometers), 55.56, 0.01) << "across the date line";
  EXPECT_EQ(GpsDistance(45.33, -79.22, 45.33, -79.22, choice::kKilometers), 0);
  EXPECT_NEAR(GpsDistance(78.6, -104, -78.6, 76, choice::kKilometers), 20002.5, 0.1) << "opposite places";
}

TEST(Gps, PlacesAreReadable) {
  EXPECT_EQ(GpsPlaceText(45.33, -79.22), "45° 19' 48.00\" N, 79° 13' 12.00\" W (45.33000, -79.22000)");
  // nothing is rounded to 60
  EXPECT_EQ(GpsPlaceText(-59.999999, 0), "60° 00' 00.00\" S, 0° 00' 00.00\" E (-60.00000, 0.00000)");
}

// What a GPS directory says about the latitude; the longitude is 10 degrees east.
std::optional<ExifPosition> PlaceTaken(const std::vector<uint32_t>& numbers, char hemisphere) {
  BlockBuilder builder;
  const auto rationals = [&](const std::vector<uint32_t>& values) {
    std::vector<uint8_t> bytes;
    for (const uint32_t value : values)
      for (int shift = 0; shift < 32; shift += 8) bytes.push_back(uint8_t(value >> shift));
    return builder.Bytes(bytes);
  };
  const uint32_t first = builder.Directory({{0x8825, 4, 1, 0}});
  const uint32_t latitude = rationals(numbers), longitude = rationals({10, 1, 0, 1, 0, 1});
  const auto count = static_cast<uint32_t>(numbers.size() / 2);
  const uint32_t gps = builder.Directory({{1, 2, 2, static_cast<uint8_t>(hemisphere)},
                                          {2, 5, count, latitude},
                                          {3, 2, 2, 'E'},
                                          {4, 5, 3, longitude}});
  builder.Patch32(first + 2 + 8, gps);
  const ExifPlaces places = FindExifPlaces(builder.block);
  EXPECT_FALSE(places.destination);
  return places.taken;
}

TEST(Gps, FindsPlacesInBlocks) {
  const struct {
    const char* name;
    std::vector<uint32_t> numbers;
    char hemisphere;
    std::optional<double> latitude;
  } rows[] = {
      {"whole numbers", {45, 1, 30, 1, 36, 1}, 'N', 45.51},
      {"south", {45, 1, 30, 1, 36, 1}, 's', -45.51},
      {"minutes with decimals, no seconds", {45, 1, 3060, 100, 0, 0}, 'N', 45.51},
      {"no hemisphere", {45, 1, 30, 1, 36, 1}, ' ', std::nullopt},
      {"beyond the pole", {90, 1, 0, 1, 1, 1}, 'N', std::nullopt},
      {"no degrees", {45, 0, 30, 1, 36, 1}, 'N', std::nullopt},
      {"two numbers", {45, 1, 30, 1}, 'N', std::nullopt},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const std::optional<ExifPosition> place = PlaceTaken(row.numbers, row.hemisphere);
    ASSERT_EQ(place.has_value(), row.latitude.has_value());
    if (!place) continue;
    EXPECT_NEAR(place->latitude, *row.latitude, 1e-9);
    EXPECT_EQ(place->longitude, 10);
  }
  EXPECT_FALSE(FindExifPlaces(BigEndianBlock()).taken);
}

}  // namespace
}  // namespace fotomill::test
