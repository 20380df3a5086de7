#include "metadata/iptc/iptc_records.h"

#include <gtest/gtest.h>

#include <algorithm>

#include "support/hex.h"

namespace fotomill::test {
namespace {

using Texts = std::vector<std::string>;
constexpr char kLatin1[] =
    "1C 02 00 0002 00 04          # version\n"
    "1C 02 05 0003 43 61 E9       # title: Ca, e with acute\n"
    "1C 02 19 0003 6F 6C 64       # keyword: old\n"
    "1C 02 78 0001 78             # description: x\n"
    "1C 02 C8 0002 FF D8          # preview\n";

TEST(IptcRecords, ReplacesDatasets) {
  const struct {
    const char* name;
    std::string before;
    IptcChanges changes;
    std::string after;
  } rows[] = {
      {"in place, all else the same",
       kLatin1,
       {Texts{"a", "b"}},
       "1C 02 00 0002 00 04  1C 02 05 0003 43 61 E9  1C 02 19 0001 61  1C 02 19 0001 62"
       "1C 02 78 0001 78  1C 02 C8 0002 FF D8"},
      {"removed",
       kLatin1,
       {Texts{}, ""},
       "1C 02 00 0002 00 04  1C 02 05 0003 43 61 E9  1C 02 C8 0002 FF D8"},
      {"added in order",
       "1C 02 05 0001 61  1C 02 50 0001 62  1C 03 00 0000",
       {Texts{"k"}, "d"},
       "1C 02 05 0001 61  1C 02 19 0001 6B  1C 02 50 0001 62  1C 02 78 0001 64  1C 03 00 0000"},
      {"converted to UTF-8, but not the preview",
       kLatin1,
       {Texts{"\xC3\xA9"}},
       "1C 01 5A 0003 1B 25 47  1C 02 00 0002 00 04  1C 02 05 0004 43 61 C3 A9"
       "1C 02 19 0002 C3 A9  1C 02 78 0001 78  1C 02 C8 0002 FF D8"},
      {"already UTF-8",
       "1C 01 5A 0003 1B 25 47  1C 02 05 0002 C3 A9",
       {Texts{"\xC3\xA9"}},
       "1C 01 5A 0003 1B 25 47  1C 02 05 0002 C3 A9  1C 02 19 0002 C3 A9"},
      {"long size", "1C 02 78 8002 0001 61  00 00", {std::nullopt, "b"}, "1C 02 78 0001 62"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    std::vector<uint8_t> made;
    EXPECT_EQ(EditIptc(Hex(row.before), row.changes, made), Status::Ok);
    EXPECT_EQ(made, Hex(row.after));
  }
}

TEST(IptcRecords, CutsLongTextsBetweenCharacters) {
  std::string keyword;
  while (keyword.size() < 80) keyword += "\xE2\x82\xAC";  // three bytes
  std::vector<uint8_t> made;
  ASSERT_EQ(EditIptc(Hex("1C 01 5A 0003 1B 25 47"), {Texts{keyword}}, made), Status::Ok);
  EXPECT_EQ(ReadIptcTags(made).keywords, Texts{keyword.substr(0, 63)});
}

TEST(IptcRecords, RefusesDamage) {
  for (const char* data : {"", "1C 02 05 0009 61", "1C 02 05 0001 61 07", "1C 02 05 8009 00",
                           "1C 02 05 8004 FFFFFFFF 61"}) {
    std::vector<uint8_t> made;
    EXPECT_EQ(EditIptc(Hex(data), {Texts{"a"}}, made), Status::DamagedFile) << data;
  }
  EXPECT_EQ(ReadIptcTags(Hex("1C 02 19 0001 61  1C 02 19 0009 62")).keywords, Texts{"a"});
}

TEST(IptcRecords, ReadsBothEncodingsAndBlanksPlaces) {
  EXPECT_EQ(ReadIptcTags(Hex(kLatin1)).title, "Ca\xC3\xA9");
  EXPECT_EQ(ReadIptcTags(Hex("1C 02 05 0002 C3 A9")).title, "\xC3\xA9");
  std::vector<uint8_t> data = Hex("1C 02 05 0001 61  1C 02 5A 0002 4242  1C 02 65 0001 43");
  EXPECT_TRUE(BlankIptcPlaces(data));
  EXPECT_EQ(data, Hex("1C 02 05 0001 61  1C 02 5A 0002 2020  1C 02 65 0001 20"));
  data = Hex("1C 02 05 0001 61");
  EXPECT_FALSE(BlankIptcPlaces(data));
}

}  // namespace
}  // namespace fotomill::test
