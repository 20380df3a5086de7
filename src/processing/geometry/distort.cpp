#include "processing/geometry/distort.h"

#include <array>
#include <cmath>
#include <numbers>

namespace fotomill {

namespace {

// Sine by interpolation in a table of exact numbers, with angles in full turns: the same on every
// processor, and accurate to 1e-6.
class Sines {
 public:
  static const Sines& Shared() {
    static const Sines sines;
    return sines;
  }
  double Of(double turns) const {
    const double place = (turns - std::floor(turns)) * kEntries;
    const auto index = static_cast<size_t>(place);
    return table_[index] +
           (table_[index + 1] - table_[index]) * (place - static_cast<double>(index));
  }

 private:
  static constexpr size_t kEntries = 4096;
  Sines() {
    for (size_t i = 0; i < table_.size(); ++i) {
      const double sine = std::sin(2 * std::numbers::pi * static_cast<double>(i) / kEntries);
      table_[i] = std::floor(sine * 16777216 + 0.5) / 16777216;
    }
  }
  std::array<double, kEntries + 2> table_;
};

// Computes a row of source positions from displacements: `way(x, y)` returns pixels to the right
// and down.
template <typename Way>
PlaceRow Moved(const WarpOrigin& origin, Way way) {
  return [=](int32_t left, int32_t y, std::span<SourcePlace> places) {
    for (SourcePlace& place : places) {
      // The displacement is rounded separately, so that tiles match the whole.
      place = way(static_cast<double>(left) + origin.left, static_cast<double>(y) + origin.top);
      place.x += static_cast<int64_t>(left++) << kPlaceBits;
      place.y += static_cast<int64_t>(y) << kPlaceBits;
    }
  };
}

Status Distort(PictureRecord& picture, const PlaceRow& places, const Work& work) {
  const Size size{picture.image.Width(), picture.image.Height()};
  return WarpPicture(picture, size, {.edgesRepeat = true}, places, work);
}

}  // namespace

int32_t WaveReach(double amplitude) {
  return static_cast<int32_t>(std::ceil(std::abs(amplitude))) + 3;
}

Status RipplePicture(PictureRecord& picture, double amplitude, double wavelength, double centerX,
                     double centerY, const WarpOrigin& origin, const Work& work) {
  const Sines& sines = Sines::Shared();
  return Distort(picture,
                 Moved(origin,
                       [=, &sines](double x, double y) {
                         const double dx = x + 0.5 - centerX, dy = y + 0.5 - centerY,
                                      r = std::sqrt(dx * dx + dy * dy);
                         if (r == 0) return SourcePlace{0, 0};
                         const double way = -amplitude * sines.Of(r / wavelength) / r;
                         return PlaceAt(way * dx, way * dy);
                       }),
                 work);
}

Status WavePicture(PictureRecord& picture, double amplitude, double wavelength, bool columns,
                   const WarpOrigin& origin, const Work& work) {
  const Sines& sines = Sines::Shared();
  return Distort(picture,
                 Moved(origin,
                       [=, &sines](double x, double y) {
                         const double way = -amplitude * sines.Of((columns ? x : y) / wavelength);
                         return columns ? PlaceAt(0, way) : PlaceAt(way, 0);
                       }),
                 work);
}

Status SwirlPicture(PictureRecord& picture, double degrees, double centerX, double centerY,
                    double radius, const Work& work) {
  const Sines& sines = Sines::Shared();
  return Distort(picture,
                 Moved({},
                       [=, &sines](double x, double y) {
                         const double dx = x + 0.5 - centerX, dy = y + 0.5 - centerY,
                                      r = std::sqrt(dx * dx + dy * dy);
                         if (r >= radius) return SourcePlace{0, 0};
                         const double share = 1 - r / radius, turns = degrees / 360 * share * share;
                         const double sine = sines.Of(turns), cosine = sines.Of(turns + 0.25);
                         return PlaceAt((cosine - 1) * dx + sine * dy,
                                        (cosine - 1) * dy - sine * dx);
                       }),
                 work);
}

Status BulgePicture(PictureRecord& picture, double amount, double centerX, double centerY,
                    double radius, const Work& work) {
  return Distort(picture, Moved({},
                                [=](double x, double y) {
                                  const double dx = x + 0.5 - centerX, dy = y + 0.5 - centerY;
                                  const double share = 1 - (dx * dx + dy * dy) / (radius * radius);
                                  if (share <= 0) return SourcePlace{0, 0};
                                  const double way = -amount * share * share;
                                  return PlaceAt(way * dx, way * dy);
                                }),
                 work);
}

}  // namespace fotomill
