#include "operations/recipe_words.h"

#include <algorithm>

namespace fotomill {

namespace {

class Splitter {
 public:
  explicit Splitter(std::string_view text) : text_(text) {}

  std::vector<RecipeLine> Split() {
    while (at_ < text_.size()) ReadCharacter();
    EndLine();
    return std::move(lines_);
  }

 private:
  void ReadCharacter() {
    const char c = text_[at_];
    if (c == '\n' || c == ';') {
      ++at_;
      EndLine();
      if (c == '\n') ++number_;
    } else if (c == ' ' || c == '\t' || c == '\r') {
      ++at_;
      EndWord();
    } else if (c == '#' && !inWord_ && line_.words.empty()) {
      at_ = std::min(text_.find('\n', at_), text_.size());
    } else {
      BeginWord();
      ReadPart();
    }
  }

  // Parses a quoted part of a word, or one character.
  void ReadPart() {
    const char c = text_[at_++];
    if (c == '\'') return ReadQuoted('\'', false);
    if (c == '"') return ReadQuoted('"', true);
    if (c == '\\' && at_ < text_.size() && text_[at_] != '\n') {
      word_.quoted = true;
      word_.text += text_[at_++];
      return;
    }
    if (c == '=' && word_.equals == std::string::npos) word_.equals = word_.text.size();
    word_.text += c;
  }

  void ReadQuoted(char quote, bool escapes) {
    word_.quoted = true;
    for (; at_ < text_.size(); ++at_) {
      const char c = text_[at_];
      if (c == quote) {
        ++at_;
        return;
      }
      const bool escaped = escapes && c == '\\' && at_ + 1 < text_.size() &&
                           (text_[at_ + 1] == quote || text_[at_ + 1] == '\\');
      if (escaped) ++at_;
      if (text_[at_] == '\n') ++number_;
      word_.text += text_[at_];
    }
    line_.open = true;
  }

  void BeginWord() {
    if (line_.words.empty() && !inWord_) line_.number = number_;
    inWord_ = true;
  }
  void EndWord() {
    if (inWord_) line_.words.push_back(std::move(word_));
    word_ = {};
    inWord_ = false;
  }
  void EndLine() {
    EndWord();
    if (!line_.words.empty()) lines_.push_back(std::move(line_));
    line_ = {};
  }

  const std::string_view text_;
  size_t at_ = 0;
  int32_t number_ = 1;
  bool inWord_ = false;
  RecipeWord word_;
  RecipeLine line_;
  std::vector<RecipeLine> lines_;
};

}  // namespace

std::vector<RecipeLine> SplitRecipe(std::string_view text) { return Splitter(text).Split(); }

std::string QuotedWord(std::string_view text) {
  constexpr std::string_view kSpecial = " \t\r\n;'\"\\=";
  const bool plain =
      !text.empty() && text[0] != '#' && text.find_first_of(kSpecial) == std::string_view::npos;
  if (plain) return std::string(text);
  std::string quoted = "\"";
  for (const char c : text) {
    if (c == '"' || c == '\\') quoted += '\\';
    quoted += c;
  }
  return quoted + '"';
}

}  // namespace fotomill
