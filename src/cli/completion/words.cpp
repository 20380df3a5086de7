#include "cli/completion/words.h"

#include <CLI/CLI.hpp>
#include <set>

#include "cli/frame/command_parser.h"
#include "cli/frame/commands.h"
#include "cli/frame/topics.h"
#include "core/text.h"
#include "operations/operations.h"
#include "registry/registry.h"
#include "settings/key_help.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

std::string OneLine(std::string text) {
  for (char& c : text) {
    if (c == '\n' || c == '\t') c = ' ';
  }
  return text;
}

std::vector<Word> KeyWords(const char* suffix) {
  std::vector<Word> words;
  for (const KeyRow& row : Keys()) {
    const std::string summary = KeySummary(row);
    words.push_back({std::string(row.name) + suffix,
                     summary.empty() ? Tr("unused in this build") : OneLine(summary)});
  }
  return words;
}

std::vector<Word> WritableExtensions() {
  std::vector<Word> words;
  for (int32_t i = 0; i < formatCount; ++i) {
    const FormatEntry& row = FormatRow(i);
    if (CanWrite(row))
      words.push_back({LowerCase(row.extension.view()), std::string(row.description.view())});
  }
  return words;
}

std::vector<Word> OperationWords() {
  std::vector<Word> words;
  for (const Operation* operation : Operations())
    words.push_back({operation->name, OneLine(Tr(operation->help))});
  return words;
}

std::vector<Word> SplitWords(const std::string& list) {
  std::vector<Word> words;
  for (size_t start = 0; start <= list.size();) {
    const size_t end = std::min(list.find('|', start), list.size());
    words.push_back({list.substr(start, end - start), {}});
    start = end + 1;
  }
  return words;
}

// Completions for the value of an option, or for a name, by placeholder.
Choice ChoiceOf(const std::string& placeholder) {
  if (placeholder == "KEY=VALUE") return {Choice::Words, KeyWords("="), true};
  if (placeholder.starts_with("KEY")) return {Choice::Words, KeyWords("")};
  if (placeholder == "EXT") return {Choice::Words, WritableExtensions()};
  if (placeholder == "[NAME]") return {Choice::Words, OperationWords()};
  if (placeholder == "SHELL") return {Choice::Words, SplitWords("bash|zsh|fish|powershell")};
  if (placeholder == "DIR") return {Choice::Folders, {}};
  for (const char* part : {"FILE", "PATH", "DB", "OUT"}) {
    if (placeholder.find(part) != std::string::npos) return {Choice::Files, {}};
  }
  return {};
}

std::vector<OptionWords> OptionsOf(const CLI::App& parser) {
  std::vector<OptionWords> options;
  for (const CLI::Option* option : parser.get_options()) {
    OptionWords words;
    for (const std::string& name : option->get_lnames()) words.names.push_back("--" + name);
    for (const std::string& name : option->get_snames()) words.names.push_back("-" + name);
    words.help = OneLine(option->get_description());
    words.takesValue = option->get_items_expected_max() > 0;
    const std::string list = option->get_type_name();
    if (list.find('|') != std::string::npos) {
      words.value = {Choice::Words, SplitWords(list)};
    } else if (words.takesValue) {
      words.value = ChoiceOf(option->get_option_text());
    }
    options.push_back(std::move(words));
  }
  return options;
}

}  // namespace

std::vector<CommandWords> AllCommandWords() {
  std::vector<CommandWords> words;
  for (const Command& command : Commands()) {
    CommandContext context;
    const CommandParser parser(&command, context);
    words.push_back({command.name, Tr(command.summary), OptionsOf(parser),
                     ChoiceOf(context.names.placeholder)});
  }
  return words;
}

std::vector<Word> FirstWords(const std::vector<CommandWords>& commands) {
  std::vector<Word> words;
  std::set<std::string> seen;
  for (const CommandWords& command : commands) {
    const size_t blank = command.name.find(' ');
    const std::string first = command.name.substr(0, blank);
    if (!seen.insert(first).second) continue;
    std::string help = command.summary;
    if (blank != std::string::npos) {
      help.clear();
      for (const Word& second : SecondWords(commands, first))
        help += (help.empty() ? "" : ", ") + second.text;
    }
    words.push_back({first, help});
  }
  words.push_back({"help", Tr("explain a command or a topic")});
  return words;
}

std::vector<Word> HelpWords(const std::vector<CommandWords>& commands) {
  std::vector<Word> words = FirstWords(commands);
  words.pop_back();
  for (const Topic& topic : Topics()) words.push_back({topic.name, Tr(topic.summary)});
  return words;
}

std::vector<Word> SecondWords(const std::vector<CommandWords>& commands, const std::string& first) {
  std::vector<Word> words;
  for (const CommandWords& command : commands) {
    if (command.name.starts_with(first + " "))
      words.push_back({command.name.substr(first.size() + 1), command.summary});
  }
  return words;
}

std::vector<OptionWords> GlobalOptionWords() {
  CommandContext context;
  std::vector<OptionWords> options = OptionsOf(CommandParser(nullptr, context));
  options.push_back(
      {{"--version", "-V"}, Tr("Show the versions of the program and its libraries"), false, {}});
  return options;
}

}  // namespace fotomill::cli
