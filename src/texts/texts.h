#pragma once

#include <concepts>
#include <cstdint>
#include <initializer_list>
#include <string>
#include <string_view>
#include <vector>

// User-visible texts in the user's language. The English source text is the message id; the
// catalogs are in po/. JSON, data formats, stored texts and key names are never translated.
//
// %1 to %9 in a text are placeholders for the arguments; translations may reorder them. Any other
// percent sign is literal. po/update extracts the texts by the names of these functions.
namespace fotomill {

// An argument: UTF-8 text or an integer.
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

// The translation of a text, or the text itself if there is none.
const char* Tr(const char* text);
std::string Tr(std::string_view text);  // for texts that are not literals
inline std::string Tr(const std::string& text) { return Tr(std::string_view(text)); }

// As above, with %1, %2, ... replaced by the arguments.
std::string TrArguments(const char* text, std::initializer_list<TextArgument> arguments);
// As above, with any number of arguments.
template <typename... Arguments>
  requires(sizeof...(Arguments) > 0)
std::string Tr(const char* text, const Arguments&... arguments) {
  return TrArguments(text, {TextArgument(arguments)...});
}

// The plural form of a text for a count. The count is %1, in plain digits for scripts to read (for
// windows see grouped_count.h); the arguments follow as %2, ...
std::string TrCountArguments(const char* one, const char* many, uint64_t count,
                             std::initializer_list<TextArgument> arguments);
// As above, with any number of arguments.
template <typename... Arguments>
std::string TrCount(const char* one, const char* many, uint64_t count,
                    const Arguments&... arguments) {
  return TrCountArguments(one, many, count, {TextArgument(arguments)...});
}

// A text that is both displayed and stored: JSON keeps the English version.
struct RecordedText {
  std::string english, shown;

  bool empty() const { return english.empty(); }
  void Append(const RecordedText& more);  // after a blank, unless it is empty
};
// English text and translation together.
RecordedText TrRecordedArguments(const char* text, std::initializer_list<TextArgument> arguments);
// As above, with any number of arguments.
template <typename... Arguments>
RecordedText TrRecorded(const char* text, const Arguments&... arguments) {
  return TrRecordedArguments(text, {TextArgument(arguments)...});
}

// Numbers with the language's separators: "12,345", "1.5".
std::string ThousandsText(uint64_t number);
std::string DecimalText(double number, int digits);  // `digits` after the decimal separator

// Marks a text in a table for translation; to be passed to Tr when displayed.
constexpr const char* TrLater(const char* text) { return text; }

// A language with a catalog, or English.
struct Language {
  std::string code;  // "de", "pt_BR"
  std::string name;  // in that language
};

// Sets the language of this run: `code` if it is not empty, else the one from LANGUAGE, LC_ALL,
// LC_MESSAGES and LANG, read as gettext does. English if there is no catalog; false if `code` names
// a language without one. Call before starting other threads.
bool StartTexts(const std::string& code);
// The current language, "en" for the source texts.
const std::string& TextLanguage();
// The installed languages, English first.
std::vector<Language> Languages();

}  // namespace fotomill
