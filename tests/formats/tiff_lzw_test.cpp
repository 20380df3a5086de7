#include "formats/tiff/tiff_lzw.h"

#include <gtest/gtest.h>

#include "support/hex.h"
#include "support/pictures.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

Bytes Decoded(const Bytes& coded, size_t size) {
  TiffLzwDecoder decoder;
  const uint8_t* bytes = decoder.Decode(coded, size);
  return bytes == nullptr ? Bytes() : Bytes(bytes, bytes + size);
}

TEST(TiffLzw, CodesAsDefined) {
  // The example in the specification: clear, 7, 258, 8, 8, 258, 6, 6, end, 9 bits each.
  const Bytes plain = Hex("07 07 07 08 08 07 07 06 06"),
              coded = Hex("80 01 E0 40 80 44 08 0C 06 80 80");
  Bytes made;
  TiffLzwEncoder encoder;
  encoder.Encode(plain, made);
  EXPECT_EQ(made, coded);
  EXPECT_EQ(Decoded(coded, plain.size()), plain);
}

TEST(TiffLzw, RoundTrips) {
  TiffLzwEncoder encoder;
  Bytes coded;
  // around table resets and width changes
  for (const size_t size : {1, 2, 3, 255, 511, 3838, 3839, 3840, 10000, 70000}) {
    Bytes noise = RandomBytes(size, 5), few = noise, same(size, 9), runs = noise;
    for (size_t i = 0; i < size; ++i) {
      few[i] &= 3;
      runs[i] = static_cast<uint8_t>(i / 700);
    }
    for (const Bytes& plain : {noise, few, same, runs}) {
      SCOPED_TRACE(size);
      encoder.Encode(plain, coded);
      EXPECT_EQ(Decoded(coded, size), plain);
      // the end code may be missing
      for (const size_t cut : {size_t{1}, coded.size() / 2, coded.size() - 3}) {
        const Bytes part(coded.begin(),
                         coded.begin() + static_cast<ptrdiff_t>(std::min(cut, coded.size() - 3)));
        if (coded.size() > 8) {
          EXPECT_EQ(Decoded(part, size), Bytes());
        }
      }
    }
  }
}

TEST(TiffLzw, RejectsInvalidCodes) {
  struct Row {
    const char* name;
    const char* coded;
  };
  const Row rows[] = {
      {"a string right after the clear", "80 40 80 00 00"}, {"a string that is not there yet", "80 01 E0 C0 00"},
      {"the end before the last byte", "80 01 E0 20 20"},   {"bits the other way round", "00 01 00 00 00"},
      {"clears without end", "80 40 20 10 08 04 02 01 00"}, {"nothing", ""},
  };
  for (const Row& row : rows) EXPECT_EQ(Decoded(Hex(row.coded), 9), Bytes()) << row.name;
}

}  // namespace
}  // namespace fotomill::test
