#include "texts/message_catalog.h"

#include <gtest/gtest.h>

#include <string>
#include <utility>
#include <vector>

namespace fotomill {
namespace {

using namespace std::string_literals;

const std::vector<std::pair<std::string, std::string>> kMessages = {
    {"",
     "Content-Type: text/plain; charset=UTF-8\nPlural-Forms: nplurals=3; plural=n==1 ? 0 : "
     "n%10>=2 && n%10<=4 ? 1 : 2;\n"},
    {"Color", "Farbe"},
    {"Untranslated", ""},
    {"one file\0%1 files"s, "jeden\0%1 dwa\0%1 wiele"s},
};

std::string Number(uint32_t value, bool big) {
  std::string bytes;
  for (int i = 0; i < 4; ++i) bytes += static_cast<char>(value >> (big ? 24 - 8 * i : 8 * i));
  return bytes;
}

// A catalog laid out as msgfmt does it.
std::string Compiled(bool big) {
  const auto count = static_cast<uint32_t>(kMessages.size());
  const uint32_t keys = 28, translations = keys + 8 * count;
  uint32_t place = translations + 8 * count;
  std::string tables[2], strings;
  for (int table = 0; table < 2; ++table) {
    for (const auto& [key, translation] : kMessages) {
      const std::string& text = table == 0 ? key : translation;
      const auto length = static_cast<uint32_t>(text.size());
      tables[table] += Number(length, big) + Number(place, big);
      strings += text + '\0';
      place += length + 1;
    }
  }
  std::string file;
  for (const uint32_t value : {0x950412DEu, 0u, count, keys, translations, 0u, 0u}) {
    file += Number(value, big);
  }
  return file + tables[0] + tables[1] + strings;
}

TEST(MessageCatalog, FindsMessagesAndPluralForms) {
  for (const bool big : {false, true}) {
    SCOPED_TRACE(big);
    MessageCatalog catalog;
    ASSERT_TRUE(catalog.Parse(Compiled(big)));
    EXPECT_STREQ(catalog.Find("Color"), "Farbe");
    for (const char* text : {"Colo", "Colors", "Untranslated", "zzz"}) {
      EXPECT_EQ(catalog.Find(text), nullptr) << text;
    }
    EXPECT_STREQ(catalog.FindPlural("one file", 1), "jeden");
    EXPECT_STREQ(catalog.FindPlural("one file", 23), "%1 dwa");
    EXPECT_STREQ(catalog.FindPlural("one file", 0), "%1 wiele");
    EXPECT_EQ(catalog.FindPlural("two files", 2), nullptr);
  }
}

TEST(MessageCatalog, RefusesDamagedFiles) {
  const std::string whole = Compiled(false);
  for (size_t size = 0; size < whole.size(); ++size) {
    MessageCatalog catalog;  // truncated: refused, or messages are missing
    (void)catalog.Parse(whole.substr(0, size));
    (void)catalog.Find("Color");
    (void)catalog.FindPlural("one file", 2);
  }
  for (size_t at = 0; at < 28 + 16 * kMessages.size(); ++at) {
    std::string changed = whole;
    changed[at] = '\xFF';
    MessageCatalog catalog;
    (void)catalog.Parse(changed);
    (void)catalog.FindPlural("one file", 2);
  }
  MessageCatalog catalog;
  EXPECT_FALSE(catalog.Parse(""));
  EXPECT_FALSE(catalog.Parse("msgid \"Color\""));
  EXPECT_FALSE(catalog.Load("/nonexistent/fotomill.mo"));
}

TEST(MessageCatalog, EvaluatesPluralFormulas) {
  const struct {
    const char* formula;
    uint64_t count, form;
  } rows[] = {
      {"(n != 1)", 1, 0},
      {"(n != 1)", 0, 1},
      {"n>1", 1, 0},
      {"0", 7, 0},
      {"n%10==1 && n%100!=11 ? 0 : n%10>=2 && (n%100<10 || n%100>=20) ? 1 : 2", 21, 0},
      {"n%10==1 && n%100!=11 ? 0 : n%10>=2 && (n%100<10 || n%100>=20) ? 1 : 2", 11, 2},
      {"n%10==1 && n%100!=11 ? 0 : n%10>=2 && (n%100<10 || n%100>=20) ? 1 : 2", 34, 1},
      {"n==1 ? 0 : n==2 ? 1 : 2", 3, 2},
      {"!n", 0, 1},
      {"n-1-1", 5, 3},  // from left to right
      {"1+2*n", 3, 7},
      {"n/0", 3, 0},
      {"n +", 3, 0},
      {"(n", 3, 0},
      {"n n", 3, 0},
  };
  for (const auto& row : rows) {
    EXPECT_EQ(PluralForm(row.formula, row.count), row.form) << row.formula << ", " << row.count;
  }
  EXPECT_EQ(PluralForm(std::string(100000, '('), 1), 0u);
  EXPECT_EQ(PluralForm(std::string(100000, '!') + "n", 1), 0u);
}

}  // namespace
}  // namespace fotomill
