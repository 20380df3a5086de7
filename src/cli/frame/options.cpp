#include "cli/frame/options.h"

#include <CLI/CLI.hpp>

namespace fotomill::cli {

CLI::Option* AddFlag(CLI::App& app, const char* names, bool& value, const char* help) { return app.add_flag(names, value, help); }

CLI::Option* AddText(CLI::App& app, const char* names, std::string& value, const char* shownAs, const char* help) {
  return app.add_option(names, value, help)->option_text(shownAs);
}

CLI::Option* AddName(CLI::App& app, const char* names, std::string& value, const char* shownAs, const char* help) {
  const CLI::Validator notEmpty([](const std::string& text) { return text.empty() ? "is empty" : std::string(); }, "");
  return AddText(app, names, value, shownAs, help)->check(notEmpty);
}

CLI::Option* AddChoice(CLI::App& app, const char* names, std::string& value, const char* shownAs,
                       std::initializer_list<const char*> choices, const char* help) {
  return AddText(app, names, value, shownAs, help)
      ->check(CLI::IsMember(std::vector<std::string>(choices.begin(), choices.end())));
}

CLI::Option* AddNumber(CLI::App& app, const char* names, int32_t& value, const char* shownAs, int32_t least, int32_t most,
                       const char* help) {
  return app.add_option(names, value, help)->option_text(shownAs)->check(CLI::Range(least, most));
}

CLI::Option* AddTexts(CLI::App& app, const char* names, std::vector<std::string>& values, int count, const char* shownAs,
                      const char* help) {
  return app.add_option(names, values, help)->option_text(shownAs)->expected(count)->allow_extra_args(false);
}

CLI::Option* AddRepeatedText(CLI::App& app, const char* names, std::vector<std::string>& values, const char* shownAs,
                             const char* help) {
  return app.add_option(names, values, help)->option_text(shownAs)->allow_extra_args(false);
}

void Require(CLI::Option* option) { option->required(); }

void Exclude(CLI::Option* option, CLI::Option* other) { option->excludes(other); }

void SetFooter(CLI::App& app, const std::string& text) { app.footer(text); }

}  // namespace fotomill::cli
