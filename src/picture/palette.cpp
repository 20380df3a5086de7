#include "picture/palette.h"

#include <algorithm>
#include <span>

namespace fotomill {

namespace {

struct Rgb {
  uint8_t red, green, blue;
};

// Appends colors to a palette, or only counts them if it is null.
class PaletteFiller {
 public:
  explicit PaletteFiller(Palette* palette) : palette_(palette) {
    if (palette_ != nullptr) palette_->fill(0);
  }
  void Add(Rgb color) {
    if (palette_ != nullptr) {
      uint8_t* entry = palette_->data() + 3 * count_;
      entry[0] = color.red;
      entry[1] = color.green;
      entry[2] = color.blue;
    }
    ++count_;
  }
  void AddAll(std::span<const Rgb> colors) {
    for (const Rgb& color : colors) Add(color);
  }
  // Every combination of the levels; the first channel varies slowest.
  void AddCube(std::span<const uint8_t> reds, std::span<const uint8_t> greens,
               std::span<const uint8_t> blues) {
    for (const uint8_t red : reds) {
      for (const uint8_t green : greens) {
        for (const uint8_t blue : blues) Add({red, green, blue});
      }
    }
  }
  int32_t Count() const { return count_; }

 private:
  Palette* palette_;
  int32_t count_ = 0;
};

constexpr uint8_t kTwoSteps[] = {0, 0xff};
constexpr uint8_t kThreeSteps[] = {0, 0x80, 0xff};
constexpr uint8_t kFourSteps[] = {0, 0x55, 0xaa, 0xff};
constexpr uint8_t kSixSteps[] = {0, 0x33, 0x66, 0x99, 0xcc, 0xff};
constexpr uint8_t kSevenSteps[] = {0, 0x2b, 0x55, 0x80, 0xaa, 0xd5, 0xff};
constexpr uint8_t kEightSteps[] = {0, 0x24, 0x48, 0x6c, 0x90, 0xb4, 0xd8, 0xff};
constexpr uint8_t kTwelveSteps[] = {0,    0x17, 0x2e, 0x46, 0x5d, 0x74,
                                    0x8b, 0xa2, 0xb9, 0xd1, 0xe8, 0xff};

constexpr Rgb kPrimaries[] = {{0, 0, 0},   {255, 0, 0},   {0, 255, 0},   {255, 255, 0},
                              {0, 0, 255}, {255, 0, 255}, {0, 255, 255}, {255, 255, 255}};
constexpr Rgb kVga[] = {{0, 0, 0},          {0x80, 0, 0},    {0, 0x80, 0},    {0x80, 0x80, 0},
                        {0, 0, 0x80},       {0x80, 0, 0x80}, {0, 0x80, 0x80}, {0x80, 0x80, 0x80},
                        {0xc0, 0xc0, 0xc0}, {255, 0, 0},     {0, 255, 0},     {255, 255, 0},
                        {0, 0, 255},        {255, 0, 255},   {0, 255, 255},   {255, 255, 255}};

// `count` evenly spaced grays between black and white, excluding both.
void AddInnerGrays(PaletteFiller& filler, int32_t count) {
  for (int32_t i = 1; i <= count; ++i) {
    const auto level = static_cast<uint8_t>((i * 255 + (count + 1) / 2) / (count + 1));
    filler.Add({level, level, level});
  }
}

}  // namespace

int32_t MakeDefaultPalette(Palette* palette, int32_t* depth, int32_t kind) {
  PaletteFiller filler(palette);
  int32_t kindDepth = 8;
  switch (kind) {
    case 0:
      filler.AddAll(std::span(kPrimaries).first(1));
      filler.AddAll(std::span(kPrimaries).last(1));
      kindDepth = 1;
      break;
    case 1:
      filler.AddAll(kPrimaries);
      kindDepth = 3;
      break;
    case 2:
      filler.AddAll(kVga);
      kindDepth = 4;
      break;
    case 3:
      filler.AddCube(kFourSteps, kFourSteps, kTwoSteps);
      kindDepth = 5;
      break;
    case 4:
      filler.AddCube(kFourSteps, kFourSteps, kFourSteps);
      kindDepth = 6;
      break;
    case 5:
      filler.AddCube(kFourSteps, kEightSteps, kFourSteps);
      kindDepth = 7;
      break;
    case 6: filler.AddCube(kSixSteps, kSixSteps, kSixSteps); break;
    case 8:
      filler.AddCube(kSixSteps, kSixSteps, kSixSteps);
      AddInnerGrays(filler, 40);
      break;
    case 9:
      filler.AddCube(kSevenSteps, kTwelveSteps, kThreeSteps);
      AddInnerGrays(filler, 4);
      break;
    default: filler.AddCube(kEightSteps, kEightSteps, kFourSteps); break;
  }
  if (depth != nullptr) *depth = kindDepth;
  return filler.Count();
}

Palette GrayRamp() {
  Palette ramp;
  for (size_t i = 0; i < ramp.size(); ++i) ramp[i] = static_cast<uint8_t>(i / 3);
  return ramp;
}

}  // namespace fotomill
