#include "cli/frame/help.h"

#include "cli/frame/command_parser.h"
#include "cli/frame/commands.h"
#include "cli/frame/libraries.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

std::string Line(std::string_view left, std::string_view right, size_t width) {
  std::string line("  ");
  return line.append(left).append(width + 2 - left.size(), ' ').append(right).append("\n");
}

// Names and summaries of the commands named `first`, or whose first word it is; of all if it is
// empty.
std::string ListCommands(std::string_view first) {
  size_t width = std::string_view("help").size();
  for (const Command& command : Commands())
    width = std::max(width, std::string_view(command.name).size());
  std::string list;
  for (const Command& command : Commands()) {
    const std::string_view name = command.name;
    const bool listed =
        first.empty() || name == first || (name.starts_with(first) && name[first.size()] == ' ');
    if (!listed) continue;
    list += Line(name, Tr(command.summary), width);
  }
  if (first.empty()) list += Line("help", Tr("explain a command"), width);
  return list;
}

}  // namespace

std::string MainHelp() {
  CommandContext context;
  const CommandParser parser(nullptr, context);
  std::string page = Tr("Fotomill Professional manages, views, converts and processes pictures.");
  page += "\n\n" + Tr("Usage: %1", "fotomill [OPTION]... COMMAND [ARGUMENT]...") + "\n\n" +
          Tr("Commands:") + "\n";
  page += ListCommands({});
  const auto formatter = std::dynamic_pointer_cast<const CLI::Formatter>(parser.get_formatter());
  page += formatter->make_groups(&parser, CLI::AppFormatMode::Normal);
  page += Line("-V, --version", Tr("Show the versions of the program and its libraries"), 22);
  page += "\n" + Tr("Example: %1", "fotomill convert holiday --to png --dest out") + "\n" +
          Tr("\"%1\" explains a command.", "fotomill help convert") + "\n";
  return page;
}

std::string HelpOf(std::string_view name) {
  if (const Command* command = FindCommand(name)) {
    CommandContext context;
    return CommandParser(command, context).HelpPage();
  }
  const std::string list = ListCommands(name);
  if (list.empty() || name.empty()) return {};
  return Tr("Usage: %1", "fotomill " + std::string(name) + " COMMAND [ARGUMENT]...") + "\n\n" +
         Tr("Commands:") + "\n" + list;
}

std::string VersionPage() {
  std::string page = "Fotomill Professional " FOTOMILL_VERSION "\n";
  for (const Library& library : Libraries())
    page += std::string(library.name) + " " + library.version + "\n";
  return page;
}

}  // namespace fotomill::cli
