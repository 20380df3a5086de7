#include "cli/commands/faces.h"

#include <memory>
#include <string>
#include <vector>

#include "batch/picture_failure.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/selection/file_selection.h"
#include "metadata/exif/picture_exif.h"
#include "processing/faces/face_finder.h"
#include "processing/geometry/orient.h"
#include "registry/registry.h"
#include "settings/job_options.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct FacesOptions {
  SelectionOptions selection;
  bool json = false;
};

// Finds the faces in a picture after turning it upright.
Status FacesOf(const std::string& name, PicturePointer& picture, std::vector<Rectangle>& faces,
               const ResultOutput& output) {
  RETURN_IF_BAD(LoadPicture({.fileName = name, .options = ReadOptionsFromSettings()}, picture));
  RETURN_IF_BAD(TurnUpright(*picture));
  return FindFaces(picture->image, FaceOptionsFromSettings(), faces,
                   [&output] { return output.GoesOn(); });
}

void Print(ResultOutput& output, const std::string& name, Status status,
           const PictureRecord* picture, const std::vector<Rectangle>& faces) {
  if (!output.IsJson()) {
    for (const Rectangle& face : faces) {
      output.Line(output.Shown(name) + ": " + std::to_string(face.width) + "x" +
                  std::to_string(face.height) + "+" + std::to_string(face.x) + "+" +
                  std::to_string(face.y));
    }
    return;
  }
  Json element;
  PutName(element, "file", name);
  if (status == Status::Ok && picture != nullptr) {
    element["width"] = picture->image.Width();
    element["height"] = picture->image.Height();
  }
  element["faces"] = Json::array();
  for (const Rectangle& face : faces) {
    element["faces"].push_back(
        {{"x", face.x}, {"y", face.y}, {"width", face.width}, {"height", face.height}});
  }
  PutStatus(element, status);
  output.Element(element);
}

int RunFaces(const FacesOptions& options, const CommandContext& context) {
  const auto selection = SelectFiles(options.selection, context);
  if (!selection) return kExitUsage;
  ResultOutput output(context, options.json);
  output.CloseWith(selection->leftOut);
  output.Expect(selection->files.size());
  for (const SelectedFile& file : selection->files) {
    if (!output.GoesOn()) break;
    PicturePointer picture;
    std::vector<Rectangle> faces;
    std::string hint = file.hint;
    Status status = file.status;
    if (status == Status::Ok) status = FacesOf(file.name, picture, faces, output);
    Print(output, file.name, status, picture.get(), faces);
    if (status == Status::Ok) {
      output.CountFile();
      continue;
    }
    if (status == Status::FeatureDisabled && !CanFindFaces(FaceOptionsFromSettings()))
      hint = Tr("The face detector is not installed.");
    output.Failure(file.name, status, hint.empty() ? OpenHint(file.name, status) : hint);
  }
  return output.Finish();
}

}  // namespace

void SetUpFaces(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<FacesOptions>();
  AddSelection(app, options->selection, context);
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {file, width, height, faces, status, message}");
  SetFooter(app,
            "Prints a line WIDTHxHEIGHT+X+Y for each face, in pixels of the upright picture. The "
            "keys FaceDetectThumbnailCascade and FaceDetectPercentage choose the classifier and "
            "the smallest face reported.",
            "fotomill faces -r holiday --json");
  context.run = [options, &context] { return RunFaces(*options, context); };
}

}  // namespace fotomill::cli
