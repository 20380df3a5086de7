#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "metadata/edit/picture_edit.h"

namespace fotomill {

// A position, with altitude and time if known. Degrees, positive for north and east; meters above
// sea level; seconds since 1970 UTC.
struct GpsPlace {
  double latitude = 0, longitude = 0;
  std::optional<double> altitude = {};
  std::optional<int64_t> time = {};
};

// The entries for a place; other GPS entries are kept.
ExifChanges PlaceEntries(const GpsPlace& place);
// The place in a GPS directory; none without latitude and longitude. Values are in the byte order
// of `directories`.
std::optional<GpsPlace> PlaceOf(const ExifDirectories& directories);
// An OpenStreetMap link with a marker at the place.
std::string MapLink(const GpsPlace& place);

// A recorded track.
class GpsTrack {
 public:
  // Reads a GPX file: all track points with a time. DamagedFile (2) if it is not GPX,
  // MemoryAllocationError (6) beyond the limit. Source: Topografix, "GPX 1.1 Schema Documentation".
  Status Parse(std::span<const uint8_t> file);
  bool Empty() const { return points_.empty(); }
  // The position at a given time, interpolated between two points, or the nearest point within
  // kMostGap; none if there is no point that close.
  std::optional<GpsPlace> At(int64_t time) const;
  static constexpr int64_t kMostGap = 1800;  // seconds

 private:
  struct Point {
    double time = 0;  // seconds since 1970 UTC
    GpsPlace place;
  };
  std::vector<Point> points_;  // sorted by time
};

// When a picture was taken, UTC, computed from the camera's time and `offset`, or without that the
// EXIF offset, if any. None for pictures without a time.
std::optional<int64_t> TakenUtc(const ExifDirectories& directories, std::optional<int64_t> offset);

// The changes for a file taken on a track; a reason if it has no time, or no point is close.
ExifChanges TrackPlace(const GpsTrack& track, std::optional<int64_t> offset,
                       const ExifDirectories& old, std::string& reason);

// Parses a place: "LAT,LON" in decimal degrees, or "45,19,48.000,N,79,13,12.000,W".
std::optional<GpsPlace> ParseGpsPlace(std::string_view text);

// Looks up a place in a list with lines of the form NAME = LAT,LON, in decimal degrees or as
// "45,19,48.000,N,79,13,12.000,W". Empty lines and lines starting with # or ; are ignored. Names
// are case-insensitive. `badLine` is the number of the first invalid line before the match, counted
// from 1; 0 if there is none.
std::optional<GpsPlace> FindListedPlace(std::string_view list, std::string_view name,
                                        size_t& badLine);
// All places of such a list, in its order; invalid lines are left out.
struct ListedPlace {
  std::string name;
  GpsPlace place;
};
std::vector<ListedPlace> ListedPlaces(std::string_view list);

}  // namespace fotomill
