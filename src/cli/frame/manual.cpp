#include "cli/frame/manual.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <string_view>

#include "cli/frame/command_parser.h"
#include "cli/frame/commands.h"
#include "cli/frame/options.h"
#include "cli/frame/topics.h"
#include "core/text.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

std::string Section(std::string_view title) { return ".SH \"" + std::string(title) + "\"\n"; }

// Escapes text for roff: backslashes, hyphens, and control characters at line starts.
std::string Roff(std::string_view text) {
  std::string out;
  bool lineBegins = true;
  for (const char c : text) {
    if (lineBegins && (c == '.' || c == '\'')) out += "\\&";
    if (c == '\\') {
      out += "\\e";
    } else if (c == '-') {
      out += "\\-";
    } else {
      out += c;
    }
    lineBegins = c == '\n';
  }
  return out;
}

std::string PageName(std::string_view command) {
  std::string name = command.empty() ? "fotomill" : "fotomill-" + std::string(command);
  std::ranges::replace(name, ' ', '-');
  return name;
}

std::string Title(std::string_view command, std::string_view summary) {
  std::string name = PageName(command);
  std::string upper = name;
  std::ranges::transform(upper, upper.begin(), [](char c) {
    return static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
  });
  return ".TH " + upper + " 1 \"\" \"Fotomill Professional " FOTOMILL_VERSION "\" \"\"\n" +
         Section(Tr("NAME")) + Roff(name) + " \\- " + Roff(summary) + "\n";
}

// A ".TP" entry: bold text, placeholder, description.
std::string Entry(const std::string& bold, const std::string& value, std::string_view text) {
  return ".TP\n\\fB" + Roff(bold) + "\\fR" + (value.empty() ? "" : " \\fI" + Roff(value) + "\\fR") +
         "\n" + Roff(text) + "\n";
}

std::string OptionEntry(const CLI::Option& option) {
  std::string names;
  for (const std::string& name : option.get_snames()) names += (names.empty() ? "-" : ", -") + name;
  for (const std::string& name : option.get_lnames())
    names += (names.empty() ? "--" : ", --") + name;
  const std::string value = option.get_type_size() == 0        ? std::string()
                            : option.get_option_text().empty() ? option.get_type_name()
                                                               : option.get_option_text();
  return Entry(names, value, option.get_description());
}

// The options of a parser, one section per group.
std::string OptionSections(const CLI::App& parser) {
  std::string text;
  for (const std::string& group : parser.get_groups()) {
    const std::vector<const CLI::Option*> options =
        parser.get_options([&](const CLI::Option* option) { return option->get_group() == group; });
    if (group.empty() || options.empty()) continue;
    text += Section(Roff(group));
    for (const CLI::Option* option : options) text += OptionEntry(*option);
  }
  return text;
}

std::string ExitStatusSection() {
  std::string text = Section(Tr("EXIT STATUS"));
  for (const TopicPart& part : ExitStatusEntries()) text += Entry(part.left, "", part.text);
  return text;
}

// One section per help topic.
std::string TopicSections() {
  std::string text;
  for (const Topic& topic : Topics()) {
    text += Section(Roff(UpperCase(topic.name)));
    for (const TopicPart& part : topic.parts()) {
      switch (part.kind) {
        case TopicPart::Kind::Paragraph: text += ".PP\n" + Roff(part.text) + "\n"; break;
        case TopicPart::Kind::Entry: text += Entry(part.left, "", part.text); break;
        case TopicPart::Kind::Example: text += ".PP\n.EX\n" + Roff(part.text) + "\n.EE\n"; break;
      }
    }
  }
  return text;
}

std::string SeeAlsoSection(std::string_view page) {
  return Section(Tr("SEE ALSO")) + "\\fB" + Roff(page) + "\\fR(1)\n";
}

std::string PageOf(const Command& command) {
  CommandContext context;
  const CommandParser parser(&command, context);
  std::string text = Title(command.name, Tr(command.summary));
  text += Section(Tr("SYNOPSIS")) + "\\fBfotomill " + Roff(command.name) + "\\fR [\\fI" +
          std::string(Tr("OPTION")) + "\\fR]... " + Roff(context.names.placeholder) + "\n";
  text += Section(Tr("DESCRIPTION")) + Roff(parser.get_description()) + "\n";
  if (*context.names.placeholder != '\0' && *context.names.help != '\0')
    text += Entry(context.names.placeholder, "", Tr(context.names.help));
  text += OptionSections(parser);
  if (!parser.get_footer().empty()) text += Section(Tr("NOTES")) + Roff(parser.get_footer()) + "\n";
  return text + ExitStatusSection() + SeeAlsoSection("fotomill");
}

std::string MainPage() {
  CommandContext context;
  const CommandParser parser(nullptr, context);
  std::string text = Title({}, Tr("manage, view, convert and process pictures"));
  text += Section(Tr("SYNOPSIS")) + "\\fBfotomill\\fR [\\fI" + Tr("OPTION") + "\\fR]... \\fI" +
          Tr("COMMAND") + "\\fR [\\fI" + Tr("ARGUMENT") + "\\fR]...\n";
  text += Section(Tr("COMMANDS"));
  for (const Command& command : Commands()) {
    const std::string page = PageName(command.name) + "(1)";
    text += Entry(command.name, "", std::string(Tr(command.summary)) + "; " + page);
  }
  text += OptionSections(parser);
  text += Section(Tr("ENVIRONMENT")) +
          Entry("FOTOMILL_DATA", "", Tr("Data folder, unless --data names one.")) +
          Entry("NO_COLOR", "", Tr("Disables color if set to anything.")) +
          Entry("LANG, LC_ALL, LANGUAGE", "", Tr("Language of messages."));
  text += Section(Tr("EXAMPLES")) + ".EX\n" +
          Roff(
              "fotomill convert holiday --to png --dest out\n"
              "fotomill apply photos --do 'resize 1600x1600; sharpen 0.5' --dest web\n"
              "fotomill rename --help") +
          "\n.EE\n";
  return text + TopicSections() + SeeAlsoSection("fotomill-convert");
}

int WriteManual(const std::string& folder, const CommandContext& context) {
  if (!platform::MakeFolders(folder))
    return UsageError(context, WithReason(Tr("The folder \"%1\" could not be created.", folder)));
  for (const auto& [name, text] : ManualPages()) {
    const std::string path = platform::JoinFolder(folder, name);
    if (platform::WriteWholeFile(path, text)) continue;
    const std::string reason = WithReason(Tr("The file cannot be written."));
    std::fprintf(context.io.err, "%s: %s\n", path.c_str(), reason.c_str());
    return kExitFailed;
  }
  return kExitOk;
}

}  // namespace

std::vector<std::pair<std::string, std::string>> ManualPages() {
  std::vector<std::pair<std::string, std::string>> pages = {{PageName({}) + ".1", MainPage()}};
  for (const Command& command : Commands())
    pages.emplace_back(PageName(command.name) + ".1", PageOf(command));
  return pages;
}

void SetUpManual(CLI::App& app, CommandContext& context) {
  context.names.Declare("DIR", "Folder for the pages, created if needed", 1, 1);
  SetFooter(app, nullptr, "fotomill manual ~/.local/share/man/man1");
  context.run = [&context] { return WriteManual(context.names.values[0], context); };
}

}  // namespace fotomill::cli
