#include "desktop/models/setup/override_options.h"

#include <algorithm>

#include "registry/registry.h"

namespace fotomill::desktop {

const std::vector<OverrideOptions>& AllOverrideOptions() {
  using enum KeyNumber;
  // clang-format off
  static const std::vector<OverrideOptions> options = {
      {"BMP",  "OverrideBmpBox",  {WriteOS2Bitmaps}},
      {"GIF",  "OverrideGifBox",  {WriteGIFInterlaced, CreateGif89, FXColorDither, FXBidirectional}},
      {"HDP",  "OverrideHdpBox",  {HDPCompression, TiffResolution}},
      {"ICO",  "OverrideIcoBox",  {ICOCompression}},
      {"JPG",  "OverrideJpgBox",  {JpegCompression, JpegSubsample, WriteJpegProgressive, JpegStoreDPI, TiffResolution,
                                   AlphaBackground}},
      {"MAC",  "OverrideMacBox",  {CreateMacbinaryHeader, FXMonoDither, FXThreshold}},
      {"PNG",  "OverridePngBox",  {PngCompression}},
      {"TGA",  "OverrideTgaBox",  {CreateTarga16}},
      {"TIF",  "OverrideTifBox",  {TiffOptions, TiffResolution, JpegCompression}},
      {"WEBP", "OverrideWebPBox", {WebPLossless, WebPQualityFactor, WebPAllowMixed}},
  };
  // clang-format on
  return options;
}

const OverrideOptions* FindOverrideOptions(std::string_view extension) {
  const int32_t wanted = FindFormatByName("a." + std::string(extension));
  if (wanted == kNoFormat || !CanWrite(FormatRow(wanted))) return nullptr;
  for (const OverrideOptions& options : AllOverrideOptions()) {
    const int32_t row = FindFormatByName(std::string("a.") + options.extension);
    if (row != kNoFormat && FormatRow(row).write == FormatRow(wanted).write) return &options;
  }
  return nullptr;
}

std::vector<SetupItem> ItemsOf(const OverrideOptions& options) {
  std::vector<SetupItem> items;
  for (const KeyNumber key : options.keys) {
    const auto found = std::ranges::find(SetupItems(), key, &SetupItem::key);
    if (found != SetupItems().end()) items.push_back(*found);
  }
  return items;
}

}  // namespace fotomill::desktop
