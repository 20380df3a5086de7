#include "metadata/exif/exif_places.h"

#include <iterator>
#include <string_view>

#include "core/text.h"
#include "metadata/exif/exif_walk.h"

namespace fotomill {

namespace {

// Tags of an angle and of its hemisphere, which directly precedes it.
constexpr uint16_t kLatitude = 0x0002, kLongitude = 0x0004, kDestinationLatitude = 0x0014,
                   kDestinationLongitude = 0x0016;

// Degrees, minutes and seconds as one unsigned number; none if invalid.
std::optional<double> AngleOf(const ExifValue& value) {
  if (value.type != kExifRational || value.count != 3) return std::nullopt;
  double parts[3];
  for (uint64_t i = 0; i < 3; ++i) {
    const uint32_t divisor = value.bytes.U32(8 * i + 4);
    // seconds are optional, and so are minutes if degrees have decimals
    if (divisor == 0 && i == 0) return std::nullopt;
    parts[i] = divisor == 0 ? 0 : static_cast<double>(value.bytes.U32(8 * i)) / divisor;
  }
  return parts[0] + parts[1] / 60 + parts[2] / 3600;
}

class PlaceFinder : public ExifSink {
 public:
  void Directory(int32_t, std::string_view label) override { gps_ = label == "GPS"; }
  void Line(const ExifLine& line) override {
    const uint16_t tag = line.value.tag;
    if (!gps_ || tag >= std::size(angles_)) return;
    if (line.value.type == kExifAscii && line.value.count > 0)
      letters_[tag] = UpperCase(static_cast<char>(line.value.bytes.U8(0)));
    angles_[tag] = AngleOf(line.value);
  }
  std::optional<ExifPosition> Place(uint16_t latitude, uint16_t longitude) const {
    const auto north = Signed(latitude, "NS", 90), east = Signed(longitude, "EW", 180);
    if (!north || !east) return std::nullopt;
    return ExifPosition{*north, *east};
  }

 private:
  std::optional<double> Signed(uint16_t tag, std::string_view hemispheres, double most) const {
    const char letter = letters_[tag - 1];
    const auto angle = angles_[tag];
    if (!angle || *angle > most || hemispheres.find(letter) == std::string_view::npos)
      return std::nullopt;
    return letter == hemispheres[1] ? -*angle : *angle;
  }

  bool gps_ = false;
  std::optional<double> angles_[kDestinationLongitude + 1];
  char letters_[kDestinationLongitude + 1] = {};
};

}  // namespace

ExifPlaces FindExifPlaces(std::span<const uint8_t> block) {
  PlaceFinder finder;
  if (!WalkExif(block, &finder)) return {};
  return {.taken = finder.Place(kLatitude, kLongitude),
          .destination = finder.Place(kDestinationLatitude, kDestinationLongitude)};
}

}  // namespace fotomill
