#include "metadata/exif_value.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <bit>
#include <cstring>
#include <random>

#include "core/limits.h"
#include "metadata/exif_tags.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

constexpr uint16_t B = kExifByte, A = kExifAscii, S = kExifShort, L = kExifLong, R = kExifRational, U = kExifUndefined,
                   Q = kExifSRational;
constexpr const char* kNoLine = nullptr;

struct ValueCase {
  uint16_t tag, type;
  uint32_t count;
  const char* bytes;  // hex, big-endian
  const char* text;   // null: no line
};

const ValueCase kValues[] = {
    // by type
    {0x0131, A, 8, "41 20 42 20 20 00 43 44", "A B  "},  // up to the zero byte, blanks kept
    {0x0131, A, 0, "", ""},
    {0x0131, A, 3, "41 42 43", "ABC"},
    {0x0100, L, 1, "FFFFFFFF", "4294967295"},
    {0x0111, L, 3, "00000001 00000002 00000003", "1 2 3"},
    {0x0102, S, 3, "0008 0008 0008", "8 8 8"},
    {0x012d, S, 17, "0001 0002 0003 0004 0005 0006 0007 0008 0009 000A 000B 000C 000D 000E 000F 0010 0011",
     "1 2 3 4 5 6 7 8 9 10 11 12 13 14 15 16 ..."},
    {0xc4a5, S, 16, "0001 0001 0001 0001 0001 0001 0001 0001 0001 0001 0001 0001 0001 0001 0001 0001",
     "1 1 1 1 1 1 1 1 1 1 1 1 1 1 1 1"},
    {0xc4a5, kExifSLong, 2, "FFFFFFFF 7FFFFFFF", "-1 2147483647"},
    {0xc4a5, kExifSShort, 2, "8000 0001", "-32768 1"},
    {0xc4a5, kExifSByte, 2, "FF 01", "-1 1"},
    {0xc4a5, B, 2, "FF 01", "255 1"},
    {0xc4a5, U, 3, "00 41 FF", "0 65 255"},
    {0x829a, R, 1, "00000001 00000008", "0.125"},
    {0x829d, R, 1, "0000001C 0000000A", "2.800"},
    {0x829d, R, 1, "FFFFFFFF 00000001", "4294967295.000"},
    {0x829d, R, 1, "00000005 00000000", "0.000"},  // nothing to divide by
    {0x0002, R, 3, "0000002D 00000001 00000013 00000001 000012C0 00000064", "45.000 19.000 48.000"},
    {0x9204, Q, 1, "FFFFFFFF 00000003", "-0.333"},
    {0x9204, Q, 1, "80000000 FFFFFFFF", "2147483648.000"},
    {0x9204, Q, 2, "FFFFFFFE 00000001 00000000 00000005", "-2.000 0.000"},
    {0xa005, L, 1, "00000100", "256"},
    {0x8769, L, 1, "00000100", "256"},
    // nothing to show
    {0x0100, L, 0, "", kNoLine},
    {0x829d, R, 0, "", kNoLine},
    {0x0100, 0, 1, "00000001", kNoLine},
    {0x0100, 11, 1, "00000001", kNoLine},
    {0x927c, U, 4, "01 02 03 04", kNoLine},
    {0xa302, U, 4, "01 02 03 04", kNoLine},
    {0xa40b, U, 4, "01 02 03 04", kNoLine},
    {0x8828, U, 4, "01 02 03 04", "1 2 3 4"},  // structural, not opaque
    // versions
    {0x9000, U, 4, "30 32 33 30", "0230"},
    {0xa000, U, 4, "30 31 30 30", "0100"},
    {0x0000, B, 4, "02 03 00 00", "2.3.0.0"},
    {0x0000, B, 2, "02 03", "2 3"},
    // letters
    {0x0001, A, 2, "4E 00", "North"},
    {0x0001, A, 2, "6E 00", "South"},  // anything else
    {0x0013, A, 2, "53 00", "South"},
    {0x0003, A, 2, "45 00", "East"},
    {0x0015, A, 2, "57 00", "West"},
    {0x0009, A, 2, "41 00", "Measurement in progress"},
    {0x0009, A, 2, "56 00", "Measurement interoperability"},
    {0x000a, A, 2, "32 00", "2-dimensional measurement"},
    {0x000a, A, 2, "33 00", "3-dimensional measurement"},
    {0x000c, A, 2, "4B 00", "Kilometers per hour"},
    {0x000c, A, 2, "4D 00", "Miles per hour"},
    {0x000c, A, 2, "4E 00", "Knots"},
    {0x000c, A, 2, "58 00", "Miles per hour"},
    {0x000e, A, 2, "54 00", "True"},
    {0x0019, A, 2, "4D 00", "Magnetic"},
    {0x0001, B, 1, "4E", "78"},  // a letter that is not ASCII is a number
    // word lists by value
    {0x0005, B, 1, "00", "Sea level"},
    {0x0005, B, 1, "01", "Sea level reference"},
    {0x0005, B, 1, "02", "Unknown"},
    {0x001e, S, 1, "0001", "Differential correction applied"},
    {0x0112, S, 1, "0000", "Unknown"},
    {0x0112, S, 1, "0003", "Bottom Left"},
    {0x0112, S, 1, "0004", "Bottom Right"},
    {0x0112, S, 1, "0008", "Left Bottom"},
    {0x0112, S, 1, "0009", "Unknown"},
    {0x0112, L, 1, "FFFFFFFF", "Unknown"},
    {0x0112, kExifSLong, 1, "FFFFFFFF", "-1"},  // of a type that the list does not take
    {0x8822, S, 1, "0008", "Landscape mode"},
    {0xa217, S, 1, "0002", "Two-chip color area sensor"},
    {0xa402, S, 1, "0002", "Auto bracket"},
    {0xa403, S, 1, "0000", "None"},
    {0xa403, S, 1, "0001", "Auto white balance"},
    {0xa407, S, 1, "0004", "High gain down"},
    {0xa408, S, 1, "0001", "Soft"},
    {0xa40a, S, 1, "0002", "Hard"},
    {0xa409, S, 1, "0003", "Unknown"},
    {0xa40c, S, 1, "0003", "Distant view"},
    {0xa300, U, 1, "03", "Digital still camera"},
    {0xa300, S, 1, "0003", "Digital still camera"},
    {0xa301, U, 1, "01", "Directly photographed image"},
    {0xa406, U, 1, "01", "1"},  // UNDEFINED is for file source and scene type alone
    // word lists by code
    {0x0128, S, 1, "0002", "Inches"},
    {0x0128, S, 1, "0003", "Centimeters"},
    {0x0128, S, 1, "0001", "Unknown"},
    {0x0103, S, 1, "0001", "Uncompressed"},
    {0x0103, S, 1, "0006", "JPEG"},
    {0x0103, S, 1, "0007", "Unknown"},
    {0x9207, S, 1, "0005", "Pattern"},
    {0x9207, S, 1, "00FF", "Other"},
    {0x9207, S, 1, "0007", "Unknown"},
    {0x9208, S, 1, "0009", "Fine weather"},
    {0x9208, S, 1, "0010", "Unknown"},  // 16 is not among the codes
    {0x9208, S, 1, "0018", "ISO studio tungsten"},
    {0x9208, S, 1, "00FF", "Other light source"},
    {0xa001, S, 1, "0001", "sRGB"},
    {0xa001, S, 1, "FFFF", "Uncalibrated"},
    {0x9101, U, 4, "01 02 03 00", "YCbCr*"},
    {0x9101, U, 4, "04 05 06 07", "RGBUnknown"},
    {0x9101, U, 3, "01 02 03", "YCbCr*"},
    // rules of their own
    {0x9209, S, 1, "0000", "Fire: N Return: X Mode: U Function: P Redeye: N"},
    {0x9209, S, 1, "005F", "Fire: Y Return: D Mode: A Function: P Redeye: Y"},
    {0x9209, S, 1, "002A", "Fire: N Return: U Mode: F Function: N Redeye: N"},
    {0x9209, S, 1, "FF94", "Fire: N Return: N Mode: S Function: P Redeye: N"},
    {0x9214, S, 2, "000A 0014", "By coordinates X: 10 Y: 20"},
    {0x9214, S, 3, "000A 0014 0005", "Circular area X: 10 Y: 20 R: 5"},
    {0x9214, S, 4, "000A 0014 0005 0006", "Rectangular area X: 10 Y: 20 W: 5 H: 6"},
    {0x9214, S, 5, "000A 0014 0005 0006 0007", "10 20 5 6 7"},
    {0xa214, S, 2, "000A 0014", "X: 10 Y: 20"},
    {0xa432, R, 4, "00000012 00000001 00000037 00000001 00000023 0000000A 00000038 0000000A",
     "Focal length minimum: 18.0 Focal length maximum: 55.0 F-stop minimum: 3.5 F-stop maximum: 5.6 "},
    {0xa432, R, 4, "00000032 00000001 00000032 00000001 00000000 00000000 00000000 00000000",
     "Focal length minimum: 50.0 Focal length maximum: 50.0 "},
    {0x9206, R, 1, "FFFFFFFF 00000001", "Infinity"},
    {0x9206, R, 1, "00000000 00000001", "Unknown"},
    {0x9206, R, 1, "0000001D 0000000A", "2.000"},  // 2.9, in whole metres
    {0x9206, R, 1, "0000001D 00000000", "0.000"},
    {0x9206, Q, 1, "0000001D 0000000A", "2.900"},
    {0x0007, R, 3, "00000009 00000001 00000005 00000001 00000177 0000000A", "09:05:37"},
    {0x0007, R, 3, "00000017 00000001 0000003B 00000001 0000003B 00000000", "23:59:00"},
    {0x0007, R, 2, "00000017 00000001 0000003B 00000001", "23.000 59.000"},
    {0x9286, U, 12, "41 53 43 49 49 00 00 00 41 62 63 00", "Abc"},
    {0x9286, U, 10, "00 00 00 00 00 00 00 00 41 62", kNoLine},
    {0x9286, A, 3, "41 62 00", "Ab"},
};

// The same values with every number's bytes turned round.
std::vector<uint8_t> Swapped(std::vector<uint8_t> bytes, uint16_t type) {
  const uint32_t width = std::min(ExifStoredSize(type), 4u);
  for (size_t i = 0; i + width <= bytes.size(); i += width) {
    std::reverse(bytes.begin() + static_cast<std::ptrdiff_t>(i), bytes.begin() + static_cast<std::ptrdiff_t>(i + width));
  }
  return bytes;
}

TEST(ExifValue, TurnsValuesIntoText) {
  std::string buffer;
  for (const ValueCase& row : kValues) {
    for (const bool bigEndian : {true, false}) {
      SCOPED_TRACE(testing::Message() << "tag " << std::hex << row.tag << " bytes " << row.bytes << " big " << bigEndian);
      const auto bytes = bigEndian ? Hex(row.bytes) : Swapped(Hex(row.bytes), row.type);
      const ExifValue value{row.tag, row.type, row.count, ExifBytes(bytes, bigEndian)};
      const auto text = ExifValueText(value, FindExifTag(row.tag), buffer);
      EXPECT_EQ(text.value_or("no line"), row.text == kNoLine ? "no line" : row.text);
    }
  }
}

// Every way of rounding, beside what the C library makes of the quotient.
TEST(ExifValue, RoundsRationalsAsPrintfDoes) {
  std::mt19937 random(1);
  std::string buffer;
  std::vector<std::pair<uint32_t, uint32_t>> rationals = {
      {1, 16}, {3, 16}, {5, 10000}, {15, 10000}, {1, 2000}, {3, 2000}, {4294967295, 2000}, {4294967295, 4294967295},
      {4294967295, 4294967294}, {1, 4294967295}, {999, 1000}, {9995, 10000}, {99995, 100000}, {0, 7}};
  for (int i = 0; i < 20000; ++i) rationals.emplace_back(random() >> random() % 32, random() >> random() % 32 | 1);
  for (const uint32_t odd : {1u, 3u, 5u, 77777u}) {
    for (uint32_t half = 16; half <= 2000000; half *= 5) rationals.emplace_back(odd, half);
  }
  for (const auto& [numerator, denominator] : rationals) {
    for (const uint16_t type : {R, Q}) {
      uint8_t bytes[8];
      std::memcpy(bytes, &numerator, 4);
      std::memcpy(bytes + 4, &denominator, 4);
      const auto text = ExifValueText({0x829d, type, 1, ExifBytes(bytes, std::endian::native == std::endian::big)},
                                      FindExifTag(0x829d), buffer);
      const double quotient = type == R ? static_cast<double>(numerator) / denominator
                                        : static_cast<double>(static_cast<int32_t>(numerator)) /
                                              static_cast<int32_t>(denominator);
      char expected[64];
      std::snprintf(expected, sizeof expected, "%.3f", quotient);
      ASSERT_EQ(text, expected) << numerator << '/' << denominator;
    }
  }
}

TEST(ExifValue, ReadsAShortThatClaimsNoValues) {
  const auto big = Hex("0112 0003 00000000 0001 0006"), little = Hex("1201 0300 00000000 0600 0100");
  std::string buffer;
  for (const auto& [bytes, bigEndian] : {std::pair(big, true), std::pair(little, false)}) {
    const ExifBytes numbers(bytes, bigEndian);
    const ExifValue value = ReadExifValue(bytes, numbers, ReadExifField(numbers, 0));
    EXPECT_EQ(ExifValueText(value, FindExifTag(0x0112), buffer), "Right Top") << "the low half of the field";
  }
}

struct CommentCase {
  const char* name;
  std::string_view data;
  uint32_t count;
  size_t most;
  bool known;
  std::string_view text;
};

TEST(ExifValue, DecodesUserComments) {
  using namespace std::string_view_literals;
  static const CommentCase kComments[] = {
      {"text", "ASCII\0\0\0Hello"sv, 13, 100, true, "Hello"},
      {"blanks kept", "ASCII\0\0\0Hi  "sv, 12, 100, true, "Hi  "},
      {"zero byte ends it", "ASCII\0\0\0Hi\0there"sv, 16, 100, true, "Hi"},
      {"count ends it", "ASCII\0\0\0Hello"sv, 10, 100, true, "He"},
      {"room ends it", "ASCII\0\0\0Hello"sv, 13, 3, true, "Hel"},
      {"block ends it", "ASCII\0\0\0He"sv, 4000000000, 100, true, "He"},
      {"no text", "ASCII\0\0\0"sv, 8, 100, true, ""},
      {"Japanese", "JIS\0\0\0\0\0xx"sv, 10, 100, true, "JIS X208-1990 (not supported)"},
      {"Unicode", "UNICODE\0xx"sv, 10, 100, true, "Unicode (not supported)"},
      {"undefined", "\0\0\0\0\0\0\0\0xx"sv, 10, 100, false, ""},
      {"JIS with more", "JIS X208xx"sv, 10, 100, false, ""},
      {"shorter than its code", "ASCII\0\0"sv, 7, 100, false, ""},
      {"count shorter than its code", "ASCII\0\0\0Hello"sv, 7, 100, false, ""},
  };
  for (const CommentCase& row : kComments) {
    SCOPED_TRACE(row.name);
    std::string_view text = "left over";
    const std::vector<uint8_t> data(row.data.begin(), row.data.end());
    EXPECT_EQ(DecodeUserComment(data, row.count, row.most, text), row.known);
    EXPECT_EQ(text, row.text);
  }
}

struct NormaliseCase {
  uint16_t type;
  uint32_t count;
  const char* bytes;       // big-endian, as in the file
  const char* normalised;  // little-endian, as the editor wants them
};

TEST(ExifValue, NormalisesRawCopies) {
  static const NormaliseCase kCases[] = {
      {S, 3, "0102 0304 0506", "02010000 04030000 06050000"},  // a slot of 32 bits each
      {S, 2, "0102 03", "02010000 00030000"},                  // the block ends within the second
      {L, 2, "01020304 05060708", "04030201 08070605"},
      {kExifSLong, 1, "FFFFFFFE", "FEFFFFFF"},
      {R, 1, "01020304 05060708", "04030201 08070605"},
      {Q, 1, "01020304 05060708", "04030201 08070605"},
      {R, 2, "01020304 0506", "04030201 00000605"},
      {B, 3, "010203", "010203"},
      {A, 3, "414200", "414200"},
      {U, 5, "0102030405", "0102030405"},
  };
  for (const NormaliseCase& row : kCases) {
    SCOPED_TRACE(row.bytes);
    const auto big = Hex(row.bytes), little = Hex(row.normalised);
    ExifRawValue copy;
    ASSERT_TRUE(CopyExifValue({0x0100, row.type, row.count, ExifBytes(big, true)}, copy));
    EXPECT_TRUE(copy.bigEndian);
    EXPECT_EQ(copy.count, row.count);
    for (int times = 0; times < 2; ++times) {  // the second time there is nothing left to do
      NormaliseExifValue(copy);
      EXPECT_FALSE(copy.bigEndian);
      const auto bytes = copy.data.Bytes();
      EXPECT_EQ(std::vector<uint8_t>(bytes.begin(), bytes.begin() + static_cast<std::ptrdiff_t>(little.size())), little);
    }
  }
}

TEST(ExifTags, LookUpFunctionsKnowTagsAndOthers) {
  EXPECT_EQ(ExifTagIndex(0x0006), 0);
  EXPECT_EQ(ExifTags()[126].tag, 0x9292);
  EXPECT_EQ(ExifTagIndex(0xc4a5), kNoExifTag);
  for (size_t i = 0; i < ExifTags().size(); ++i) EXPECT_EQ(ExifTagIndex(ExifTags()[i].tag), static_cast<int32_t>(i));
  EXPECT_EQ(ExifTagName(0x9209), "Flash");
  EXPECT_EQ(ExifTagName(0xc4a5), "Unknown");
  EXPECT_EQ(CopyExifTag(0xc4a5).name, "Unknown");
  EXPECT_EQ(CopyExifTag(0xc4a5).tag, 0xc4a5);
  EXPECT_EQ(ExifTagRange(0x9204).minimum, -99990);
  EXPECT_EQ(ExifTagRange(0xa20b).maximum, 1000000000);
  EXPECT_EQ(ExifTagRange(0xc4a5).maximum, 0);
  EXPECT_EQ(ExifEditClass(0x927c), kExifOpaque);
  EXPECT_EQ(ExifEditClass(0xc4a5), kExifOrdinary);
  EXPECT_EQ(ExifTypeLabel(0), "[BYTE]");
  EXPECT_EQ(ExifTypeLabel(8), "[UNKNOWN]");
  EXPECT_EQ(ExifTypeLabel(0xffff), "[SRATIONAL]");
  EXPECT_EQ(ExifTypeSize(8), 1u);
  EXPECT_EQ(ExifTypeSize(12), 1u);
}

}  // namespace
}  // namespace fotomill::test
