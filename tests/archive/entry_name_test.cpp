#include "archive/entry_name.h"

#include <gtest/gtest.h>

namespace fotomill {
namespace {

TEST(EntryName, IsSafeBelowAFolderOnly) {
  const std::string longPart(255, 'x');
  for (const std::string& name : {std::string("a"), std::string("a/b.jpg"), std::string("..a/b.."),
                                  std::string("a b/.hidden"), longPart, std::string("ab:c"),
                                  std::string("grün/ü"), "a/" + longPart + "/b"})
    EXPECT_TRUE(IsSafeEntryName(name)) << name;
  std::string deep = "a";
  while (deep.size() <= 4096) deep += "/a";
  for (const std::string& name :
       {std::string(),        std::string("/"),       std::string("/etc/x"), std::string(".."),
        std::string("../x"),  std::string("a/../x"),  std::string("a/.."),   std::string("./a"),
        std::string("a/./b"), std::string("a//b"),    std::string("a/"),     std::string("C:x"),
        std::string("c:/x"),  std::string("a\\b"),    std::string("..\\x"),  std::string("a\nb"),
        std::string("a\x7f"), std::string("a\0b", 3), longPart + "x",        deep})
    EXPECT_FALSE(IsSafeEntryName(name)) << name;
}

TEST(EntryName, IsShownAsUtf8) {
  const struct {
    const char *bytes, *shown;
  } rows[] = {
      {"plain.txt", "plain.txt"},
      {"gr\xc3\xbcn", "grün"},
      {"\x80\x81\xe1\xff", "Çüß\u00a0"},
      {"\xb0\xc4\xdf\xe0\xfe", "░─▀α■"},
      {"folder/", "folder"},
      {"folder//", "folder"},
      {"./a", "a"},
      {"././a", "a"},
      {"./", "."},
      {"/", "/"},
      {"../a", "../a"},
  };
  for (const auto& row : rows) EXPECT_EQ(ReadableEntryName(row.bytes), row.shown);
}

TEST(EntryName, IsStoredRelative) {
  const struct {
    const char *path, *stored;
  } rows[] = {
      {"a/b.jpg", "a/b.jpg"}, {"./a", "a"},    {"/home/me/a", "home/me/a"},
      {"../../a/b", "a/b"},   {"x/../a", "a"}, {"a//b/", "a/b"},
      {"a/./b", "a/b"},       {"..", ""},      {"a/..", ""},
  };
  for (const auto& row : rows) EXPECT_EQ(StoredEntryName(row.path), row.stored) << row.path;
}

}  // namespace
}  // namespace fotomill
