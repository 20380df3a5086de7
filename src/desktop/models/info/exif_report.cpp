#include "desktop/models/info/exif_report.h"

#include "catalog/thumbnails/exif_thumbnail.h"
#include "core/shown_text.h"
#include "metadata/exif/exif_source.h"
#include "metadata/exif/exif_tags.h"
#include "texts/status_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

// Gathers a walk as rows and as the text that the core makes of it.
class Gather : public ExifSink {
 public:
  Gather(ExifReport& report, const ExifTextOptions& options)
      : report_(report), types_(options.showTypes), text_(options) {}

  void Directory(int32_t number, std::string_view label) override {
    report_.rows.push_back({true, 0, "DIRECTORY " + std::string(label), {}});
    text_.Directory(number, label);
  }
  void Line(const ExifLine& line) override {
    std::string name(line.name);
    if (types_) name.append(" ").append(ExifTypeLabel(line.value.type));
    report_.rows.push_back({false, line.value.tag, std::move(name), EscapeControls(line.text)});
    text_.Line(line);
  }
  void Finish() {
    report_.text = text_.Text();
    if (!text_.Complete()) report_.problem = Tr("There was not enough memory for all lines.");
  }

 private:
  ExifReport& report_;
  const bool types_;
  ExifText text_;
};

void ReadThumbnail(std::span<const uint8_t> bytes, ExifReport& report) {
  report.thumbnailBytes.assign(bytes.begin(), bytes.end());
  PicturePointer picture;
  if (bytes.empty() || DecodeExifThumbnail(bytes, picture) != Status::Ok) return;
  if (ToRgb(picture->image, report.thumbnail) != Status::Ok) report.thumbnail = {};
}

}  // namespace

ExifReport ReadExifReport(const std::string& path, const ExifTextOptions& options) {
  ExifReport report;
  ExifSource source;
  report.status = source.Open(path.c_str());
  if (report.status != Status::Ok) {
    report.problem = StatusText(report.status);
    return report;
  }
  if (source.Block().empty()) {
    report.problem = Tr("This file has no EXIF.");
    return report;
  }
  Gather gather(report, options);
  ExifFindings findings;
  if (!WalkExif(source.Block(), &gather, &findings)) {
    report.status = Status::DamagedFile;
    report.problem = Tr("The EXIF block has no valid header.");
    return report;
  }
  gather.Finish();
  ReadThumbnail(ExifThumbnail(source.Block(), findings), report);
  if (!source.Intact()) {
    report.status = Status::FileReadError;
    report.problem = Tr("The file was truncated while it was read; some of this may be wrong.");
  }
  return report;
}

}  // namespace fotomill::desktop
