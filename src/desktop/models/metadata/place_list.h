#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "metadata/edit/gps_place.h"

namespace fotomill::desktop {

// A place to choose.
struct OfferedPlace {
  std::string name;
  GpsPlace place;
  bool listed = true;  // in the list of places; false: the default location
};
// The default location, if there is one, then the places of the user's list.
std::vector<OfferedPlace> OfferedPlaces();

// Changes the user's list, whose file is replaced as a whole; other lines, comments included, stay.
// Return what is wrong, a sentence; empty on success. Names are compared ignoring case.
std::string AddPlace(std::string_view name, const GpsPlace& place);
std::string RenamePlace(std::string_view from, std::string_view to);
std::string RemovePlace(std::string_view name);

// Why a name cannot be used in the list, a sentence; empty if it can.
std::string PlaceNameProblem(std::string_view name);

}  // namespace fotomill::desktop
