// The PNG writer keeps the depth: palettes of 1, 4 and 8 bits (grays as gray), RGB, or RGBA with an
// alpha plane. libpng writes everything before the pixels, png_deflate.cpp the pixels, compressed
// with PngCompression.
#include <algorithm>
#include <cmath>
#include <cstring>
#include <string>

#include "core/byte_writer.h"
#include "formats/png/png.h"
#include "formats/png/png_deflate.h"
#include "formats/png/png_library.h"
#include "picture/gray_palette.h"
#include "processing/pixel_rows.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

// A file being written.
struct PngWriter {
  explicit PngWriter(ByteWriter& target) : out(target) {
    png = png_create_write_struct(PNG_LIBPNG_VER_STRING, nullptr, OnPngError, OnPngWarning);
    if (png != nullptr) info = png_create_info_struct(png);
  }
  ~PngWriter() { png_destroy_write_struct(&png, &info); }
  PngWriter(const PngWriter&) = delete;
  PngWriter& operator=(const PngWriter&) = delete;
  bool Ready() const { return info != nullptr; }

  ByteWriter& out;
  png_structp png = nullptr;
  png_infop info = nullptr;
};

void WriteBytes(png_structp png, png_bytep bytes, size_t count) {
  static_cast<PngWriter*>(png_get_io_ptr(png))->out.Bytes({bytes, count});
}
void FlushNothing(png_structp) {}

// Whether the palette is the gray ramp of its depth.
bool IsGray(const Palette& palette, int32_t bits) {
  const Palette grays = GrayLevels(bits);
  return std::equal(grays.begin(), grays.begin() + (3 << bits), palette.begin());
}

int ColorType(const PictureRecord& picture) {
  const int32_t bits = picture.image.Bits();
  if (!picture.alpha.Empty()) return PNG_COLOR_TYPE_RGB_ALPHA;
  if (bits == 24) return PNG_COLOR_TYPE_RGB;
  return IsGray(picture.palette, bits) ? PNG_COLOR_TYPE_GRAY : PNG_COLOR_TYPE_PALETTE;
}

void SetMetadata(const PngWriter& writer, const PictureRecord& picture, bool keep, uint8_t& lost) {
  const PictureMetadata& metadata = picture.metadata;
  if (metadata.dpiX > 0 && metadata.dpiY > 0) {
    png_set_pHYs(writer.png, writer.info,
                 static_cast<png_uint_32>(std::lround(metadata.dpiX * kPngInchesPerMeter)),
                 static_cast<png_uint_32>(std::lround(metadata.dpiY * kPngInchesPerMeter)),
                 PNG_RESOLUTION_METER);
  }
  if (!metadata.icc.empty()) {
    png_set_benign_errors(writer.png, 1);  // an invalid profile is dropped, not the picture
    png_set_iCCP(writer.png, writer.info, "ICC profile", PNG_COMPRESSION_TYPE_BASE,
                 metadata.icc.data(), static_cast<png_uint_32>(metadata.icc.size()));
    if (png_get_valid(writer.png, writer.info, PNG_INFO_iCCP) == 0) lost |= kLostIcc;
  }
  if (keep && !metadata.exif.empty()) {
    png_set_eXIf_1(writer.png, writer.info, static_cast<png_uint_32>(metadata.exif.size()),
                   const_cast<png_bytep>(metadata.exif.data()));
  }
}

void SetText(const PngWriter& writer, const char* key, const std::string& text) {
  png_text entry = {};
  entry.compression = PNG_ITXT_COMPRESSION_NONE;
  entry.key = const_cast<png_charp>(key);
  entry.text = const_cast<png_charp>(text.c_str());
  entry.itxt_length = text.size();
  png_set_text(writer.png, writer.info, &entry, 1);
}

int DepthOf(const PictureRecord& picture) {
  const int32_t bits = picture.image.Bits();
  return bits == 24 || !picture.alpha.Empty() ? 8 : bits;
}

void SetHeader(const PngWriter& writer, const PictureRecord& picture) {
  const PackedImage& image = picture.image;
  const int type = ColorType(picture);
  png_set_IHDR(writer.png, writer.info, static_cast<png_uint_32>(image.Width()),
               static_cast<png_uint_32>(image.Height()), DepthOf(picture), type, PNG_INTERLACE_NONE,
               PNG_COMPRESSION_TYPE_BASE, PNG_FILTER_TYPE_BASE);
  if (type == PNG_COLOR_TYPE_PALETTE) {
    png_color colors[256];
    for (size_t i = 0; i < static_cast<size_t>(image.Colors()); ++i) {
      colors[i] = {picture.palette[3 * i], picture.palette[3 * i + 1], picture.palette[3 * i + 2]};
    }
    png_set_PLTE(writer.png, writer.info, colors, image.Colors());
  }
}

// A row of red, green, blue, alpha. The colors are first copied to its end and then spread out from
// the left.
void MergeRow(const BgrRows& colors, const PackedImage& alpha, int32_t y, uint8_t* target) {
  const auto width = static_cast<size_t>(alpha.Width());
  const uint8_t* source = target + width;
  colors.CopyRow(y, target + width);
  const uint8_t* opacity = alpha.Row(y).data();
  for (size_t x = 0; x < width; ++x, source += 3, target += 4) {
    const uint8_t blue = source[0], green = source[1], red = source[2];
    target[0] = red;
    target[1] = green;
    target[2] = blue;
    target[3] = opacity[x];
  }
}

Status WritePixels(const PictureRecord& picture, int32_t compression, ByteWriter& out) {
  const PackedImage& image = picture.image;
  const int32_t width = image.Width();
  BgrRows colors;
  RETURN_IF_BAD(colors.Open(image));
  PngRows rows;
  rows.height = image.Height();
  rows.pixelBits = static_cast<uint32_t>(picture.alpha.Empty() ? image.Bits() : 32);
  rows.rowBytes = (static_cast<uint64_t>(width) * rows.pixelBits + 7) / 8;
  rows.fetch = [&](int32_t y, uint8_t* row) {
    if (!picture.alpha.Empty()) {
      MergeRow(colors, picture.alpha, y, row);
    } else if (image.Bits() == 24) {
      SwapColors(image.Row(y).data(), static_cast<size_t>(width), row);
    } else {
      std::memcpy(row, image.Row(y).data(), rows.rowBytes);
    }
  };
  // filters do not help with palettes and packed pixels
  const int type = ColorType(picture);
  const bool filtered = type != PNG_COLOR_TYPE_PALETTE && DepthOf(picture) == 8;
  return WritePngPixels(rows, filtered, compression, out,
                        [&](int32_t y) { return picture.ReportRow(y); });
}

void WriteEnd(ByteWriter& out) {
  constexpr uint32_t kCrc = 0xAE426082;  // of the chunk type
  out.Be32(0);
  out.Text("IEND");
  out.Be32(kCrc);
}

// `keep`: whether to write metadata and comment; `lost`: what could not be written.
Status WriteAll(PngWriter& writer, const PictureRecord& picture, const EncodeOptions& options,
                bool keep, uint8_t& lost) {
  const std::string xmp(picture.metadata.xmp.begin(), picture.metadata.xmp.end());
  const std::string comment(picture.comment.begin(), picture.comment.end());
  const bool written = PngGuarded(writer.png, [&] {
    png_set_write_fn(writer.png, &writer, WriteBytes, FlushNothing);
    SetHeader(writer, picture);
    SetMetadata(writer, picture, keep, lost);
    if (keep && !xmp.empty()) SetText(writer, kPngXmpKeyword, xmp);
    if (keep && !comment.empty()) SetText(writer, "Comment", comment);
    png_write_info(writer.png, writer.info);
  });
  if (!written) return Status::ErrorWritingFile;
  RETURN_IF_BAD(WritePixels(picture, options.pngCompression, writer.out));
  WriteEnd(writer.out);
  return Status::Ok;
}

}  // namespace

Status EncodePng(const PictureRecord& picture, const EncodeOptions& options, ByteWriter& out) {
  PngWriter writer(out);
  if (!writer.Ready()) return Status::MemoryAllocationError;
  uint8_t lost = 0;
  return WriteAll(writer, picture, options, false, lost);
}

Status PngWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  if (picture.image.Empty()) return Status::MemoryAllocationError;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  PngWriter writer(out);
  if (!writer.Ready()) return Status::MemoryAllocationError;
  RETURN_IF_BAD(WriteAll(writer, picture, options.encode, options.KeepsMetadata(), picture.lostMetadata));
  return CommitOutput(out, options);
}

}  // namespace fotomill
