#include "metadata/exif/exif_source.h"

#include <gtest/gtest.h>

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
Bytes Size16(size_t size) { return {static_cast<uint8_t>(size >> 8), static_cast<uint8_t>(size)}; }

Bytes Segment(uint8_t marker, const Bytes& contents) {
  return Bytes{0xff, marker} + Size16(contents.size() + 2) + contents;
}
Bytes PngChunk(std::string_view type, const Bytes& contents) {
  return Bytes(2) + Size16(contents.size()) + Of(type) + contents + Bytes(4);
}
Bytes WebpChunk(std::string_view type, const Bytes& contents) {
  const Bytes size = Size16(contents.size());
  return Of(type) + Bytes{size[1], size[0], 0, 0} + contents + Bytes(contents.size() % 2);
}

TEST(ExifSource, FindsTheBlockInEveryFormat) {
  const Bytes block = BigEndianBlock(), little = LittleEndianBlock(), none;
  const Bytes mark = Hex("45786966 0000"), far(20000);  // beyond the head that is read first
  const Bytes start = Hex("FFD8"), app1 = Segment(0xe1, mark + block), scan = Hex("FFDA 0002");
  const Bytes png = Hex("89504E47 0D0A1A0A"), webp = Hex("52494646 00000000 57454250");
  const struct {
    const char* name;
    Bytes bytes, block;
  } files[] = {
      {"JPEG, another APP1 first", start + Segment(0xe1, Of("http://ns.adobe.com/")) + app1 + scan, block},
      {"JPEG, fill bytes", start + Bytes{0xff, 0xff} + app1, block},
      {"JPEG, behind long segments", start + Segment(0xe2, far) + Segment(0xe2, far) + app1, block},
      {"JPEG, block across the head's end", start + Segment(0xe2, Bytes(16200)) + app1, block},
      {"JPEG, two blocks", start + app1 + Segment(0xe1, mark + little), block},
      {"JPEG, APP1 behind the scan", start + scan + app1, none},
      {"JPEG cut within the mark", start + Hex("FFE1 0100 4578"), none},
      {"JPEG, segment of size 0", start + Hex("FFE1 0000") + app1, none},
      {"PNG", png + PngChunk("IHDR", Bytes(13)) + PngChunk("eXIf", block) + PngChunk("IEND", {}), block},
      {"PNG, behind the pixels, mark", png + PngChunk("IDAT", far) + PngChunk("eXIf", mark + little), little},
      {"PNG, behind the end", png + PngChunk("IEND", {}) + PngChunk("eXIf", block), none},
      {"PNG, chunk beyond the file", png + Hex("FFFFFFFF") + Of("eXIf") + block, block},
      {"WebP, odd chunk in front, mark", webp + WebpChunk("VP8 ", Bytes(3)) + WebpChunk("EXIF", mark + little), little},
      {"WebP, far behind", webp + WebpChunk("VP8 ", far) + WebpChunk("EXIF", block), block},
      {"bare block", block, block},
      {"bare block longer than the head, mark", mark + little + far, little + far},
      {"bare block of another byte order mark", Hex("5858 002A 00000008 0000"), Hex("5858 002A 00000008 0000")},
      {"JPEG XR", Hex("4949 BC01 08000000 0000"), none},
      {"bitmap", Hex("424D 36000000 00000000 36000000"), none},
      {"empty", {}, none},
  };
  const TemporaryFolder folder;
  const std::string path = folder.Path("picture");
  ExifSource source;
  for (const auto& file : files) {
    SCOPED_TRACE(file.name);
    WriteBytes(path, file.bytes);
    ASSERT_EQ(source.Open(path.c_str()), Status::Ok);
    EXPECT_EQ(Bytes(source.Block().begin(), source.Block().end()), file.block);
    for (size_t size = file.bytes.size(); size > 0;) {  // no failure wherever it is truncated
      size -= size <= 64 ? 1 : std::min<size_t>(size - 64, size < 1024 ? 7 : 1001);
      std::filesystem::resize_file(path, size);
      ASSERT_EQ(source.Open(path.c_str()), Status::Ok);
      EXPECT_LE(source.Block().size(), size);
    }
  }
}

TEST(ExifSource, ReportsReadErrors) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("picture");
  ExifSource source;
  EXPECT_EQ(source.Open(path.c_str()), Status::FileOpenError);
  EXPECT_EQ(source.Open(folder.Path().c_str()), Status::FileOpenError);
  WriteBytes(path, Hex("89504E47 0D0A1A0A") + PngChunk("eXIf", LittleEndianBlock() + Bytes(20000)));
  const uint64_t usual = limits.metadataBytes;
  limits.metadataBytes = 1000;
  EXPECT_EQ(source.Open(path.c_str()), Status::MemoryAllocationError);
  limits.metadataBytes = usual;
  EXPECT_EQ(source.Open(path.c_str()), Status::Ok);
}

}  // namespace
}  // namespace fotomill::test
