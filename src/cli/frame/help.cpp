#include "cli/frame/help.h"

#include "cli/frame/command_parser.h"
#include "cli/frame/commands.h"
#include "cli/frame/shown_text.h"
#include "cli/frame/topics.h"
#include "core/utf8.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

constexpr size_t kPageWidth = 100;

std::string Line(std::string_view left, std::string_view right, size_t width) {
  std::string line("  ");
  return line.append(left).append(width + 2 - left.size(), ' ').append(right).append("\n");
}

// Names and summaries of commands whose name or first word is `first`; of all if it is empty.
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
  if (first.empty()) list += Line("help", Tr("explain a command or a topic"), width);
  return list;
}

// Wraps a text to the page width, indenting all but the first line.
std::string Wrapped(std::string_view text, size_t indent) {
  std::string lines;
  for (const std::string& line : WrappedLines(text, kPageWidth - indent))
    lines += (lines.empty() ? "" : "\n" + std::string(indent, ' ')) + line;
  return lines;
}

// Formats a topic for the terminal.
std::string TopicPage(const Topic& topic) {
  const std::vector<TopicPart> parts = topic.parts();
  size_t width = 0;
  for (const TopicPart& part : parts) width = std::max(width, CharacterCount(part.left));
  std::string page = std::string(topic.name) + ": " + Tr(topic.summary) + "\n";
  bool inList = false;
  for (const TopicPart& part : parts) {
    const bool entry = part.kind == TopicPart::Kind::Entry;
    if (!entry || !inList) page += "\n";
    inList = entry;
    if (entry) {
      page += "  " + part.left + std::string(width + 2 - CharacterCount(part.left), ' ') +
              Wrapped(part.text, width + 4);
    } else if (part.kind == TopicPart::Kind::Example) {
      page += "  " + CLI::detail::find_and_replace(part.text, "\n", "\n  ");
    } else {
      page += Wrapped(part.text, 0);
    }
    page += "\n";
  }
  return page;
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
  page += std::string("\n") + Tr("Topics:") + "\n";
  for (const Topic& topic : Topics()) page += Line(topic.name, Tr(topic.summary), 22);
  page += "\n" + Tr("Example: %1", "fotomill convert holiday --to png --dest out") + "\n" +
          Tr("\"%1\" explains a command, \"%2\" a topic.", "fotomill help convert",
             "fotomill help names") +
          "\n";
  return page;
}

std::string HelpOf(std::string_view name) {
  if (const Topic* topic = FindTopic(name)) return TopicPage(*topic);
  if (const Command* command = FindCommand(name)) {
    CommandContext context;
    return CommandParser(command, context).HelpPage();
  }
  const std::string list = ListCommands(name);
  if (list.empty() || name.empty()) return {};
  return Tr("Usage: %1", "fotomill " + std::string(name) + " COMMAND [ARGUMENT]...") + "\n\n" +
         Tr("Commands:") + "\n" + list;
}

}  // namespace fotomill::cli
