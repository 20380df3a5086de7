#pragma once

#include <string>
#include <vector>

namespace fotomill::cli {

// The completions shared by the scripts of all shells.

// A completion.
struct Word {
  std::string text;
  std::string help;  // in the user's language, one line
};

// What can complete one position of the command line.
struct Choice {
  enum Kind { Words, Files, Folders, Anything } kind = Anything;
  std::vector<Word> words;  // for Words
  bool goesOn = false;      // words are incomplete: "KEY=" needs a value
};

// An option and its value.
struct OptionWords {
  std::vector<std::string> names;  // "--to", "-t"
  std::string help;
  bool takesValue = false;
  Choice value;
};

// A command and what may follow its name.
struct CommandWords {
  std::string name;  // one or two words
  std::string summary;
  std::vector<OptionWords> options;  // including global ones
  Choice arguments;
};

// All commands, and the words that can start a command line, including "help".
std::vector<CommandWords> AllCommandWords();
std::vector<Word> FirstWords(const std::vector<CommandWords>& commands);
// The words after "help": the same without itself, plus the topics.
std::vector<Word> HelpWords(const std::vector<CommandWords>& commands);
// The second words of a group such as "config"; none for single-word commands.
std::vector<Word> SecondWords(const std::vector<CommandWords>& commands, const std::string& first);
// Options allowed before any command.
std::vector<OptionWords> GlobalOptionWords();

// The completion script for a shell.
std::string BashCompletion();
std::string ZshCompletion();         // a function _fotomill for fpath
std::string FishCompletion();        // "complete" lines
std::string PowerShellCompletion();  // Register-ArgumentCompleter

}  // namespace fotomill::cli
