#include "formats/cals/t6_coding.h"

#include <gtest/gtest.h>
#include <tiffio.h>

#include <cstring>

#include "support/files.h"
#include "support/hex.h"
#include "support/pictures.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

struct Picture {
  const char* name;
  int32_t width, height;
  Bytes rows;  // (width + 7) / 8 bytes each
};

size_t RowBytes(const Picture& picture) { return static_cast<size_t>(picture.width + 7) / 8; }

Picture Noise(const char* name, int32_t width, int32_t height, int32_t sparse) {
  Picture picture{name, width, height, {}};
  picture.rows = RandomBytes(RowBytes(picture) * static_cast<size_t>(height), 7);
  for (int32_t i = 0; i < sparse; ++i) {
    const Bytes more = RandomBytes(picture.rows.size(), static_cast<uint32_t>(20 + i));
    for (size_t k = 0; k < more.size(); ++k) picture.rows[k] &= more[k];
  }
  if (width % 8 != 0) {
    for (size_t k = RowBytes(picture) - 1; k < picture.rows.size(); k += RowBytes(picture)) {
      picture.rows[k] &= static_cast<uint8_t>(0xff << (8 - width % 8));
    }
  }
  return picture;
}

// Long runs of both colors that shift slightly from row to row.
Picture Bars(int32_t width, int32_t height) {
  Picture picture{"bars", width, height, {}};
  picture.rows.resize(RowBytes(picture) * static_cast<size_t>(height));
  for (int32_t y = 0; y < height; ++y) {
    for (int32_t x = 0; x < width; ++x) {
      if ((x + y * y % 11) / (70 + 900 * (y % 3)) % 2 == 0) continue;
      picture.rows[static_cast<size_t>(y) * RowBytes(picture) + static_cast<size_t>(x / 8)] |=
          static_cast<uint8_t>(0x80 >> x % 8);
    }
  }
  return picture;
}

std::vector<Picture> Pictures() {
  Picture white{"white", 100, 3, Bytes(39)}, black{"black", 64, 3, Bytes(24, 0xff)};
  return {white,
          black,
          Noise("one pixel", 1, 9, 0),
          Noise("noise", 203, 40, 0),
          Noise("few dots", 3001, 30, 4),
          Bars(7000, 24)};
}

Bytes Encoded(const Picture& picture) {
  T6Encoder encoder(picture.width);
  for (size_t at = 0; at < picture.rows.size(); at += RowBytes(picture)) {
    encoder.EncodeRow(std::span(picture.rows).subspan(at, RowBytes(picture)));
  }
  return encoder.Finish();
}

Status Decode(const Bytes& coded, const Picture& picture, Bytes& rows) {
  T6Decoder decoder(coded, picture.width);
  rows.resize(picture.rows.size());
  for (size_t at = 0; at < rows.size(); at += RowBytes(picture)) {
    const Status status = decoder.DecodeRow(std::span(rows).subspan(at, RowBytes(picture)));
    if (status != Status::Ok) return status;
  }
  return Status::Ok;
}

TIFF* OpenFax(const std::string& path, const Picture& picture) {
  TIFF* const file = TIFFOpen(path.c_str(), "w");
  TIFFSetField(file, TIFFTAG_IMAGEWIDTH, picture.width);
  TIFFSetField(file, TIFFTAG_IMAGELENGTH, picture.height);
  TIFFSetField(file, TIFFTAG_BITSPERSAMPLE, 1);
  TIFFSetField(file, TIFFTAG_SAMPLESPERPIXEL, 1);
  TIFFSetField(file, TIFFTAG_ROWSPERSTRIP, picture.height);
  TIFFSetField(file, TIFFTAG_COMPRESSION, COMPRESSION_CCITTFAX4);
  TIFFSetField(file, TIFFTAG_PHOTOMETRIC, PHOTOMETRIC_MINISWHITE);
  return file;
}

TEST(T6Coding, AgreesWithLibtiff) {
  const TemporaryFolder folder;
  for (const Picture& picture : Pictures()) {
    SCOPED_TRACE(picture.name);
    const std::string path = folder.Path("fax.tif");
    Bytes coded = Encoded(picture), rows;
    TIFF* file = OpenFax(path, picture);
    TIFFWriteRawStrip(file, 0, coded.data(), static_cast<tmsize_t>(coded.size()));
    TIFFClose(file);
    rows.resize(picture.rows.size());
    file = TIFFOpen(path.c_str(), "r");
    EXPECT_EQ(TIFFReadEncodedStrip(file, 0, rows.data(), static_cast<tmsize_t>(rows.size())), static_cast<tmsize_t>(rows.size()));
    TIFFClose(file);
    EXPECT_EQ(rows, picture.rows);

    file = OpenFax(path, picture);
    Bytes source = picture.rows;
    TIFFWriteEncodedStrip(file, 0, source.data(), static_cast<tmsize_t>(source.size()));
    TIFFClose(file);
    file = TIFFOpen(path.c_str(), "r");
    coded.resize(static_cast<size_t>(TIFFRawStripSize(file, 0)));
    TIFFReadRawStrip(file, 0, coded.data(), static_cast<tmsize_t>(coded.size()));
    TIFFClose(file);
    EXPECT_EQ(coded, Encoded(picture)) << "both choose the shortest modes";
    EXPECT_EQ(Decode(coded, picture, rows), Status::Ok);
    EXPECT_EQ(rows, picture.rows);
  }
}

TEST(T6Coding, RejectsTruncatedAndInvalidData) {
  for (const Picture& picture : Pictures()) {
    SCOPED_TRACE(picture.name);
    const Bytes coded = Encoded(picture);
    Bytes rows;
    for (size_t length = 0; length + 6 < coded.size(); length += 1 + length / 16) {
      EXPECT_NE(Decode(Bytes(coded.begin(), coded.begin() + static_cast<ptrdiff_t>(length)), picture, rows), Status::Ok);
    }
    for (uint32_t seed = 0; seed < 200; ++seed) (void)Decode(RandomBytes(300, seed), picture, rows);
  }
  Bytes rows;
  const Picture narrow{"narrow", 20, 1, Bytes(3)};
  EXPECT_EQ(Decode(Hex("00 00 00 00"), narrow, rows), Status::DamagedFile) << "no mode begins so";
  EXPECT_EQ(Decode(Hex("21 B0 00 00"), narrow, rows), Status::DamagedFile) << "a run of 64 in a row of 20";
}

}  // namespace
}  // namespace fotomill::test
