#include "cli/frame/topics.h"

#include <CLI/CLI.hpp>
#include <algorithm>

#include "cli/frame/command_parser.h"
#include "cli/frame/commands.h"
#include "core/status.h"
#include "operations/macros.h"
#include "operations/operations.h"
#include "texts/status_text.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

using Kind = TopicPart::Kind;

struct ExitStatusRow {
  const char* status;
  const char* meaning;  // in English
};
constexpr ExitStatusRow kExitStatuses[] = {
    {"0", TrLater("Everything was done.")},
    {"1", TrLater("A file failed, or nothing was found.")},
    {"2", TrLater("The command line is wrong; nothing was touched.")},
    {"130, 143", TrLater("Stopped by SIGINT or SIGTERM.")},
};

constexpr Status kStatuses[] = {
#define STATUS(number, name, message) Status::name,
#include "core/status.def"
#undef STATUS
};

std::vector<TopicPart> ExitStatusParts() {
  std::vector<TopicPart> parts = ExitStatusEntries();
  parts.push_back({Kind::Paragraph,
                   Tr("A file that fails has its own message and does not stop the others; a name "
                      "that does not exist is a failed file. A folder without pictures is not a "
                      "failure.")});
  parts.push_back(
      {Kind::Paragraph, Tr("The messages have numbers, which JSON has in the field \"status\":")});
  for (const Status status : kStatuses)
    parts.push_back({Kind::Entry, StatusText(status), std::to_string(StatusNumber(status))});
  return parts;
}

std::vector<TopicPart> JsonParts() {
  std::vector<TopicPart> parts = {
      {Kind::Paragraph, Tr("With --json, standard output is one JSON array, whose elements are "
                           "written one a line as they happen. Messages stay on standard error.")},
      {Kind::Paragraph,
       Tr("Numbers are numbers, \"status\" too; \"message\" is its text, in English in every "
          "language. Text is valid UTF-8. A name that is not has its bytes beside it in base64: "
          "\"fileBytes\" beside \"file\". Fields may be added later; those that exist "
          "stay.")},
      {Kind::Example, "fotomill info holiday --json | jq -r '.[] | select(.width > 4000).file'"},
  };
  for (const Command& command : Commands()) {
    CommandContext context;
    const CommandParser parser(&command, context);
    if (const CLI::Option* option = parser.get_option_no_throw("--json"))
      parts.push_back({Kind::Entry, option->get_description(), command.name});
  }
  parts.push_back({Kind::Entry, Tr("A JSON object {name, version, buildDate, license, libraries}"),
                   "--version"});
  return parts;
}

std::vector<TopicPart> RecipeParts() {
  std::vector<TopicPart> parts = {
      {Kind::Paragraph, Tr("A recipe is a list of operations, applied in order: in a file, one a "
                           "line, or on the command line with --do, separated by \";\".")},
      {Kind::Example,
       "# large and small\nupright\noutput large\n  resize 2048x2048 only=shrink\n"
       "  save to=jpg quality=85 name=\"%F-large\"\noutput small\n  resize 320x320\n"
       "  save to=png name=\"%F-small\""},
      {Kind::Paragraph,
       Tr("A line is an operation and its parameters: values in order, name=value, or the name of "
          "a flag. Quotes are those of a shell; a line that begins with # is a comment. \"output\" "
          "begins one of several outputs, steps before the first one are shared, and \"save\" "
          "gives an output its format, quality, folder and name.")},
      {Kind::Paragraph,
       Tr("--recipe takes a file, or a name: NAME.recipe in the folder \"recipes\" of the data "
          "folder, or a recipe that comes with the program.")},
      {Kind::Example,
       "fotomill recipe list\nfotomill recipe check my.recipe\n"
       "fotomill apply holiday --recipe web --dest site"},
      {Kind::Paragraph, Tr("The operations; \"%1\" explains one:", "fotomill operations NAME")},
  };
  for (const Operation* operation : Operations()) {
    const std::string family(FamilyName(operation->family));
    if (parts.back().left != family) parts.push_back({Kind::Entry, {}, family});
    parts.back().text += (parts.back().text.empty() ? "" : ", ") + std::string(operation->name);
  }
  return parts;
}

std::vector<TopicPart> NameParts() {
  std::vector<TopicPart> parts = {
      {Kind::Paragraph,
       Tr("A folder stands for its pictures, with -r also for those of its subfolders; hidden "
          "files and formats that cannot be read are left out. \"-\" is standard input or output. "
          "--files-from reads names from a file. After \"--\", names may begin with a hyphen.")},
      {Kind::Example, "find . -name '*.pcx' -print0 | fotomill convert --files-from - -0 --to png"},
      {Kind::Paragraph,
       Tr("The extension of a name selects the format; if the contents are of another format, they "
          "decide. Names are bytes: they need not be UTF-8. On a terminal, control characters in "
          "names "
          "are shown escaped.")},
      {Kind::Paragraph,
       Tr("An output has the name of its source with the extension of its format, beside the "
          "source or in --dest; --prefix puts a text before it, --out names it. If it exists, "
          "--overwrite decides; \"keep-both\" takes the next free of \"name [1]\", \"name [2]\".")},
      {Kind::Paragraph,
       Tr("Names of \"save\" in recipes, and texts in pictures, may have macros:")},
  };
  for (const MacroRow& macro : Macros())
    parts.push_back({Kind::Entry, Tr(macro.help), macro.written});
  return parts;
}

constexpr Topic kTopics[] = {
    {"exit-status", TrLater("what the exit status and the numbers of messages mean"),
     ExitStatusParts},
    {"json", TrLater("what --json prints"), JsonParts},
    {"recipes", TrLater("operations on pictures, and recipes of them"), RecipeParts},
    {"names", TrLater("names of files, of outputs, and macros in names"), NameParts},
};

}  // namespace

std::span<const Topic> Topics() { return kTopics; }

const Topic* FindTopic(std::string_view name) {
  const auto found = std::ranges::find(kTopics, name, &Topic::name);
  return found != std::end(kTopics) ? found : nullptr;
}

std::vector<TopicPart> ExitStatusEntries() {
  std::vector<TopicPart> entries;
  for (const ExitStatusRow& row : kExitStatuses)
    entries.push_back({Kind::Entry, Tr(row.meaning), row.status});
  return entries;
}

}  // namespace fotomill::cli
