#include "cli/frame/command_parser.h"

#include <algorithm>
#include <memory>
#include <string_view>

#include "cli/frame/options.h"
#include "core/nearest_name.h"

namespace fotomill::cli {

namespace {

constexpr const char* kGlobalGroup = "Options of every command";
constexpr size_t kFirstColumn = 26;

// The option's placeholder instead of types, and the names as their command describes them.
class HelpFormatter : public CLI::Formatter {
 public:
  explicit HelpFormatter(const NameArguments& names) : names_(names) { column_width(kFirstColumn); }
  std::string make_usage(const CLI::App* app, std::string) const override {
    std::string line = "\nUsage: " + app->get_name() + " [OPTION]...";
    if (*names_.placeholder != '\0') line += std::string(" ") + names_.placeholder;
    return line + "\n";
  }
  std::string make_positionals(const CLI::App*) const override {
    if (*names_.placeholder == '\0' || *names_.help == '\0') return {};
    std::stringstream out;
    out << '\n';
    CLI::detail::format_help(out, names_.placeholder, names_.help, kFirstColumn);
    return out.str();
  }
  std::string make_option_name(const CLI::Option* option, bool) const override {
    return CLI::detail::find_and_replace(option->get_name(false, true), ",", ", ");
  }
  std::string make_option_opts(const CLI::Option* option) const override {
    if (option->get_type_size() == 0) return {};
    return " " + (option->get_option_text().empty() ? option->get_type_name() : option->get_option_text());
  }

 private:
  const NameArguments& names_;
};

void AddGlobalOptions(CLI::App& app, GlobalOptions& global) {
  app.option_defaults()->group(kGlobalGroup);
  AddName(app, "--data", global.dataFolder, "DIR", "Folder of the configuration and the stores");
  AddRepeatedText(app, "--set", global.settings, "KEY=VALUE", "Give a configuration key a value for this run; may be repeated");
  AddFlag(app, "-q,--quiet", global.quiet, "No progress and no closing lines");
  AddFlag(app, "--no-input", global.noInput, "Never ask");
  AddFlag(app, "--no-plugins", global.noPlugins, "Load no plug-ins");
  AddChoice(app, "--progress", global.progress, "WHEN", {"auto", "never"}, "auto (on a terminal) or never");
  AddChoice(app, "--color", global.color, "WHEN", {"auto", "always", "never"},
            "auto (on a terminal, unless NO_COLOR is set), always or never");
  app.set_help_flag("-h,--help", "Print this help");
}

// The parser would take "--name=" for an option whose value follows.
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
  constexpr std::string_view kWithValue[] = {"--data", "--set", "--progress", "--color"};
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
    std::string summary = command->summary;
    summary[0] = static_cast<char>(std::toupper(static_cast<unsigned char>(summary[0])));
    description(summary + ".");
    command->setUp(*this, context);
  }
  AddGlobalOptions(*this, context.global);
}

void CommandParser::ParseArguments(std::vector<std::string> arguments) {
  SplitEmptyValues(arguments);
  std::reverse(arguments.begin(), arguments.end());
  parse(std::move(arguments));
  TakeNames();
}

std::string CommandParser::HelpPage() const { return CLI::detail::find_and_replace(help(), "\n\n\n", "\n\n"); }

// What the parser did not know is a name, or an option that there is not.
void CommandParser::TakeNames() {
  NameArguments& names = context_.names;
  bool namesOnly = false;
  for (auto& [kind, text] : missing_) {
    if (kind == CLI::detail::Classifier::POSITIONAL_MARK && !namesOnly) {
      namesOnly = true;
    } else if (kind == CLI::detail::Classifier::NONE) {
      names.values.push_back(std::move(text));
    } else {
      RefuseOption(text);
    }
  }
  if (names.values.size() < names.least) throw CLI::RequiredError(names.placeholder);
  if (names.values.size() > names.most) {
    throw CLI::ExtrasError("\"" + names.values[names.most] + "\" is one argument too many", CLI::ExitCodes::ExtrasError);
  }
}

void CommandParser::RefuseOption(const std::string& typed) const {
  const std::string name = typed.substr(0, typed.find('='));
  std::vector<std::string> known;
  for (const CLI::Option* option : get_options()) {
    for (const std::string& longName : option->get_lnames()) known.push_back("--" + longName);
  }
  const std::vector<std::string_view> names(known.begin(), known.end());
  throw CLI::ExtrasError("There is no option \"" + name + "\"." + NearestNameHint(name, names), CLI::ExitCodes::ExtrasError);
}

}  // namespace fotomill::cli
