#include "registry/signature.h"

#include <gtest/gtest.h>

#include "support/files.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

std::vector<uint8_t> Behind(size_t zeros, const std::vector<uint8_t>& bytes) {
  std::vector<uint8_t> all(zeros);
  all.insert(all.end(), bytes.begin(), bytes.end());
  return all;
}

TEST(Signature, IdentifiesFilesByContents) {
  const struct {
    std::vector<uint8_t> head;
    const char* name;
  } rows[] = {
      {Hex("89 50 4E 47 0D 0A 1A 0A 00 00 00 0D"), "PNG"},
      {Hex("00 00 00 20  66 74 79 70  61 76 69 66  00 00 00 00"), "AVIF"},
      {Hex("00 00 00 18  66 74 79 70  68 65 69 63"), "HEIC"},
      {Hex("00 00 00 18  66 74 79 70  69 73 6F 6D"), "MP4"},  // any other brand
      {Hex("52 49 46 46  00 00 00 00  57 45 42 50"), "WebP"},
      {Hex("52 49 46 46  00 00 00 00  58 58 58 58"), ""},         // a container of something else
      {Hex("49 49 2A 00 10 00 00 00 43 52 02 00"), "Canon CR2"},  // also has a TIFF signature
      {Hex("49 49 2A 00 08 00 00 00"), "TIFF"},
      {Hex("49 49 55 00 18 00 00 00"), "Panasonic RW2"},
      {Behind(522, Hex("00 11 02 FF 0C 00")), "a Macintosh picture"},
      {Behind(521, Hex("00 11 02 FF 0C 00")), ""},
      {Hex("42 4D 36 10 0E 00 00 00 00 00 36 00"), "BMP"},
      {Hex("42 4D 36 10 0E 00 01 00 00 00 36 00"), ""},  // nonzero reserved fields: text
      {Hex("42 4D"), ""},                                // too short
      {Hex("0A 05 01 08"), "PCX"},
      {Hex("FF 0A 00"), "JPEG XL"},
      {{}, ""},
      {Hex("00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00"), ""},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    EXPECT_EQ(IdentifySignature(row.head).name, row.name);
  }
}

TEST(Signature, NamesTheMatchingRows) {
  const struct {
    std::vector<uint8_t> head;
    std::vector<std::string_view> extensions;
  } rows[] = {
      {Hex("FF D8 FF E0"), {"JPG", "JFI", "JFIF", "JPE", "JPEG", "PIC", "KQP"}},
      {Hex("00 00 02 00 01 00"), {"CUR", "ICO"}},
      {Hex("00 00 00 00 12 AF"), {"FLC", "FLI"}},
      {Hex("49 49 2A 00 10 00 00 00 43 52 02 00"), {"CR2"}},  // plug-ins only, though TIFF
      {Hex("42 4D 36 10 0E 00 00 00 00 00 36 00"), {"BMP", "DIB", "RLE", "BGA"}},
  };
  for (const auto& row : rows) EXPECT_EQ(IdentifySignature(row.head).extensions, row.extensions);
}

TEST(Signature, OfFiles) {
  const TemporaryFolder folder;
  WriteBytes(folder.Path("x.bin"), Hex("47 49 46 38 39 61"));
  EXPECT_EQ(IdentifyFile(folder.Path("x.bin")).name, "GIF");
  WriteBytes(folder.Path("drawing.pict"), Behind(522, Hex("00 11 02 FF 0C 00")));
  EXPECT_EQ(IdentifyFile(folder.Path("drawing.pict")).name, "a Macintosh picture");
  EXPECT_EQ(IdentifyFile(folder.Path("none")).name, "");
  EXPECT_EQ(IdentifyFile(folder.Path()).name, "");
}

}  // namespace
}  // namespace fotomill::test
