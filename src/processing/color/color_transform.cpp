#include "processing/color/color_transform.h"

#include <lcms2.h>

#include <algorithm>
#include <cstdlib>
#include <functional>
#include <vector>

#include "core/workers/share_out.h"
#include "processing/color/color_profile.h"

// Pixels are passed to the library as stored in a packed image. Its one-pixel cache is disabled, so
// that threads can share a transform.

namespace fotomill {

namespace {

constexpr uint64_t kPixelsPerBand = 1 << 18;  // smaller bands are not worth a thread
constexpr int32_t kUnseen = 1;                // possible rounding difference of 8-bit values

// Null if it is not a device profile for RGB or gray.
Profile OpenProfile(std::span<const uint8_t> bytes) {
  const ProfileColors colors = ColorsOfProfile(bytes);
  const bool known = colors == ProfileColors::Rgb || colors == ProfileColors::Gray;
  return known ? OpenTrustedProfile(bytes) : nullptr;
}

Profile OpenSource(std::span<const uint8_t> bytes) {
  Profile source = OpenProfile(bytes);
  return source != nullptr ? std::move(source) : Profile(cmsCreate_sRGBProfile());
}

Profile OpenScreen(std::span<const uint8_t> bytes) {
  Profile screen = OpenProfile(bytes);
  const bool fits = screen != nullptr && cmsGetColorSpace(screen.get()) == cmsSigRgbData;
  return fits ? std::move(screen) : Profile(cmsCreate_sRGBProfile());
}

bool IsGray(const uint8_t* bgr, int32_t pixels, int32_t step) {
  for (int32_t i = 0; i < pixels; ++i, bgr += step) {
    if (bgr[0] != bgr[1] || bgr[1] != bgr[2]) return false;
  }
  return true;
}

bool IsGray(const PackedImage& image) {
  for (int32_t r = 0; r < image.Height(); ++r) {
    if (!IsGray(image.StoredRow(r).data(), image.Width(), 3)) return false;
  }
  return true;
}

// Distributes rows over the free cores; `work` gets the first row and the one after the last.
Status ForBandsOfRows(int32_t rows, uint64_t pixels, const StopToken& stop,
                      const std::function<void(int32_t, int32_t)>& work) {
  const auto bands = static_cast<int32_t>(
      std::clamp<uint64_t>(pixels / kPixelsPerBand, 1, static_cast<uint64_t>(rows)));
  const auto start = [&](int32_t band) {
    return static_cast<int32_t>(int64_t{rows} * band / bands);
  };
  const auto part = [&](int32_t band) {
    work(start(band), start(band + 1));
    return Status::Ok;
  };
  return ShareOut(bands, part, stop);
}

}  // namespace

ColorTransform::ColorTransform(std::span<const uint8_t> source, std::span<const uint8_t> screen) {
  const Profile from = OpenSource(source), to = OpenScreen(screen);
  if (from == nullptr || to == nullptr) return;
  gray_ = cmsGetColorSpace(from.get()) == cmsSigGrayData;
  // For the few gray levels no optimization is needed; it would cost precision in the shadows.
  const cmsUInt32Number flags = gray_ ? cmsFLAGS_NOCACHE | cmsFLAGS_NOOPTIMIZE : cmsFLAGS_NOCACHE;
  transform_ = cmsCreateTransform(from.get(), gray_ ? TYPE_GRAY_8 : TYPE_BGR_8, to.get(),
                                  TYPE_BGR_8, INTENT_PERCEPTUAL, flags);
  if (transform_ == nullptr || ChangesTestColors()) return;
  cmsDeleteTransform(transform_);
  transform_ = nullptr;
}

ColorTransform::~ColorTransform() {
  if (transform_ != nullptr) cmsDeleteTransform(transform_);
}

Status ColorTransform::Apply(PackedImage& image, const StopToken& stop) const {
  if (!ChangesColors() || image.Empty()) return Status::Ok;
  if (image.Bits() != 24) {
    ApplyToColorTable(image);
    return Status::Ok;
  }
  if (gray_ && !IsGray(image)) return Status::Ok;
  const uint64_t pixels =
      static_cast<uint64_t>(image.Width()) * static_cast<uint64_t>(image.Height());
  return ForBandsOfRows(image.Height(), pixels, stop,
                        [&](int32_t first, int32_t end) { ApplyToRows(image, first, end); });
}

void ColorTransform::ApplyToColorTable(PackedImage& image) const {
  uint8_t* const table = image.ColorTable().data();
  const int32_t colors = image.Colors();
  if (gray_ && !IsGray(table, colors, 4)) return;
  for (int32_t i = 0; i < colors; ++i) {
    uint8_t* const bgr = table + 4 * i;
    if (gray_) {
      MapGrays(bgr, 1);
    } else {
      cmsDoTransform(transform_, bgr, bgr, 1);
    }
  }
}

void ColorTransform::ApplyToRows(PackedImage& image, int32_t first, int32_t end) const {
  for (int32_t r = first; r < end; ++r) {
    uint8_t* const bgr = image.StoredRow(r).data();
    if (gray_) {
      MapGrays(bgr, image.Width());
    } else {
      cmsDoTransform(transform_, bgr, bgr, static_cast<cmsUInt32Number>(image.Width()));
    }
  }
}

void ColorTransform::MapGrays(uint8_t* bgr, int32_t pixels) const {
  for (uint8_t* const end = bgr + 3 * int64_t{pixels}; bgr < end; bgr += 3)
    std::copy_n(&grays_[3 * size_t{*bgr}], 3, bgr);
}

// Whether the transform changes any color of a test grid or any gray; for gray profiles, any gray.
bool ColorTransform::ChangesTestColors() {
  constexpr int32_t kSteps = 6, kGraySteps = 18;  // both include 0 and 255
  std::vector<uint8_t> colors, changed;
  const auto add = [&](int32_t blue, int32_t green, int32_t red) {
    for (const int32_t value : {blue, green, red}) colors.push_back(static_cast<uint8_t>(value));
  };
  for (int32_t i = 0; i < kGrays; ++i) {
    if (gray_ || i % (255 / (kGraySteps - 1)) == 0) add(i, i, i);
  }
  for (int32_t i = 0; i < kSteps * kSteps * kSteps && !gray_; ++i) {
    constexpr int32_t kStep = 255 / (kSteps - 1);
    add(i % kSteps * kStep, i / kSteps % kSteps * kStep, i / kSteps / kSteps * kStep);
  }
  changed.resize(colors.size());
  const auto pixels = static_cast<cmsUInt32Number>(colors.size() / 3);
  if (gray_) {
    std::array<uint8_t, kGrays> values;
    for (int32_t i = 0; i < kGrays; ++i) values[static_cast<size_t>(i)] = static_cast<uint8_t>(i);
    cmsDoTransform(transform_, values.data(), grays_.data(), pixels);
    std::ranges::copy(grays_, changed.begin());
  } else {
    cmsDoTransform(transform_, colors.data(), changed.data(), pixels);
  }
  return !std::ranges::equal(colors, changed,
                             [](uint8_t a, uint8_t b) { return std::abs(a - b) <= kUnseen; });
}

}  // namespace fotomill
