#include "formats/pcx/pcx.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "support/codecs.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;
using testing::ElementsAreArray;

struct Header {
  uint16_t width = 1, height = 1;
  uint8_t bits = 8, planes = 1;
  uint16_t bytesPerLine = 1;
  uint8_t version = 5;
};

// A file whose header palette starts with 010203 040506, with its data in hex.
Bytes Pcx(const Header& header, std::string_view data) {
  Bytes bytes(128);
  bytes[0] = 10;
  bytes[1] = header.version;
  bytes[3] = header.bits;
  bytes[4] = 7;  // xmin
  bytes[8] = static_cast<uint8_t>(7 + header.width - 1);
  bytes[9] = static_cast<uint8_t>((7 + header.width - 1) >> 8);
  bytes[10] = static_cast<uint8_t>(header.height - 1);
  bytes[11] = static_cast<uint8_t>((header.height - 1) >> 8);
  for (uint8_t i = 0; i < 6; ++i) bytes[16 + i] = static_cast<uint8_t>(i + 1);
  bytes[65] = header.planes;
  bytes[66] = static_cast<uint8_t>(header.bytesPerLine);
  bytes[67] = static_cast<uint8_t>(header.bytesPerLine >> 8);
  const Bytes tail = Hex(data);
  bytes.insert(bytes.end(), tail.begin(), tail.end());
  return bytes;
}

TEST(PcxRead, Lines) {
  struct Row {
    const char* name;
    Bytes file;
    Status status;
    const char* pixels;
  };
  const Row rows[] = {
      {"literals and runs", Pcx({4, 1, 8, 1, 4}, "01 C2 C5 BF"), Status::Ok, "1 197 197 191"},
      {"a run goes on into the next line", Pcx({3, 2, 8, 1, 3}, "01 C4 07 02"), Status::Ok, "1 7 7 / 7 7 2"},
      {"a run over a whole line", Pcx({1, 3, 8, 1, 1}, "C3 07"), Status::Ok, "7 / 7 / 7"},
      {"runs of nothing", Pcx({2, 1, 8, 1, 2}, "C0 09 01 C0 FF 02"), Status::Ok, "1 2"},
      {"what is left of the last run is dropped", Pcx({1, 1, 8, 1, 1}, "FF 07"), Status::Ok, "7"},
      {"lines longer than the row", Pcx({1, 2, 8, 1, 7}, "01 C6 09 02 C6 09"), Status::Ok, "1 / 2"},
      {"lines shorter than the row", Pcx({6, 1, 8, 1, 2}, "01 02"), Status::Ok, "1 2 0 0 0 0"},
      {"1 bit", Pcx({9, 1, 1, 1, 2}, "C1 FF 00"), Status::Ok, "1 1 1 1 1 1 1 1 0"},
      {"2 planes", Pcx({4, 1, 1, 2, 1}, "50 30"), Status::Ok, "0 1 2 3"},
      {"3 planes, padded lines", Pcx({9, 1, 1, 3, 4}, "55 80 00 00  33 00 00 00  0F C1 FF 00 00"), Status::Ok,
       "0 1 2 3 4 5 6 7 5"},
      {"4 planes, lines too short", Pcx({10, 1, 1, 4, 1}, "C3 80 01"), Status::Ok, "7 0 0 0 0 0 0 8 0 0"},
      {"4 bits in one plane", Pcx({3, 1, 4, 1, 2}, "12 30"), Status::Ok, "1 2 3"},
      {"2 bits in one plane", Pcx({5, 1, 2, 1, 2}, "1B C1 C0"), Status::Ok, "0 1 2 3 3"},
      {"2 bits, lines too short", Pcx({6, 1, 2, 1, 1}, "1B"), Status::Ok, "0 1 2 3 0 0"},
      {"24 bits, runs over the planes", Pcx({2, 2, 8, 3, 2}, "01 C4 02 03  C6 09"), Status::Ok, "010202 020203 / 090909 090909"},
      {"24 bits, lines too short", Pcx({2, 1, 8, 3, 1}, "01 02 03"), Status::Ok, "010203 000000"},
      {"ends before a line is full", Pcx({3, 1, 8, 1, 3}, "01 02"), Status::FileReadError, ""},
      {"ends between count and byte", Pcx({3, 1, 8, 1, 3}, "01 C2"), Status::FileReadError, ""},
      {"no data", Pcx({1, 1, 8, 1, 1}, ""), Status::FileReadError, ""},
      {"beyond the limit", Pcx({65529, 65535, 8, 1, 65535}, ""), Status::MemoryAllocationError, ""},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    for (int round = 0; round < 2; ++round) {  // the second read starts without a pending run
      const Decoded decoded = Decode(PcxRead, row.file);
      EXPECT_EQ(decoded.status, row.status);
      EXPECT_EQ(PixelText(decoded.picture->image), row.pixels);
    }
  }
}

TEST(PcxInfo, DepthSizeAndEstimate) {
  struct Row {
    const char* name;
    Header header;
    Status status;
    int32_t bitsPerPixel;
    uint64_t imageBytes;
  };
  const Row rows[] = {
      {"1x1", {9, 3, 1, 1, 2}, Status::Ok, 1, 6},
      {"1x2", {9, 3, 1, 2, 2}, Status::Ok, 2, 6},
      {"1x3", {9, 3, 1, 3, 2}, Status::Ok, 3, 6},
      {"1x4", {9, 3, 1, 4, 2}, Status::Ok, 4, 6},
      {"2x1", {9, 3, 2, 1, 4}, Status::Ok, 2, 12},
      {"4x1", {9, 3, 4, 1, 6}, Status::Ok, 4, 18},
      {"8x1", {9, 3, 8, 1, 9}, Status::Ok, 8, 27},
      {"8x3", {9, 3, 8, 3, 9}, Status::Ok, 24, 81},
      {"1x5", {9, 3, 1, 5, 2}, Status::DamagedFile, 0, 0},
      {"2x2", {9, 3, 2, 2, 4}, Status::DamagedFile, 0, 0},
      {"8x4", {9, 3, 8, 4, 9}, Status::DamagedFile, 0, 0},
      {"no planes", {9, 3, 8, 0, 9}, Status::DamagedFile, 0, 0},
      {"no bits", {9, 3, 0, 1, 9}, Status::DamagedFile, 0, 0},
      {"no bytes per line", {9, 3, 8, 1, 0}, Status::DamagedFile, 0, 0},
      {"xmax before xmin", {0, 3, 8, 1, 9}, Status::DamagedFile, 0, 0},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const Bytes file = Pcx(row.header, "");
    const Decoded decoded = Describe(PcxInfo, file);
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(decoded.picture->fileSize, file.size());
    if (row.status != Status::Ok) {
      EXPECT_EQ(Decode(PcxRead, file).status, row.status);
      continue;
    }
    EXPECT_EQ(decoded.picture->width, 9);
    EXPECT_EQ(decoded.picture->height, 3);
    EXPECT_EQ(decoded.picture->bitsPerPixel, row.bitsPerPixel);
    EXPECT_EQ(decoded.picture->imageBytes, row.imageBytes);
    EXPECT_TRUE(decoded.picture->typeName.empty());
  }
  for (const Bytes& file : {Bytes(127, 10), Bytes(128, 0), Bytes()}) {
    EXPECT_EQ(Describe(PcxInfo, file).status, Status::DamagedFile);
    EXPECT_EQ(Decode(PcxRead, file).status, Status::DamagedFile);
  }
  PictureRecord picture;
  EXPECT_EQ(PcxInfo(picture, RequestFor("/nowhere/a.pcx")), Status::FileOpenError);
  EXPECT_EQ(PcxRead(picture, RequestFor("/nowhere/a.pcx")), Status::FileOpenError);
}

TEST(PcxInfo, PaletteByVersionAndDepth) {
  struct Row {
    const char* name;
    Bytes file;
    Bytes begin;  // of the palette
  };
  const std::string colors = "0C 111213 212223" + std::string(2 * 762, '9');
  const Row rows[] = {
      {"8 bits with a palette at the end", Pcx({1, 1, 8, 1, 1}, "00" + colors), Hex("111213 212223 999999")},
      {"8 bits, version 4", Pcx({1, 1, 8, 1, 1, 4}, "00" + colors), Hex("010203 040506 000000")},
      {"8 bits, version 3", Pcx({1, 1, 8, 1, 1, 3}, "00" + colors), Hex("000000 0000AA 00AA00")},
      {"8 bits without the mark", Pcx({1, 1, 8, 1, 1}, "00 0C" + colors + "00"), Hex("010203 040506 000000")},
      {"8 bits, too short for a palette at the end", Pcx({1, 1, 8, 1, 1}, "00"), Hex("010203 040506 000000")},
      {"4 bits, version 3", Pcx({1, 1, 4, 1, 1, 3}, "00"), Hex("000000 0000AA 00AA00 00AAAA AA0000 AA00AA AA5500")},
      {"4 bits, version 5", Pcx({1, 1, 4, 1, 1}, "00" + colors), Hex("010203 040506 000000")},
      {"2 bits in one plane, version 0", Pcx({1, 1, 2, 1, 1, 0}, "00"), Hex("010203 040506 000000")},
      {"1 bit", Pcx({1, 1, 1, 1, 1}, "00"), Hex("000000 FFFFFF 000000")},
      {"24 bits", Pcx({1, 1, 8, 3, 1}, "000000"), Hex("000000 000055 0000AA 0000FF 002400")},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    for (const Decoded& decoded : {Describe(PcxInfo, row.file), Decode(PcxRead, row.file)}) {
      EXPECT_EQ(decoded.status, Status::Ok);
      EXPECT_THAT(std::span(decoded.picture->palette).first(row.begin.size()), ElementsAreArray(row.begin));
    }
  }
}

// An 8-bit picture of one row.
PicturePointer OneRow(const Bytes& pixels, int32_t bitsPerPixel = 8) {
  PicturePointer picture = PatternPicture(static_cast<int32_t>(pixels.size()), 1, bitsPerPixel);
  for (size_t x = 0; x < pixels.size(); ++x)
    SetPixel(picture->image, static_cast<int32_t>(x), 0, pixels[x]);
  return picture;
}

TEST(PcxWrite, TokensOfOneLine) {
  struct Row {
    const char* name;
    Bytes plane;
    Bytes tokens;
  };
  const Row rows[] = {
      {"single", Hex("05"), Hex("05")},
      {"single of 0xC0", Hex("C0"), Hex("C1 C0")},
      {"single below", Hex("BF C5 BF"), Hex("BF C1 C5 BF")},
      {"two equal bytes", Hex("07 07"), Hex("C1 07 07")},
      {"four equal bytes, then another", Hex("07 07 07 07 09"), Hex("C3 07 07 09")},
      {"run of 0xFF", Hex("FF FF FF"), Hex("C2 FF C1 FF")},
      {"run at the end", Hex("01 09 09 09"), Hex("01 C2 09 09")},
      {"two runs", Hex("01 01 02 02 02"), Hex("C1 01 01 C2 02 02")},
      {"63 equal bytes", Bytes(63, 7), Hex("FE 07 07")},
      {"64 equal bytes", Bytes(64, 7), Hex("FF 07 07")},
      {"65 equal bytes", Bytes(65, 7), Hex("FF 07 C1 07 07")},
      {"127 equal bytes", Bytes(127, 7), Hex("FF 07 FF 07 07")},
      {"no sign of what follows the plane", Hex("00"), Hex("00")},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const Bytes file = Encode(PcxWrite, *OneRow(row.plane));
    ASSERT_EQ(file.size(), 128 + row.tokens.size() + 769);
    EXPECT_THAT(std::span(file).subspan(128, row.tokens.size()), ElementsAreArray(row.tokens));
  }
}

TEST(PcxWrite, WholeFiles) {
  const std::string zeros(2 * 58, '0');
  struct Row {
    const char* name;
    PicturePointer picture;
    Bytes begin;  // the header
    Bytes tokens;
    Bytes trailer;  // the palette
  };
  const Row rows[] = {
      {"1 bit",
       OneRow({1, 0, 1, 1, 1, 1, 1, 1, 1}, 1),
       Hex("0A 05 01 01  0000 0000 0800 0000  2C01 2C01  000000 FFFFFF" + std::string(84, '0') +
           "00 01 0200 0100" + zeros),
       Hex("BF 80"),
       {}},
      {"2 bits in 2 planes",
       OneRow({0, 1, 2, 3}, 2),
       Hex("0A 05 01 01  0000 0000 0300 0000  2C01 2C01  000000 000055 0000AA 0000FF 002400 002455 "
           "0024AA 0024FF"
           "004800 004855 0048AA 0048FF 006C00 006C55 006CAA 006CFF  00 02 0100 0100" +
           zeros),
       Hex("50 30"),
       {}},
      {"4 bits in 4 planes",
       OneRow({1, 2, 4, 8, 15, 0, 0, 0, 8}, 4),
       Hex("0A 05 01 01  0000 0000 0800 0000"),
       Hex("88 00 48 00 28 00 18 80"),
       {}},
      {"7 bits in one plane, odd line", OneRow({1, 2, 127}, 7),
       Hex("0A 05 01 08  0000 0000 0200 0000"), Hex("01 02 7F"), Hex("0C 000000 000055 0000AA")},
      {"24 bits",
       OneRow({1, 2}, 24),
       Hex("0A 05 01 08  0000 0000 0100 0000  2C01 2C01  000000 000055 0000AA 0000FF 002400 002455 "
           "0024AA 0024FF"
           "004800 004855 0048AA 0048FF 006C00 006C55 006CAA 006CFF  00 03 0200 0000" +
           zeros),
       Hex("C1 00 00 C1 00 00 01 02"),
       {}},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const Bytes file = Encode(PcxWrite, *row.picture);
    ASSERT_EQ(file.size(), 128 + row.tokens.size() + (row.trailer.empty() ? 0 : 769));
    EXPECT_THAT(std::span(file).first(row.begin.size()), ElementsAreArray(row.begin));
    EXPECT_THAT(std::span(file).subspan(128, row.tokens.size()), ElementsAreArray(row.tokens));
    EXPECT_THAT(std::span(file).subspan(128 + row.tokens.size()).first(row.trailer.size()), ElementsAreArray(row.trailer));
  }
}

TEST(PcxWrite, RefusesWhatItCannotStore) {
  struct Row {
    const char* name;
    int32_t width, height, bitsPerPixel;
    Status status;
  };
  const Row rows[] = {
      {"widest of 1 bit", 65536, 1, 1, Status::Ok},
      {"too wide for a line", 65536, 1, 8, Status::UnsuitableImage},
      {"highest", 1, 65536, 8, Status::Ok},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const PicturePointer picture = PatternPicture(row.width, row.height, row.bitsPerPixel);
    Status status = Status::Ok;
    const Bytes file = Encode(PcxWrite, *picture, &status);
    EXPECT_EQ(status, row.status);
    if (row.status == Status::Ok) {
      EXPECT_TRUE(SamePixels(Decode(PcxRead, file).picture->image, picture->image));
    }
  }
  Status status = Status::Ok;
  Encode(PcxWrite, *NewPictureRecord(), &status);
  EXPECT_EQ(status, Status::MemoryAllocationError);
}

}  // namespace
}  // namespace fotomill::test
