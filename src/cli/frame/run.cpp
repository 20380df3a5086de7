#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <new>
#include <optional>
#include <string>
#include <vector>

#include "cli/frame/command_parser.h"
#include "cli/frame/commands.h"
#include "cli/frame/help.h"
#include "cli/frame/prepare.h"
#include "cli/frame/topics.h"
#include "cli/frame/version.h"
#include "core/shown_text.h"
#include "platform/process.h"
#include "texts/name_hint.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

using Arguments = std::vector<std::string>;

void Print(std::FILE* stream, std::string_view text) {
  std::fwrite(text.data(), 1, text.size(), stream);
}

int Complain(const Io& io, const std::string& message, const std::string& topic = {}) {
  const std::string help = "fotomill help" + (topic.empty() ? "" : " " + topic);
  Print(io.err, "fotomill: " + (io.errTerminal ? EscapeControls(message) : message) + "\n" +
                    Tr("Try \"%1\".", help) + "\n");
  return kExitUsage;
}

// Index of the first argument from `from` that is not an option or its value.
std::optional<size_t> FindWord(const Arguments& arguments, size_t from) {
  for (size_t i = from; i < arguments.size(); ++i) {
    if (arguments[i] == "--") return i + 1 < arguments.size() ? std::optional(i + 1) : std::nullopt;
    if (arguments[i].empty() || arguments[i][0] != '-') return i;
    if (GlobalOptionTakesValue(arguments[i])) ++i;
  }
  return std::nullopt;
}

bool IsAnyOf(const std::string& argument, std::string_view shortForm, std::string_view longForm) {
  return argument == shortForm || argument == longForm;
}

// The name of a command, one word or two, and the indices of those words.
struct CommandName {
  std::string name;
  std::vector<size_t> places;
};

bool BeginsCommandGroup(const std::string& word) {
  for (const Command& command : Commands()) {
    if (std::string_view(command.name).starts_with(word + " ")) return true;
  }
  return false;
}

// If a command also starts a group, such as "exif", its second word must follow immediately:
// elsewhere it may be the value of an option, or a file.
CommandName NameOfCommand(const Arguments& arguments, size_t place) {
  CommandName result{arguments[place], {place}};
  if (!BeginsCommandGroup(result.name)) return result;
  const bool alone = FindCommand(result.name) != nullptr;
  if (alone && place + 1 >= arguments.size()) return result;
  const auto second = alone ? std::optional(place + 1) : FindWord(arguments, place + 1);
  const std::string both = second ? result.name + " " + arguments[*second] : std::string();
  if (!second || (alone && FindCommand(both) == nullptr)) return result;
  return {both, {place, *second}};
}

int RefuseCommand(const std::string& name, const Io& io) {
  std::vector<std::string_view> names{"help"};
  for (const Command& command : Commands()) names.emplace_back(command.name);
  for (const Topic& topic : Topics()) names.emplace_back(topic.name);
  return Complain(io, Tr("Unknown command \"%1\".", name) + NearestNameHint(name, names));
}

int PrintHelp(const Arguments& words, const Io& io) {
  std::string topic;
  for (const std::string& word : words) {
    if (!word.empty() && word[0] != '-') topic += (topic.empty() ? "" : " ") + word;
  }
  const std::string page = topic.empty() || topic == "help" ? MainHelp() : HelpOf(topic);
  if (page.empty()) return RefuseCommand(topic, io);
  Print(io.out, page);
  return kExitOk;
}

// Parses the arguments of `command` (null: global options only) and runs it.
int ParseAndRun(const Command* command, const Arguments& arguments, const Io& io) {
  CommandContext context;
  context.io = io;
  CommandParser parser(command, context);
  try {
    parser.ParseArguments(arguments);
  } catch (const CLI::CallForHelp&) {
    Print(io.out, command == nullptr ? MainHelp() : parser.HelpPage());
    return kExitOk;
  } catch (const CLI::ParseError& error) {
    return Complain(io,
                    (command == nullptr ? "" : std::string(command->name) + ": ") + error.what(),
                    command == nullptr ? "" : command->name);
  }
  if (command == nullptr) return Complain(io, Tr("No command given."));
  std::vector<std::string> notes;
  const std::string problem = PrepareFor(*command, context.global, notes);
  if (!problem.empty())
    return Complain(io, std::string(command->name) + ": " + problem, command->name);
  for (const std::string& note : notes)
    if (!context.global.quiet) Print(io.err, "fotomill: " + note + "\n");
  const auto begun = std::chrono::steady_clock::now();
  const int status = context.run();
  FinishAfter(*command);
  if (context.global.verbose && !context.global.quiet) {
    const std::chrono::duration<double> taken = std::chrono::steady_clock::now() - begun;
    char seconds[32];
    std::snprintf(seconds, sizeof seconds, "%.2f", taken.count());
    Print(io.err, Tr("It took %1 seconds.", seconds) + "\n");
  }
  return status;
}

// The value of --lang anywhere in the arguments, as texts are needed before parsing. Empty if not
// given.
std::string WantedLanguage(const Arguments& arguments) {
  constexpr std::string_view kOption = "--lang";
  std::string language;
  for (size_t i = 0; i < arguments.size() && arguments[i] != "--"; ++i) {
    const std::string_view argument = arguments[i];
    if (argument == kOption && i + 1 < arguments.size()) language = arguments[i + 1];
    if (argument.starts_with(kOption) && argument.substr(kOption.size()).starts_with('=')) {
      language = argument.substr(kOption.size() + 1);
    }
  }
  return language;
}

int RefuseLanguage(const std::string& code, const Io& io) {
  std::string list;
  for (const Language& language : Languages()) list += (list.empty() ? "" : ", ") + language.code;
  return Complain(io, Tr("There is no translation \"%1\"; available: %2.", code, list));
}

// Prints the version; its options may come before or after --version.
int PrintVersion(Arguments arguments, const Io& io) {
  VersionOptions options;
  std::erase_if(arguments, [&](const std::string& argument) {
    const bool json = argument == "--json", licenses = argument == "--licenses";
    options.json = options.json || json;
    options.licenses = options.licenses || licenses;
    return json || licenses || IsAnyOf(argument, "-V", "--version");
  });
  CommandContext context;
  try {
    CommandParser(nullptr, context).ParseArguments(std::move(arguments));
  } catch (const CLI::CallForHelp&) {
    Print(io.out, MainHelp());
    return kExitOk;
  } catch (const CLI::ParseError& error) {
    return Complain(io, error.what());
  }
  Print(io.out, VersionPage(options));
  return kExitOk;
}

int Dispatch(Arguments arguments, const Io& io) {
  const std::string language = WantedLanguage(arguments);
  if (!StartTexts(language)) return RefuseLanguage(language, io);
  const std::optional<size_t> place = FindWord(arguments, 0);
  for (size_t i = 0; i < place.value_or(arguments.size()); ++i) {
    if (arguments[i] == "--") break;
    if (GlobalOptionTakesValue(arguments[i])) {
      ++i;
    } else if (IsAnyOf(arguments[i], "-V", "--version")) {
      if (place) arguments.resize(*place);
      return PrintVersion(std::move(arguments), io);
    } else if (!place && IsAnyOf(arguments[i], "-h", "--help")) {
      Print(io.out, MainHelp());
      return kExitOk;
    }
  }
  if (!place && arguments.empty()) {
    Print(io.err, MainHelp());
    return kExitUsage;
  }
  if (!place) return ParseAndRun(nullptr, arguments, io);
  if (arguments[*place] == "help")
    return PrintHelp({arguments.begin() + static_cast<ptrdiff_t>(*place) + 1, arguments.end()}, io);

  const CommandName named = NameOfCommand(arguments, *place);
  const Command* command = FindCommand(named.name);
  if (command == nullptr && named.places.size() == 1 && BeginsCommandGroup(named.name)) {
    const std::string page = HelpOf(named.name);
    const bool asked =
        arguments.size() > *place + 1 && IsAnyOf(arguments[*place + 1], "-h", "--help");
    Print(asked ? io.out : io.err, page);
    return asked ? kExitOk : kExitUsage;
  }
  if (command == nullptr) return RefuseCommand(named.name, io);
  for (auto word = named.places.rbegin(); word != named.places.rend(); ++word) {
    arguments.erase(arguments.begin() + static_cast<ptrdiff_t>(*word));
  }
  return ParseAndRun(command, arguments, io);
}

}  // namespace

bool CommandContext::ColorOn(bool terminal) const {
  if (global.color != "auto") return global.color == "always";
  const char* const noColor = std::getenv("NO_COLOR");
  const char* const kind = std::getenv("TERM");
  const bool dumb = kind != nullptr && std::string_view(kind) == "dumb";
  return terminal && !dumb && (noColor == nullptr || *noColor == '\0');
}

int UsageError(const CommandContext& context, std::string_view message) {
  const std::string name = context.command->name;
  return Complain(context.io, name + ": " + std::string(message), name);
}

int RunCommandLine(int count, const char* const* arguments, const Io& io) {
  int status = kExitFailed;
  try {
    status = Dispatch(Arguments(arguments + (count > 0 ? 1 : 0), arguments + count), io);
  } catch (const std::bad_alloc&) {
    Print(io.err, std::string("fotomill: ") + Tr("Memory allocation error.") + "\n");
  } catch (const std::exception& error) {
    Print(io.err, std::string("fotomill: ") + error.what() + "\n");
  }
  const bool failed = std::fflush(io.out) != 0 || std::ferror(io.out) != 0;
  if (failed && !(io.out == stdout && platform::IsReaderGone(1))) {
    Print(io.err, std::string("fotomill: ") + Tr("The results could not be written.") + "\n");
    if (status == kExitOk) status = kExitFailed;
  }
  const int asked = platform::PendingExit();
  return asked != 0 ? asked : status;
}

}  // namespace fotomill::cli
