// The bash and zsh scripts share lists: functions that print words with their descriptions, one per
// line, separated by a tab; or one of "*files", "*folders" and "*anything".

#include "cli/completion/words.h"

namespace fotomill::cli {

namespace {

std::string Quoted(const std::string& text) {
  std::string quoted = "'";
  for (const char c : text) quoted += c == '\'' ? std::string("'\\''") : std::string(1, c);
  return quoted + "'";
}

std::string PrintWords(const std::vector<Word>& words) {
  std::string line = "printf '%s\\n'";
  for (const Word& word : words) line += " " + Quoted(word.text + "\t" + word.help);
  return line;
}

// Long lists become functions, shared by all their uses.
class Lists {
 public:
  std::string Print(const Choice& choice) {
    switch (choice.kind) {
      case Choice::Files: return "echo '*files'";
      case Choice::Folders: return "echo '*folders'";
      case Choice::Anything: return "echo '*anything'";
      case Choice::Words: break;
    }
    std::string line = PrintWords(choice.words);
    if (line.size() < kShort) return line;
    for (size_t i = 0; i < lines_.size(); ++i) {
      if (lines_[i] == line) return Name(i);
    }
    lines_.push_back(std::move(line));
    return Name(lines_.size() - 1);
  }
  std::string Functions() const {
    std::string text;
    for (size_t i = 0; i < lines_.size(); ++i) text += Name(i) + "() {\n  " + lines_[i] + "\n}\n";
    return text;
  }

 private:
  static constexpr size_t kShort = 500;
  static std::string Name(size_t number) { return "_fotomill_list" + std::to_string(number); }
  std::vector<std::string> lines_;
};

std::string Case(const std::string& place, const std::string& action) {
  return "    " + Quoted(place) + ") " + action + " ;;\n";
}

std::string Function(const std::string& name, const std::string& cases) {
  return name + "() {\n  case $1 in\n" + cases + "    *) ;;\n  esac\n}\n";
}

std::vector<Word> WordsOf(const std::vector<OptionWords>& options) {
  std::vector<Word> words;
  for (const OptionWords& option : options) {
    for (const std::string& name : option.names) words.push_back({name, option.help});
  }
  return words;
}

std::string ValueCases(const std::string& command, const std::vector<OptionWords>& options,
                       Lists& lists) {
  std::string cases;
  for (const OptionWords& option : options) {
    if (!option.takesValue) continue;
    for (const std::string& name : option.names)
      cases += Case(command + " " + name, lists.Print(option.value));
  }
  return cases;
}

std::string SharedLists() {
  const std::vector<CommandWords> commands = AllCommandWords();
  const std::vector<OptionWords> global = GlobalOptionWords();
  Lists lists;
  std::string second, options, values, arguments;
  for (const Word& first : FirstWords(commands)) {
    const std::vector<Word> words = SecondWords(commands, first.text);
    if (!words.empty()) second += Case(first.text, PrintWords(words));
  }
  for (const CommandWords& command : commands) {
    options += Case(command.name, PrintWords(WordsOf(command.options)));
    values += ValueCases(command.name, command.options, lists);
    arguments += Case(command.name, lists.Print(command.arguments));
  }
  options += Case("", PrintWords(WordsOf(global)));
  values += ValueCases("", global, lists);
  return "_fotomill_first() {\n  " + PrintWords(FirstWords(commands)) + "\n}\n" +
         "_fotomill_help() {\n  " + PrintWords(HelpWords(commands)) + "\n}\n" +
         Function("_fotomill_second", second) + Function("_fotomill_options", options) +
         Function("_fotomill_values", values) + Function("_fotomill_arguments", arguments) +
         lists.Functions();
}

// clang-format off
// Finds the command and the completions; $current and $previous are set by the shell's part.
constexpr const char* kFindLines = R"sh(
_fotomill_lines() {
  lines=$(_fotomill_values "$command $previous")
  [[ -n $lines ]] && return
  if [[ $current == -* ]]; then
    lines=$(_fotomill_options "$command")
  elif [[ -z $command && -n $help ]]; then
    lines=$(_fotomill_help)
  elif [[ -z $command ]]; then
    lines=$(_fotomill_first)
  elif [[ -n $(_fotomill_second "$command") ]]; then
    lines=$(_fotomill_second "$command")
  elif [[ -z $help ]]; then
    lines=$(_fotomill_arguments "$command")
  fi
}
# Takes one word before the cursor; false when the command is known.
_fotomill_take() {
  case $1 in
    -*) return 0 ;;
    help) [[ -z $command ]] && { help=1; return 0; } ;;
  esac
  command+="${command:+ }$1"
  [[ $command != *' '* && -n $(_fotomill_second "$command") ]]
}
)sh";

constexpr const char* kBash = R"sh(
_fotomill() {
  local current=${COMP_WORDS[COMP_CWORD]} previous=${COMP_WORDS[COMP_CWORD-1]} command= help= lines= word text i
  local -a texts=()
  COMPREPLY=()
  if [[ $current == = ]]; then
    current=
  elif [[ $previous == = ]]; then
    previous=${COMP_WORDS[COMP_CWORD-2]}
  fi
  for ((i = 1; i < COMP_CWORD; ++i)); do
    case ${COMP_WORDS[i]} in
      --data|--set|--progress|--color|--lang) ((++i)); [[ ${COMP_WORDS[i]-} == = ]] && ((++i)) ;;
      *) _fotomill_take "${COMP_WORDS[i]}" || break ;;
    esac
  done
  _fotomill_lines
  case $lines in
    '*files') compopt -o filenames 2>/dev/null
              local IFS=$'\n'; COMPREPLY=($(compgen -f -- "$current")); return ;;
    '*folders') compopt -o filenames 2>/dev/null
                local IFS=$'\n'; COMPREPLY=($(compgen -d -- "$current")); return ;;
    '*'*|'') return ;;
  esac
  while IFS=$'\t' read -r word text; do
    [[ $word == "$current"* ]] || continue
    [[ $word == *= ]] && compopt -o nospace 2>/dev/null
    COMPREPLY+=("$word"); texts+=("$text")
  done <<<"$lines"
  # a list is shown with what the words mean; one word alone is what gets typed
  if [[ ${COMP_TYPE-} == 63 ]] && ((${#COMPREPLY[@]} > 1)); then
    for i in "${!COMPREPLY[@]}"; do
      [[ -n ${texts[i]} ]] || continue
      printf -v text '%-24s (%s)' "${COMPREPLY[i]}" "${texts[i]}"
      COMPREPLY[i]=${text:0:${COLUMNS:-80}-2}
    done
  fi
}
complete -F _fotomill fotomill
)sh";

constexpr const char* kZsh = R"sh(
_fotomill() {
  local current=${words[CURRENT]} previous=${words[CURRENT-1]} command= help= lines= line i
  local -a found=() suffix=()
  if [[ $current == --*=* ]]; then
    previous=${current%%=*}
    current=${current#*=}
    compset -P '*='
  fi
  for ((i = 2; i < CURRENT; ++i)); do
    case ${words[i]} in
      --data|--set|--progress|--color|--lang) ((++i)) ;;
      *) _fotomill_take "${words[i]}" || break ;;
    esac
  done
  _fotomill_lines
  case $lines in
    '*files') _files; return ;;
    '*folders') _files -/; return ;;
    '*'*|'') return 1 ;;
  esac
  for line in "${(@f)lines}"; do
    found+=("${${line%%$'\t'*}//:/\\:}:${line#*$'\t'}")
  done
  [[ $lines == *=$'\t'* ]] && suffix=(-S '')
  _describe -t words 'fotomill' found "${suffix[@]}"
}
if [[ $funcstack[1] == _fotomill ]]; then
  _fotomill "$@"
else
  compdef _fotomill fotomill
fi
)sh";
// clang-format on

}  // namespace

std::string BashCompletion() {
  return "# bash completion of fotomill\n" + SharedLists() + kFindLines + kBash;
}

std::string ZshCompletion() { return "#compdef fotomill\n" + SharedLists() + kFindLines + kZsh; }

}  // namespace fotomill::cli
