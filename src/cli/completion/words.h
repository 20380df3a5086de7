#pragma once

#include <string>
#include <vector>

namespace fotomill::cli {

// What the completion scripts of all shells offer.

// A word to offer.
struct Word {
  std::string text;
  std::string help;  // in the user's language, one line
};

// What may stand in one place of the command line.
struct Choice {
  enum Kind { Words, Files, Folders, Anything } kind = Anything;
  std::vector<Word> words;  // of the kind Words
  bool goesOn = false;      // a word is not complete yet: "KEY=" is followed by a value
};

// An option, and what may follow it.
struct OptionWords {
  std::vector<std::string> names;  // "--to", "-t"
  std::string help;
  bool takesValue = false;
  Choice value;
};

// A command with all that may follow its name.
struct CommandWords {
  std::string name;  // one word or two
  std::string summary;
  std::vector<OptionWords> options;  // the global ones too
  Choice arguments;
};

// All commands, and the words that begin a command line, "help" among them.
std::vector<CommandWords> AllCommandWords();
std::vector<Word> FirstWords(const std::vector<CommandWords>& commands);
// The words that "help" explains: the same but itself, and the topics.
std::vector<Word> HelpWords(const std::vector<CommandWords>& commands);
// The second words of a group such as "config"; none for a command of one word.
std::vector<Word> SecondWords(const std::vector<CommandWords>& commands, const std::string& first);
// The options before any command.
std::vector<OptionWords> GlobalOptionWords();

// The script of a shell.
std::string BashCompletion();
std::string ZshCompletion();         // a function _fotomill for fpath
std::string FishCompletion();        // "complete" lines
std::string PowerShellCompletion();  // Register-ArgumentCompleter

}  // namespace fotomill::cli
