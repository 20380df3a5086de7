#pragma once

#include <array>
#include <cstdint>
#include <span>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "picture/packed_image.h"

namespace fotomill {

// How the colors of an ICC profile become those of a screen, by the profile's perceptual intent.
// Profiles of RGB and of gray pictures count; none, one of another kind and one that is damaged
// stand for sRGB. Where the screen shows the colors as they are, nothing is changed.
class ColorTransform {
 public:
  // `source` is the profile of the pictures, `screen` that of the screen, both as files hold them.
  // Only one of RGB counts as the latter. Takes from a part of a millisecond to some milliseconds.
  explicit ColorTransform(std::span<const uint8_t> source, std::span<const uint8_t> screen = {});
  ~ColorTransform();
  ColorTransform(const ColorTransform&) = delete;
  ColorTransform& operator=(const ColorTransform&) = delete;

  bool ChangesColors() const { return transform_ != nullptr; }  // false: Apply does nothing
  // Changes the pixels of an image of 24 bits, or the color table of a smaller one; large images on
  // all cores. A picture in colors with the profile of a gray one stays as it is. Any number of
  // threads may call this at once. FunctionCancelled (4) when `stop` was asked meanwhile: a part of
  // the pixels is changed then.
  Status Apply(PackedImage& image, const StopToken& stop = {}) const;

 private:
  static constexpr int32_t kGrays = 256;

  void ApplyToColorTable(PackedImage& image) const;
  void ApplyToRows(PackedImage& image, int32_t first, int32_t end) const;
  void MapGrays(uint8_t* bgr, int32_t pixels) const;
  bool ChangesTestColors();

  void* transform_ = nullptr;  // the library's; null where nothing changes
  bool gray_ = false;          // the profile is one of gray pictures: `grays_` says it all
  std::array<uint8_t, 3 * kGrays> grays_{};
};

}  // namespace fotomill
