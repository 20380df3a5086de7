#include "core/utf8.h"

#include <gtest/gtest.h>

namespace fotomill {
namespace {

constexpr char32_t kUnknown = 0xFFFD;

TEST(Utf8, ReadsCharacters) {
  struct Row {
    std::string_view text;
    std::u32string_view characters;
  };
  const Row rows[] = {
      {"a\x7F", U"a\x7F"},
      {"Gr\xC3\xB6\xC3\x9F", U"Gr\u00F6\u00DF"},
      {"\xE2\x82\xAC\xEF\xBF\xBF", U"\u20AC\uFFFF"},
      {"\xF0\x9F\x98\x80\xF4\x8F\xBF\xBF", U"\U0001F600\U0010FFFF"},
      {"\xC0\x80", U"\uFFFD\uFFFD"},                        // overlong
      {"\xED\xA0\x80", U"\uFFFD\uFFFD\uFFFD"},              // a surrogate
      {"\xF4\x90\x80\x80", U"\uFFFD\uFFFD\uFFFD\uFFFD"},    // out of range
      {"\xE2\x82", U"\uFFFD\uFFFD"},                        // truncated
      {"\x80z\xFFz", U"\uFFFDz\uFFFDz"},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(testing::PrintToString(row.text));
    std::u32string characters;
    for (std::string_view rest = row.text; !rest.empty();)
      characters += NextCharacter(rest, kUnknown);
    EXPECT_EQ(characters, row.characters);
    EXPECT_EQ(IsUtf8(row.text), row.characters.find(kUnknown) == std::u32string_view::npos);
  }
  EXPECT_EQ(CharacterCount("Gr\xC3\xB6\xC3\x9F"
                           "e"),
            5u);
}

TEST(Utf8, TextsAreCutBetweenCharacters) {
  constexpr std::string_view kText = "a\xC3\xB6\xE2\x82\xAC\xF0\x9F\x98\x80.";
  const size_t lengths[] = {0, 1, 1, 3, 3, 3, 6, 6, 6, 6, 10, 11, 11};
  for (size_t limit = 0; limit < std::size(lengths); ++limit)
    EXPECT_EQ(CutText(kText, limit).size(), lengths[limit]) << limit;
  EXPECT_EQ(CutText("\x80\x80\x80\x80\x80", 4).size(), 4u);  // no whole character is cut
}

}  // namespace
}  // namespace fotomill
