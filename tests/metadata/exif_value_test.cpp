#include "metadata/exif/exif_value.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <bit>
#include <cstring>
#include <random>

#include "metadata/exif/exif_tags.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

constexpr uint16_t B = kExifByte, A = kExifAscii, S = kExifShort, L = kExifLong, R = kExifRational,
                   U = kExifUndefined, Q = kExifSRational;
constexpr const char* kNoLine = nullptr;

struct ValueCase {
  uint16_t tag, type;
  uint32_t count;
  const char* bytes;  // hex, big-endian
  const char* text;   // null: no line
};

// clang-format off
const ValueCase kValues[] = {
    // by type
    {0x0131, A, 8, "41 20 42 20 20 00 43 44", "A B  "}, {0x0131, A, 0, "", ""},  // up to the NUL, blanks kept
    {0x012d, S, 17, "0001 0002 0003 0004 0005 0006 0007 0008 0009 000A 000B 000C 000D 000E 000F 0010 0011",
     "1 2 3 4 5 6 7 8 9 10 11 12 13 14 15 16 ..."},
    {0xc4a5, B, 16, "01 01 01 01 01 01 01 01 01 01 01 01 01 01 01 FF", "1 1 1 1 1 1 1 1 1 1 1 1 1 1 1 255"},
    {0xc4a5, kExifSLong, 2, "FFFFFFFF 7FFFFFFF", "-1 2147483647"}, {0x0100, L, 1, "FFFFFFFF", "4294967295"},
    {0xc4a5, kExifSShort, 2, "8000 0001", "-32768 1"}, {0xc4a5, kExifSByte, 2, "FF 01", "-1 1"},
    {0x829d, R, 1, "00000005 00000000", "0.000"},  // division by zero
    {0x9204, Q, 3, "FFFFFFFF 00000003 80000000 FFFFFFFF 00000000 00000005", "-0.333 2147483648.000 0.000"},
    {0x0100, L, 0, "", kNoLine}, {0x0100, 0, 1, "00000001", kNoLine}, {0x0100, 11, 1, "00000001", kNoLine},
    {0x927c, U, 4, "01 02 03 04", kNoLine}, {0x8828, U, 4, "01 02 03 FF", "1 2 3 255"},  // opaque, structural
    {0x9000, U, 4, "30 32 33 30", "0230"}, {0x0000, B, 4, "02 03 00 00", "2.3.0.0"}, {0x0000, B, 2, "02 03", "2 3"},
    // word lists
    {0x0001, A, 2, "4E 00", "North"}, {0x0001, A, 2, "6E 00", "South"}, {0x0001, B, 1, "4E", "78"},  // not ASCII
    {0x000c, A, 2, "4E 00", "Knots"}, {0x000c, A, 2, "58 00", "Miles per hour"},
    {0x0112, S, 1, "0008", "Left Bottom"}, {0x0112, S, 1, "0009", "Unknown"}, {0x0112, L, 1, "FFFFFFFF", "Unknown"},
    {0x0112, kExifSLong, 1, "FFFFFFFF", "-1"}, {0xa406, U, 1, "01", "1"},  // types that the lists do not accept
    {0xa300, U, 1, "03", "Digital still camera"}, {0xa403, S, 1, "0000", "None"},
    {0x0128, S, 1, "0001", "Unknown"}, {0x0103, S, 1, "0007", "Unknown"}, {0xa001, S, 1, "FFFF", "Uncalibrated"},
    {0x9207, S, 1, "00FF", "Other"}, {0x9208, S, 1, "0018", "ISO studio tungsten"}, {0x9208, S, 1, "0010", "Unknown"},
    {0x9101, U, 4, "04 05 06 07", "RGBUnknown"}, {0x9101, U, 3, "01 02 03", "YCbCr*"},
    // special rules
    {0x9209, S, 1, "005F", "Fire: Y Return: D Mode: A Function: P Redeye: Y"},
    {0x9209, S, 1, "002A", "Fire: N Return: U Mode: F Function: N Redeye: N"},
    {0x9209, S, 1, "FF94", "Fire: N Return: N Mode: S Function: P Redeye: N"},
    {0x9214, S, 2, "000A 0014", "By coordinates X: 10 Y: 20"}, {0xa214, S, 2, "000A 0014", "X: 10 Y: 20"},
    {0x9214, S, 3, "000A 0014 0005", "Circular area X: 10 Y: 20 R: 5"},
    {0x9214, S, 4, "000A 0014 0005 0006", "Rectangular area X: 10 Y: 20 W: 5 H: 6"},
    {0x9214, S, 5, "000A 0014 0005 0006 0007", "10 20 5 6 7"},
    {0xa432, R, 4, "00000012 00000001 00000037 00000001 00000000 00000000 00000038 0000000A",
     "Focal length minimum: 18.0 Focal length maximum: 55.0 F-stop maximum: 5.6 "},
    {0x9206, R, 1, "FFFFFFFF 00000001", "Infinity"}, {0x9206, R, 1, "00000000 00000001", "Unknown"},
    {0x9206, R, 1, "0000001D 0000000A", "2.000"}, {0x9206, R, 1, "0000001D 00000000", "0.000"},  // whole meters
    {0x0007, R, 3, "00000009 00000001 00000177 0000000A 0000003B 00000000", "09:37:00"},
    {0x0007, R, 2, "00000017 00000001 0000003B 00000001", "23.000 59.000"},
    {0x9286, U, 12, "41 53 43 49 49 00 00 00 41 62 63 00", "Abc"}, {0x9286, A, 3, "41 62 00", "Ab"},
    {0x9286, U, 10, "00 00 00 00 00 00 00 00 41 62", kNoLine},
};
// clang-format on

TEST(ExifValue, TurnsValuesIntoText) {
  std::string buffer;
  for (const ValueCase& row : kValues) {
    SCOPED_TRACE(testing::Message() << "tag " << std::hex << row.tag << " bytes " << row.bytes);
    const auto bytes = Hex(row.bytes);
    const ExifValue value{row.tag, row.type, row.count, ExifBytes(bytes, true)};
    const auto text = ExifValueText(value, FindExifTag(row.tag), buffer);
    EXPECT_EQ(text.value_or("no line"), row.text == kNoLine ? "no line" : row.text);
  }
}

// Every rounding case, compared with the C library.
TEST(ExifValue, RoundsRationalsAsPrintfDoes) {
  std::mt19937 random(1);
  std::string buffer;
  std::vector<std::pair<uint32_t, uint32_t>> rationals = {
      {15, 10000}, {4294967295, 2000}, {4294967295, 4294967294}};
  for (int i = 0; i < 20000; ++i)
    rationals.emplace_back(random() >> random() % 32, random() >> random() % 32 | 1);
  for (const uint32_t odd : {1u, 3u, 77777u}) {
    for (uint32_t half = 16; half <= 2000000; half *= 5) rationals.emplace_back(odd, half);
  }
  for (const auto& [numerator, denominator] : rationals) {
    const uint32_t numbers[] = {numerator, denominator};
    uint8_t bytes[sizeof numbers];
    std::memcpy(bytes, numbers, sizeof numbers);
    const ExifValue value{0x829d, R, 1, ExifBytes(bytes, std::endian::native == std::endian::big)};
    char expected[64];
    std::snprintf(expected, sizeof expected, "%.3f", static_cast<double>(numerator) / denominator);
    ASSERT_EQ(ExifValueText(value, FindExifTag(value.tag), buffer), expected) << numerator << '/' << denominator;
  }
}

TEST(ExifValue, ReadsAShortThatClaimsNoValues) {
  // one value, in the low half of the field
  const auto bytes = Hex("0112 0003 00000000 0001 0006");
  const ExifBytes numbers(bytes, true);
  std::string buffer;
  EXPECT_EQ(ExifValueText(ReadExifValue(bytes, numbers, ReadExifField(numbers, 0)), nullptr, buffer), "6");
}

TEST(ExifValue, DecodesUserComments) {
  using namespace std::string_view_literals;
  const struct {
    std::string_view data;
    uint32_t count;
    size_t most;
    std::string_view text;
  } rows[] = {
      {"ASCII\0\0\0Hi  "sv, 12, 100, "Hi  "},
      {"ASCII\0\0\0Hi\0there"sv, 16, 100, "Hi"},
      {"ASCII\0\0\0Hello"sv, 10, 100, "He"},
      {"ASCII\0\0\0Hello"sv, 13, 3, "Hel"},
      {"ASCII\0\0\0He"sv, 4000000000, 100, "He"},
      {"ASCII\0\0"sv, 7, 100, ""},
      {"ASCII\0\0\0Hello"sv, 7, 100, ""},
      {"JIS\0\0\0\0\0xx"sv, 10, 100, "JIS X208-1990 (not supported)"},
      {"JIS X208xx"sv, 10, 100, ""},
      {"UNICODE\0xx"sv, 10, 100, "Unicode (not supported)"},
      {"\0\0\0\0\0\0\0\0xx"sv, 10, 100, ""},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(testing::Message() << row.data << ' ' << row.count);
    std::string_view text = "left over";
    const std::vector<uint8_t> data(row.data.begin(), row.data.end());
    EXPECT_EQ(DecodeUserComment(data, row.count, row.most, text), !row.text.empty());
    EXPECT_EQ(text, row.text);
  }
}

TEST(ExifValue, NormalizesRawCopies) {
  const struct {
    uint16_t type;
    // big-endian, as in the file; little-endian, as the editor expects
    const char *bytes, *normalized;
  } rows[] = {
      {S, "0102 0304 0506", "02010000 04030000 06050000"},  // 32-bit slots
      {S, "0102 03", "02010000 00030000"},                  // the block ends within the second
      {L, "01020304 05060708", "04030201 08070605"},
      {kExifSLong, "FFFFFFFE", "FEFFFFFF"},
      {R, "01020304 0506", "04030201 00000605"},
      {Q, "01020304 05060708", "04030201 08070605"},
      {U, "0102030405", "0102030405"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.bytes);
    const auto big = Hex(row.bytes);
    auto little = Hex(row.normalized);
    ExifRawValue copy;
    ASSERT_TRUE(CopyExifValue({0x0100, row.type, 9, ExifBytes(big, true)}, copy));
    EXPECT_TRUE(copy.bigEndian);
    for (int times = 0; times < 2; ++times) {  // the second time is a no-op
      NormalizeExifValue(copy);
      little.resize(copy.data.Size());
      EXPECT_TRUE(std::ranges::equal(copy.data.Bytes(), little));
    }
  }
}

TEST(ExifTags, LookUpKnownAndUnknownTags) {
  for (size_t i = 0; i < ExifTags().size(); ++i)
    EXPECT_EQ(ExifTagIndex(ExifTags()[i].tag), static_cast<int32_t>(i));
  EXPECT_EQ(ExifTagIndex(0xc4a5), kNoExifTag);
  EXPECT_EQ(ExifTagName(0xc4a5), "Unknown");
  EXPECT_EQ(CopyExifTag(0xc4a5).tag, 0xc4a5);
  EXPECT_EQ(ExifTypeLabel(0xffff), "[SRATIONAL]");
  EXPECT_EQ(ExifTypeSize(12), 1u);
}

}  // namespace
}  // namespace fotomill::test
