#include <algorithm>
#include <charconv>
#include <cmath>
#include <pugixml.hpp>

#include "metadata/edit/exif_dates.h"
#include "metadata/edit/gps_place.h"

namespace fotomill {

namespace {

// Parsing takes up to sixteen times this much memory.
constexpr size_t kMostBytes = size_t{32} << 20;

// An element's name without its namespace prefix.
std::string_view NameOf(const pugi::xml_node& node) {
  const std::string_view name = node.name();
  return name.substr(name.rfind(':') + 1);
}

std::optional<double> NumberOf(const char* given) {
  std::string_view text = given;
  constexpr std::string_view kBlanks = " \t\r\n";
  text.remove_prefix(std::min(text.find_first_not_of(kBlanks), text.size()));
  text = text.substr(0, text.find_last_not_of(kBlanks) + 1);
  if (text.starts_with('+')) text.remove_prefix(1);
  double number = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  if (error != std::errc{} || end != text.data() + text.size() || !std::isfinite(number)) return {};
  return number;
}

// "2024-05-31T12:03:00.5Z", or an offset such as +02:00 instead of Z; UTC if neither is given.
std::optional<double> TimeOf(const char* given) {
  constexpr size_t kSeconds = 19;  // up to and including the seconds
  std::string_view text = given;
  text.remove_prefix(std::min(text.find_first_not_of(" \t\r\n"), text.size()));
  const auto whole = ParseExifTime(text.substr(0, kSeconds));
  if (!whole) return {};
  text.remove_prefix(kSeconds);
  auto time = static_cast<double>(*whole);
  if (text.starts_with('.')) {
    const size_t end = std::min(text.find_first_not_of("0123456789", 1), text.size());
    double fraction = 0;
    if (std::from_chars(text.data(), text.data() + end, fraction).ec == std::errc{})
      time += fraction;
    text.remove_prefix(end);
  }
  text = text.substr(0, text.find_last_not_of(" \t\r\n") + 1);
  if (text.empty() || text == "Z") return time;
  const auto zone = ParseTimeShift(text);
  return zone ? std::optional(time - static_cast<double>(*zone)) : std::nullopt;
}

double Between(double a, double b, double part) { return a + (b - a) * part; }

}  // namespace

Status GpsTrack::Parse(std::span<const uint8_t> file) {
  points_.clear();
  if (file.size() > kMostBytes) return Status::MemoryAllocationError;
  pugi::xml_document document;
  const auto result = document.load_buffer(file.data(), file.size(), pugi::parse_default);
  if (result.status == pugi::status_out_of_memory) return Status::MemoryAllocationError;
  const pugi::xml_node root = document.document_element();
  if (!result || NameOf(root) != "gpx") return Status::DamagedFile;
  for (const pugi::xml_node& track : root.children()) {
    if (NameOf(track) != "trk") continue;
    for (const pugi::xml_node& segment : track.children()) {
      if (NameOf(segment) != "trkseg") continue;
      for (const pugi::xml_node& node : segment.children()) {
        if (NameOf(node) != "trkpt") continue;
        const auto latitude = NumberOf(node.attribute("lat").value()),
                   longitude = NumberOf(node.attribute("lon").value());
        Point point;
        std::optional<double> time;
        for (const pugi::xml_node& fact : node.children()) {
          if (NameOf(fact) == "time") time = TimeOf(fact.child_value());
          if (NameOf(fact) == "ele") point.place.altitude = NumberOf(fact.child_value());
        }
        if (!latitude || !longitude || !time || std::abs(*latitude) > 90 ||
            std::abs(*longitude) > 180)
          continue;
        point.time = *time;
        point.place.latitude = *latitude;
        point.place.longitude = *longitude;
        points_.push_back(point);
      }
    }
  }
  std::ranges::stable_sort(points_, {}, &Point::time);
  return Status::Ok;
}

std::optional<GpsPlace> GpsTrack::At(int64_t moment) const {
  const auto time = static_cast<double>(moment);
  const auto next = std::ranges::lower_bound(points_, time, {}, &Point::time);
  const Point* after = next == points_.end() ? nullptr : &*next;
  const Point* before = next == points_.begin() ? nullptr : &*std::prev(next);
  if (after != nullptr && after->time - time > kMostGap) after = nullptr;
  if (before != nullptr && time - before->time > kMostGap) before = nullptr;
  if (after == nullptr && before == nullptr) return {};
  GpsPlace place = (after != nullptr ? after : before)->place;
  if (after != nullptr && before != nullptr) {
    const double gap = after->time - before->time;
    const double part = gap > 0 ? (time - before->time) / gap : 1;
    const GpsPlace &a = before->place, &b = after->place;
    double east = b.longitude - a.longitude;  // in degrees; may cross the date line
    east = east > 180 ? east - 360 : east < -180 ? east + 360 : east;
    place.latitude = Between(a.latitude, b.latitude, part);
    place.longitude = std::remainder(a.longitude + east * part, 360);
    if (a.altitude && b.altitude) place.altitude = Between(*a.altitude, *b.altitude, part);
  }
  place.time = moment;
  return place;
}

}  // namespace fotomill
