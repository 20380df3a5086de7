#include "cli/commands/match.h"

#include <cstdint>
#include <memory>
#include <string>

#include "batch/picture_failure.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "core/shown_text.h"
#include "core/text.h"
#include "platform/paths.h"
#include "registry/registry.h"
#include "settings/job_options.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct MatchOptions {
  bool contents = false;
  bool json = false;
};

Json NameMatch(const std::string& name, int32_t index) {
  Json element;
  PutName(element, "name", name);
  element["index"] = index;
  element["extension"] =
      index == kNoFormat ? std::string_view() : FormatRow(index).extension.view();
  PutName(element, "typeName", DescribeFileType(name));
  return element;
}

// The format detected from a file's contents.
struct ContentsMatch {
  Status status = Status::Ok;
  int32_t index = kNoFormat;   // the format that opens the file
  std::string_view looksLike;  // actual type if the name is wrong or the file cannot be opened
};

// Identifies a file, ignoring settings that restrict identification.
ContentsMatch MatchContents(const std::string& name, int32_t named) {
  ContentsMatch match;
  ReadRequest request{.fileName = name, .options = ReadOptionsFromSettings()};
  request.options.identify = {.exceptions = {}, .mostSide = INT32_MAX};
  PicturePointer picture;
  match.status = LoadPictureInfo(request, picture);
  if (match.status == Status::Ok) match.index = picture->formatIndex;
  if (match.status != Status::Ok || OpenedByContents(*picture))
    match.looksLike = LooksLike(name, named);
  return match;
}

// "EXT, DESCRIPTION, by its extension": naming the rule explains why .pict does not select PCT.
std::string MatchText(const std::string& name, const FormatEntry& row) {
  const std::string description = EscapeControls(row.description);
  const bool whole = EqualIgnoringCase(platform::ExtensionOf(name), row.extension);
  return whole ? Tr("%1, %2, by its extension", row.extension.view(), description)
               : Tr("%1, %2, by its first three characters", row.extension.view(), description);
}

// "JPG, (JPG) Jpeg, by its contents; its name selects PNG"
std::string ContentsText(const std::string& name, const ContentsMatch& match, int32_t named) {
  const FormatEntry& row = FormatRow(match.index);
  if (match.looksLike.empty()) return MatchText(name, row);
  const std::string_view extension = row.extension;
  const std::string description = EscapeControls(row.description);
  if (named == kNoFormat)
    return Tr("%1, %2, by its contents; its name selects no format", extension, description);
  return Tr("%1, %2, by its contents; its name selects %3", extension, description,
            FormatRow(named).extension.view());
}

// Prints the format that opens a file, or why none does.
void ReportContents(const std::string& name, ResultOutput& output) {
  const int32_t named = FindFormatByName(name);
  const ContentsMatch match = MatchContents(name, named);
  if (output.IsJson()) {
    Json element = NameMatch(name, named);
    element["contentsIndex"] = match.index;
    element["contentsExtension"] =
        match.index == kNoFormat ? std::string_view() : FormatRow(match.index).extension.view();
    if (!match.looksLike.empty()) element["looksLike"] = match.looksLike;
    PutStatus(element, match.status);
    output.Element(element);
  }
  if (match.status != Status::Ok)
    return output.Failure(name, match.status, OpenHint(name, match.status));
  output.CountFile();
  if (!output.IsJson()) output.Line(output.Shown(name) + ": " + ContentsText(name, match, named));
}

int RunMatchContents(const MatchOptions& options, const CommandContext& context) {
  ResultOutput output(context, options.json);
  for (const std::string& name : context.names.values) {
    if (!output.GoesOn()) break;
    ReportContents(name, output);
  }
  return output.Finish();
}

int RunMatch(const MatchOptions& options, const CommandContext& context) {
  ResultOutput output(context, options.json);
  bool allMatch = true;
  for (const std::string& name : context.names.values) {
    const int32_t index = FindFormatByName(name);
    allMatch = allMatch && index != kNoFormat;
    if (output.IsJson()) {
      output.Element(NameMatch(name, index));
    } else if (index == kNoFormat) {
      output.Line(output.Shown(name) + ": " + Tr("no format"));
    } else {
      output.Line(output.Shown(name) + ": " + MatchText(name, FormatRow(index)));
    }
  }
  return allMatch ? kExitOk : kExitFailed;
}

}  // namespace

void SetUpMatch(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<MatchOptions>();
  context.names.Declare("NAME...", "File names; without --contents they need not exist", 1);
  AddFlag(app, "--contents", options->contents, "Open the files and detect their real format");
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {name, index, extension, typeName}; with --contents, also the "
          "detected format");
  SetFooter(app,
            "The exit status is 1 if a name selects no format or, with --contents, a file cannot "
            "be opened.",
            "fotomill match --contents scan.tiff photo.jpeg");
  context.run = [options, &context] {
    return options->contents ? RunMatchContents(*options, context) : RunMatch(*options, context);
  };
}

}  // namespace fotomill::cli
