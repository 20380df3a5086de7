#pragma once

#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <string>
#include <vector>

namespace CLI {
class App;
class Option;
}  // namespace CLI

// Functions to declare a command's options. Avoids including the parser's header, which takes
// seconds to compile, in every command.
//
// `names` are the forms of the option ("-r,--recursive"), `shownAs` is the placeholder for its
// value in the help, `help` is its description in English, translated by these functions. The
// variable must outlive the parser; it keeps its value if the option is not given.
namespace fotomill::cli {

// A flag.
CLI::Option* AddFlag(CLI::App& app, const char* names, bool& value, const char* help);
// Any text.
CLI::Option* AddText(CLI::App& app, const char* names, std::string& value, const char* shownAs,
                     const char* help);
// A name; must not be empty, which is most often
// caused by an unset variable in a script.
CLI::Option* AddName(CLI::App& app, const char* names, std::string& value, const char* shownAs,
                     const char* help);
// One of several words.
CLI::Option* AddChoice(CLI::App& app, const char* names, std::string& value, const char* shownAs,
                       const char* help, std::initializer_list<const char*> choices);
// An integer from `least` to `most`.
CLI::Option* AddNumber(CLI::App& app, const char* names, int32_t& value, const char* shownAs,
                       int32_t least, int32_t most, const char* help);
// `count` texts after the option.
CLI::Option* AddTexts(CLI::App& app, const char* names, std::vector<std::string>& values, int count,
                      const char* shownAs, const char* help);
// One text per occurrence of the option.
CLI::Option* AddRepeatedText(CLI::App& app, const char* names, std::vector<std::string>& values,
                             const char* shownAs, const char* help);

// The flags of commands that change files: -n, --dry-run, and --json with the fields of its
// elements.
void AddDryRunAndJson(CLI::App& app, bool& dryRun, bool& json, const char* jsonHelp);

// Makes an option mandatory.
void Require(CLI::Option* option);
// Makes two options mutually exclusive.
void Exclude(CLI::Option* option, CLI::Option* other);
// The help text after the options: notes in English (may be null), translated here, and an example
// command line.
void SetFooter(CLI::App& app, const char* notes, const char* example);

}  // namespace fotomill::cli
