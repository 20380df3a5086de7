#include "metadata/exif_source.h"

#include <gmock/gmock.h>

#include <algorithm>
#include <filesystem>

#include "core/limits.h"
#include "support/exif_blocks.h"
#include "support/files.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

Bytes operator+(Bytes left, const Bytes& right) {
  left.insert(left.end(), right.begin(), right.end());
  return left;
}

Bytes Of(std::string_view text) { return {text.begin(), text.end()}; }

Bytes Be(uint64_t number, int size) {
  Bytes bytes;
  for (int i = size - 1; i >= 0; --i) bytes.push_back(static_cast<uint8_t>(number >> (8 * i)));
  return bytes;
}

Bytes Segment(uint8_t marker, const Bytes& contents) { return Bytes{0xff, marker} + Be(contents.size() + 2, 2) + contents; }

Bytes PngChunk(std::string_view type, const Bytes& contents) {
  return Be(contents.size(), 4) + Of(type) + contents + Be(0, 4);
}

Bytes WebpChunk(std::string_view type, const Bytes& contents) {
  Bytes size = Be(contents.size(), 4);
  std::reverse(size.begin(), size.end());
  return Of(type) + size + contents + Bytes(contents.size() % 2, 0);
}

const Bytes kMark = Hex("45786966 0000");  // "Exif" and two zero bytes
const Bytes kStart = Hex("FFD8"), kScan = Hex("FFDA 0002");
const Bytes kPng = Hex("89504E47 0D0A1A0A");
const Bytes kWebp = Hex("52494646 00000000 57454250");

struct FileCase {
  const char* name;
  Bytes bytes;
  Bytes block;
};

std::vector<FileCase> Files() {
  const Bytes block = BigEndianBlock(), little = LittleEndianBlock();
  const Bytes far(20000, 0);      // more than the head that is read first
  const Bytes odd(3, 0), none;
  const Bytes whole = kStart + Segment(0xe1, kMark + block), cut(whole.begin(), whole.end() - 10);
  return {
      {"JPEG", kStart + Segment(0xe0, Bytes(14)) + Segment(0xe1, kMark + block) + kScan, block},
      {"JPEG with another APP1 first", kStart + Segment(0xe1, Of("http://ns.adobe.com/")) + Segment(0xe1, kMark + block), block},
      {"JPEG with fill bytes", kStart + Bytes{0xff, 0xff} + Segment(0xe1, kMark + block), block},
      {"JPEG, behind long segments", kStart + Segment(0xe2, far) + Segment(0xe2, far) + Segment(0xe1, kMark + block), block},
      {"JPEG, block across the head's end", kStart + Segment(0xe2, Bytes(16200)) + Segment(0xe1, kMark + block), block},
      {"JPEG, two blocks", kStart + Segment(0xe1, kMark + block) + Segment(0xe1, kMark + little), block},
      {"JPEG, APP1 behind the scan", kStart + kScan + Segment(0xe1, kMark + block), none},
      {"JPEG cut within the block", cut, Bytes(block.begin(), block.end() - 10)},
      {"JPEG cut within the mark", kStart + Hex("FFE1 0100 4578"), none},
      {"JPEG cut within a size", kStart + Hex("FFE1 01"), none},
      {"JPEG, segment of size 0", kStart + Hex("FFE1 0000") + Segment(0xe1, kMark + block), none},
      {"PNG", kPng + PngChunk("IHDR", Bytes(13)) + PngChunk("eXIf", block) + PngChunk("IEND", {}), block},
      {"PNG, behind the pixels", kPng + PngChunk("IDAT", far) + PngChunk("eXIf", little), little},
      {"PNG with a mark", kPng + PngChunk("eXIf", kMark + block), block},
      {"PNG, behind the end", kPng + PngChunk("IEND", {}) + PngChunk("eXIf", block), none},
      {"PNG, chunk beyond the file", kPng + Hex("FFFFFFFF") + Of("eXIf") + block, block},
      {"WebP", kWebp + WebpChunk("VP8X", Bytes(10)) + WebpChunk("EXIF", block), block},
      {"WebP, odd chunk in front, mark", kWebp + WebpChunk("VP8 ", odd) + WebpChunk("EXIF", kMark + little), little},
      {"WebP, far behind", kWebp + WebpChunk("VP8 ", far) + WebpChunk("EXIF", block), block},
      {"WebP without", kWebp + WebpChunk("VP8 ", odd), none},
      {"bare block, big-endian", block, block},
      {"bare block, little-endian", little, little},
      {"bare block with a mark", kMark + little, little},
      {"bare block longer than the head", little + far, little + far},
      {"bare block of another byte order mark", Hex("5858 002A 00000008 0000"), Hex("5858 002A 00000008 0000")},
      {"JPEG XR", Hex("4949 BC01 08000000 0000"), none},
      {"bitmap", Hex("424D 36000000 00000000 36000000"), none},
      {"two bytes", Hex("FFD8"), none},
      {"empty", {}, none},
  };
}

TEST(ExifSource, FindsTheBlockOfEveryKindOfFile) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("picture");
  ExifSource source;
  for (const FileCase& file : Files()) {
    SCOPED_TRACE(file.name);
    WriteBytes(path, file.bytes);
    ASSERT_EQ(source.Open(path.c_str()), Status::Ok);
    EXPECT_EQ(Bytes(source.Block().begin(), source.Block().end()), file.block);
  }
}

TEST(ExifSource, SurvivesFilesCutAnywhere) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("picture");
  ExifSource source;
  for (const FileCase& file : Files()) {
    SCOPED_TRACE(file.name);
    WriteBytes(path, file.bytes);
    for (size_t size = file.bytes.size(); size > 0;) {
      size -= size <= 64 ? 1 : std::min<size_t>(size - 64, size < 1024 ? 7 : 1001);
      std::filesystem::resize_file(path, size);
      ASSERT_EQ(source.Open(path.c_str()), Status::Ok);
      EXPECT_LE(source.Block().size(), size);
    }
  }
}

TEST(ExifSource, SaysWhatCannotBeOpened) {
  const TemporaryFolder folder;
  ExifSource source;
  EXPECT_EQ(source.Open(folder.Path("missing").c_str()), Status::FileOpenError);
  EXPECT_EQ(source.Open(folder.Path().c_str()), Status::FileOpenError);
}

TEST(ExifSource, RefusesABlockBeyondTheLimit) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("picture");
  WriteBytes(path, kPng + PngChunk("eXIf", LittleEndianBlock() + Bytes(20000)));
  const uint64_t usual = limits.metadataBytes;
  limits.metadataBytes = 1000;
  ExifSource source;
  EXPECT_EQ(source.Open(path.c_str()), Status::MemoryAllocationError);
  limits.metadataBytes = usual;
  EXPECT_EQ(source.Open(path.c_str()), Status::Ok);
}

}  // namespace
}  // namespace fotomill::test
