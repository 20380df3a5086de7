#include "desktop/models/metadata/place_list.h"

#include <algorithm>
#include <functional>

#include "core/file_edit.h"
#include "core/limits.h"
#include "core/text.h"
#include "metadata/gps.h"
#include "platform/paths.h"
#include "settings/exif_settings.h"
#include "settings/job_options.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

std::string LineOf(std::string_view name, const GpsPlace& place) {
  return std::string(name) + " = " + GpsDegreesText(place.latitude) + "," +
         GpsDegreesText(place.longitude);
}

// Whether a line of the list is that of a name.
bool IsLineOf(const std::string& line, std::string_view name) {
  const std::vector<ListedPlace> places = ListedPlaces(line);
  return places.size() == 1 && EqualIgnoringCase(places.front().name, name);
}

// Replaces the lines of a name by what `change` makes of them; an empty line is removed.
bool ChangeLines(std::string& list, std::string_view name,
                 const std::function<std::string(const std::string& line)>& change) {
  std::string changed;
  bool found = false;
  for (size_t start = 0; start < list.size();) {
    const size_t end = std::min(list.find('\n', start), list.size() - 1) + 1;
    std::string line = list.substr(start, end - start);
    start = end;
    if (IsLineOf(line, name)) {
      found = true;
      line = change(line);
    }
    changed += line;
  }
  list = changed;
  return found;
}

// `edit` leaves the list alone if it returns a problem.
std::string Edit(const std::function<std::string(std::string& list)>& edit) {
  const std::string path = LocationsPath();
  if (path.empty()) return Tr("There is no data folder.");
  std::string problem;
  const EditResult result = EditTextFile(path, limits.listFileBytes,
                                         [&](std::string& list) { problem = edit(list); });
  if (!problem.empty()) return problem;
  if (result == EditResult::NotRead) return WithReason(Tr("\"%1\" cannot be read.", path));
  if (result == EditResult::Failed) return WithReason(Tr("\"%1\" cannot be written.", path));
  return {};
}

std::string NotListed(std::string_view name) {
  return Tr("\"%1\" is not in the list of places.", std::string(name));
}

bool HasPlace(std::string_view list, std::string_view name) {
  size_t badLine = 0;
  return FindListedPlace(list, name, badLine).has_value();
}

}  // namespace

std::vector<OfferedPlace> OfferedPlaces() {
  std::vector<OfferedPlace> places;
  GpsLocation home;
  if (GpsLocationFromSettings(home)) {
    const GpsPlace place{.latitude = GpsDegrees(home.latitude),
                         .longitude = GpsDegrees(home.longitude)};
    places.push_back({Tr("Default location"), place, false});
  }
  std::string list;
  if (!ReadLocations(list).empty()) return places;
  for (const ListedPlace& place : ListedPlaces(list)) places.push_back({place.name, place.place});
  return places;
}

std::string PlaceNameProblem(std::string_view name) {
  const bool plain =
      !name.empty() && name.front() != '#' && name.front() != ';' &&
      std::ranges::none_of(name, [](char c) { return static_cast<uint8_t>(c) < ' '; }) &&
      name.front() != ' ' && name.back() != ' ';
  return plain ? std::string() : Tr("A name cannot be empty, or begin with \"#\" or \";\".");
}

std::string AddPlace(std::string_view name, const GpsPlace& place) {
  if (const std::string problem = PlaceNameProblem(name); !problem.empty()) return problem;
  return Edit([&](std::string& list) {
    if (HasPlace(list, name)) return Tr("There is already a place \"%1\".", std::string(name));
    if (!list.empty() && list.back() != '\n') list += platform::kLineEnd;
    list.append(LineOf(name, place)).append(platform::kLineEnd);
    return std::string();
  });
}

std::string RenamePlace(std::string_view from, std::string_view to) {
  if (const std::string problem = PlaceNameProblem(to); !problem.empty()) return problem;
  return Edit([&](std::string& list) {
    if (!EqualIgnoringCase(from, to) && HasPlace(list, to))
      return Tr("There is already a place \"%1\".", std::string(to));
    const bool found = ChangeLines(list, from, [&](const std::string& line) {
      return std::string(to) + " =" + line.substr(line.rfind('=') + 1);
    });
    return found ? std::string() : NotListed(from);
  });
}

std::string RemovePlace(std::string_view name) {
  return Edit([&](std::string& list) {
    return ChangeLines(list, name, [](const std::string&) { return std::string(); })
               ? std::string()
               : NotListed(name);
  });
}

}  // namespace fotomill::desktop
