#include "metadata/exif/exif_walk.h"

#include <gmock/gmock.h>

#include "core/limits.h"
#include "support/exif_blocks.h"

namespace fotomill::test {
namespace {

using testing::ElementsAre;
using testing::SizeIs;
using Lines = std::vector<std::string>;

Lines LinesOf(const std::vector<uint8_t>& block, bool cutShort = false) {
  CollectedLines sink;
  ExifFindings findings;
  EXPECT_TRUE(WalkExif(block, &sink, &findings));
  EXPECT_EQ(findings.cutShort, cutShort);
  return sink.lines;
}

TEST(ExifWalk, FindsTheSameInBothByteOrders) {
  auto otherMark = BigEndianBlock();
  otherMark[0] = otherMark[1] = 'X';  // any mark but II is big-endian
  for (auto block : {BigEndianBlock(), LittleEndianBlock(), otherMark}) {
    CollectedLines all, one;
    ExifFindings findings;
    ASSERT_TRUE(WalkExif(block, &all, &findings));
    EXPECT_EQ(all.lines, LinesOf(LittleEndianBlock()));
    EXPECT_THAT(all.numbers, ElementsAre(0, 1, 2, 3));
    EXPECT_TRUE(WalkExif(block, &one, nullptr, 1));
    EXPECT_THAT(one.lines, ElementsAre("DIRECTORY IFD 1", "Compression scheme=JPEG",
                                       "Offset to JPEG SOI=122", "Bytes of JPEG data=4"));
    EXPECT_EQ(findings.exifOffset, 0x7eu);
    EXPECT_EQ(findings.gpsOffset, 0xb0u);
    EXPECT_THAT(ExifThumbnail(block, findings), ElementsAre(0xff, 0xd8, 0xff, 0xd9));
    EXPECT_THAT(ExifThumbnail(block, {0, 0, 0x7a, 0xce - 0x7a}), SizeIs(0xce - 0x7a));
    for (const ExifFindings& none :
         {ExifFindings{0, 0, 0, 4}, ExifFindings{0, 0, 0x7a, 0xce - 0x7a + 1},
          ExifFindings{0, 0, 0xffffffff, 1}, ExifFindings{0, 0, 8, 0xffffffff}}) {
      EXPECT_TRUE(ExifThumbnail(block, none).empty()) << none.thumbnailOffset;
    }
    block[2] ^= 1;
    EXPECT_FALSE(WalkExif(block, &one)) << "another magic number";
    EXPECT_THAT(one.lines, SizeIs(4));
  }
}

constexpr uint16_t kWidth = 0x0100, kExif = 0x8769, kGps = 0x8825;

// Consecutive directories: the first at offset 8, with 6 bytes plus 12 per entry.
struct Trap {
  const char* name;
  // entries, next directory
  std::vector<std::pair<std::vector<BlockBuilder::Entry>, uint32_t>> directories;
  Lines lines;
};

const Trap kTraps[] = {
    {"first directory beyond the block", {}, {}},
    {"an empty second directory ends the walk in front of EXIF",
     {{{{kExif, 4, 1, 44}, {kWidth, 3, 1, 5}}, 38}, {{}, 0}, {{{kWidth, 3, 1, 6}}, 0}},
     {"DIRECTORY IFD 0", "Exif tag=44", "Image width=5"}},
    {"a directory that links to itself", {{{{kWidth, 3, 1, 7}}, 8}}, {"DIRECTORY IFD 0", "Image width=7"}},
    {"EXIF pointer back to the first directory", {{{{kExif, 4, 1, 8}}, 0}}, {"DIRECTORY IFD 0", "Exif tag=8"}},
    {"only the first EXIF pointer counts, and GPS alone comes last",
     {{{{kExif, 4, 1, 50}, {kExif, 4, 1, 8}, {kGps, 4, 1, 68}}, 0}, {{{kWidth, 4, 1, 70000}}, 0}, {{{5, 1, 1, 1}}, 0}},
     {"DIRECTORY IFD 0", "Exif tag=50", "Exif tag=8", "GPS tag=68", "DIRECTORY EXIF", "Image width=70000", "DIRECTORY GPS",
      "Altitude reference=Sea level reference"}},
    {"a directory chained behind EXIF keeps the running number",
     {{{{kExif, 4, 1, 26}}, 0}, {{{kWidth, 3, 1, 1}}, 44}, {{{kWidth, 3, 1, 2}}, 0}},
     {"DIRECTORY IFD 0", "Exif tag=26", "DIRECTORY EXIF", "Image width=1", "DIRECTORY IFD 2", "Image width=2"}},
    {"values beyond the block are zero",
     {{{{0x011a, 5, 1, 0xffffffff}, {0x010f, 2, 0xffffffff, 0xfffffff0}, {0x0111, 4, 0xffffffff, 0x7fffffff}}, 0}},
     {"DIRECTORY IFD 0", "Image resolution for width=0.000",
      "Image input equipment manufacturer=", "Image data location=0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 ..."}},
};

TEST(ExifWalk, StaysInsideHostileBlocks) {
  for (const Trap& trap : kTraps) {
    SCOPED_TRACE(trap.name);
    BlockBuilder blocks;
    for (const auto& [entries, next] : trap.directories) blocks.Directory(entries, next);
    EXPECT_EQ(LinesOf(blocks.block), trap.lines);
  }
  BlockBuilder blocks;
  blocks.Directory({{kWidth, 3, 1, 1}});
  blocks.block[8] = blocks.block[9] = 0xff;
  EXPECT_THAT(LinesOf(blocks.block), ElementsAre("DIRECTORY IFD 0", "Image width=1")) << "65535 entries";
}

TEST(ExifWalk, TakesTheLastThumbnailTags) {
  BlockBuilder blocks;
  blocks.Directory({{0x0201, 4, 1, 8}, {0x0202, 4, 1, 9}}, 38);
  blocks.Directory({{0x0201, 3, 1, 0xabcd0004}, {0x0202, 4, 1, 2}});
  ExifFindings findings;
  ASSERT_TRUE(WalkExif(blocks.block, nullptr, &findings));
  EXPECT_EQ(findings.thumbnailOffset, 4u) << "a SHORT keeps its low 16 bits";
  EXPECT_EQ(findings.thumbnailSize, 2u);
}

TEST(ExifWalk, KeepsToItsLimitsAndReportsThem) {
  // Two directories of 40,000 entries: the walk ends with entry 65,536.
  BlockBuilder blocks;
  const std::vector<BlockBuilder::Entry> many(40000, {kWidth, 3, 1, 1});
  blocks.Directory(many, 8 + 6 + 12 * 40000);
  blocks.Directory(many);
  EXPECT_THAT(LinesOf(blocks.block, true), SizeIs(2 + 65536));

  // A chain of directories at different offsets.
  BlockBuilder chain;
  for (uint32_t i = 1; i <= 600; ++i) chain.Directory({{kWidth, 3, 1, 1}}, 8 + 18 * i);
  EXPECT_THAT(LinesOf(chain.block, true), SizeIs(2 * limits.exifDirectories));

  // One long text shared by many entries.
  BlockBuilder texts;
  const uint32_t text = texts.Bytes(std::vector<uint8_t>(10000, 'x'));
  texts.Patch32(4,
                texts.Directory(std::vector<BlockBuilder::Entry>(60000, {0x010f, 2, 10000, text})));
  const Lines lines = LinesOf(texts.block, true);
  uint64_t size = 0;
  for (const std::string& line : lines) size += line.size();
  EXPECT_EQ(lines[1].size(), std::string("Image input equipment manufacturer=").size() + limits.exifValueCharacters);
  EXPECT_LE(size, limits.exifTextBytes);
  EXPECT_GT(size, limits.exifTextBytes - 16384);
}

}  // namespace
}  // namespace fotomill::test
