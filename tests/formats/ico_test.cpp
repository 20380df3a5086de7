#include "formats/icon/ico.h"

#include <gtest/gtest.h>

#include "core/choice_lists.h"
#include "formats/png/png.h"
#include "settings/settings.h"
#include "support/codecs.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

// A directory with one entry for `picture`.
std::string OneIcon(const std::string& picture) {
  return "0000 0100 0100  02 01 00 00 0100 2000 FFFFFFFF 16000000 " + picture;
}
// A bitmap header for 2 x 1 pixels.
std::string Bitmap(const char* bits, const std::string& rest) {
  return std::string("28000000 02000000 02000000 0100 ") + bits +
         " 00000000 00000000 00000000 00000000 00000000 00000000 " + rest;
}

TEST(IcoRead, Entries) {
  struct Row {
    const char* name;
    std::string file;
    Status status;
    const char* pixels;
    const char* alpha;
  };
  const Row rows[] = {
      {"32 bits with alpha", OneIcon(Bitmap("2000", "01020380 04050600  00000000")), Status::Ok, "030201 060504", "128 0"},
      {"32 bits without alpha: the mask counts", OneIcon(Bitmap("2000", "01020300 04050600  40000000")), Status::Ok,
       "030201 060504", "255 0"},
      {"24 bits, opaque", OneIcon(Bitmap("1800", "010203 040506 0000  00000000")), Status::Ok, "030201 060504", ""},
      {"1 bit, opaque, keeps its palette", OneIcon(Bitmap("0100", "00000000 FFFFFF00  40000000  00000000")), Status::Ok, "0 1",
       ""},
      {"1 bit with a mask", OneIcon(Bitmap("0100", "00000000 0000FF00  40000000  80000000")), Status::Ok, "000000 FF0000",
       "0 255"},
      {"no mask", OneIcon(Bitmap("1800", "010203 040506 0000")), Status::Ok, "030201 060504", ""},
      {"no colors", OneIcon(Bitmap("1800", "010203")), Status::FileReadError, "", ""},
      {"a depth that cannot be", OneIcon(Bitmap("0300", "00")), Status::DamagedFile, "", ""},
      {"no entry", "0000 0100 0000", Status::NoImages, "", ""},
      {"the entry points nowhere", "0000 0100 0100  02 01 00 00 0100 2000 00000000 FFFF0000", Status::NoImages, "", ""},
      {"neither icon nor cursor", "0000 0300 0100", Status::DamagedFile, "", ""},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded decoded = Decode(IcoRead, Hex(row.file));
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(PixelText(decoded.picture->image), row.pixels);
    EXPECT_EQ(PixelText(decoded.picture->alpha), row.alpha);
  }
}

TEST(IcoRead, PrefersLargestThenDeepestAndSelectsPages) {
  const std::string small =
      "28000000 01000000 02000000 0100 1800 00000000 00000000 00000000 00000000 00000000 00000000 "
      "0A0B0C 00 00000000 ";                                                             // 48 bytes
  const std::string shallow = Bitmap("0100", "00000000 FFFFFF00  40000000  00000000 ");  // 56 bytes
  const std::string deep = Bitmap("1800", "010203 040506 0000  00000000 ");
  TemporaryFolder folder;
  WriteBytes(folder.Path("a.cur"), Hex("0000 0200 0300  01 01 00 00 0000 0000 30000000 36000000 "
                                       "02 01 00 00 0000 0000 38000000 66000000  02 01 00 00 0300 0400 34000000 9E000000 " +
                                       small + shallow + deep));
  const char* const pixels[] = {"030201 060504", "0 1", "0C0B0A"};
  for (int32_t page = 0; page < 3; ++page) {
    const PicturePointer picture = NewPictureRecord();
    ASSERT_EQ(IcoRead(*picture, {.fileName = folder.Path("a.cur"), .page = page}), Status::Ok);
    EXPECT_EQ(PixelText(picture->image), pixels[page]) << page;
    EXPECT_EQ(picture->pageCount, 3);
    EXPECT_EQ(picture->hotSpotY, page == 0 ? 4 : 0);
  }
}

// PNG entries of the same size: the directory has their depth.
TEST(IcoRead, PrefersTheDeepestOfEqualSizes) {
  const auto shallow = Encode(PngWrite, *PatternPicture(20, 20, 4)),
             deep = Encode(PngWrite, *PatternPicture(20, 20, 24));
  const auto entry = [](uint8_t bits, size_t size, size_t offset) {
    std::vector<uint8_t> bytes = {20, 20, 0, 0, 1, 0, bits, 0};
    for (const size_t value : {size, offset}) {
      for (int shift = 0; shift < 32; shift += 8)
        bytes.push_back(static_cast<uint8_t>(value >> shift));
    }
    return bytes;
  };
  std::vector<uint8_t> file = {0, 0, 1, 0, 2, 0};
  constexpr size_t kPictures = 6 + 2 * 16;
  for (const auto& part : {entry(4, shallow.size(), kPictures),
                           entry(32, deep.size(), kPictures + shallow.size()), shallow, deep}) {
    file.insert(file.end(), part.begin(), part.end());
  }
  const Decoded decoded = Decode(IcoRead, file);
  EXPECT_EQ(decoded.status, Status::Ok);
  EXPECT_EQ(decoded.picture->image.Bits(), 24);
}

TEST(IcoWrite, MaskAndPng) {
  const ScopedSettings scoped;
  settings.ICOCompression = choice::kIconBitmaps;
  const PicturePointer picture = PatternPicture(2, 1, 24);
  SetPixel(picture->image, 0, 0, 0x030201);
  SetPixel(picture->image, 1, 0, 0x060504);
  ASSERT_EQ(NewAlphaPlane(2, 1, picture->alpha), Status::Ok);
  picture->alpha.Row(0)[1] = 200;
  EXPECT_EQ(Encode(IcoWrite, *picture), Hex(R"(0000 0100 0100  02 01 00 00 0100 2000 34000000 16000000
      28000000 02000000 02000000 0100 2000 00000000 0C000000 00000000 00000000 00000000 00000000
      01020300 040506C8
      80000000   # the first pixel is transparent)"));
  settings.ICOCompression = choice::kIconPngAlways;
  const Bytes file = Encode(IcoWrite, *picture);
  EXPECT_EQ(Bytes(file.begin() + 22, file.begin() + 26), Hex("89504E47"));
  EXPECT_EQ(file[14] | file[15] << 8, static_cast<int>(file.size()) - 22);
  const Decoded back = Decode(IcoRead, file);
  ASSERT_EQ(back.status, Status::Ok);
  EXPECT_TRUE(SamePixels(picture->alpha, back.picture->alpha));
}

}  // namespace
}  // namespace fotomill::test
