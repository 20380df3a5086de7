#include "desktop/models/view/photo_facts.h"

#include <algorithm>
#include <cstdio>
#include <map>
#include <string_view>

#include "core/shown_text.h"
#include "metadata/exif/exif_walk.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

// Source: CIPA DC-008-2012, sections 4.6.4 to 4.6.6.
constexpr uint16_t kMake = 0x010f, kModel = 0x0110, kChanged = 0x0132, kExposure = 0x829a,
                   kFNumber = 0x829d, kIso = 0x8827, kTaken = 0x9003, kBias = 0x9204,
                   kFlash = 0x9209, kFocalLength = 0x920a, kFocalLengthIn35 = 0xa405,
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
  bool Has(uint16_t tag) const { return numbers_.contains(tag); }
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
    if (divisor == 0) return 0;
    if (value.type == kExifSRational)
      return static_cast<double>(static_cast<int32_t>(value.bytes.U32(0))) /
             static_cast<int32_t>(divisor);
    return value.type == kExifRational ? static_cast<double>(value.bytes.U32(0)) / divisor : 0;
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

// Empty if the number is missing.
std::string PrintedTag(const Values& values, uint16_t tag, const char* format) {
  return values.Number(tag) > 0 ? Printed(format, values.Number(tag)) : std::string();
}

std::string ExposureText(const Values& values) {
  const double seconds = values.Number(kExposure);
  if (seconds <= 0) return {};
  return seconds > kLongestFraction ? Printed("%.3g s", seconds) : Printed("1/%.0f s", 1 / seconds);
}

std::string ExposureLine(const Values& values) {
  std::string line;
  for (const std::string& text :
       {ExposureText(values), PrintedTag(values, kFNumber, "f/%.3g"),
        PrintedTag(values, kIso, "ISO %.0f"), PrintedTag(values, kFocalLength, "%.4g mm")}) {
    if (!text.empty()) line.append(line.empty() ? "" : "   ").append(text);
  }
  return line;
}

// "8.6 mm (39 mm in 35 mm format)"
std::string FocalLengthText(const Values& values) {
  const std::string length = PrintedTag(values, kFocalLength, "%.4g mm"),
                    same = PrintedTag(values, kFocalLengthIn35, "%.4g mm");
  return length.empty() || same.empty() ? length : Tr("%1 (%2 in 35 mm format)", length, same);
}

std::string BiasText(const Values& values) {
  if (!values.Has(kBias)) return {};
  return values.Number(kBias) == 0 ? "0 EV" : Printed("%+.2g EV", values.Number(kBias));
}

std::string FlashText(const Values& values) {
  if (!values.Has(kFlash)) return {};
  return static_cast<int>(values.Number(kFlash)) % 2 == 1 ? Tr("Fired") : Tr("Did not fire");
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

std::vector<PhotoFact> PhotoTable(std::span<const uint8_t> exif) {
  Values values;
  if (exif.empty() || !WalkExif(exif, &values)) return {};
  std::vector<PhotoFact> facts = {
      {TrLater("Camera"), Named(values.Text(kMake), values.Text(kModel))},
      {TrLater("Lens"), Named(values.Text(kLensMake), values.Text(kLens))},
      {TrLater("Taken"), DateLine(values)},
      {TrLater("Exposure time"), ExposureText(values)},
      {TrLater("Aperture"), PrintedTag(values, kFNumber, "f/%.3g")},
      {TrLater("Sensitivity"), PrintedTag(values, kIso, "ISO %.0f")},
      {TrLater("Focal length"), FocalLengthText(values)},
      {TrLater("Exposure compensation"), BiasText(values)},
      {TrLater("Flash"), FlashText(values)},
  };
  std::erase_if(facts, [](const PhotoFact& fact) { return fact.value.empty(); });
  return facts;
}

}  // namespace fotomill::desktop
