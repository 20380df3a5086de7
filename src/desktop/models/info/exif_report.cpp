#include "desktop/models/info/exif_report.h"

#include <algorithm>

#include "catalog/thumbnails/exif_thumbnail.h"
#include "core/shown_text.h"
#include "desktop/models/info/map_link.h"
#include "metadata/exif/exif_source.h"
#include "metadata/exif/exif_tags.h"
#include "metadata/gps.h"
#include "metadata/tags/tag_lines.h"
#include "settings/job_options.h"
#include "texts/status_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

// Collects a walk as rows, and as text.
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

void AddRow(const char* name, const std::string& text, ExifReport& report) {
  report.rows.push_back({false, 0, Tr(name), text});
  report.text.append("    ").append(Tr(name)).append("\t").append(text).append("\n");
}

void AddPlaces(const ExifPlaces& places, const ExifReportOptions& options, ExifReport& report) {
  if (!places.taken && !places.destination) return;
  report.rows.push_back({true, 0, Tr("Places"), {}});
  report.text.append(Tr("Places")).append("\n");
  const auto distance = [&](const ExifPosition& from, const ExifPosition& to) {
    return DecimalText(
               GpsDistance(from.latitude, from.longitude, to.latitude, to.longitude, options.unit),
               1) +
           " " + Tr(DistanceUnitName(options.unit));
  };
  if (places.taken) {
    AddRow(TrLater("Place of the picture"),
           GpsPlaceText(places.taken->latitude, places.taken->longitude), report);
    if (options.home)
      AddRow(TrLater("Distance to the default location"), distance(*options.home, *places.taken),
             report);
  }
  if (places.destination)
    AddRow(TrLater("Place of destination"),
           GpsPlaceText(places.destination->latitude, places.destination->longitude), report);
  if (places.taken && places.destination)
    AddRow(TrLater("Distance to destination"), distance(*places.taken, *places.destination),
           report);
}

void AddTags(const std::string& path, const TagSources& sources, ExifReport& report) {
  PictureTags tags;
  (void)ReadPictureTags(path, sources, tags);  // the file could be read
  const std::vector<TagLine> lines = TagLines(tags);
  if (lines.empty()) return;
  report.rows.push_back({true, 0, Tr(kTagsHeading), {}});
  report.text.append(Tr(kTagsHeading)).append("\n");
  for (const TagLine& line : lines) AddRow(line.label, EscapeControls(line.text), report);
}

}  // namespace

ExifReportOptions ExifReportOptionsFromSettings() {
  ExifReportOptions options{.text = ExifTextOptionsFromSettings(),
                            .unit = DistanceUnitFromSettings(),
                            .tags = TagSourcesFromSettings()};
  options.tags.exif = false;
  GpsLocation home;
  if (GpsLocationFromSettings(home))
    options.home = ExifPosition{GpsDegrees(home.latitude), GpsDegrees(home.longitude)};
  return options;
}

std::string ShownHeading(const std::string& heading, bool raw) {
  struct Title {
    const char *heading, *title;
  };
  constexpr Title kTitles[] = {{"DIRECTORY IFD 0", TrLater("Picture")},
                               {"DIRECTORY IFD 1", TrLater("Thumbnail")},
                               {"DIRECTORY EXIF", TrLater("Camera settings")},
                               {"DIRECTORY GPS", TrLater("Position")}};
  const auto* const found = std::ranges::find(kTitles, heading, &Title::heading);
  return raw || found == std::end(kTitles) ? heading : std::string(Tr(found->title));
}

std::vector<ExifRow> RowsForPeople(const ExifReport& report, bool raw) {
  std::vector<ExifRow> rows;
  if (!raw && !report.photo.empty()) {
    rows.push_back({true, 0, Tr("Photo"), {}});
    for (const PhotoFact& fact : report.photo)
      rows.push_back({false, 0, Tr(fact.label), fact.value});
    if (!report.link.empty()) rows.push_back({false, 0, Tr("Map"), report.link});
  }
  for (const ExifRow& row : report.rows) {
    rows.push_back(row);
    if (row.heading) rows.back().name = ShownHeading(row.name, raw);
  }
  return rows;
}

ExifReport ReadExifReport(const std::string& path, const ExifReportOptions& options) {
  ExifReport report;
  ExifSource source;
  report.status = source.Open(path.c_str());
  if (report.status != Status::Ok) {
    report.problem = StatusText(report.status);
    return report;
  }
  if (source.Block().empty()) {
    AddTags(path, options.tags, report);
    if (report.rows.empty()) report.problem = Tr("This file has no EXIF.");
    return report;
  }
  Gather gather(report, options.text);
  ExifFindings findings;
  if (!WalkExif(source.Block(), &gather, &findings)) {
    report.status = Status::DamagedFile;
    report.problem = Tr("The EXIF block has no valid header.");
    return report;
  }
  gather.Finish();
  const ExifPlaces places = FindExifPlaces(source.Block());
  AddPlaces(places, options, report);
  report.photo = PhotoTable(source.Block());
  if (places.taken) report.link = MapLinkOf(places.taken->latitude, places.taken->longitude);
  AddTags(path, options.tags, report);
  ReadThumbnail(ExifThumbnail(source.Block(), findings), report);
  if (!source.Intact()) {
    report.status = Status::FileReadError;
    report.problem = Tr("The file was truncated while it was read; some of this may be wrong.");
  }
  return report;
}

}  // namespace fotomill::desktop
