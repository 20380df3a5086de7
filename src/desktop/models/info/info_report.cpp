#include "desktop/models/info/info_report.h"

#include <algorithm>
#include <cmath>
#include <map>
#include <unordered_map>

#include "batch/picture_failure.h"
#include "core/choice_lists.h"
#include "core/shown_text.h"
#include "core/text.h"
#include "desktop/models/history/history_dates.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "registry/registry.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr const char* kDetailsTitle = TrLater("Details");
constexpr const char* kFileName = TrLater("File name");

// Formats a resolution: integer, or two decimals.
std::string DpiText(double dpi) {
  return DecimalText(dpi, std::abs(dpi - std::round(dpi)) < 0.005 ? 0 : 2);
}

std::string PixelsText(int32_t width, int32_t height) {
  const double millions = static_cast<double>(width) * height / 1e6;
  if (millions < 0.1) return Tr("%1 x %2 pixels", width, height);
  return Tr("%1 x %2 pixels (%3 megapixels)", width, height, DecimalText(millions, 1));
}

std::string BytesText(uint64_t bytes) { return TrCount("%1 byte", "%1 bytes", bytes); }

// Print size at the picture's resolution, or at the default one if it has none.
std::string PrintSize(const PictureRecord& picture, const InfoOptions& options) {
  const bool own = picture.metadata.dpiX > 0 && picture.metadata.dpiY > 0;
  const double assumed = std::max(options.resolution, 1);
  const double x = own ? picture.metadata.dpiX : assumed, y = own ? picture.metadata.dpiY : assumed;
  std::string text;
  switch (options.units) {
    case choice::kPixels: return {};
    case choice::kCentimeters:
      text = Tr("%1 x %2 centimeters", DecimalText(picture.width / x * 2.54, 2),
                DecimalText(picture.height / y * 2.54, 2));
      break;
    default:
      text = Tr("%1 x %2 inches", DecimalText(picture.width / x, 2),
                DecimalText(picture.height / y, 2));
  }
  return own ? text : Tr("%1 at %2 dots per inch", text, DpiText(assumed));
}

void AddFileFacts(const std::string& path, const InfoOptions& options, FileInfo& info,
                  InfoSection& general) {
  const platform::FileFacts facts = platform::FactsOf(path);
  general.lines.push_back({Tr(kFileName), std::string(platform::FileNameOf(path))});
  const platform::PathParts parts = platform::SplitPath(path);
  general.lines.push_back({Tr("Folder"), std::string(parts.drive) + std::string(parts.folder)});
  if (facts.kind == platform::FileKind::Missing) return;
  info.size = facts.size;
  general.lines.push_back({Tr("File size"), BytesText(facts.size)});
  general.lines.push_back({Tr("Created"), HistoryDate(facts.created, options.dateMode)});
  general.lines.push_back({Tr("Changed"), HistoryDate(facts.modified, options.dateMode)});
}

void AddPictureFacts(const PictureRecord& picture, const InfoOptions& options, FileInfo& info,
                     InfoSection& general) {
  const FormatEntry& row = FormatRow(picture.formatIndex);
  info.format = row.description.view();
  info.width = picture.width;
  info.height = picture.height;
  info.imageBytes = picture.imageBytes;
  general.lines.push_back({Tr("Format"), info.format});
  if (std::string remark = MisnamedRemark(picture); !remark.empty())
    general.lines.push_back({Tr("Remark"), std::move(remark)});
  if (!picture.typeName.empty())
    general.lines.push_back({Tr("Type"), std::string(picture.typeName.view())});
  general.lines.push_back({Tr("Dimensions"), PixelsText(picture.width, picture.height)});
  std::string depth = TrCount("%1 bit", "%1 bits", static_cast<uint64_t>(picture.bitsPerPixel));
  if ((picture.alphaFlags & kHasAlpha) != 0) depth = Tr("%1 and alpha", depth);
  general.lines.push_back({Tr("Depth"), depth});
  if (picture.pageCount > 1)
    general.lines.push_back({Tr("Pages"), std::to_string(picture.pageCount)});
  if (picture.metadata.dpiX > 0 && picture.metadata.dpiY > 0) {
    general.lines.push_back(
        {Tr("Resolution"), Tr("%1 x %2 dots per inch", DpiText(picture.metadata.dpiX), DpiText(picture.metadata.dpiY))});
  }
  if (std::string size = PrintSize(picture, options); !size.empty())
    general.lines.push_back({Tr("Print size"), std::move(size)});
  general.lines.push_back({Tr("Image data"), BytesText(picture.imageBytes)});
}

// Position of the colon in a detail line "Name: value"; npos for others, such as FITS cards, whose
// values may contain colons.
size_t ColonBehindLabel(std::string_view line) {
  const size_t colon = line.find(": ");
  if (colon == std::string_view::npos || colon == 0) return std::string_view::npos;
  const std::string_view name = line.substr(0, colon);
  return name.find_first_of("=\"'") == std::string_view::npos ? colon : std::string_view::npos;
}

// The lines from the codec, split if of the form "Name: value".
InfoSection DetailsOf(const PictureRecord& picture) {
  InfoSection section{Tr(kDetailsTitle), {}};
  for (size_t i = 0; i < picture.detailLines.Count(); ++i) {
    const std::string_view line = picture.detailLines.Line(i);
    const size_t colon = ColonBehindLabel(line);
    if (colon == std::string_view::npos) {
      section.lines.push_back({{}, std::string(line)});
    } else {
      // Codecs pad names with blanks to align their values.
      const std::string_view name = line.substr(0, colon);
      section.lines.push_back(
          {std::string(name.substr(std::min(name.find_first_not_of(' '), colon))), std::string(line.substr(colon + 2))});
    }
  }
  return section;
}

// What photographers look for, after the general facts.
void AddPhoto(const ExifReport& report, FileInfo& info) {
  InfoSection photo{Tr("Photo"), {}};
  for (const PhotoFact& fact : report.photo) photo.lines.push_back({Tr(fact.label), fact.value});
  if (!report.link.empty()) photo.lines.push_back({Tr("Map"), report.link, report.link});
  if (!photo.lines.empty()) info.sections.insert(info.sections.begin() + 1, std::move(photo));
}

void AddExif(const std::string& path, const InfoOptions& options, FileInfo& info) {
  constexpr std::string_view kDirectory = "DIRECTORY ";
  ExifReport report = ReadExifReport(path, options.exif);
  AddPhoto(report, info);
  for (ExifRow& row : report.rows) {
    if (row.heading) {
      const bool directory = row.name.starts_with(kDirectory);
      std::string title = ShownHeading(row.name, options.exif.text.showTypes);
      if (title.starts_with(kDirectory)) title.erase(0, kDirectory.size());
      info.sections.push_back({directory ? "EXIF: " + title : title, {}, directory});
    } else {
      info.sections.back().lines.push_back({std::move(row.name), std::move(row.text)});
    }
  }
}

// The distinct values with the number of files each, most frequent first.
std::string SpreadOf(const std::map<std::string, size_t>& counts) {
  constexpr size_t kMost = 4;
  std::vector<std::pair<std::string, size_t>> values(counts.begin(), counts.end());
  std::ranges::stable_sort(values,
                           [](const auto& a, const auto& b) { return a.second > b.second; });
  std::string list;
  for (size_t i = 0; i < std::min(values.size(), kMost); ++i) {
    if (i > 0) list += "; ";
    list += values[i].second > 1 ? Tr("%1 (%2 files)", values[i].first, values[i].second)
                                 : values[i].first;
  }
  return Tr("%1 different: %2", values.size(), values.size() > kMost ? list + "; ..." : list);
}

struct Compared {
  std::string label;
  std::map<std::string, size_t> values;
  size_t files = 0;
};

std::vector<Compared> Compare(std::span<const FileInfo> files) {
  std::vector<Compared> all;
  std::unordered_map<std::string_view, size_t> places;
  for (const FileInfo& file : files) {
    for (const InfoSection& section : file.sections) {
      // only comparable within a format
      if (section.title == Tr(kDetailsTitle)) continue;
      for (const InfoLine& line : section.lines) {
        if (line.label.empty() || line.label == Tr(kFileName)) continue;
        const auto [place, added] = places.emplace(line.label, all.size());
        if (added) all.push_back({line.label, {}, 0});
        ++all[place->second].values[line.value];
        ++all[place->second].files;
      }
    }
  }
  return all;
}

}  // namespace

InfoOptions InfoOptionsFromSettings() {
  return {.resolution = settings.InfoResolution,
          .units = settings.InfoUnits,
          .dateMode = settings.FileHistoryDateMode,
          .exif = ExifReportOptionsFromSettings()};
}

FileInfo ReadFileInfo(const std::string& path, const InfoOptions& options) {
  FileInfo info;
  info.path = path;
  InfoSection general{Tr("General"), {}};
  AddFileFacts(path, options, info, general);
  PicturePointer picture;
  info.status = LoadPictureInfo({.fileName = path, .options = ReadOptionsFromSettings()}, picture);
  if (info.status == Status::Ok) {
    AddPictureFacts(*picture, options, info, general);
    const FormatEntry& row = FormatRow(picture->formatIndex);
    if (row.details != nullptr) info.status = row.details(*picture);
  }
  if (info.status != Status::Ok) info.problem = FailureText(path, info.status);
  info.sections.push_back(std::move(general));
  if (picture != nullptr && picture->detailLines.Count() > 0)
    info.sections.push_back(DetailsOf(*picture));
  if (picture != nullptr) AddExif(path, options, info);
  return info;
}

std::vector<InfoSection> SummaryOf(std::span<const FileInfo> files) {
  InfoSection totals{Tr("Totals"), {}}, same{Tr("The same in all"), {}},
      different{Tr("Different"), {}}, failed{Tr("Could not be read"), {}};
  uint64_t size = 0, imageBytes = 0, pixels = 0, pictures = 0;
  for (const FileInfo& file : files) {
    size += file.size;
    imageBytes += file.imageBytes;
    pixels += static_cast<uint64_t>(file.width) * static_cast<uint64_t>(file.height);
    pictures += file.width > 0;
    if (file.status != Status::Ok)
      failed.lines.push_back({std::string(platform::FileNameOf(file.path)), file.problem});
  }
  totals.lines.push_back({Tr("Files"), std::to_string(files.size())});
  totals.lines.push_back({Tr("Pictures"), std::to_string(pictures)});
  totals.lines.push_back({Tr("File size"), BytesText(size)});
  totals.lines.push_back({Tr("Image data"), BytesText(imageBytes)});
  totals.lines.push_back(
      {Tr("Pixels"), Tr("%1 million", DecimalText(static_cast<double>(pixels) / 1e6, 1))});
  for (const Compared& compared : Compare(files)) {
    if (compared.files < 2) continue;
    if (compared.values.size() == 1 && compared.files == files.size()) {
      same.lines.push_back({compared.label, compared.values.begin()->first});
    } else {
      std::string text =
          compared.values.size() > 1 ? SpreadOf(compared.values) : compared.values.begin()->first;
      if (compared.files < files.size())
        text = Tr("%1 (in %2 of %3 files)", text, compared.files, files.size());
      different.lines.push_back({compared.label, std::move(text)});
    }
  }
  std::vector<InfoSection> sections;
  for (InfoSection* section : {&totals, &failed, &different, &same}) {
    if (!section->lines.empty()) sections.push_back(std::move(*section));
  }
  return sections;
}

std::string TextOf(std::span<const InfoSection> sections) {
  std::string text;
  for (const InfoSection& section : sections) {
    text.append(section.title).append("\n");
    for (const InfoLine& line : section.lines) {
      text.append("    ");
      if (!line.label.empty()) text.append(EscapeControls(line.label)).append(": ");
      text.append(EscapeControls(line.value)).append("\n");
    }
  }
  return text;
}

std::string TextOf(const FileInfo& file) {
  std::string text = EscapeControls(file.path) + "\n";
  if (!file.problem.empty()) text += file.problem + "\n";
  return text + TextOf(file.sections);
}

}  // namespace fotomill::desktop
