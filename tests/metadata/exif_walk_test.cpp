#include "metadata/exif_walk.h"

#include <gmock/gmock.h>

#include "core/limits.h"
#include "support/exif_blocks.h"

namespace fotomill::test {
namespace {

using testing::ElementsAre;
using testing::SizeIs;
using Lines = std::vector<std::string>;

Lines LinesOf(const std::vector<uint8_t>& block, int32_t only = kAllExifDirectories) {
  CollectedLines sink;
  EXPECT_TRUE(WalkExif(block, &sink, nullptr, only));
  return sink.lines;
}

const Lines kPictureLines = {
    "DIRECTORY IFD 0",
    "Image input equipment manufacturer=Acme",
    "Orientation of image=Bottom Left",
    "Exif tag=126",
    "GPS tag=176",
    "Unknown (50341)=1 2 3 4",
    "DIRECTORY IFD 1",
    "Compression scheme=JPEG",
    "Offset to JPEG SOI=122",
    "Bytes of JPEG data=4",
    "DIRECTORY EXIF",
    "Exposure time=0.017",
    "Exif version=0220",
    "Flash=Fire: Y Return: X Mode: A Function: P Redeye: N",
    "DIRECTORY GPS",
    "GPS tag version=2.2.0.0",
    "North or South latitude=South",
};

TEST(ExifWalk, ShowsTheSameLinesInBothByteOrders) {
  EXPECT_EQ(LinesOf(BigEndianBlock()), kPictureLines);
  EXPECT_EQ(LinesOf(LittleEndianBlock()), kPictureLines);
  auto otherMark = BigEndianBlock();
  otherMark[0] = otherMark[1] = 'X';
  EXPECT_EQ(LinesOf(otherMark), kPictureLines) << "any mark but II is big-endian";
}

TEST(ExifWalk, ShowsOneDirectoryOnly) {
  EXPECT_THAT(LinesOf(BigEndianBlock(), 1), ElementsAre("DIRECTORY IFD 1", "Compression scheme=JPEG",
                                                        "Offset to JPEG SOI=122", "Bytes of JPEG data=4"));
  EXPECT_THAT(LinesOf(BigEndianBlock(), 3), SizeIs(3));
  EXPECT_THAT(LinesOf(BigEndianBlock(), 4), SizeIs(0));
}

TEST(ExifWalk, FindsPointersAndThumbnailWithoutLines) {
  for (const auto& block : {BigEndianBlock(), LittleEndianBlock()}) {
    ExifFindings findings;
    ASSERT_TRUE(WalkExif(block, nullptr, &findings));
    EXPECT_EQ(findings.exifOffset, 0x7eu);
    EXPECT_EQ(findings.gpsOffset, 0xb0u);
    EXPECT_THAT(ExifThumbnail(block, findings), ElementsAre(0xff, 0xd8, 0xff, 0xd9));
    EXPECT_THAT(ExifThumbnail(block, {0, 0, 0x7a, 0xce - 0x7a}), SizeIs(0xce - 0x7a));
    for (const ExifFindings& none : {ExifFindings{0, 0, 0, 4}, ExifFindings{0, 0, 4, 0},
                                     ExifFindings{0, 0, 0x7a, 0xce - 0x7a + 1}, ExifFindings{0, 0, 0xffffffff, 1},
                                     ExifFindings{0, 0, 8, 0xffffffff}}) {
      EXPECT_TRUE(ExifThumbnail(block, none).empty()) << none.thumbnailOffset;
    }
  }
}

TEST(ExifWalk, RefusesOtherMagicNumbers) {
  CollectedLines sink;
  auto block = LittleEndianBlock();
  block[2] = 43;
  EXPECT_FALSE(WalkExif(block, &sink));
  EXPECT_FALSE(WalkExif({}, &sink));
  block.resize(2);
  EXPECT_FALSE(WalkExif(block, &sink));
  EXPECT_TRUE(sink.lines.empty());
}

TEST(ExifWalk, EndsCleanlyWhereverTheBlockIsCut) {
  for (const auto& block : {BigEndianBlock(), LittleEndianBlock()}) {
    for (size_t size = 4; size < block.size(); ++size) {
      SCOPED_TRACE(size);
      const std::vector<uint8_t> cut(block.begin(), block.begin() + static_cast<std::ptrdiff_t>(size));
      const Lines lines = LinesOf(cut);
      EXPECT_LE(lines.size(), kPictureLines.size());
    }
  }
}

constexpr uint16_t kWidth = 0x0100;

struct Trap {
  const char* name;
  void (*build)(BlockBuilder& blocks);
  Lines lines;
};

const Trap kTraps[] = {
    {"no directory", [](BlockBuilder& b) { b.Patch32(4, 0); }, {}},
    {"first directory beyond the block", [](BlockBuilder& b) { b.Patch32(4, 0xfffffffe); }, {}},
    {"no entries", [](BlockBuilder& b) { b.Directory({}); }, {}},
    {"an empty second directory ends the walk in front of EXIF",
     [](BlockBuilder& b) {
       const uint32_t first = b.Directory({{0x8769, 4, 1, 0}, {kWidth, 3, 1, 5}});
       b.Patch32(first + 10, b.Directory({{0x9000, 7, 4, 0x30323230}}));
       b.Patch32(b.LinkOf(first), b.Directory({}));
     },
     {"DIRECTORY IFD 0", "Exif tag=38", "Image width=5"}},
    {"a directory that links to itself", [](BlockBuilder& b) { b.Directory({{kWidth, 3, 1, 7}}, 8); },
     {"DIRECTORY IFD 0", "Image width=7"}},
    {"EXIF pointer back to the first directory", [](BlockBuilder& b) { b.Directory({{0x8769, 4, 1, 8}}); },
     {"DIRECTORY IFD 0", "Exif tag=8"}},
    {"only the first EXIF pointer counts, and GPS alone comes last",
     [](BlockBuilder& b) {
       const uint32_t first = b.Directory({{0x8769, 4, 1, 0}, {0x8769, 4, 1, 8}, {0x8825, 4, 1, 0}});
       b.Patch32(first + 10, b.Directory({{kWidth, 4, 1, 70000}}));
       b.Patch32(first + 34, b.Directory({{0x0005, 1, 1, 1}}));
     },
     {"DIRECTORY IFD 0", "Exif tag=50", "Exif tag=8", "GPS tag=68", "DIRECTORY EXIF", "Image width=70000",
      "DIRECTORY GPS", "Altitude reference=Sea level reference"}},
    {"a directory chained behind EXIF keeps the running number",
     [](BlockBuilder& b) {
       const uint32_t first = b.Directory({{0x8769, 4, 1, 0}});
       const uint32_t exif = b.Directory({{kWidth, 3, 1, 1}});
       b.Patch32(first + 10, exif);
       b.Patch32(b.LinkOf(exif), b.Directory({{kWidth, 3, 1, 2}}));
     },
     {"DIRECTORY IFD 0", "Exif tag=26", "DIRECTORY EXIF", "Image width=1", "DIRECTORY IFD 2", "Image width=2"}},
    {"a count that runs beyond the block ends with it",
     [](BlockBuilder& b) {
       b.Directory({{kWidth, 3, 1, 1}});
       b.block[8] = b.block[9] = 0xff;
     },
     {"DIRECTORY IFD 0", "Image width=1"}},
    {"values beyond the block are zero",
     [](BlockBuilder& b) {
       b.Directory({{0x011a, 5, 1, 0xffffffff}, {0x010f, 2, 0xffffffff, 0xfffffff0}, {0x0111, 4, 0xffffffff, 0x7fffffff}});
     },
     {"DIRECTORY IFD 0", "Image resolution for width=0.000", "Image input equipment manufacturer=",
      "Image data location=0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 ..."}},
    {"types that have no text give no line",
     [](BlockBuilder& b) {
       b.Directory({{kWidth, 0, 1, 1}, {kWidth, 12, 1, 1}, {kWidth, 4, 0, 1}, {0x927c, 7, 4, 1}, {0x9286, 7, 4, 1}});
     },
     {"DIRECTORY IFD 0"}},
};

TEST(ExifWalk, StaysInsideHostileBlocks) {
  for (const Trap& trap : kTraps) {
    SCOPED_TRACE(trap.name);
    BlockBuilder blocks;
    trap.build(blocks);
    EXPECT_EQ(LinesOf(blocks.block), trap.lines);
  }
}

TEST(ExifWalk, CountsDirectoriesWithTheirHeadings) {
  CollectedLines sink;
  ASSERT_TRUE(WalkExif(BigEndianBlock(), &sink));
  EXPECT_THAT(sink.numbers, ElementsAre(0, 1, 2, 3));
}

TEST(ExifWalk, TakesTheLastThumbnailTags) {
  BlockBuilder blocks;
  const uint32_t first = blocks.Directory({{0x0201, 4, 1, 8}, {0x0202, 4, 1, 9}});
  const uint32_t next = blocks.Directory({{0x0201, 3, 1, 0xabcd0004}, {0x0202, 4, 1, 2}});
  blocks.Patch32(blocks.LinkOf(first), next);
  ExifFindings findings;
  ASSERT_TRUE(WalkExif(blocks.block, nullptr, &findings));
  EXPECT_EQ(findings.thumbnailOffset, 4u) << "a SHORT keeps its low 16 bits";
  EXPECT_EQ(findings.thumbnailSize, 2u);
}

TEST(ExifWalk, KeepsToItsLimits) {
  // Two directories of 40,000 entries: the walk ends with entry 65,536.
  BlockBuilder blocks;
  const std::vector<BlockBuilder::Entry> many(40000, {kWidth, 3, 1, 1});
  const uint32_t first = blocks.Directory(many);
  blocks.Patch32(blocks.LinkOf(first), blocks.Directory(many));
  EXPECT_THAT(LinesOf(blocks.block), SizeIs(2 + 65536));

  // A chain of directories, each at an offset of its own.
  BlockBuilder chain;
  uint32_t previous = 0;
  for (int i = 0; i < 600; ++i) {
    const uint32_t offset = chain.Directory({{kWidth, 3, 1, 1}});
    if (previous != 0) chain.Patch32(chain.LinkOf(previous), offset);
    previous = offset;
  }
  EXPECT_THAT(LinesOf(chain.block), SizeIs(2 * limits.exifDirectories));

  // One long text that many entries share.
  BlockBuilder texts;
  const uint32_t text = texts.Bytes(std::vector<uint8_t>(10000, 'x'));
  texts.Patch32(4, texts.Directory(std::vector<BlockBuilder::Entry>(60000, {0x010f, 2, 10000, text})));
  const Lines lines = LinesOf(texts.block);
  EXPECT_EQ(lines[1].size(), std::string("Image input equipment manufacturer=").size() + limits.exifValueCharacters);
  uint64_t size = 0;
  for (const std::string& line : lines) size += line.size();
  EXPECT_LE(size, limits.exifTextBytes);
  EXPECT_GT(size, limits.exifTextBytes - 16384);
}

}  // namespace
}  // namespace fotomill::test
