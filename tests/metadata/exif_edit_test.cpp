#include "metadata/exif/exif_edit.h"

#include <gmock/gmock.h>

#include "support/exif_blocks.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

using testing::Contains;
using testing::ElementsAre;
using Bytes = std::vector<uint8_t>;

std::vector<std::string> LinesOf(const Bytes& block) {
  CollectedLines sink;
  WalkExif(block, &sink);
  return sink.lines;
}

Bytes ThumbnailOf(const Bytes& block) {
  ExifFindings findings;
  WalkExif(block, nullptr, &findings);
  const auto bytes = ExifThumbnail(block, findings);
  return {bytes.begin(), bytes.end()};
}

constexpr BlockBuilder::Entry kOrientation6 = {0x0112, 3, 1, 6};

TEST(ExifEdit, ReadsTheOrientation) {
  EXPECT_EQ(ExifOrientation(BigEndianBlock()), 3);
  const struct {
    const char* name;
    std::vector<BlockBuilder::Entry> entries;
    int32_t orientation;
  } rows[] = {
      {"none", {{0x0100, 3, 1, 6}}, 1},
      {"0", {{0x0112, 3, 1, 0}}, 1},
      {"9", {{0x0112, 3, 1, 9}}, 1},
      {"as LONG", {{0x0112, 4, 1, 8}}, 8},
      {"as BYTE", {{0x0112, 1, 1, 5}}, 5},
      {"first of two", {kOrientation6, {0x0112, 3, 1, 2}}, 6},
      {"far away", {{0x0112, 3, 3, 0x7fffffff}}, 1},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    BlockBuilder blocks;
    blocks.Directory(row.entries);
    EXPECT_EQ(ExifOrientation(blocks.block), row.orientation);
    blocks.block.resize(blocks.block.size() - 4);  // the link after the entries is missing
    EXPECT_EQ(ExifOrientation(blocks.block), row.orientation);
  }
}

TEST(ExifEdit, SetsFactsInPlace) {
  for (const bool bigEndian : {true, false}) {
    Bytes block = bigEndian ? BigEndianBlock() : LittleEndianBlock(), expected = block;
    SetExifPictureFacts(block, {640, 480, 1});
    expected[bigEndian ? 0x1f : 0x1e] = 1;  // there was nothing else to set
    EXPECT_EQ(block, expected);
  }
  BlockBuilder blocks;
  blocks.Directory({{0x0100, 3, 1, 10}, {0x0101, 4, 1, 20}, kOrientation6, {0x8769, 4, 1, 62}});
  blocks.Directory({{0xa002, 3, 1, 10}, {0xa003, 5, 1, 0x100}});
  SetExifPictureFacts(blocks.block, {70000, 300, 0});
  EXPECT_THAT(LinesOf(blocks.block),
              ElementsAre("DIRECTORY IFD 0", "Image width=70000", "Image height=300",
                          "Orientation of image=Right Top", "Exif tag=62", "DIRECTORY EXIF",
                          "Valid image width=70000", "Valid image height=300"));
}

TEST(ExifEdit, DropsTheThumbnail) {
  for (Bytes block : {BigEndianBlock(), LittleEndianBlock()}) {
    auto lines = LinesOf(block);
    DropExifThumbnail(block);
    lines.erase(lines.begin() + 6, lines.begin() + 10);  // the second directory and nothing else
    EXPECT_EQ(LinesOf(block), lines);
    for (size_t i = 0x50; i < 0x7e; ++i)
      EXPECT_EQ(block[i], 0) << "nothing of it stays behind, offset " << i;
    const Bytes once = block;
    DropExifThumbnail(block);
    EXPECT_EQ(block, once);
  }
}

TEST(ExifEdit, CutsOffAThumbnailAtTheEnd) {
  BlockBuilder blocks;
  blocks.Directory({kOrientation6, {0x830e, 12, 1, 38}}, 46);
  blocks.Bytes(Hex("03 00 00 00 00 00 00 00"));  // a DOUBLE that ends in zeros
  const Bytes rest = blocks.block;
  blocks.Directory({{0x0201, 4, 1, 76}, {0x0202, 4, 1, 100}});
  blocks.Bytes(Bytes(100, 0xee));
  DropExifThumbnail(blocks.block);
  EXPECT_EQ(blocks.block.size(), rest.size());
  EXPECT_EQ(LinesOf(blocks.block), LinesOf(rest));
}

TEST(ExifEdit, DroppingTheThumbnailSparesOverlappingData) {
  // The thumbnail claims the whole block, and its directory shares the offset of the EXIF directory
  // and links to itself.
  BlockBuilder blocks;
  blocks.Directory({kOrientation6, {0x8769, 4, 1, 38}}, 38);
  blocks.Directory({{0xa002, 3, 1, 10}, {0x0201, 4, 1, 8}, {0x0202, 4, 1, 0xffffffff}}, 38);
  DropExifThumbnail(blocks.block);
  EXPECT_THAT(LinesOf(blocks.block), Contains("Valid image width=10"));
  EXPECT_THAT(LinesOf(blocks.block), Contains("Orientation of image=Right Top"));
}

TEST(ExifEdit, ReplacesTheThumbnail) {
  const Bytes small(10, 0xaa), large(3000, 0xbb);
  BlockBuilder plain;  // without any before
  plain.Directory({kOrientation6});
  for (Bytes block : {BigEndianBlock(), LittleEndianBlock(), plain.block}) {
    const int32_t orientation = ExifOrientation(block);
    for (const Bytes& thumbnail : {large, small, large}) {
      ASSERT_TRUE(ReplaceExifThumbnail(block, thumbnail, 65527));
      EXPECT_EQ(ThumbnailOf(block), thumbnail);
      EXPECT_THAT(LinesOf(block), Contains("Compression scheme=JPEG"));
      EXPECT_THAT(LinesOf(block), Contains("Image resolution for width=72.000"));
      EXPECT_EQ(ExifOrientation(block), orientation);
    }
    EXPECT_LT(block.size(), 0xceu + 100 + large.size()) << "the room of the one before is used again";
    EXPECT_FALSE(ReplaceExifThumbnail(block, large, 3000));
    EXPECT_TRUE(ThumbnailOf(block).empty());
  }
}

TEST(ExifEdit, LeavesInvalidBlocksAlone) {
  for (const char* hex :
       {"", "4949", "4949 2B00 08000000 0100 0001 0300 01000000 05000000 00000000",
        "4949 2A00 00000000", "4949 2A00 08000000", "4949 2A00 08000000 0000 00000000",
        "4949 2A00 FEFFFFFF 0100",
        "4949 2A00 04000000 0100 0001 0300 01000000 05000000 00000000"}) {
    SCOPED_TRACE(hex);
    Bytes block = Hex(hex);
    SetExifPictureFacts(block, {1, 1, 1});
    DropExifThumbnail(block);
    EXPECT_FALSE(ReplaceExifThumbnail(block, Bytes(4, 1), 65527));
    EXPECT_EQ(block, Hex(hex));
    EXPECT_EQ(ExifOrientation(block), 1);
  }
}

}  // namespace
}  // namespace fotomill::test
