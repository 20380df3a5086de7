#include "processing/color/color_transform.h"

#include <gtest/gtest.h>
#include <lcms2.h>

#include <cmath>
#include <cstring>

#include "processing/pictures.h"

namespace fotomill {
namespace {

constexpr cmsCIExyY kDaylight = {0.3127, 0.3290, 1};

std::vector<uint8_t> Saved(cmsHPROFILE profile) {
  cmsUInt32Number size = 0;
  cmsSaveProfileToMem(profile, nullptr, &size);
  std::vector<uint8_t> bytes(size);
  cmsSaveProfileToMem(profile, bytes.data(), &size);
  cmsCloseProfile(profile);
  return bytes;
}

// The primaries of Adobe RGB (1998), whose green is far outside sRGB.
std::vector<uint8_t> WideProfile() {
  const cmsCIExyYTRIPLE primaries = {{0.64, 0.33, 1}, {0.21, 0.71, 1}, {0.15, 0.06, 1}};
  cmsToneCurve* const gamma = cmsBuildGamma(nullptr, 563.0 / 256);
  cmsToneCurve* const curves[] = {gamma, gamma, gamma};
  const auto bytes = Saved(cmsCreateRGBProfile(&kDaylight, &primaries, curves));
  cmsFreeToneCurve(gamma);
  return bytes;
}

std::vector<uint8_t> GrayProfile(double gamma) {
  cmsToneCurve* const curve = cmsBuildGamma(nullptr, gamma);
  const auto bytes = Saved(cmsCreateGrayProfile(&kDaylight, curve));
  cmsFreeToneCurve(curve);
  return bytes;
}

double Encoded(double light) {
  light = std::clamp(light, 0.0, 1.0);
  return 255 * (light <= 0.0031308 ? 12.92 * light : 1.055 * std::pow(light, 1 / 2.4) - 0.055);
}

// A wide-gamut color, 0x00RRGGBB, in sRGB: by the two standards' matrices, independent
// of the library.
std::array<double, 3> WideInSrgb(uint32_t color) {
  const double r = std::pow((color >> 16) / 255.0, 563.0 / 256),
               g = std::pow((color >> 8 & 255) / 255.0, 563.0 / 256),
               b = std::pow((color & 255) / 255.0, 563.0 / 256);
  const double x = 0.57667 * r + 0.18556 * g + 0.18823 * b,
               y = 0.29734 * r + 0.62736 * g + 0.07529 * b,
               z = 0.02703 * r + 0.07069 * g + 0.99134 * b;
  return {Encoded(3.2404542 * x - 1.5371385 * y - 0.4985314 * z),
          Encoded(-0.9692660 * x + 1.8760108 * y + 0.0415560 * z),
          Encoded(0.0556434 * x - 0.2040259 * y + 1.0572252 * z)};
}

TEST(ColorTransform, CanBeCanceled) {
  const StopSource stop;
  const auto picture = test::MakePicture(
      900, 900, [](int32_t x, int32_t y) { return test::Scatter(x, y) & 0xffffff; });
  const std::vector<uint32_t> before = test::Colors(*picture);
  stop.Stop();
  EXPECT_EQ(ColorTransform(WideProfile()).Apply(picture->image, stop.Token()),
            Status::FunctionCancelled);
  EXPECT_EQ(test::Colors(*picture), before);
}

TEST(ColorTransform, ConvertsWideGamutColors) {
  const ColorTransform transform(WideProfile());
  ASSERT_TRUE(transform.ChangesColors());
  const auto picture = test::MakePicture(
      1031, 1021, [](int32_t x, int32_t y) { return test::Scatter(x, y) & 0xffffff; });
  const std::vector<uint32_t> before = test::Colors(*picture);
  ASSERT_EQ(transform.Apply(picture->image), Status::Ok);
  const std::vector<uint32_t> after = test::Colors(*picture);
  for (size_t i = 0; i < before.size(); ++i) {
    const auto wanted = WideInSrgb(before[i]);
    for (int c = 0; c < 3; ++c)
      ASSERT_NEAR(after[i] >> (16 - 8 * c) & 255, wanted[static_cast<size_t>(c)], 1.6) << std::hex << before[i];
  }
  // The table of a palette image is converted like pixels.
  PackedImage small;
  ASSERT_EQ(NewPackedImage(1, 1, nullptr, 4, small), Status::Ok);
  small.ColorTable()[1] = 200;
  ASSERT_EQ(transform.Apply(small), Status::Ok);
  EXPECT_NEAR(small.ColorTable()[1], WideInSrgb(0x00c800)[1], 1);
  // If the screen has the same profile, nothing changes; pictures without a profile are sRGB.
  EXPECT_FALSE(ColorTransform(WideProfile(), WideProfile()).ChangesColors());
  PackedImage green;
  ASSERT_EQ(NewPackedImage(1, 1, nullptr, 24, green), Status::Ok);
  green.Row(0)[1] = 255;
  ASSERT_EQ(ColorTransform({}, WideProfile()).Apply(green), Status::Ok);
  EXPECT_NEAR(green.Row(0)[2], 144, 1);  // sRGB green has this much red in Adobe RGB
}

TEST(ColorTransform, GrayProfilesAreForGrayPictures) {
  const ColorTransform transform(GrayProfile(1));
  ASSERT_TRUE(transform.ChangesColors());
  const auto picture = test::MakePicture(
      256, 1, [](int32_t x, int32_t) { return static_cast<uint32_t>(x) * 0x10101; });
  ASSERT_EQ(transform.Apply(picture->image), Status::Ok);
  for (int32_t x = 0; x < 256; ++x)
    EXPECT_NEAR(picture->image.PixelAt(x, 0) & 255, Encoded(x / 255.0), 1) << x;
  const auto colored =
      test::MakePicture(2, 1, [](int32_t x, int32_t) { return x == 0 ? 0x404040u : 0x404041u; });
  ASSERT_EQ(transform.Apply(colored->image), Status::Ok);
  EXPECT_EQ(colored->image.PixelAt(0, 0), 0x404040);
}

// The offset of a tag's entry in the tag table.
size_t EntryOf(const std::vector<uint8_t>& profile, const char* name) {
  for (size_t at = 132; at + 12 <= profile.size(); at += 12) {
    if (std::memcmp(&profile[at], name, 4) == 0) return at;
  }
  ADD_FAILURE() << "no tag " << name;
  return 132;
}

void Put32(std::vector<uint8_t>& bytes, size_t at, size_t value) {
  for (int i = 0; i < 4; ++i)
    bytes[at + static_cast<size_t>(i)] = static_cast<uint8_t>(value >> (24 - 8 * i));
}

// Replaces the copyright tag by a chain of 100,000 steps that all share one matrix.
std::vector<uint8_t> WithEndlessSteps(std::vector<uint8_t> profile) {
  constexpr size_t kSteps = 100'000, kMatrix = 16 + 8 * kSteps, kMatrixSize = 12 + 12 * 4;
  const size_t entry = EntryOf(profile, "cprt"), start = (profile.size() + 3) / 4 * 4;
  profile.resize(start + kMatrix + kMatrixSize);
  std::memcpy(&profile[entry], "D2B0", 4);
  Put32(profile, entry + 4, start);
  Put32(profile, entry + 8, kMatrix + kMatrixSize);
  std::memcpy(&profile[start], "mpet\0\0\0\0\0\3\0\3", 12);
  Put32(profile, start + 12, kSteps);
  for (size_t i = 0; i < kSteps; ++i) {
    Put32(profile, start + 16 + 8 * i, kMatrix);
    Put32(profile, start + 20 + 8 * i, kMatrixSize);
  }
  std::memcpy(&profile[start + kMatrix], "matf\0\0\0\0\0\3\0\3", 12);
  for (size_t i = 0; i < 3; ++i) Put32(profile, start + kMatrix + 12 + 16 * i, 0x3f800000);
  Put32(profile, 0, profile.size());
  return profile;
}

TEST(ColorTransform, HostileProfilesDoNoHarm) {
  EXPECT_FALSE(ColorTransform({}).ChangesColors());
  EXPECT_FALSE(ColorTransform(Saved(cmsCreate_sRGBProfile())).ChangesColors());
  EXPECT_FALSE(ColorTransform(Saved(cmsCreateLab4Profile(nullptr))).ChangesColors());
  EXPECT_FALSE(ColorTransform(Saved(cmsCreateInkLimitingDeviceLink(cmsSigCmykData, 300))).ChangesColors());
  const std::vector<uint8_t> wide = WideProfile();
  EXPECT_TRUE(ColorTransform(WithEndlessSteps(wide)).ChangesColors());  // fast, by its other tags
  const auto picture =
      test::MakePicture(4, 4, [](int32_t x, int32_t y) { return test::Scatter(x, y) & 0xffffff; });
  for (size_t cut = 0; cut < wide.size(); cut += 7)
    ASSERT_EQ(ColorTransform({wide.data(), cut}).Apply(picture->image), Status::Ok);
  for (size_t place = 0; place < wide.size(); place += 3) {
    std::vector<uint8_t> damaged = wide;
    damaged[place] = static_cast<uint8_t>(damaged[place] ^ (place % 2 == 0 ? 0xff : 0x55));
    ASSERT_EQ(ColorTransform(damaged, wide).Apply(picture->image), Status::Ok);
    ASSERT_EQ(ColorTransform(wide, damaged).Apply(picture->image), Status::Ok);
  }
}

}  // namespace
}  // namespace fotomill
