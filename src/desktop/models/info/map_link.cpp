#include "desktop/models/info/map_link.h"

#include "metadata/edit/gps_place.h"

namespace fotomill::desktop {

std::string MapLinkOf(double latitude, double longitude) {
  GpsPlace place;
  place.latitude = latitude;
  place.longitude = longitude;
  return MapLink(place);
}

}  // namespace fotomill::desktop
