#include "cli/commands/info.h"

#include <memory>
#include <string>

#include "batch/picture_failure.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/frame/tag_json.h"
#include "cli/selection/file_selection.h"
#include "core/shown_text.h"
#include "core/text.h"
#include "core/utf8.h"
#include "metadata/edit/gps_place.h"
#include "metadata/tags/tag_lines.h"
#include "registry/registry.h"
#include "settings/job_options.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct InfoOptions {
  SelectionOptions selection;
  bool json = false;
};

std::string Resolution(double pixelsPerInch) {
  char text[32];
  std::snprintf(text, sizeof text, "%g", pixelsPerInch);
  return text;
}

// Adds frame durations and the loop count, 0 for endless.
void AddFrames(const PictureRecord& picture, Json& facts) {
  AnimationPointer animation;
  if (picture.pageCount < 2 ||
      OpenAnimation(
          {.fileName = picture.fileName.c_str(), .options = ReadOptionsFromSettings()}, animation) !=
          Status::Ok)
    return;
  facts["delaysMs"] = animation->Delays();
  facts["rounds"] = animation->Rounds();
}

Json FactsAsJson(const PictureRecord& picture, const PictureTags& tags) {
  const FormatEntry& row = FormatRow(picture.formatIndex);
  Json facts;
  facts["format"] = row.extension.view();
  facts["index"] = picture.formatIndex;
  facts["description"] = row.description.view();
  facts["typeName"] = picture.typeName.view();
  facts["width"] = picture.width;
  facts["height"] = picture.height;
  facts["bitsPerPixel"] = picture.bitsPerPixel;
  facts["alpha"] = (picture.alphaFlags & kHasAlpha) != 0;
  facts["fileSize"] = picture.fileSize;
  facts["imageBytes"] = picture.imageBytes;
  facts["details"] = Json::array();
  for (size_t i = 0; i < picture.detailLines.Count(); ++i)
    facts["details"].push_back(picture.detailLines.Line(i));
  facts["pages"] = picture.pageCount;
  AddFrames(picture, facts);
  if (picture.metadata.dpiX > 0) facts["dpiX"] = picture.metadata.dpiX;
  if (picture.metadata.dpiY > 0) facts["dpiY"] = picture.metadata.dpiY;
  if (const auto place = PlaceOf(ParseExifBlock(picture.metadata.exif))) {
    facts["location"] = {{"latitude", place->latitude},
                         {"longitude", place->longitude},
                         {"link", MapLink(*place)}};
  }
  if (Json object = TagsAsJson(tags); !object.empty()) facts["tags"] = std::move(object);
  return facts;
}

void AddFact(std::string& text, std::string_view label, std::string_view value) {
  constexpr size_t kColumn = 14;
  const size_t width = CharacterCount(label);
  text.append(2, ' ').append(label).append(width < kColumn ? kColumn - width : 1, ' ');
  text.append(EscapeControls(value)).append(1, '\n');
}

// All lines of one file as one text.
std::string FactsAsText(const PictureRecord& picture, const PictureTags& tags) {
  const FormatEntry& row = FormatRow(picture.formatIndex);
  std::string text;
  AddFact(text, Tr("Format"), row.description.view());
  if (const std::string remark = MisnamedRemark(picture); !remark.empty())
    AddFact(text, Tr("Remark"), remark);
  if (!picture.typeName.empty()) AddFact(text, Tr("Type"), picture.typeName.view());
  AddFact(text, Tr("Dimensions"), Tr("%1 x %2 pixels", picture.width, picture.height));
  const std::string depth =
      TrCount("%1 bit", "%1 bits", static_cast<uint64_t>(picture.bitsPerPixel));
  AddFact(text, Tr("Depth"),
          (picture.alphaFlags & kHasAlpha) != 0 ? Tr("%1 and alpha", depth) : depth);
  if (picture.pageCount > 1) AddFact(text, Tr("Pages"), std::to_string(picture.pageCount));
  if (picture.metadata.dpiX > 0 && picture.metadata.dpiY > 0) {
    AddFact(text, Tr("Resolution"),
            Tr("%1 x %2 pixels per inch", Resolution(picture.metadata.dpiX),
               Resolution(picture.metadata.dpiY)));
  }
  if (const auto place = PlaceOf(ParseExifBlock(picture.metadata.exif))) {
    char degrees[48];
    std::snprintf(degrees, sizeof degrees, "%.5f, %.5f  ", place->latitude, place->longitude);
    AddFact(text, Tr("Location"), degrees + MapLink(*place));
  }
  for (const TagLine& line : TagLines(tags)) AddFact(text, Tr(line.label), line.text);
  AddFact(text, Tr("File size"), TrCount("%1 byte", "%1 bytes", picture.fileSize));
  AddFact(text, Tr("Image data"), TrCount("%1 byte", "%1 bytes", picture.imageBytes));
  for (size_t i = 0; i < picture.detailLines.Count(); ++i) {
    text.append(2, ' ').append(EscapeControls(picture.detailLines.Line(i))).append(1, '\n');
  }
  text.pop_back();
  return text;
}

Status GatherFacts(const SelectedFile& file, PicturePointer& picture, PictureTags& tags) {
  if (file.status != Status::Ok) return file.status;
  RETURN_IF_BAD(LoadPictureInfo({.fileName = file.name, .options = ReadOptionsFromSettings()}, picture));
  const FormatEntry& row = FormatRow(picture->formatIndex);
  if (row.details != nullptr) RETURN_IF_BAD(row.details(*picture));
  (void)ReadPictureTags(file.name, TagSourcesFromSettings(), tags);  // the file could be read
  return Status::Ok;
}

void ReportFile(const SelectedFile& file, ResultOutput& output) {
  PicturePointer picture;
  PictureTags tags;
  const Status status = GatherFacts(file, picture, tags);
  const std::string hint =
      status == Status::Ok || !file.hint.empty() ? file.hint : OpenHint(file.name, status);
  if (output.IsJson()) {
    Json element;
    PutName(element, "file", output.NameOf(file.name));
    PutStatus(element, status);
    if (status == Status::Ok) element.update(FactsAsJson(*picture, tags));
    if (status == Status::Ok ? OpenedByContents(*picture) : file.status == Status::Ok) {
      const std::string_view looksLike = LooksLike(file.name, FindFormatByName(file.name));
      if (!looksLike.empty()) element["looksLike"] = looksLike;
    }
    output.Element(element);
  }
  if (status != Status::Ok) {
    output.Failure(file.name, status, hint);
    return;
  }
  output.CountFile();
  if (!output.IsJson()) output.Line(output.Shown(file.name) + "\n" + FactsAsText(*picture, tags));
}

int RunInfo(const InfoOptions& options, const CommandContext& context) {
  const auto selection = SelectFiles(options.selection, context);
  if (!selection) return kExitUsage;
  ResultOutput output(context, options.json);
  output.CloseWith(selection->leftOut);
  if (selection->input) output.ShowAsStream(selection->input->Path());
  for (const SelectedFile& file : selection->files) {
    if (!output.GoesOn()) break;
    ReportFile(file, output);
  }
  return output.Finish();
}

}  // namespace

void SetUpInfo(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<InfoOptions>();
  options->selection.takesInput = true;
  AddSelection(app, options->selection, context);
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {file, status, message, format, index, description, typeName, "
          "width, height, bitsPerPixel, alpha, fileSize, imageBytes, details, ...}");
  SetFooter(app, nullptr, "fotomill info holiday --recursive --json");
  context.run = [options, &context] { return RunInfo(*options, context); };
}

}  // namespace fotomill::cli
