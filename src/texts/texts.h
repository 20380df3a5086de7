#pragma once

#include <concepts>
#include <cstdint>
#include <initializer_list>
#include <string>
#include <string_view>
#include <vector>

// What people read, in their language. The English text in the source is the id; catalogs of po/
// translate it. JSON, data formats, stored texts and names of keys never come through here.
//
// %1 to %9 in a text stand for the arguments; a translation may put them in any order. A per cent
// sign before anything else is one. po/update extracts the texts by the names of these functions.
namespace fotomill {

// One argument: a text in UTF-8 or a whole number.
class TextArgument {
 public:
  TextArgument(const char* text) : text_(text) {}
  TextArgument(std::string_view text) : text_(text) {}
  TextArgument(const std::string& text) : text_(text) {}
  TextArgument(std::integral auto number) : text_(std::to_string(number)) {}

  const std::string& Text() const { return text_; }  // digits of a number, without separators

 private:
  std::string text_;
};

// The translation of a whole text, itself when there is none.
const char* Tr(const char* text);
std::string Tr(std::string_view text);  // for texts that are not literals
inline std::string Tr(const std::string& text) { return Tr(std::string_view(text)); }

// The same with %1, %2, ... replaced by the arguments.
std::string TrArguments(const char* text, std::initializer_list<TextArgument> arguments);
// The translation with its arguments put in.
template <typename... Arguments>
  requires(sizeof...(Arguments) > 0)
std::string Tr(const char* text, const Arguments&... arguments) {
  return TrArguments(text, {TextArgument(arguments)...});
}

// The form of a text that a count asks for. The count is %1, in plain digits, as scripts read it
// (for windows see grouped_count.h); the arguments follow as %2, ...
std::string TrCountArguments(const char* one, const char* many, uint64_t count,
                             std::initializer_list<TextArgument> arguments);
// The same with any number of arguments.
template <typename... Arguments>
std::string TrCount(const char* one, const char* many, uint64_t count,
                    const Arguments&... arguments) {
  return TrCountArguments(one, many, count, {TextArgument(arguments)...});
}

// A text that is both shown and stored: JSON keeps it in English.
struct RecordedText {
  std::string english, shown;

  bool empty() const { return english.empty(); }
  void Append(const RecordedText& more);  // behind a blank, unless it is empty
};
// English and translation at once.
RecordedText TrRecordedArguments(const char* text, std::initializer_list<TextArgument> arguments);
// The same with any number of arguments.
template <typename... Arguments>
RecordedText TrRecorded(const char* text, const Arguments&... arguments) {
  return TrRecordedArguments(text, {TextArgument(arguments)...});
}

// Numbers for people, with the separators of the language: "12,345", "1.5".
std::string ThousandsText(uint64_t number);
std::string DecimalText(double number, int digits);  // so many digits behind the decimal separator

// Marks a text in a table for translation; whoever shows it calls Tr.
constexpr const char* TrLater(const char* text) { return text; }

// A language with a catalog, or English.
struct Language {
  std::string code;  // "de", "pt_BR"
  std::string name;  // in the language itself
};

// Chooses the language of this run: `code` if it is not empty, else what LANGUAGE, LC_ALL,
// LC_MESSAGES and LANG ask for, as gettext reads them. English if there is no catalog; false if
// that is not what `code` asks for. Before other threads run.
bool StartTexts(const std::string& code);
// The language in use, "en" for the source texts.
const std::string& TextLanguage();
// The languages installed with the program, English first.
std::vector<Language> Languages();

}  // namespace fotomill
