// Source: CIPA DC-008-2012, section 4.6.6.
#include "metadata/edit/gps_place.h"

#include <algorithm>
#include <cmath>

#include "core/text.h"
#include "metadata/edit/exif_dates.h"
#include "metadata/edit/exif_input.h"
#include "metadata/exif/exif_tags.h"
#include "metadata/gps.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr uint16_t kLatitudeRef = 0x0001, kLatitude = 0x0002, kLongitudeRef = 0x0003,
                   kLongitude = 0x0004, kAltitudeRef = 0x0005, kAltitude = 0x0006, kTime = 0x0007,
                   kDatum = 0x0012, kDate = 0x001d;

// Degrees, minutes and seconds to four decimals (three millimeters).
ExifEntry Angle(uint16_t tag, double degrees) {
  constexpr int64_t kParts = 10000;
  const int64_t all = std::llround(std::abs(degrees) * 3600 * kParts);
  const auto part = [](int64_t number) { return static_cast<uint32_t>(number); };
  return ExifRationalEntry(tag, {{part(all / (3600 * kParts)), 1},
                                 {part(all / (60 * kParts) % 60), 1},
                                 {part(all % (60 * kParts)), part(kParts)}});
}

double Wrapped(double longitude) {
  return longitude > 180 ? longitude - 360 : longitude < -180 ? longitude + 360 : longitude;
}

// Value `i` of a RATIONAL entry, if present.
std::optional<double> RationalOf(const ExifEntry* entry, size_t i, bool bigEndian) {
  if (entry == nullptr || entry->type != kExifRational || entry->value.size() < 8 * (i + 1))
    return {};
  const auto number = [&](size_t at) {
    uint32_t value = 0;
    for (size_t k = 0; k < 4; ++k) value = value << 8 | entry->value[at + (bigEndian ? k : 3 - k)];
    return value;
  };
  const uint32_t denominator = number(8 * i + 4);
  if (denominator == 0) return {};
  return static_cast<double>(number(8 * i)) / denominator;
}

std::optional<double> AngleOf(const ExifDirectories& directories, uint16_t tag, uint16_t refTag,
                              char negative, double most) {
  const ExifEntry* entry = FindExifEntry(directories.gps, tag);
  const ExifEntry* ref = FindExifEntry(directories.gps, refTag);
  const auto degrees = RationalOf(entry, 0, directories.bigEndian);
  if (!degrees || ref == nullptr) return {};
  const double angle = *degrees + RationalOf(entry, 1, directories.bigEndian).value_or(0) / 60 +
                       RationalOf(entry, 2, directories.bigEndian).value_or(0) / 3600;
  if (!(angle <= most)) return {};
  return ExifEntryText(*ref).starts_with(negative) ? -angle : angle;
}

std::string_view Trimmed(std::string_view text) {
  constexpr std::string_view kBlanks = " \t\r";
  text.remove_prefix(std::min(text.find_first_not_of(kBlanks), text.size()));
  return text.substr(0, text.find_last_not_of(kBlanks) + 1);
}

// Calls `take` with the number of each line, and its place, if valid, until that returns false.
template <typename Take>
void EachPlace(std::string_view list, const Take& take) {
  for (size_t number = 1; !list.empty(); ++number) {
    const size_t end = std::min(list.find('\n'), list.size());
    const std::string_view line = Trimmed(list.substr(0, end));
    list.remove_prefix(std::min(end + 1, list.size()));
    if (line.empty() || line[0] == '#' || line[0] == ';') continue;
    const size_t equals = line.rfind('=');
    const bool named = equals != std::string_view::npos && equals > 0;
    const auto place = named ? ParseGpsPlace(line.substr(equals + 1)) : std::nullopt;
    if (!take(number, Trimmed(line.substr(0, named ? equals : 0)), place)) return;
  }
}

}  // namespace

ExifChanges PlaceEntries(const GpsPlace& place) {
  ExifChanges changes;
  const auto add = [&](ExifEntry entry) {
    changes.push_back({ExifPlace::Gps, entry.tag, std::move(entry)});
  };
  const double longitude = Wrapped(place.longitude);
  add(ExifTextEntry(kLatitudeRef, place.latitude < 0 ? "S" : "N"));
  add(Angle(kLatitude, place.latitude));
  add(ExifTextEntry(kLongitudeRef, longitude < 0 ? "W" : "E"));
  add(Angle(kLongitude, longitude));
  if (place.altitude && std::abs(*place.altitude) < 1e6) {
    const uint8_t below = *place.altitude < 0 ? 1 : 0;
    add({kAltitudeRef, kExifByte, 1, {below}});
    const auto millimeters = static_cast<uint32_t>(std::llround(std::abs(*place.altitude) * 1000));
    add(ExifRationalEntry(kAltitude, {{millimeters, 1000}}));
  }
  if (place.time) {
    const std::string text = ExifTimeText(*place.time);
    const int64_t second = (*place.time % 86400 + 86400) % 86400;
    add(ExifRationalEntry(kTime, {{static_cast<uint32_t>(second / 3600), 1},
                                  {static_cast<uint32_t>(second / 60 % 60), 1},
                                  {static_cast<uint32_t>(second % 60), 1}}));
    add(ExifTextEntry(kDate, text.substr(0, 10)));
  }
  add(ExifTextEntry(kDatum, "WGS-84"));
  return changes;
}

std::optional<GpsPlace> PlaceOf(const ExifDirectories& directories) {
  const auto latitude = AngleOf(directories, kLatitude, kLatitudeRef, 'S', 90),
             longitude = AngleOf(directories, kLongitude, kLongitudeRef, 'W', 180);
  if (!latitude || !longitude) return {};
  return GpsPlace{.latitude = *latitude, .longitude = *longitude};
}

std::string MapLink(const GpsPlace& place) {
  const std::string latitude = GpsDegreesText(place.latitude),
                    longitude = GpsDegreesText(place.longitude);
  return "https://www.openstreetmap.org/?mlat=" + latitude + "&mlon=" + longitude + "#map=15/" +
         latitude + "/" + longitude;
}

std::optional<int64_t> TakenUtc(const ExifDirectories& directories, std::optional<int64_t> offset) {
  // DateTimeOriginal and DateTimeDigitized, each with its offset from UTC
  constexpr struct { uint16_t time, offset; } kTags[] = {{0x9003, 0x9011}, {0x9004, 0x9012}};
  for (const auto& tags : kTags) {
    const ExifEntry* entry = FindExifEntry(directories.exif, tags.time);
    const auto time = entry == nullptr ? std::nullopt : ParseExifTime(ExifEntryText(*entry));
    if (!time) continue;
    if (offset) return *time + *offset;
    const ExifEntry* zone = FindExifEntry(directories.exif, tags.offset);
    return *time - (zone == nullptr ? 0 : ParseTimeShift(ExifEntryText(*zone)).value_or(0));
  }
  return {};
}

ExifChanges TrackPlace(const GpsTrack& track, std::optional<int64_t> offset,
                       const ExifDirectories& old, std::string& reason) {
  const auto time = TakenUtc(old, offset);
  const auto place = time ? track.At(*time) : std::nullopt;
  if (!time) reason = Tr("It does not tell when it was taken.");
  if (time && !place)
    reason = Tr("The track has no point within %1 minutes of its time.", GpsTrack::kMostGap / 60);
  return place ? PlaceEntries(*place) : ExifChanges();
}

std::optional<GpsPlace> ParseGpsPlace(std::string_view text) {
  GpsPlace place;
  GpsLocation location;
  text = Trimmed(text);
  if (ParseGpsDegrees(text, place.latitude, place.longitude)) return place;
  if (!ParseGpsLocation(text, location)) return {};
  place.latitude = GpsDegrees(location.latitude);
  place.longitude = GpsDegrees(location.longitude);
  if (std::abs(place.latitude) > 90 || std::abs(place.longitude) > 360) return {};
  return place;
}

std::optional<GpsPlace> FindListedPlace(std::string_view list, std::string_view name,
                                        size_t& badLine) {
  badLine = 0;
  std::optional<GpsPlace> found;
  EachPlace(list, [&](size_t number, std::string_view lineName, const auto& place) {
    if (!place && badLine == 0) badLine = number;
    if (place && EqualIgnoringCase(lineName, Trimmed(name))) found = place;
    return !found;
  });
  return found;
}

std::vector<ListedPlace> ListedPlaces(std::string_view list) {
  std::vector<ListedPlace> places;
  EachPlace(list, [&](size_t, std::string_view name, const auto& place) {
    if (place) places.push_back({std::string(name), *place});
    return true;
  });
  return places;
}

}  // namespace fotomill
