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

// How a command declares its options. Commands use these and not the parser's own header, which
// takes seconds to compile in every file that includes it.
//
// `names` are an option's forms ("-r,--recursive"), `shownAs` stands for its value in the help,
// `help` is its line there in English, which these functions translate. The variable keeps its
// value when the option is not given, and outlives the parser.
namespace fotomill::cli {

// Given or not.
CLI::Option* AddFlag(CLI::App& app, const char* names, bool& value, const char* help);
// Any text.
CLI::Option* AddText(CLI::App& app, const char* names, std::string& value, const char* shownAs,
                     const char* help);
// A name of something. An empty one is refused: most often it comes from a script whose variable is
// not set.
CLI::Option* AddName(CLI::App& app, const char* names, std::string& value, const char* shownAs,
                     const char* help);
// One of several words.
CLI::Option* AddChoice(CLI::App& app, const char* names, std::string& value, const char* shownAs,
                       const char* help, std::initializer_list<const char*> choices);
// A number from `least` to `most`.
CLI::Option* AddNumber(CLI::App& app, const char* names, int32_t& value, const char* shownAs,
                       int32_t least, int32_t most, const char* help);
// `count` texts behind the option.
CLI::Option* AddTexts(CLI::App& app, const char* names, std::vector<std::string>& values, int count,
                      const char* shownAs, const char* help);
// A text each time the option is given.
CLI::Option* AddRepeatedText(CLI::App& app, const char* names, std::vector<std::string>& values,
                             const char* shownAs, const char* help);

// Refuses a command line that leaves the option out.
void Require(CLI::Option* option);
// Refuses a command line that gives both.
void Exclude(CLI::Option* option, CLI::Option* other);
// The text below the options in the help: notes in English (may be null), translated here, and one
// example, a command line.
void SetFooter(CLI::App& app, const char* notes, const char* example);

}  // namespace fotomill::cli
