#include "metadata/edit/gps_place.h"

#include <gmock/gmock.h>

#include "metadata/edit/exif_dates.h"
#include "metadata/edit/exif_input.h"
#include "support/exif_blocks.h"

namespace fotomill::test {
namespace {

using testing::Contains;
using testing::DoubleNear;

std::span<const uint8_t> BytesOf(std::string_view text) {
  return {reinterpret_cast<const uint8_t*>(text.data()), text.size()};
}

int64_t Time(std::string_view text) { return ParseExifTime(text).value_or(0); }

// A block with nothing but the place, in either byte order.
ExifDirectories Told(const GpsPlace& place) {
  ExifDirectories directories;
  for (const DirectoryChange& change : PlaceEntries(place))
    directories.gps.push_back(*change.entry);
  return directories;
}

TEST(GpsPlaces, EntriesTellThePlaceAgain) {
  for (const auto& [latitude, longitude, back] : {std::tuple{45.33, -79.22, -79.22},
                                                  {-33.86, 151.21, 151.21},
                                                  {0.0, 0.0, 0.0},
                                                  {90.0, 180.0, 180.0},
                                                  {12.5, 359.5, -0.5},
                                                  {-0.00001, 179.99999, 179.99999}}) {
    SCOPED_TRACE(latitude);
    const auto place = PlaceOf(Told({.latitude = latitude, .longitude = longitude}));
    ASSERT_TRUE(place);
    EXPECT_THAT(place->latitude, DoubleNear(latitude, 5e-8));
    EXPECT_THAT(place->longitude, DoubleNear(back, 5e-8));
  }
  const std::vector<uint8_t> block = MakeExifBlock(Told({.latitude = -1.5,
                                                         .longitude = 2.25,
                                                         .altitude = -4.5,
                                                         .time = Time("2024:05:31 23:05:09")}));
  CollectedLines lines;
  WalkExif(block, &lines);
  for (const char* line :
       {"North or South latitude=South", "Latitude=1.000 30.000 0.000",
        "East or West longitude=East", "Longitude=2.000 15.000 0.000", "Altitude=4.500",
        "Altitude reference=Sea level reference", "GPS time=23:05:09", "GPS date=2024:05:31",
        "Geodetic survey data used=WGS-84"})
    EXPECT_THAT(lines.lines, Contains(line));
  EXPECT_FALSE(PlaceOf({}));
  EXPECT_EQ(MapLink({.latitude = 1.5, .longitude = -2}),
            "https://www.openstreetmap.org/?mlat=1.50000&mlon=-2.00000#map=15/1.50000/-2.00000");
}

constexpr std::string_view kTrack = R"(<?xml version="1.0"?>
<g:gpx xmlns:g="http://www.topografix.com/GPX/1/1"><g:trk><g:trkseg>
<g:trkpt lat="10.2" lon="-179.9"><g:ele>120</g:ele><g:time>2024-05-31T12:10:00.0Z</g:time></g:trkpt>
<g:trkpt lat="10.0" lon="179.9"><g:ele>100</g:ele><g:time> 2024-05-31T14:00:00+02:00
 </g:time></g:trkpt>
<g:trkpt lat="95" lon="0"><g:time>2024-05-31T12:05:00Z</g:time></g:trkpt>
<g:trkpt lat="50" lon="0"></g:trkpt>
<g:trkpt lat="x" lon="0"><g:time>2024-05-31T12:05:00Z</g:time></g:trkpt>
</g:trkseg><g:trkseg><g:trkpt lat="20" lon="30"><g:time>2024-05-31T15:00:00Z</g:time></g:trkpt>
</g:trkseg></g:trk></g:gpx>)";

TEST(GpsPlaces, TrackIsInterpolated) {
  GpsTrack track;
  ASSERT_EQ(track.Parse(BytesOf(kTrack)), Status::Ok);
  const struct {
    const char* time;
    double latitude, longitude, altitude;  // latitude 99: none; altitude -1: none
  } rows[] = {
      {"2024:05:31 12:00:00", 10.0, 179.9, 100},  {"2024:05:31 12:05:00", 10.1, 180.0, 110},
      {"2024:05:31 12:10:00", 10.2, -179.9, 120}, {"2024:05:31 11:30:00", 10.0, 179.9, 100},
      {"2024:05:31 11:29:59", 99, 0, 0},          {"2024:05:31 12:40:00", 10.2, -179.9, 120},
      {"2024:05:31 13:30:00", 99, 0, 0},          {"2024:05:31 14:45:00", 20, 30, -1},
      {"2024:05:31 15:30:01", 99, 0, 0},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.time);
    const auto place = track.At(Time(row.time));
    ASSERT_EQ(place.has_value(), row.latitude < 99);
    if (!place) continue;
    EXPECT_THAT(place->latitude, DoubleNear(row.latitude, 1e-9));
    EXPECT_THAT(place->longitude, DoubleNear(row.longitude, 1e-9));
    EXPECT_THAT(place->altitude.value_or(-1), DoubleNear(row.altitude, 1e-9));
    EXPECT_EQ(place->time, Time(row.time));
  }
  for (const char* bad : {"", "<gpx>", "<kml/>", "no xml", "<gpx></gpx"}) {
    EXPECT_EQ(track.Parse(BytesOf(bad)), Status::DamagedFile) << bad;
    EXPECT_TRUE(track.Empty());
  }
  std::string deep = "<gpx>";
  for (int i = 0; i < 200'000; ++i) deep += "<trk>";
  EXPECT_EQ(track.Parse(BytesOf(deep)), Status::DamagedFile);
  EXPECT_EQ(track.Parse(BytesOf("<gpx/>")), Status::Ok);
  EXPECT_FALSE(track.At(0));
}

TEST(GpsPlaces, CameraTimeBecomesUtc) {
  ExifDirectories told;
  EXPECT_FALSE(TakenUtc(told, 0));
  told.exif = {ExifTextEntry(0x9004, "2024:05:31 10:00:00")};
  EXPECT_EQ(TakenUtc(told, {}), Time("2024:05:31 10:00:00"));
  told.exif.push_back(ExifTextEntry(0x9003, "2024:05:31 01:00:00"));
  told.exif.push_back(ExifTextEntry(0x9011, "+02:00"));
  EXPECT_EQ(TakenUtc(told, {}), Time("2024:05:30 23:00:00"));
  EXPECT_EQ(TakenUtc(told, 5400), Time("2024:05:31 02:30:00"));
}

TEST(GpsPlaces, AreFoundInTheList) {
  constexpr std::string_view kList =
      "# mine\r\n\r\nHome = 48.5, 11.25\nA = b=1,2\n;x\nLake=45,30,0,N,79,15,0,W\nwrong\nEnd=1,1";
  size_t badLine = 0;
  const auto home = FindListedPlace(kList, "home", badLine),
             lake = FindListedPlace(kList, " Lake ", badLine),
             odd = FindListedPlace(kList, "a = B", badLine);
  ASSERT_TRUE(home && lake && odd);
  EXPECT_EQ(badLine, 0u);
  EXPECT_EQ(home->longitude, 11.25);
  EXPECT_EQ(lake->latitude, 45.5);
  EXPECT_EQ(lake->longitude, -79.25);
  EXPECT_EQ(odd->longitude, 2);
  EXPECT_FALSE(FindListedPlace(kList, "Sea", badLine));
  EXPECT_EQ(badLine, 7u);
  for (const char* line : {"x=91,0", "x=0,361", "x=1", "x=1,2,3", "=1,2", "x=nan,1"})
    EXPECT_FALSE(FindListedPlace(line, "x", badLine)) << line;
}

}  // namespace
}  // namespace fotomill::test
