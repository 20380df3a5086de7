#include "containers/exif_directories.h"

#include <gtest/gtest.h>

#include "formats/hdphoto/hdp.h"
#include "formats/tiff/tiff.h"
#include "metadata/exif/exif_source.h"
#include "support/codecs.h"
#include "support/exif_blocks.h"
#include "support/files.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

std::vector<std::string> LinesOf(const std::vector<uint8_t>& block) {
  CollectedLines sink;
  WalkExif(block, &sink);
  // Offsets and layouts of directories may differ.
  std::erase_if(sink.lines,
                [](const std::string& line) { return line.find(" tag=") != std::string::npos; });
  return sink.lines;
}

// Lines about the picture: without IFD0's layout tags and without the thumbnail.
std::vector<std::string> PictureLines(const std::vector<uint8_t>& block) {
  return LinesOf(MakeExifBlock(ParseExifBlock(block)));
}

TEST(ExifDirectories, RoundTripThroughFiles) {
  struct Row {
    const char* name;
    WriteOperation write;
    ReadOperation read;
  };
  for (const Row& row : {Row{"TIFF", TiffWrite, TiffRead}, Row{"HD Photo", HdpWrite, HdpRead}}) {
    if (row.write == HdpWrite && !HdpWorksHere()) continue;
    for (const auto& block : {BigEndianBlock(), LittleEndianBlock()}) {
      SCOPED_TRACE(row.name);
      const PicturePointer picture = PatternPicture(20, 10, 24);
      picture->metadata.exif = block;
      const Decoded back = Decode(row.read, Encode(row.write, *picture));
      ASSERT_EQ(back.status, Status::Ok);
      EXPECT_EQ(picture->lostMetadata, 0);
      EXPECT_EQ(PictureLines(back.picture->metadata.exif), PictureLines(block));
      const TemporaryFolder folder;  // without decoding
      WriteBytes(folder.Path("picture"), Encode(row.write, *picture));
      ExifSource source;
      ASSERT_EQ(source.Open(folder.Path("picture").c_str()), Status::Ok);
      EXPECT_EQ(PictureLines({source.Block().begin(), source.Block().end()}), PictureLines(block));
      EXPECT_EQ(PictureLines(block).size(), 10u);
    }
    const PicturePointer broken = PatternPicture(20, 10, 24);
    broken->metadata.exif = Hex("4D4D 002B 00000008 0001");
    EXPECT_FALSE(Encode(row.write, *broken).empty());
    EXPECT_EQ(broken->lostMetadata, kLostExif);
  }
}

TEST(ExifDirectories, ReadsDamagedBlocksPartially) {
  const std::vector<uint8_t> block = BigEndianBlock();
  for (size_t length = 0; length < block.size(); ++length) {
    const ExifDirectories directories = ParseExifBlock(std::span(block).first(length));
    (void)PlaceExif(directories, 8);
    const std::vector<uint8_t> made = MakeExifBlock(directories);
    EXPECT_EQ(MakeExifBlock(ParseExifBlock(made)), made) << length;
  }
  // A value that overlaps its entry, a directory that links to itself, a count beyond any file.
  EXPECT_TRUE(ParseExifBlock(Hex("4949 2A00 08000000 0100 0F01 0200 FFFFFFFF FFFFFFFF")).first.empty());
  EXPECT_EQ(ParseExifBlock(Hex("4949 2A00 08000000 0100 6987 0400 01000000 08000000 00000000")).exif.size(), 0u);
}

}  // namespace
}  // namespace fotomill::test
