#include "formats/pictor/pictor.h"

#include <gtest/gtest.h>

#include "formats/pictor/pegasus.h"
#include "formats/pictor/pic.h"
#include "formats/pictor/pictor_runs.h"
#include "support/codecs.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/pictures.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

Bytes Joined(std::initializer_list<Bytes> parts) {
  Bytes all;
  for (const Bytes& part : parts) all.insert(all.end(), part.begin(), part.end());
  return all;
}

TEST(PicRead, Pictor) {
  struct Row {
    const char* name;
    const char* file;
    Status status;
    const char* pixels;
  };
  const Row rows[] = {
      {"8 bits, plain, rows from the bottom", "3412 0200 0200 0000 0000 08 FF 4C 0000 0000 0000  01 02 03 04", Status::Ok, "3 4 / 1 2"},
      {"without a mark", "3412 0200 0100 0000 0000 08  0000  01 02", Status::Ok, "1 2"},
      {"a block", "3412 0400 0100 0000 0000 08 FF 4C 0000 0000 0100  0900 0400 77  77 03 05 06", Status::Ok, "5 5 5 6"},
      {"a long run over rows", "3412 0200 0200 0000 0000 08 FF 4C 0000 0000 0100  0A00 0400 77  77 00 0400 05", Status::Ok, "5 5 / 5 5"},
      {"two blocks", "3412 0200 0100 0000 0000 08 FF 4C 0000 0000 0200  0600 0100 77 01  0600 0100 01 02", Status::Ok, "1 2"},
      {"a marker of 0", "3412 0300 0100 0000 0000 08 FF 4C 0000 0000 0100  0900 0300 00  00 02 05 00", Status::FileReadError, ""},
      {"an empty block", "3412 0100 0100 0000 0000 08 FF 4C 0000 0000 0200  0500 0000 77  0600 0100 77 09", Status::Ok, "9"},
      {"a block shorter than its head", "3412 0100 0100 0000 0000 08 FF 4C 0000 0000 0200  0000 0000 77  0600 0100 77 09", Status::Ok, "9"},
      {"fewer blocks than bytes", "3412 0400 0100 0000 0000 08 FF 4C 0000 0000 0100  0600 0100 77 01", Status::FileReadError, ""},
      {"65535 x 65535 without data", "3412 FFFF FFFF 0000 0000 08 FF 4C 0000 0000 0000", Status::FileReadError, ""},
      {"a palette beyond the end", "3412 0100 0100 0000 0000 08 FF 4C 0400 0003 0000", Status::FileReadError, ""},
      {"no rows", "3412 0100 0000 0000 0000 08 FF 4C 0000 0000 0000 01", Status::DamagedFile, ""},
      {"three planes of 8 bits", "3412 0100 0100 0000 0000 28 FF 4C 0000 0000 0000 010203", Status::UnsupportedFormat, ""},
      {"a text screen", "3412 0100 0100 0000 0000 08 FF 31 0000 0000 0000 01", Status::UnsupportedFormat, ""},
      {"two planes of 1 bit", "3412 0300 0100 0000 0000 11 FF 4C 0000 0000 0000  A0 C0", Status::Ok, "3 2 1"},
      {"2 bits", "3412 0300 0100 0000 0000 02 FF 41 0000 0000 0000  E4", Status::Ok, "3 2 1"},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded decoded = Decode(PicRead, Hex(row.file));
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(PixelText(decoded.picture->image), row.pixels);
  }
}

TEST(PictorRuns, RoundTrip) {
  for (const size_t length : {size_t{1}, size_t{255}, size_t{256}, kPictorBlock}) {
    for (const int mask : {0xFF, 0x01, 0x00}) {
      SCOPED_TRACE(length);
      Bytes bytes = RandomBytes(length, 3);
      for (uint8_t& byte : bytes) byte = static_cast<uint8_t>(byte & mask);
      Bytes code;
      AppendPictorBlock(bytes, code);
      EXPECT_EQ(code[0] | code[1] << 8, static_cast<int>(code.size()));
      EXPECT_LE(code.size(), length + length / 64 + 16);
      Bytes back(length);
      PictorData data(code, 1);
      EXPECT_TRUE(data.Next(back));
      EXPECT_EQ(back, bytes);
    }
  }
}

TEST(PictorWrite, WhatDoesNotFit) {
  Status status = Status::Ok;
  EXPECT_TRUE(Encode(PictorWrite, *MakePicture(2, 2, 24), &status).empty());
  EXPECT_EQ(status, Status::TooManyColors);
}

// A gray JPEG stream of 8 x 8 equal pixels, without tables: its only coefficient is `difference`
// times the first quantizer.
Bytes BareStream(const char* codes, const char* frame = "C0") {
  Bytes stream = Hex("FFD8");
  if (*codes != 0) stream = Joined({stream, Hex("FFE1 0009 50494300"), Hex(codes)});
  // the code in T.81, K.3 for 3 luma bits is 100; 4 follows as 100, and 1010 ends the block
  return Joined({stream, Hex("FF"), Hex(frame), Hex("000B 08 0008 0008 01 01 11 00"),
                 Hex("FFDA 0008 01 01 00 00 3F 00"), Hex("92 BF FFD9")});
}

Bytes Bitmap(const Bytes& stream, uint8_t offset, const char* compression) {
  Bytes head = Hex("424D 00000000 00000000");
  head = Joined(
      {head, {offset, 0, 0, 0}, Hex("44000000 08000000 08000000 0100 0800"), Hex(compression)});
  head.resize(82);
  return Joined({head, stream});
}

TEST(PicRead, Pegasus) {
  struct Row {
    const char* name;
    Bytes file;
    Status status;
    int32_t gray;  // 128 + 4 x 16 x code / 32 / 8
  };
  const Row rows[] = {
      {"the table as it is", Bitmap(BareStream("002020"), 82, "4A504547"), Status::Ok, 136},
      {"twice", Bitmap(BareStream("004020"), 82, "4A504547"), Status::Ok, 144},
      {"half, and the other code does not count", Bitmap(BareStream("0010FF"), 82, "4A504547"), Status::Ok, 132},
      {"no step is below 1", Bitmap(BareStream("000000"), 82, "4A504547"), Status::Ok, 129},
      {"with a wrong offset", Bitmap(BareStream("002020"), 14, "4A504547"), Status::Ok, 136},
      {"without the head of a bitmap", BareStream("002020"), Status::Ok, 136},
      {"without codes", Bitmap(BareStream(""), 82, "4A504547"), Status::DamagedFile, 0},
      {"of the maker's own coder", Bitmap(BareStream("002020"), 82, "50494320"), Status::UnsupportedFormat, 0},
      {"coded arithmetically", Bitmap(BareStream("002020", "C9"), 82, "4A504547"), Status::UnsupportedFormat, 0},
      {"a real bitmap", Bitmap({}, 82, "00000000"), Status::DamagedFile, 0},
      {"without a stream", Bitmap({}, 82, "4A504547"), Status::DamagedFile, 0},
      {"its head alone", Hex("424D 0000"), Status::FileReadError, 0},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded decoded = Decode(PicRead, row.file);
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(Describe(PicInfo, row.file).status, row.status == Status::DamagedFile && row.gray == 0 && std::string_view(row.name) == "without codes" ? Status::Ok : row.status);
    if (row.status == Status::Ok) {
      EXPECT_EQ(decoded.picture->image.PixelAt(3, 3), row.gray);
    } else {
      EXPECT_TRUE(decoded.picture->image.Empty());
    }
  }
}

}  // namespace
}  // namespace fotomill::test
