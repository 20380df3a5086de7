#pragma once

#include <string>

namespace fotomill::desktop {

// The address of a web map with a marker at a place, in degrees.
std::string MapLinkOf(double latitude, double longitude);

}  // namespace fotomill::desktop
