#include "cli/frame/options.h"

#include <CLI/CLI.hpp>

#include "core/whole_number.h"
#include "texts/texts.h"

namespace fotomill::cli {

CLI::Option* AddFlag(CLI::App& app, const char* names, bool& value, const char* help) {
  return app.add_flag(names, value, Tr(help));
}

void AddDryRunAndJson(CLI::App& app, bool& dryRun, bool& json, const char* jsonHelp) {
  AddFlag(app, "-n,--dry-run", dryRun, "Only show what would be done");
  AddFlag(app, "--json", json, jsonHelp);
}

CLI::Option* AddText(CLI::App& app, const char* names, std::string& value, const char* shownAs,
                     const char* help) {
  return app.add_option(names, value, Tr(help))->option_text(shownAs);
}

CLI::Option* AddName(CLI::App& app, const char* names, std::string& value, const char* shownAs,
                     const char* help) {
  const CLI::Validator notEmpty(
      [](const std::string& text) { return text.empty() ? Tr("is empty") : std::string(); }, "");
  return AddText(app, names, value, shownAs, help)->check(notEmpty);
}

CLI::Option* AddChoice(CLI::App& app, const char* names, std::string& value, const char* shownAs,
                       const char* help, std::initializer_list<const char*> choices) {
  const std::vector<std::string> words(choices.begin(), choices.end());
  const CLI::Validator isWord(
      [words](const std::string& text) {
        if (std::ranges::find(words, text) != words.end()) return std::string();
        std::string list;
        for (const std::string& word : words) list += (list.empty() ? "" : ", ") + word;
        return Tr("\"%1\" is not one of %2", text, list);
      },
      "");
  std::string list;
  for (const std::string& word : words) list += (list.empty() ? "" : "|") + word;
  CLI::Option* const option = AddText(app, names, value, shownAs, help)->check(isWord);
  option->type_name(list);  // used for completion
  const bool named = std::ranges::all_of(words, [&](const std::string& word) {
    return std::string_view(help).find(word) != std::string_view::npos;
  });
  if (!named) option->description(option->get_description() + " (" + list + ")");
  return option;
}

CLI::Option* AddNumber(CLI::App& app, const char* names, int32_t& value, const char* shownAs,
                       int32_t least, int32_t most, const char* help) {
  const CLI::Validator inRange(
      [least, most](const std::string& text) {
        const auto number = ParseNumber<int32_t>(text);
        if (number && *number >= least && *number <= most) return std::string();
        if (most == INT32_MAX)
          return Tr("\"%1\" is not a whole number of at least %2", text, least);
        return Tr("\"%1\" is not a whole number from %2 to %3", text, least, most);
      },
      "");
  std::string text = Tr(help);
  const std::string highest = std::to_string(most);
  if (most != INT32_MAX && std::string_view(help).find(highest) == std::string_view::npos)
    text += " " + Tr("(%1 to %2)", least, most);
  return app.add_option(names, value, text)->option_text(shownAs)->check(inRange);
}

CLI::Option* AddTexts(CLI::App& app, const char* names, std::vector<std::string>& values, int count,
                      const char* shownAs, const char* help) {
  return app.add_option(names, values, Tr(help))
      ->option_text(shownAs)
      ->expected(count)
      ->allow_extra_args(false);
}

CLI::Option* AddRepeatedText(CLI::App& app, const char* names, std::vector<std::string>& values,
                             const char* shownAs, const char* help) {
  return app.add_option(names, values, Tr(help))->option_text(shownAs)->allow_extra_args(false);
}

void Require(CLI::Option* option) {
  option->required();
  option->description(option->get_description() + " " + Tr("(required)"));
}

void Exclude(CLI::Option* option, CLI::Option* other) { option->excludes(other); }

void SetFooter(CLI::App& app, const char* notes, const char* example) {
  app.footer((notes == nullptr ? "" : std::string(Tr(notes)) + "\n\n") +
             Tr("Example: %1", example));
}

}  // namespace fotomill::cli
