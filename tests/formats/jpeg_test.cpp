#include "formats/jpeg/jpeg.h"

#include <gtest/gtest.h>

#include <cstdlib>

#include "core/choice_lists.h"
#include "settings/settings.h"
#include "support/codecs.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

// Smooth gradients, which JPEG preserves well.
PicturePointer SmoothPicture(int32_t width, int32_t height) {
  PicturePointer picture = PatternPicture(width, height, 24);
  for (int32_t y = 0; y < height; ++y) {
    for (int32_t x = 0; x < width; ++x) {
      SetPixel(picture->image, x, y,
               (x * 255 / width) << 16 | (y * 255 / height) << 8 | (255 - x * 255 / width));
    }
  }
  return picture;
}

int32_t LargestError(const PackedImage& a, const PackedImage& b) {
  int32_t largest = 0;
  for (int32_t y = 0; y < a.Height(); ++y) {
    for (int32_t x = 0; x < a.Width(); ++x) {
      for (const int32_t shift : {0, 8, 16}) {
        largest = std::max(
            largest, std::abs((a.PixelAt(x, y) >> shift & 255) - (b.PixelAt(x, y) >> shift & 255)));
      }
    }
  }
  return largest;
}

TEST(Jpeg, RoundTripsAreCloseInEveryVariant) {
  const ScopedSettings scoped;
  const PicturePointer picture = SmoothPicture(65, 49);
  settings.JpegCompression = 95;
  for (const int32_t sampling :
       {choice::kSubsample444, choice::kSubsample422, choice::kSubsample420}) {
    for (const int32_t progressive : {0, 1}) {
      SCOPED_TRACE(std::to_string(sampling) + (progressive != 0 ? " progressive" : ""));
      settings.JpegSubsample = sampling;
      settings.WriteJpegProgressive = progressive;
      const Decoded back = Decode(JpegRead, Encode(JpegWrite, *picture));
      ASSERT_EQ(back.status, Status::Ok);
      EXPECT_EQ(back.picture->typeName.view(), progressive != 0 ? "Progressive JPEG" : "JPEG");
      EXPECT_LE(LargestError(picture->image, back.picture->image), 16);
    }
  }
}

TEST(Jpeg, GraysStayGray) {
  const PicturePointer picture = PatternPicture(9, 5, 8);
  picture->palette = GrayRamp();
  const Decoded back = Decode(JpegRead, Encode(JpegWrite, *picture));
  ASSERT_EQ(back.status, Status::Ok);
  EXPECT_EQ(back.picture->bitsPerPixel, 8);
}

TEST(Jpeg, MetadataRoundTrips) {
  const ScopedSettings scoped;
  settings.JpegStoreDPI = 1;
  const PicturePointer picture = SmoothPicture(8, 8);
  picture->metadata.exif = Hex("49492A00 08000000 0000 00000000");
  picture->metadata.xmp = {'<', 'x', '/', '>'};
  picture->metadata.icc.resize(150000);  // three segments
  for (size_t i = 0; i < picture->metadata.icc.size(); ++i)
    picture->metadata.icc[i] = static_cast<uint8_t>(i * 7 >> 3);
  picture->metadata.dpiX = picture->metadata.dpiY = 200;
  picture->comment = {'h', 'i'};
  const Decoded back = Decode(JpegRead, Encode(JpegWrite, *picture));
  ASSERT_EQ(back.status, Status::Ok);
  EXPECT_EQ(back.picture->metadata.exif, picture->metadata.exif);
  EXPECT_EQ(back.picture->metadata.xmp, picture->metadata.xmp);
  EXPECT_EQ(back.picture->metadata.icc, picture->metadata.icc);
  EXPECT_EQ(back.picture->metadata.dpiX, 200);
  EXPECT_EQ(back.picture->comment, picture->comment);
}

TEST(Jpeg, TruncatedFilesFail) {
  const Bytes file = Encode(JpegWrite, *PatternPicture(64, 64, 24));
  const std::span<const uint8_t> whole(file);
  EXPECT_EQ(Decode(JpegRead, whole.first(file.size() / 2)).status, Status::FileReadError);
  EXPECT_EQ(Decode(JpegRead, whole.first(file.size() - 2)).status, Status::Ok) << "only the end marker is missing";
  EXPECT_EQ(Decode(JpegRead, whole.first(30)).status, Status::FileReadError);
  EXPECT_EQ(Decode(JpegRead, Hex("FFD8FFD9")).status, Status::DamagedFile);
  EXPECT_EQ(Decode(JpegRead, Hex("47494638")).status, Status::DamagedFile);
}

TEST(Jpeg, ReportsToleratedErrors) {
  Bytes file = Encode(JpegWrite, *PatternPicture(64, 64, 24));
  const size_t middle = file.size() * 3 / 4;
  file[middle] = 0xFF;
  file[middle + 1] = 0xD9;  // an end marker in the middle of the scan
  const Decoded back = Decode(JpegRead, file);
  EXPECT_EQ(back.status, Status::Ok);
  EXPECT_FALSE(back.picture->warning.empty());

  // An unknown marker is odd but harmless.
  Bytes odd = Encode(JpegWrite, *PatternPicture(64, 64, 24));
  const Bytes jfif = {'J', 'F', 'I', 'F', 0, 1};
  const auto version = std::search(odd.begin(), odd.end(), jfif.begin(), jfif.end()) + 5;
  *version = 7;
  const Decoded noted = Decode(JpegRead, odd);
  EXPECT_EQ(noted.status, Status::Ok);
  EXPECT_TRUE(noted.picture->warning.empty()) << noted.picture->warning.view();
  EXPECT_FALSE(noted.picture->note.empty());
}

// A file with one 8 x 8 block, where every component has a single value. Huffman codes: 0 for 7
// bits that follow, 10 for 8 bits, 110 for the value 128; each is followed by 0 for end of block.
Bytes OneBlock(const char* frame, const Bytes& scans) {
  Bytes file = Hex("FFD8  FFDB 0043 00");
  file.insert(file.end(), 64, 8);  // quantizers of 8, so that a coefficient is the value minus 128
  const Bytes tables =
      Hex("FFC4 0016 00 010101 00000000000000000000000000 070800"
          "FFC4 0014 10 01 000000000000000000000000000000 00");
  for (const Bytes& part : {tables, Hex(frame), scans, Hex("FFD9")})
    file.insert(file.end(), part.begin(), part.end());
  return file;
}

TEST(Jpeg, ConvertsCmykToRgb) {
  const struct {
    const char *name, *adobe, *data;
    int32_t color;
  } rows[] = {
      // Cyan 255, magenta 0, yellow and black 128.
      {"no marker, read like Adobe's", "", "7F4FECCF", 0x800040},
      {"Adobe's, 255 is no ink", "FFEE 000E 41646F6265 0064 0000 0000 00", "7F4FECCF", 0x800040},
      {"Adobe's as YCCK, all 128", "FFEE 000E 41646F6265 0064 0000 0000 02", "CCCC", 0x404040},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const std::string frame =
        std::string(row.adobe) + "FFC0 0014 08 0008 0008 04 011100 021100 031100 041100";
    const std::string scan = std::string("FFDA 000E 04 0100 0200 0300 0400 003F00") + row.data;
    const Decoded decoded = Decode(JpegRead, OneBlock(frame.c_str(), Hex(scan)));
    ASSERT_EQ(decoded.status, Status::Ok);
    EXPECT_EQ(decoded.picture->image.PixelAt(0, 0), row.color);
    EXPECT_EQ(decoded.picture->image.PixelAt(7, 7), row.color);
  }
}

// Every scan takes a pass over the picture, but only ten bytes.
TEST(Jpeg, RejectsEndlessScans) {
  for (const int count : {1, 400, 600}) {
    SCOPED_TRACE(count);
    Bytes scans;
    for (int i = 0; i < count; ++i) {
      const Bytes scan = Hex("FFDA 0008 01 0100 000000 DF");
      scans.insert(scans.end(), scan.begin(), scan.end());
    }
    const Bytes file = OneBlock("FFC2 000B 08 0008 0008 01 011100", scans);
    const Decoded decoded = Decode(JpegRead, file);
    EXPECT_EQ(decoded.status, count < 600 ? Status::Ok : Status::DamagedFile);
    EXPECT_EQ(decoded.picture->image.Empty(), count == 600);
  }
}

TEST(Jpeg, ThumbnailsDecodeAtTheSmallestSufficientSize) {
  TemporaryFolder folder;
  WriteBytes(folder.Path("a.jpg"), Encode(JpegWrite, *SmoothPicture(800, 600)));
  struct Row {
    int32_t side, width;
  };
  for (const Row& row :
       {Row{0, 800}, Row{96, 200}, Row{50, 100}, Row{10, 100}, Row{201, 800}, Row{200, 400}}) {
    SCOPED_TRACE(row.side);
    const PicturePointer picture = NewPictureRecord();
    ASSERT_EQ(JpegRead(*picture, {.fileName = folder.Path("a.jpg"), .thumbnailSide = row.side}), Status::Ok);
    EXPECT_EQ(picture->image.Width(), row.width);
    EXPECT_EQ(picture->width, 800);
  }
}

TEST(Jpeg, ReportsMetadataTooLargeForASegment) {
  const PicturePointer picture = PatternPicture(8, 8, 24);
  picture->metadata.exif.assign(70000, 1);
  picture->metadata.xmp.assign(70000, 'x');
  picture->metadata.icc.assign(70000, 2);  // needs two segments
  const Decoded back = Decode(JpegRead, Encode(JpegWrite, *picture));
  EXPECT_EQ(picture->lostMetadata, kLostExif | kLostXmp);
  EXPECT_TRUE(back.picture->metadata.exif.empty());
  EXPECT_EQ(back.picture->metadata.icc, picture->metadata.icc);
}

}  // namespace
}  // namespace fotomill::test
