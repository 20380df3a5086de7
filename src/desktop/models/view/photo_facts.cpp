#include "desktop/models/view/photo_facts.h"

#include <algorithm>
#include <cstdio>
#include <map>
#include <string_view>

#include "core/shown_text.h"
#include "metadata/exif/exif_walk.h"

namespace fotomill::desktop {

namespace {

// Source: CIPA DC-008-2012, sections 4.6.4 to 4.6.6.
constexpr uint16_t kMake = 0x010f, kModel = 0x0110, kChanged = 0x0132, kExposure = 0x829a,
                   kFNumber = 0x829d, kIso = 0x8827, kTaken = 0x9003, kFocalLength = 0x920a,
                   kLensMake = 0xa433, kLens = 0xa434;
constexpr double kLongestFraction = 0.3;  // seconds; longer exposures are shown as decimals

// Texts and first numbers of a walk; if a tag is in several directories, the first one with a
// value.
class Values : public ExifSink {
 public:
  void Directory(int32_t, std::string_view) override {}
  void Line(const ExifLine& line) override {
    if (line.value.count == 0) return;
    texts_.try_emplace(line.value.tag, Trimmed(line.text));
    numbers_.try_emplace(line.value.tag, NumberOf(line.value));
  }

  std::string Text(uint16_t tag) const {
    const auto found = texts_.find(tag);
    return found == texts_.end() ? std::string() : found->second;
  }
  // 0 if not found.
  double Number(uint16_t tag) const {
    const auto found = numbers_.find(tag);
    return found == numbers_.end() ? 0 : found->second;
  }

 private:
  static std::string Trimmed(std::string_view text) {
    const size_t start = std::min(text.find_first_not_of(' '), text.size());
    return EscapeControls(text.substr(start, text.find_last_not_of(' ') + 1 - start));
  }
  static double NumberOf(const ExifValue& value) {
    if (value.type == kExifShort) return value.bytes.U16(0);
    if (value.type == kExifLong) return value.bytes.U32(0);
    const uint32_t divisor = value.bytes.U32(4);
    return value.type == kExifRational && divisor != 0
               ? static_cast<double>(value.bytes.U32(0)) / divisor
               : 0;
  }

  std::map<uint16_t, std::string> texts_;
  std::map<uint16_t, double> numbers_;
};

std::string Printed(const char* format, double number) {
  char text[48];
  std::snprintf(text, sizeof text, format, number);
  return text;
}

// Some makers repeat their name in the model.
std::string Named(const std::string& make, const std::string& model) {
  const std::string_view firstWord = std::string_view(make).substr(0, make.find(' '));
  return make.empty() || model.starts_with(firstWord) ? model
         : model.empty()                              ? make
                                                      : make + " " + model;
}

std::string ExposureLine(const Values& values) {
  std::string line;
  const auto add = [&](uint16_t tag, const std::string& text) {
    if (values.Number(tag) > 0) line.append(line.empty() ? "" : "   ").append(text);
  };
  const double seconds = values.Number(kExposure);
  add(kExposure,
      seconds > kLongestFraction ? Printed("%.3g s", seconds) : Printed("1/%.0f s", 1 / seconds));
  add(kFNumber, Printed("f/%.3g", values.Number(kFNumber)));
  add(kIso, Printed("ISO %.0f", values.Number(kIso)));
  add(kFocalLength, Printed("%.4g mm", values.Number(kFocalLength)));
  return line;
}

// "2001:05:19 18:36:41" with hyphens in the date.
std::string DateLine(const Values& values) {
  std::string date = values.Text(kTaken).empty() ? values.Text(kChanged) : values.Text(kTaken);
  for (const size_t colon : {4, 7}) {
    if (date.size() > colon && date[colon] == ':') date[colon] = '-';
  }
  return date;
}

}  // namespace

std::vector<std::string> PhotoFacts(std::span<const uint8_t> exif) {
  Values values;
  if (exif.empty() || !WalkExif(exif, &values)) return {};
  std::vector<std::string> lines = {Named(values.Text(kMake), values.Text(kModel)),
                                    Named(values.Text(kLensMake), values.Text(kLens)),
                                    ExposureLine(values), DateLine(values)};
  std::erase_if(lines, [](const std::string& line) { return line.empty(); });
  return lines;
}

}  // namespace fotomill::desktop
