#include "cli/frame/command_parser.h"

#include <algorithm>
#include <memory>
#include <string_view>

#include "cli/frame/options.h"
#include "texts/name_hint.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {


constexpr size_t kFirstColumn = 26;

// Shows placeholders instead of types, and names as described by the command.
class HelpFormatter : public CLI::Formatter {
 public:
  explicit HelpFormatter(const NameArguments& names) : names_(names) { column_width(kFirstColumn); }
  std::string make_usage(const CLI::App* app, std::string) const override {
    std::string line = app->get_name() + " [OPTION]...";
    if (*names_.placeholder != '\0') line += std::string(" ") + names_.placeholder;
    return "\n" + Tr("Usage: %1", line) + "\n";
  }
  std::string make_positionals(const CLI::App*) const override {
    if (*names_.placeholder == '\0' || *names_.help == '\0') return {};
    std::stringstream out;
    out << '\n';
    CLI::detail::format_help(out, names_.placeholder, Tr(names_.help), kFirstColumn);
    return out.str();
  }
  std::string make_option_name(const CLI::Option* option, bool) const override {
    return CLI::detail::find_and_replace(option->get_name(false, true), ",", ", ");
  }
  std::string make_option_opts(const CLI::Option* option) const override {
    if (option->get_type_size() == 0) return {};
    return " " + (option->get_option_text().empty() ? option->get_type_name()
                                                    : option->get_option_text());
  }

 private:
  const NameArguments& names_;
};

void AddGlobalOptions(CLI::App& app, GlobalOptions& global) {
  app.option_defaults()->group(Tr("Options of every command"));
  AddName(app, "--data", global.dataFolder, "DIR",
          "Data folder: configuration, thumbnail database, file history");
  AddRepeatedText(app, "--set", global.settings, "KEY=VALUE",
                  "Set a configuration key for this run; may be repeated");
  AddFlag(app, "-q,--quiet", global.quiet, "No progress bar, notes or summary");
  AddFlag(app, "-v,--verbose", global.verbose,
          "More details: notes on files, and the time it took");
  AddFlag(app, "--no-input", global.noInput, "Never ask questions");
  AddFlag(app, "--no-plugins", global.noPlugins, "Do not load plug-ins");
  AddFlag(app, "--no-history", global.noHistory, "Do not record files in the file history");
  AddChoice(app, "--progress", global.progress, "WHEN",
            "Progress bar: auto (on a terminal) or never", {"auto", "never"});
  AddChoice(app, "--color", global.color, "WHEN",
            "Color: auto (on a terminal, unless NO_COLOR is set), always or never",
            {"auto", "always", "never"});
  AddName(app, "--lang", global.language, "CODE",
          "Language of messages, such as de or en (default: from the environment)");
  app.set_help_flag("-h,--help", Tr("Show this help"));
}

// CLI11 would take the next argument as the value of "--name=".
void SplitEmptyValues(std::vector<std::string>& arguments) {
  for (size_t i = 0; i < arguments.size() && arguments[i] != "--"; ++i) {
    std::string& argument = arguments[i];
    if (!argument.starts_with("--") || argument.find('=') != argument.size() - 1) continue;
    argument.pop_back();
    arguments.insert(arguments.begin() + static_cast<std::ptrdiff_t>(++i), std::string());
  }
}

}  // namespace

bool GlobalOptionTakesValue(std::string_view option) {
  constexpr std::string_view kWithValue[] = {"--data", "--set", "--progress", "--color", "--lang"};
  return std::ranges::find(kWithValue, option) != std::end(kWithValue);
}

CommandParser::CommandParser(const Command* command, CommandContext& context)
    : CLI::App(command == nullptr ? "" : command->summary, "fotomill"), context_(context) {
  context.command = command;
  allow_windows_style_options(false);
  allow_extras();
  set_help_flag();
  formatter(std::make_shared<HelpFormatter>(context.names));
  if (command != nullptr) {
    name(std::string("fotomill ") + command->name);
    std::string summary = Tr(command->summary);
    summary[0] = static_cast<char>(std::toupper(static_cast<unsigned char>(summary[0])));
    description(summary + ".");
    option_defaults()->group(Tr("Options"));
    command->setUp(*this, context);
  }
  AddGlobalOptions(*this, context.global);
}

void CommandParser::ParseArguments(std::vector<std::string> arguments) {
  RefuseFlagValues(arguments);
  SplitEmptyValues(arguments);
  std::reverse(arguments.begin(), arguments.end());
  try {
    parse(std::move(arguments));
  } catch (const CLI::ParseError& error) {
    Reword(error);
    throw;
  }
  TakeNames();
}

// Flags take no value: "--json=no" would be misleading.
void CommandParser::RefuseFlagValues(const std::vector<std::string>& arguments) const {
  for (const std::string& argument : arguments) {
    if (argument == "--") return;
    const size_t equals = argument.find('=');
    if (!argument.starts_with("--") || equals == std::string::npos) continue;
    const std::string name = argument.substr(0, equals);
    const CLI::Option* const option = get_option_no_throw(name);
    if (option != nullptr && option->get_items_expected_max() == 0)
      throw CLI::ExtrasError(Tr("%1 takes no value.", name), CLI::ExitCodes::ExtrasError);
  }
}

// Rethrows errors of CLI11 with our own translated text; returns for all other errors.
void CommandParser::Reword(const CLI::ParseError& error) {
  const std::string text = error.what(), kind = error.get_name();
  const std::string option = text.substr(0, text.find_first_of(": "));
  const auto refuse = [&](const std::string& message) {
    throw CLI::ExtrasError(message, CLI::ExitCodes::ExtrasError);
  };
  if (kind == "ExcludesError")
    refuse(Tr("%1 and %2 cannot be combined.", option, text.substr(text.rfind(' ') + 1)));
  if (kind == "RequiredError") refuse(Tr("%1 is missing.", option));
  if (kind != "ArgumentMismatch") return;
  const CLI::Option* const found = get_option_no_throw(option);
  const int values = found == nullptr ? 1 : found->get_expected_min() * found->get_type_size();
  if (values > 1)
    refuse(TrCount("%2 needs %1 value.", "%2 needs %1 values.", static_cast<uint64_t>(values),
                   option));
  refuse(text.find("received") != std::string::npos ? Tr("%1 was given twice.", option)
                                                    : Tr("%1 needs a value.", option));
}

std::string CommandParser::HelpPage() const {
  return CLI::detail::find_and_replace(help(), "\n\n\n", "\n\n");
}

// Arguments unknown to CLI11 are names or unknown options.
void CommandParser::TakeNames() {
  NameArguments& names = context_.names;
  bool namesOnly = false;
  for (auto& [kind, text] : missing_) {
    if (kind == CLI::detail::Classifier::POSITIONAL_MARK && !namesOnly) {
      namesOnly = true;
    } else if (kind == CLI::detail::Classifier::NONE &&
               (namesOnly || text.size() < 2 || text[0] != '-')) {
      names.values.push_back(std::move(text));
    } else {
      RefuseOption(text);
    }
  }
  if (names.values.size() < names.least) {
    throw CLI::ExtrasError(Tr("%1 is missing.", names.placeholder), CLI::ExitCodes::ExtrasError);
  }
  if (names.values.size() > names.most) {
    throw CLI::ExtrasError(Tr("Unexpected argument \"%1\".", names.values[names.most]),
                           CLI::ExitCodes::ExtrasError);
  }
}

void CommandParser::RefuseOption(const std::string& typed) const {
  const std::string name = typed.substr(0, typed.find('='));
  std::vector<std::string> known;
  for (const CLI::Option* option : get_options()) {
    for (const std::string& longName : option->get_lnames()) known.push_back("--" + longName);
  }
  const std::vector<std::string_view> names(known.begin(), known.end());
  throw CLI::ExtrasError(Tr("Unknown option \"%1\".", name) + NearestNameHint(name, names),
                         CLI::ExitCodes::ExtrasError);
}

}  // namespace fotomill::cli
