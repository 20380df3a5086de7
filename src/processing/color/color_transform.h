#pragma once

#include <array>
#include <cstdint>
#include <span>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "picture/packed_image.h"

namespace fotomill {

// Converts colors from an ICC profile to the screen's, with perceptual intent. RGB and gray
// profiles are used; missing, damaged or other profiles count as sRGB. If source and screen are
// equivalent, nothing is changed.
class ColorTransform {
 public:
  // `source` is the picture's profile, `screen` the screen's, as stored in files. The latter must
  // be RGB. Takes up to a few milliseconds.
  explicit ColorTransform(std::span<const uint8_t> source, std::span<const uint8_t> screen = {});
  ~ColorTransform();
  ColorTransform(const ColorTransform&) = delete;
  ColorTransform& operator=(const ColorTransform&) = delete;

  bool ChangesColors() const { return transform_ != nullptr; }  // false: Apply is a no-op
  // Converts the pixels of a 24-bit image or the color table of a
  // palette image; large images on all cores. Color pictures with a
  // gray profile are left unchanged. Thread-safe. FunctionCancelled
  // (4) if `stop` was requested; some pixels are converted then.
  Status Apply(PackedImage& image, const StopToken& stop = {}) const;

 private:
  static constexpr int32_t kGrays = 256;

  void ApplyToColorTable(PackedImage& image) const;
  void ApplyToRows(PackedImage& image, int32_t first, int32_t end) const;
  void MapGrays(uint8_t* bgr, int32_t pixels) const;
  bool ChangesTestColors();

  void* transform_ = nullptr;  // the library's handle; null if nothing changes
  bool gray_ = false;          // the source is a gray profile: only `grays_` is used
  std::array<uint8_t, 3 * kGrays> grays_{};
};

}  // namespace fotomill
