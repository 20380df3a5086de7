#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "metadata/edit/picture_edit.h"

namespace fotomill {

// Where, and if known, how high and when. Degrees, north and east positive; meters above the sea;
// seconds since 1970 UTC.
struct GpsPlace {
  double latitude = 0, longitude = 0;
  std::optional<double> altitude = {};
  std::optional<int64_t> time = {};
};

// The entries that tell a place; what else a GPS directory says stays.
ExifChanges PlaceEntries(const GpsPlace& place);
// The place that a GPS directory tells; none without latitude and longitude. Values in the set's
// byte order.
std::optional<GpsPlace> PlaceOf(const ExifDirectories& directories);
// A page of OpenStreetMap with a mark at the place.
std::string MapLink(const GpsPlace& place);

// A recorded track.
class GpsTrack {
 public:
  // Reads a GPX file: the points of its tracks that have a time. DamagedFile (2) for what is no GPX,
  // MemoryAllocationError (6) beyond the limit. Source: Topografix, "GPX 1.1 Schema Documentation".
  Status Parse(std::span<const uint8_t> file);
  bool Empty() const { return points_.empty(); }
  // Where the track was at a time: between two points, or at one that is at most kMostGap away; none
  // further away from all of them.
  std::optional<GpsPlace> At(int64_t time) const;
  static constexpr int64_t kMostGap = 1800;  // seconds

 private:
  struct Point {
    double time = 0;  // seconds since 1970 UTC
    GpsPlace place;
  };
  std::vector<Point> points_;  // by time
};

// When a picture was taken, UTC: the camera's time and `offset`; without one, the offset that EXIF
// tells, else none. None for pictures without a time.
std::optional<int64_t> TakenUtc(const ExifDirectories& directories, std::optional<int64_t> offset);

// Finds a place in a list: a line each of NAME = LAT,LON, in decimal degrees or as in
// "45,19,48.000,N,79,13,12.000,W"; empty lines and lines that begin with # or ; do not count. Case
// of names does not matter. `badLine` is the first line before it, from 1, that is none of these; 0
// if all are.
std::optional<GpsPlace> FindListedPlace(std::string_view list, std::string_view name,
                                        size_t& badLine);

}  // namespace fotomill
