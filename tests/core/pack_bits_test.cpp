#include "core/pack_bits.h"

#include <gtest/gtest.h>

#include "support/hex.h"
#include "support/pictures.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

Bytes Packed(const Bytes& row) {
  Bytes code(MostPackedBits(row.size()));
  code.resize(PackBits(row, code.data()));
  return code;
}

TEST(PackBits, PacksRunsAndLiterals) {
  struct Row {
    const char* name;
    Bytes row, code;
  };
  const Row rows[] = {
      {"nothing", {}, {}},
      {"one byte", Hex("07"), Hex("00 07")},
      {"two equal bytes", Hex("07 07"), Hex("FF 07")},
      {"two equal bytes between others", Hex("01 07 07 02"), Hex("03 01 07 07 02")},
      {"three equal bytes between others", Hex("01 07 07 07 02"), Hex("00 01 FE 07 00 02")},
      {"129 equal bytes", Bytes(129, 5), Hex("81 05 00 05")},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    EXPECT_EQ(Packed(row.row), row.code);
  }
}

TEST(PackBits, RoundTripsAndRejectsTruncatedData) {
  for (const size_t size : {1, 127, 128, 129, 130, 5000}) {
    for (const int mask : {0xff, 0x01, 0x00}) {
      SCOPED_TRACE(size);
      Bytes row = RandomBytes(size, 3);
      for (uint8_t& byte : row) byte = static_cast<uint8_t>(byte & mask);
      const Bytes code = Packed(row);
      Bytes back(size);
      std::span<const uint8_t> rest(code);
      EXPECT_TRUE(UnpackBits(rest, back));
      EXPECT_TRUE(rest.empty());
      EXPECT_EQ(back, row);
      rest = std::span(code).first(code.size() - 1);
      EXPECT_FALSE(UnpackBits(rest, back));
    }
  }
}

TEST(PackBits, ReadsOtherEncoders) {
  struct Row {
    const char* name;
    Bytes code;
    size_t size;
    Bytes row;
    size_t left;
  };
  const Row rows[] = {
      {"128 means nothing", Hex("80 80 00 09"), 1, Hex("09"), 0},
      {"a run beyond the row", Hex("F0 09 55"), 3, Hex("09 09 09"), 1},
      {"bytes beyond the row", Hex("03 01 02 03 04 55"), 2, Hex("01 02"), 1},
      {"bytes beyond row and code", Hex("07 01 02"), 2, Hex("01 02"), 0},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    Bytes out(row.size);
    std::span<const uint8_t> code(row.code);
    EXPECT_TRUE(UnpackBits(code, out));
    EXPECT_EQ(out, row.row);
    EXPECT_EQ(code.size(), row.left);
  }
}

}  // namespace
}  // namespace fotomill::test
