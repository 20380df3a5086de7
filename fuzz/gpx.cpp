// A GPX track, and where it was at times around its own; the input is also read as a list of
// places.

#include <cmath>
#include <cstdlib>

#include "metadata/edit/exif_dates.h"
#include "metadata/edit/gps_place.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  using namespace fotomill;
  GpsTrack track;
  if (track.Parse({data, size}) == Status::Ok) {
    const int64_t noon = ParseExifTime("2024:05:31 12:00:00").value_or(0);
    for (int64_t time = noon - 7200; time <= noon + 7200; time += 300) {
      const auto place = track.At(time);
      if (!place) continue;
      if (!(std::abs(place->latitude) <= 90) || !(std::abs(place->longitude) <= 180)) std::abort();
      (void)PlaceEntries(*place);
    }
  }
  const std::string_view list(reinterpret_cast<const char*>(data), size);
  size_t badLine = 0;
  if (const auto place = FindListedPlace(list, "home", badLine)) (void)MapLink(*place);
  return 0;
}
