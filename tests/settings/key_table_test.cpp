#include "settings/key_table.h"

#include <gtest/gtest.h>

#include <string>

#include "core/plain_name.h"
#include "settings/settings.h"
#include "settings/spin_range.h"

namespace fotomill {
namespace {

// Each key is found by its name and its control only, and its default is valid.
TEST(KeyTable, RowsAreValid) {
  for (const KeyRow& row : Keys()) {
    SCOPED_TRACE(row.name);
    EXPECT_EQ(FindKey(row.name), &row);
    EXPECT_EQ(FindKey(row.name, NumberOfKey(row) + 1), &row) << "around the end of the table";
    EXPECT_EQ(FindKeyOfControl(row.control), row.control == 0 ? nullptr : &row);
    EXPECT_TRUE(IsAtDefault(row));
    if ((row.type & KEY_SPIN) != 0) {
      const SpinRange range = SpinRangeOf(row);
      EXPECT_LT(range.maximum, INT32_MAX) << "no range of its own";
      EXPECT_LE(range.minimum, DefaultNumber(row));
      EXPECT_GE(range.maximum, DefaultNumber(row));
      EXPECT_NE(row.control, 0u);
    }
    EXPECT_TRUE((row.type & KEY_TEXT_LIMIT) == 0 || row.extra.textLimit == TextLimit(row));
    EXPECT_TRUE(!HoldsName(row) || IsPlainName(DefaultText(row)));
  }
}

TEST(KeyTable, StoredTextsStayWithinTheirLimit) {
  const KeyRow& crop = KeyOf(KeyNumber::PrefixCrop);
  const SettingPrefix duplicate = settings.PrefixDuplicate;  // comes after PrefixCrop
  StoreText(crop, std::string(100, 'x'));
  EXPECT_EQ(TextIn(crop), std::string(32, 'x'));
  EXPECT_EQ(settings.PrefixDuplicate.view(), duplicate.view());
  StoreText(crop, "y");
  EXPECT_EQ(TextIn(crop), "y");
  StoreDefault(crop);
  EXPECT_EQ(settings.PrefixCrop.view(), "Cropped_ ");
}

TEST(KeyTable, AlwaysFindsANearestKey) {
  const std::pair<const char*, const char*> rows[] = {
      {"FindSimilarDistance", "FindSimlarDistance"}, {"jpegcompression", "JpegCompression"},
      {"PngCompresion", "PngCompression"},           {"", "AllowDestinationOverrides"},
      {"%%%", "AllowDestinationOverrides"},
  };
  for (const auto& [typed, nearest] : rows) EXPECT_EQ(NearestKey(typed), nearest) << typed;
}

TEST(PlainName, RejectsPaths) {
  for (const char* name : {"", "Cropped_ ", ".hidden", "a.b", "\xC3\xA4\xFF", "a b [1]"})
    EXPECT_TRUE(IsPlainName(name)) << name;
  using namespace std::string_view_literals;
  for (const auto name : {"/"sv, "a/b"sv, "a\\"sv, ".."sv, "a..b"sv, "a\0b"sv, "\n"sv, "\x7F"sv})
    EXPECT_FALSE(IsPlainName(name)) << name;
}

}  // namespace
}  // namespace fotomill
