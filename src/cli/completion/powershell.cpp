#include "cli/completion/words.h"

namespace fotomill::cli {

namespace {

std::string Quoted(const std::string& text) {
  std::string quoted = "'";
  for (const char c : text) quoted += c == '\'' ? std::string("''") : std::string(1, c);
  return quoted + "'";
}

// "@(@('word','text'),...)"
std::string Pairs(const std::vector<Word>& words) {
  std::string list;
  for (const Word& word : words) {
    list += (list.empty() ? "" : ",") + std::string("@(") + Quoted(word.text) + "," +
            Quoted(word.help) + ")";
  }
  return "@(" + list + (words.size() == 1 ? ",$null" : "") + ")";
}

std::string Entry(const std::string& place, const std::string& list) {
  return "    " + Quoted(place) + " = " + list + "\n";
}

std::string ListOf(const Choice& choice) {
  switch (choice.kind) {
    case Choice::Words: return Pairs(choice.words);
    case Choice::Files:
    case Choice::Folders: return "'*files'";
    case Choice::Anything: break;
  }
  return "'*anything'";
}

// The lists for one command: options, their values, arguments.
std::string EntriesOf(const std::string& command, const std::vector<OptionWords>& options) {
  std::vector<Word> names;
  std::string values;
  for (const OptionWords& option : options) {
    for (const std::string& name : option.names) {
      names.push_back({name, option.help});
      if (!option.takesValue) continue;
      const bool keys = option.value.goesOn;
      values += Entry("value:" + command + " " + name, keys ? "$keys" : ListOf(option.value));
    }
  }
  return Entry("option:" + command, Pairs(names)) + values;
}

// clang-format off
constexpr const char* kHead = R"ps(# PowerShell completion of fotomill
Register-ArgumentCompleter -Native -CommandName 'fotomill' -ScriptBlock {
  param($current, $line, $position)
)ps";

constexpr const char* kTail = R"ps(
  $words = @($line.CommandElements | Select-Object -Skip 1 |
    Where-Object { $_.Extent.EndOffset -lt $position } | ForEach-Object { $_.ToString() })
  $command = ''
  $isHelp = $false
  for ($i = 0; $i -lt $words.Count; $i++) {
    $word = $words[$i]
    if ('--data', '--set', '--progress', '--color', '--lang' -ccontains $word) { $i++; continue }
    if ($word.StartsWith('-')) { continue }
    if ($command -eq '' -and $word -ceq 'help') { $isHelp = $true; continue }
    $command = "$command $word".Trim()
    if (-not $lists.ContainsKey("second:$command")) { break }
  }
  $previous = if ($words.Count -gt 0) { $words[-1] } else { '' }
  $found = $null
  if ($lists.ContainsKey("value:$command $previous")) { $found = $lists["value:$command $previous"] }
  elseif ($current.StartsWith('-')) { $found = $lists["option:$command"] }
  elseif ($command -eq '' -and $isHelp) { $found = $lists['help'] }
  elseif ($command -eq '') { $found = $lists['first'] }
  elseif ($lists.ContainsKey("second:$command")) { $found = $lists["second:$command"] }
  elseif (-not $isHelp) { $found = $lists["argument:$command"] }
  if ($null -eq $found -or $found -is [string]) { return }
  foreach ($pair in $found) {
    if ($null -eq $pair -or -not $pair[0].StartsWith($current)) { continue }
    $text = if ($pair[1] -eq '') { $pair[0] } else { $pair[1] }
    [System.Management.Automation.CompletionResult]::new($pair[0], $pair[0], 'ParameterValue', $text)
  }
}
)ps";
// clang-format on

}  // namespace

std::string PowerShellCompletion() {
  const std::vector<CommandWords> commands = AllCommandWords();
  const std::vector<OptionWords> global = GlobalOptionWords();
  std::string keys = "@()", lists = EntriesOf("", global);
  for (const OptionWords& option : global) {
    if (option.value.goesOn) keys = Pairs(option.value.words);
  }
  lists += Entry("first", Pairs(FirstWords(commands)));
  lists += Entry("help", Pairs(HelpWords(commands)));
  for (const Word& first : FirstWords(commands)) {
    const std::vector<Word> second = SecondWords(commands, first.text);
    if (!second.empty()) lists += Entry("second:" + first.text, Pairs(second));
  }
  for (const CommandWords& command : commands) {
    lists += EntriesOf(command.name, command.options);
    lists += Entry("argument:" + command.name, ListOf(command.arguments));
  }
  return kHead + std::string("  $keys = ") + keys + "\n  $lists = @{\n" + lists + "  }\n" + kTail;
}

}  // namespace fotomill::cli
