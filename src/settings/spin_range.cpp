#include "settings/spin_range.h"

#include <limits>

#include "core/whole_number.h"

namespace fotomill {

namespace {

struct KeyRange {
  KeyNumber key;
  SpinRange range;
};

// clang-format off
constexpr KeyRange kRanges[] = {
    {KeyNumber::BrowserThumbnailPrecacheDelay, {0, 60000, 50}},   // milliseconds
    {KeyNumber::DitherBrightness,              {-100, 100, 1}},
    {KeyNumber::DitherContrast,                {-100, 100, 1}},
    {KeyNumber::FaceDetectPercentage,          {0, 100,   1}},
    {KeyNumber::FXBrightness,                  {-100, 100, 1}},
    {KeyNumber::FXContrast,                    {-100, 100, 1}},
    {KeyNumber::FXGrayLevel,                   {0, 256,   1}},    // shades, 0: all
    {KeyNumber::FXThreshold,                   {0, 255,   1}},    // 0: automatic
    {KeyNumber::HDPCompression,                {0, 255,   1}},    // quantizer, 0 is lossless
    {KeyNumber::JpegCompression,               {0, 100,   1}},    // quality
    {KeyNumber::MaximumPreviewDimension,       {16, 65535, 16}},  // pixels
    {KeyNumber::MovieQualityFactor,            {0, 10000, 100}},
    {KeyNumber::PngCompression,                {0, 9,     1}},    // deflate level
    {KeyNumber::PrintBrightness,               {-100, 100, 1}},
    {KeyNumber::PrintContrast,                 {-100, 100, 1}},
    {KeyNumber::PrintFontSize,                 {4, 72,    1}},    // points
    {KeyNumber::TiffResolution,                {1, 32767, 1}},    // dots per inch
    {KeyNumber::UndoLevels,                    {0, 1000,  1}},
    {KeyNumber::WebPQualityFactor,             {0, 100,   1}},
};
// clang-format on

}  // namespace

std::optional<SpinRange> LimitsOf(const KeyRow& row) {
  for (const KeyRange& range : kRanges) {
    if (&KeyOf(range.key) == &row) return range.range;
  }
  return std::nullopt;
}

SpinRange SpinRangeOf(const KeyRow& row) {
  return LimitsOf(row).value_or(SpinRange{0, std::numeric_limits<int32_t>::max(), 1});
}

std::string SpinRangeText(const SpinRange& range) {
  return std::to_string(range.minimum) + "," + std::to_string(range.maximum) + "," +
         std::to_string(range.step);
}

std::optional<SpinRange> ParseSpinRange(std::string_view text) {
  SpinRange range;
  int32_t* const numbers[] = {&range.minimum, &range.maximum, &range.step};
  for (int32_t* number : numbers) {
    if (number != numbers[0] && !text.starts_with(',')) return std::nullopt;
    if (number != numbers[0]) text.remove_prefix(1);
    const auto read = TakeNumber(text);
    if (!read) return std::nullopt;
    *number = *read;
  }
  return range;
}

}  // namespace fotomill
