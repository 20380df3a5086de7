#include "cli/frame/completion.h"

#include <CLI/CLI.hpp>
#include <memory>
#include <set>
#include <string>
#include <vector>

#include "cli/frame/command_parser.h"
#include "cli/frame/commands.h"
#include "cli/frame/options.h"
#include "core/text.h"
#include "registry/registry.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

// What a shell needs to know about a command.
struct CommandWords {
  std::string name;  // one word or two
  std::string summary;
  std::vector<std::string> options;  // "--to", "-t"
};

std::vector<std::string> OptionsOf(const CLI::App& parser) {
  std::vector<std::string> options;
  for (const CLI::Option* option : parser.get_options()) {
    for (const std::string& name : option->get_lnames()) options.push_back("--" + name);
    for (const std::string& name : option->get_snames()) options.push_back("-" + name);
  }
  return options;
}

std::vector<CommandWords> AllCommands() {
  std::vector<CommandWords> words;
  for (const Command& command : Commands()) {
    CommandContext context;
    words.push_back(
        {command.name, Tr(command.summary), OptionsOf(CommandParser(&command, context))});
  }
  return words;
}

std::string Joined(const std::vector<std::string>& words) {
  std::string text;
  for (const std::string& word : words) text += (text.empty() ? "" : " ") + word;
  return text;
}

// The words that may come first.
std::string FirstWords(const std::vector<CommandWords>& commands) {
  std::vector<std::string> words;
  std::set<std::string> seen;
  for (const CommandWords& command : commands) {
    const std::string first = command.name.substr(0, command.name.find(' '));
    if (seen.insert(first).second) words.push_back(first);
  }
  return Joined(words) + " help";
}

// Second words by first word.
std::string SecondWords(const std::vector<CommandWords>& commands, const std::string& first) {
  std::vector<std::string> words;
  for (const CommandWords& command : commands) {
    if (command.name.starts_with(first + " "))
      words.push_back(command.name.substr(first.size() + 1));
  }
  return Joined(words);
}

std::string WritableExtensions() {
  std::vector<std::string> extensions;
  for (int32_t i = 0; i < formatCount; ++i) {
    if (CanWrite(FormatRow(i))) extensions.push_back(LowerCase(FormatRow(i).extension));
  }
  return Joined(extensions);
}

// clang-format off
constexpr const char* kBash = R"sh(_fotomill() {
  local current=${COMP_WORDS[COMP_CWORD]} previous=${COMP_WORDS[COMP_CWORD-1]} command= i
  COMPREPLY=()
  for ((i = 1; i < COMP_CWORD; ++i)); do
    case ${COMP_WORDS[i]} in
      --data|--set|--progress|--color|--lang) ((++i)) ;;
      -*) ;;
      *) command+="${command:+ }${COMP_WORDS[i]}"
         [[ $command == *' '* || -z $(_fotomill_second "$command") ]] && break ;;
    esac
  done
  case $previous in
    -t|--to) COMPREPLY=($(compgen -W '@EXTENSIONS@' -- "$current")); return ;;
    --color) COMPREPLY=($(compgen -W 'auto always never' -- "$current")); return ;;
    --progress) COMPREPLY=($(compgen -W 'auto never' -- "$current")); return ;;
    --frame) COMPREPLY=($(compgen -W 'none raised flat' -- "$current")); return ;;
    --overwrite) COMPREPLY=($(compgen -W 'ask replace keep-both skip' -- "$current")); return ;;
  esac
  if [[ $current == -* ]]; then
    COMPREPLY=($(compgen -W "$(_fotomill_options "$command")" -- "$current"))
  elif [[ -z $command || $command == help ]]; then
    COMPREPLY=($(compgen -W '@COMMANDS@' -- "$current"))
  elif [[ $command != *' '* && -n $(_fotomill_second "$command") ]]; then
    COMPREPLY=($(compgen -W "$(_fotomill_second "$command")" -- "$current"))
  elif [[ $command == completion ]]; then
    COMPREPLY=($(compgen -W 'bash zsh fish' -- "$current"))
  else
    compopt -o filenames 2>/dev/null
    local IFS=$'\n'
    COMPREPLY=($(compgen -f -- "$current"))
  fi
}
complete -F _fotomill fotomill
)sh";
// clang-format on

std::string BashScript(const std::vector<CommandWords>& commands) {
  CommandContext context;
  std::string options = "_fotomill_options() {\n  case $1 in\n",
              second = "_fotomill_second() {\n  case $1 in\n";
  std::set<std::string> groups;
  for (const CommandWords& command : commands) {
    options += "    '" + command.name + "') echo '" + Joined(command.options) + "' ;;\n";
    const std::string first = command.name.substr(0, command.name.find(' '));
    if (first != command.name && groups.insert(first).second) {
      second += "    '" + first + "') echo '" + SecondWords(commands, first) + "' ;;\n";
    }
  }
  options += "    *) echo '" + Joined(OptionsOf(CommandParser(nullptr, context))) +
             " --version -V' ;;\n  esac\n}\n";
  second += "    *) ;;\n  esac\n}\n";
  std::string script = CLI::detail::find_and_replace(kBash, "@COMMANDS@", FirstWords(commands));
  script = CLI::detail::find_and_replace(script, "@EXTENSIONS@", WritableExtensions());
  return "# bash completion of fotomill\n" + options + second + script;
}

// zsh runs the script for bash.
std::string ZshScript(const std::vector<CommandWords>& commands) {
  return "#compdef fotomill\nautoload -U +X bashcompinit && bashcompinit\n" + BashScript(commands);
}

std::string FishQuoted(const std::string& text) {
  std::string quoted = "'";
  for (const char c : text) {
    if (c == '\'' || c == '\\') quoted += '\\';
    quoted += c;
  }
  return quoted + "'";
}

std::string FishOptions(const std::string& condition, const CLI::App& parser) {
  std::string lines;
  for (const CLI::Option* option : parser.get_options()) {
    std::string line = "complete -c fotomill -n " + FishQuoted(condition);
    for (const std::string& name : option->get_lnames()) line += " -l " + name;
    for (const std::string& name : option->get_snames()) line += " -s " + name;
    if (option->get_type_size() != 0) line += " -r";
    lines += line + " -d " + FishQuoted(option->get_description()) + "\n";
  }
  return lines;
}

std::string FishScript(const std::vector<CommandWords>& commands) {
  std::string script =
      "# fish completion of fotomill\n"
      "function __fotomill_is\n"
      "    set -l words (commandline -opc | string match -v -- '-*')\n"
      "    set -l line (string join ' ' -- $words[2..-1])\n"
      "    string match -q -- \"$argv *\" \"$line \"\n"
      "end\n"
      "function __fotomill_none\n"
      "    test (count (commandline -opc | string match -v -- '-*')) -eq 1\n"
      "end\n";
  for (const CommandWords& command : commands) {
    const size_t blank = command.name.find(' ');
    const std::string first = command.name.substr(0, blank);
    script += "complete -c fotomill -n __fotomill_none -f -a " + first + " -d " +
              FishQuoted(blank == std::string::npos ? command.summary : first + " ...") + "\n";
    if (blank != std::string::npos) {
      script += "complete -c fotomill -n '__fotomill_is " + first + "' -f -a " +
                command.name.substr(blank + 1) + " -d " + FishQuoted(command.summary) + "\n";
    }
    CommandContext context;
    script += FishOptions("__fotomill_is " + command.name,
                          CommandParser(FindCommand(command.name), context));
  }
  for (const char* command : {"convert", "contact-sheet"}) {
    script += std::string("complete -c fotomill -n '__fotomill_is ") + command +
              "' -s t -l to -x -a " + FishQuoted(WritableExtensions()) + "\n";
  }
  return script;
}

int RunCompletion(const CommandContext& context) {
  const std::string& shell = context.names.values[0];
  const std::vector<CommandWords> commands = AllCommands();
  std::string script;
  if (shell == "bash") script = BashScript(commands);
  if (shell == "zsh") script = ZshScript(commands);
  if (shell == "fish") script = FishScript(commands);
  if (script.empty())
    return UsageError(context,
                      Tr("There is no completion for \"%1\"; choose bash, zsh or fish.", shell));
  std::fwrite(script.data(), 1, script.size(), context.io.out);
  return kExitOk;
}

}  // namespace

void SetUpCompletion(CLI::App& app, CommandContext& context) {
  context.names.Declare("SHELL", "bash, zsh or fish", 1, 1);
  SetFooter(app, nullptr,
            "fotomill completion bash > ~/.local/share/bash-completion/completions/fotomill");
  context.run = [&context] { return RunCompletion(context); };
}

}  // namespace fotomill::cli
