#include <gtest/gtest.h>

#include <algorithm>
#include <sstream>

#include "containers/jpeg_segments.h"
#include "containers/png_chunks.h"
#include "containers/riff_chunks.h"
#include "core/limits.h"
#include "support/files.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

// Each part as its name, the offset of its data and their size; finally the status, if a
// walk has one.
template <uint64_t mostGarbage>
std::string JpegPartsOver(WalkedBytes file) {
  std::ostringstream list;
  JpegWalk walk(file, mostGarbage);
  for (JpegPlace part; walk.Next(part);) {
    list << std::hex << int{part.marker} << std::dec << '@' << part.data << '+'
         << part.end - part.data << ' ';
    EXPECT_LE(part.start + 2, part.data);
    const uint64_t behind = part.data < file.Size() ? file.Size() - part.data : 0;
    EXPECT_GE(part.first.size(), std::min<uint64_t>(behind, 12));
  }
  list << "= " << static_cast<int>(walk.Outcome());
  if (walk.Outcome() == Status::Ok) list << " at " << walk.Position();
  return list.str();
}

std::string PngParts(WalkedBytes file) {
  std::ostringstream list;
  PngWalk walk(file);
  for (PngPlace part; walk.Next(part);)
    list << part.type << '@' << part.data << '+' << part.size << ' ';
  list << "= " << static_cast<int>(walk.Outcome());
  return list.str();
}

std::string RiffParts(WalkedBytes file) {
  std::ostringstream list;
  RiffWalk walk(file);
  for (RiffPlace part; walk.Next(part);)
    list << part.name << '@' << part.data << '+' << part.size << ' ';
  return list.str();
}

constexpr auto JpegParts = JpegPartsOver<0>;
constexpr char kPng[] = "89504E470D0A1A0A ";

const struct {
  const char* name;
  std::string (*parts)(WalkedBytes);
  std::vector<uint8_t> file;
  const char* expected;
} kFiles[] = {
    {"JPEG: segments to the scan", JpegParts, Hex("FFD8  FFE0 0003 AA  FFFE 0002  FFDA 0002"),
     "e0@6+1 fe@11+0 = 0 at 11"},
    {"JPEG: fill bytes, also before the scan", JpegParts, Hex("FFD8  FFFFFFFE 0004 AABB  FFFFDA"),
     "fe@8+2 = 0 at 10"},
    {"JPEG: markers without a length", JpegParts, Hex("FFD8  FFD8 FF01 FFD0 FFD7  FFDA"),
     "d8@4+0 1@6+0 d0@8+0 d7@10+0 = 0 at 10"},
    {"JPEG: longest segment, all of it missing", JpegParts, Hex("FFD8  FFE1 FFFF"),
     "e1@6+65533 = 3"},
    {"JPEG: a length shorter than itself", JpegParts, Hex("FFD8  FFE1 0001 AA"), "= 2"},
    {"JPEG: no marker behind a segment", JpegParts, Hex("FFD8  FFE1 0002  00 FFDA"), "e1@6+0 = 2"},
    {"JPEG: a stuffed zero", JpegParts, Hex("FFD8  FF00 FFDA"), "= 2"},
    {"JPEG: its end before a scan", JpegParts, Hex("FFD8  FFD9"), "= 2"},
    {"JPEG: cut within fill bytes", JpegParts, Hex("FFD8  FFFFFF"), "= 3"},
    {"JPEG: cut within a length", JpegParts, Hex("FFD8  FFE0 00"), "= 3"},
    {"JPEG: another kind of file", JpegParts, Hex("FFD9  FFDA"), "= 2"},
    {"JPEG: as much garbage as allowed", JpegPartsOver<5>,
     Hex("FFD8  00FF00AA FFFE 0003 AA  FFFFDA"), "fe@10+1 = 0 at 11"},
    {"JPEG: a fill byte too many", JpegPartsOver<4>, Hex("FFD8  00FF00AA FFFE 0003 AA  FFFFDA"),
     "fe@10+1 = 2"},
    {"JPEG: more garbage than allowed", JpegPartsOver<3>, Hex("FFD8  00FF00AA FFFE 0003 AA  FFDA"),
     "= 2"},
    {"JPEG: a length that is too short, allowed", JpegPartsOver<3>, Hex("FFD8  FFFE 0001  FFDA"),
     "fe@6+0 = 0 at 6"},
    {"PNG: chunks to IEND", PngParts,
     Hex(kPng + std::string("00000001 49444154 AA 00000000  00000000 49454E44 00000000  00000000 "
                            "65584966 00000000")),
     "IDAT@16+1 IEND@29+0 = 0"},
    {"PNG: a chunk that claims all there could be", PngParts,
     Hex(kPng + std::string("FFFFFFFF 65584966 AA")), "eXIf@16+4294967295 = 3"},
    {"PNG: a type that is none", PngParts,
     Hex(kPng + std::string("00000000 49484452 00000000  00000000 49440054 00000000")),
     "IHDR@16+0 = 2"},
    {"PNG: cut within a type", PngParts, Hex(kPng + std::string("00000000 494844")), "= 3"},
    {"PNG: cut within the signature", PngParts, Hex("89504E47"), "= 3"},
    {"PNG: another kind of file", PngParts, Hex("8A4D4E470D0A1A0A"), "= 2"},
    {"RIFF: padding behind odd lengths", RiffParts,
     Hex("52494646 00000000 57454250  41414141 01000000 AA00  42424242 02000000 AABB"),
     "AAAA@20+1 BBBB@30+2 "},
    {"RIFF: a chunk longer than the file", RiffParts,
     Hex("52494646 00000000 57454250  41414141 FFFFFFFF AABB"), "AAAA@20+2 "},
    {"RIFF: cut within a head, padding missing", RiffParts,
     Hex("52494646 00000000 57454250  41414141 00000000  42424242 010000"), "AAAA@20+0 "},
};

TEST(ContainerWalks, FindTheSameInMemoryAndInAFile) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("file");
  for (const auto& row : kFiles) {
    SCOPED_TRACE(row.name);
    EXPECT_EQ(row.parts(std::span<const uint8_t>(row.file)), row.expected);
    WriteBytes(path, row.file);
    platform::FileView head;
    ASSERT_TRUE(head.OpenHead(path.c_str(), 3));
    EXPECT_EQ(row.parts(WalkedBytes(head)), row.expected);
  }
}

TEST(ContainerWalks, KeepToTheLimitOfOffsets) {
  const TemporaryFolder folder;
  WriteBytes(folder.Path("fill"), std::vector<uint8_t>(1000, 0xFF));
  platform::FileView head;
  ASSERT_TRUE(head.OpenHead(folder.Path("fill").c_str(), 8));
  WalkedBytes bytes(head);
  EXPECT_EQ(bytes.At(4, 4).size(), 4u);
  EXPECT_EQ(bytes.At(998, 4).size(), 2u);
  EXPECT_TRUE(bytes.At(1000, 1).empty());
  const uint32_t usual = limits.walkedPlaces;
  limits.walkedPlaces = 2;
  EXPECT_EQ(bytes.At(500, 16).size(), 16u);
  EXPECT_TRUE(bytes.At(501, 16).empty());
  limits.walkedPlaces = usual;
  EXPECT_FALSE(bytes.Failed());
}

TEST(ContainerWalks, OfOneRiffForm) {
  EXPECT_TRUE(IsRiff(Hex("52494646 FFFFFFFF 57454250"), "WEBP"));
  EXPECT_FALSE(IsRiff(Hex("52494646 FFFFFFFF 57415645"), "WEBP"));
  EXPECT_FALSE(IsRiff(Hex("52494646 57454250"), "WEBP"));
}

}  // namespace
}  // namespace fotomill::test
