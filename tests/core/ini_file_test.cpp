#include "core/ini_file.h"

#include <gtest/gtest.h>

#include <vector>

namespace fotomill {
namespace {

using namespace std::string_literals;

TEST(IniFile, ReadsTheEffectiveValue) {
  struct Row {
    const char* name;
    std::string text;
    std::optional<std::string> value;  // of "Key" in "Fotomill"
  };
  const Row rows[] = {
      {"plain", "[Fotomill]\nKey=1\n", "1"},
      {"no line end", "[Fotomill]\nKey=1", "1"},
      {"CR LF", "[Fotomill]\r\nKey=1\r\n", "1"},
      {"blanks of the value stay", "[Fotomill]\nKey=  Cropped_ \n", "  Cropped_ "},
      {"blanks around the key do not", "  [Fotomill] \n\tKey =1\n", "1"},
      {"equals signs in the value", "[Fotomill]\nKey=a=b=\n", "a=b="},
      {"empty value", "[Fotomill]\nKey=\n", ""},
      {"value to the end of the file", "[Fotomill]\nKey=", ""},
      {"bytes as they are", "[Fotomill]\nKey=\xFF\x00\xC3;#\n"s, "\xFF\x00\xC3;#"s},
      {"mark of UTF-8", "\xEF\xBB\xBF[Fotomill]\r\nKey=1\r\n", "1"},
      {"first of two", "[Fotomill]\nKey=1\nKey=2\n", "1"},
      {"divided section", "[Fotomill]\nA=0\n[Other]\nKey=9\n[Fotomill]\nKey=2\n", "2"},
      {"remark behind the section", "[Fotomill] ; ours\nKey=1\n", "1"},
      {"no section", "Key=1\n", std::nullopt},
      {"other section", "[fotomill]\nKey=1\n[Fotomill2]\nKey=2\n[Fotomill \nKey=3\n", std::nullopt},
      {"other case, longer, shorter", "[Fotomill]\nkey=1\nKeys=2\nKe=3\n", std::nullopt},
      {"comments", "[Fotomill]\n;Key=1\n # Key=2\n", std::nullopt},
      {"no equals sign", "[Fotomill]\nKey 1\n=Key\n", std::nullopt},
      {"nothing but line ends", "\n\r\n\r\r\n", std::nullopt},
      {"empty", "", std::nullopt},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const auto found = FindIniValue(row.text, "Fotomill", "Key");
    EXPECT_EQ(found ? std::optional<std::string>(*found) : std::nullopt, row.value);
  }
}

TEST(IniFile, ChangesOnlyTheGivenKeys) {
  const std::vector<IniEdit> set{{"Key", "new"}};
  const std::vector<IniEdit> two{{"Zeta", "9"}, {"Key", "new"}};
  const std::vector<IniEdit> remove{{"Key", std::nullopt}};
  struct Row {
    const char* name;
    const std::vector<IniEdit>& edits;
    std::string before, after;
  };
  const Row rows[] = {
      {"in its place", set, "; mine\n\n[Fotomill]\nA=1\nKey=old ; x\nB=2\n", "; mine\n\n[Fotomill]\nA=1\nKey=new\nB=2\n"},
      {"blanks before the equals sign stay", set, "[Fotomill]\n  Key =old\n", "[Fotomill]\n  Key =new\n"},
      {"CR LF stays", set, "[Fotomill]\r\nKey=old\r\nB=2\r\n", "[Fotomill]\r\nKey=new\r\nB=2\r\n"},
      {"a last line without end", set, "[Fotomill]\nKey=old", "[Fotomill]\nKey=new"},
      {"mixed line ends stay", set, "[Fotomill]\r\nA=1\nKey=old\r\n", "[Fotomill]\r\nA=1\nKey=new\r\n"},
      {"only the first of two counts", set, "[Fotomill]\nKey=1\nKey=2\n", "[Fotomill]\nKey=new\nKey=2\n"},
      {"new key behind the last entry", set, "[Fotomill]\nA=1\n\n; of the next\n[Other]\nKey=5\n",
       "[Fotomill]\nA=1\nKey=new\n\n; of the next\n[Other]\nKey=5\n"},
      {"new key in an empty section", set, "[Fotomill]\r\n", "[Fotomill]\r\nKey=new\r\n"},
      {"new key behind a line without end", set, "[Fotomill]\nA=1", "[Fotomill]\nA=1\nKey=new\n"},
      {"new key behind half a line end", set, "[Fotomill]\nA=1\r", "[Fotomill]\nA=1\r\nKey=new\n"},
      {"the other half of CR LF", set, "[Fotomill]\r\nA=1\r", "[Fotomill]\r\nA=1\r\nKey=new\r\n"},
      {"new section behind others", set, "[Other]\r\nA=1", "[Other]\r\nA=1\r\n[Fotomill]\r\nKey=new\r\n"},
      {"new file", set, "", "[Fotomill]\nKey=new\n"},
      {"one old, one new", two, "[Fotomill]\nKey=old\n", "[Fotomill]\nKey=new\nZeta=9\n"},
      {"in the second part of the section", set, "[Fotomill]\nA=1\n[O]\n[Fotomill]\nKey=old\n",
       "[Fotomill]\nA=1\n[O]\n[Fotomill]\nKey=new\n"},
      {"removal takes every line of the key", remove, "[Fotomill]\nKey=1\nA=1\nKey=2\n[O]\nKey=3\n",
       "[Fotomill]\nA=1\n[O]\nKey=3\n"},
      {"removal of what is not there", remove, "[Fotomill]\n;Key=1\nkey=2\n", "[Fotomill]\n;Key=1\nkey=2\n"},
      {"zero bytes and stray lines survive", set, "\0[x\n\r[Fotomill]\nno entry\0\nKey=\0\n"s,
       "\0[x\n\r[Fotomill]\nno entry\0\nKey=\0\n[Fotomill]\nKey=new\n"s},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const std::string after = EditIni(row.before, "Fotomill", row.edits);
    EXPECT_EQ(after, row.after);
    EXPECT_EQ(EditIni(after, "Fotomill", row.edits), row.after) << "a second time changes nothing";
  }
}

}  // namespace
}  // namespace fotomill
