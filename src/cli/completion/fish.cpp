#include "cli/completion/words.h"

namespace fotomill::cli {

namespace {

std::string Quoted(const std::string& text) {
  std::string quoted = "'";
  for (const char c : text) {
    if (c == '\'' || c == '\\') quoted += '\\';
    quoted += c;
  }
  return quoted + "'";
}

// Functions that print lists of words; identical lists share a function.
class Lists {
 public:
  std::string Call(const std::vector<Word>& words) {
    std::string body = "    printf '%s\\t%s\\n'";
    for (const Word& word : words) body += " " + Quoted(word.text) + " " + Quoted(word.help);
    for (size_t i = 0; i < bodies_.size(); ++i) {
      if (bodies_[i] == body) return Name(i);
    }
    bodies_.push_back(std::move(body));
    return Name(bodies_.size() - 1);
  }
  std::string Functions() const {
    std::string text;
    for (size_t i = 0; i < bodies_.size(); ++i)
      text += "function __fotomill_list" + std::to_string(i) + "\n" + bodies_[i] + "\nend\n";
    return text;
  }

 private:
  static std::string Name(size_t number) {
    return "'(__fotomill_list" + std::to_string(number) + ")'";
  }
  std::vector<std::string> bodies_;
};

std::string Line(const std::string& condition) {
  return "complete -c fotomill -n " + Quoted(condition);
}

std::string OptionLine(const std::string& condition, const OptionWords& option, Lists& lists) {
  std::string line = Line(condition);
  for (const std::string& name : option.names) {
    const bool isLong = name.starts_with("--");
    line += (isLong ? " -l " : " -s ") + name.substr(isLong ? 2 : 1);
  }
  switch (option.value.kind) {
    case Choice::Words: line += " -x -a " + lists.Call(option.value.words); break;
    case Choice::Folders: line += " -x -a '(__fish_complete_directories)'"; break;
    case Choice::Files: line += " -r -F"; break;
    case Choice::Anything: line += option.takesValue ? " -x" : ""; break;
  }
  return line + " -d " + Quoted(option.help) + "\n";
}

// clang-format off
constexpr const char* kHead = R"fish(# fish completion of fotomill
# The words before the cursor that are no options, and no values of options before the command.
function __fotomill_words
    set -l skip 0
    for word in (commandline -opc)[2..-1]
        if test $skip = 1
            set skip 0
        else if contains -- $word --data --set --progress --color --lang
            set skip 1
        else if not string match -q -- '-*' $word
            echo $word
        end
    end
end
function __fotomill_is
    set -l line (string join ' ' -- (__fotomill_words))
    string match -q -- "$argv *" "$line "
end
function __fotomill_just
    set -l line (string join ' ' -- (__fotomill_words))
    test "$line" = "$argv" -o "$line" = "help $argv"
end
function __fotomill_none
    set -l line (string join ' ' -- (__fotomill_words))
    test -z "$line" -o "$line" = help
end
function __fotomill_help
    test (string join ' ' -- (__fotomill_words)) = help
end
complete -c fotomill -f
)fish";
// clang-format on

}  // namespace

std::string FishCompletion() {
  const std::vector<CommandWords> commands = AllCommandWords();
  Lists lists;
  std::string lines;
  const std::vector<Word> first = FirstWords(commands);
  lines += Line("__fotomill_none; and not __fotomill_help") + " -a " + lists.Call(first) + "\n";
  lines += Line("__fotomill_help") + " -a " + lists.Call(HelpWords(commands)) + "\n";
  for (const Word& word : first) {
    const std::vector<Word> second = SecondWords(commands, word.text);
    if (!second.empty())
      lines += Line("__fotomill_just " + word.text) + " -a " + lists.Call(second) + "\n";
  }
  for (const OptionWords& option : GlobalOptionWords())
    lines += OptionLine("__fotomill_none", option, lists);
  for (const CommandWords& command : commands) {
    const std::string condition = "__fotomill_is " + command.name;
    for (const OptionWords& option : command.options) lines += OptionLine(condition, option, lists);
    switch (command.arguments.kind) {
      case Choice::Words:
        lines += Line(condition) + " -a " + lists.Call(command.arguments.words) + "\n";
        break;
      case Choice::Folders:
        lines += Line(condition) + " -a '(__fish_complete_directories)'\n";
        break;
      case Choice::Files: lines += Line(condition) + " -F\n"; break;
      case Choice::Anything: break;
    }
  }
  return kHead + lists.Functions() + lines;
}

}  // namespace fotomill::cli
