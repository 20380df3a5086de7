#include "pages/gallery/exposure_text.h"

#include <cmath>
#include <cstdio>

#include "metadata/exif/exif_walk.h"

namespace fotomill {

namespace {

constexpr uint16_t kModel = 0x0110, kExposureTime = 0x829A, kFNumber = 0x829D,
                   kSensitivity = 0x8827, kFocalLength = 0x920A;
constexpr uint16_t kRational = 5;

std::string Short(double value) {
  char text[32];
  std::snprintf(text, sizeof text, "%.1f", value);
  std::string shortened = text;
  if (shortened.ends_with(".0")) shortened.resize(shortened.size() - 2);
  return shortened;
}

class ExposureSink : public ExifSink {
 public:
  void Directory(int32_t, std::string_view) override {}
  void Line(const ExifLine& line) override {
    const ExifValue& value = line.value;
    if (value.tag == kModel && model_.empty()) model_ = line.text;
    if (value.tag == kSensitivity && sensitivity_.empty()) sensitivity_ = line.text;
    if (value.type != kRational || value.count == 0) return;
    const double above = value.bytes.U32(0), below = value.bytes.U32(4);
    if (above <= 0 || below <= 0) return;
    if (value.tag == kExposureTime) time_ = above / below;
    if (value.tag == kFNumber) aperture_ = above / below;
    if (value.tag == kFocalLength) focal_ = above / below;
  }

  std::string Text() const {
    std::string text;
    const auto add = [&text](const std::string& part) {
      text += (text.empty() ? "" : " \u00B7 ") + part;
    };
    if (!model_.empty()) add(model_);
    if (time_ > 0)
      add(time_ < 0.4 ? "1/" + std::to_string(std::lround(1 / time_)) + " s" : Short(time_) + " s");
    if (aperture_ > 0) add("f/" + Short(aperture_));
    if (!sensitivity_.empty() && sensitivity_ != "0") add("ISO " + sensitivity_);
    if (focal_ > 0) add(Short(focal_) + " mm");
    return text;
  }

 private:
  std::string model_, sensitivity_;
  double time_ = 0, aperture_ = 0, focal_ = 0;
};

}  // namespace

std::string ExposureText(std::span<const uint8_t> exif) {
  ExposureSink sink;
  (void)WalkExif(exif, &sink);
  return sink.Text();
}

}  // namespace fotomill
