// Portable Network Graphics (PNG), big-endian, decoded and encoded by libpng.
//
//   signature 89 50 4E 47 0D 0A 1A 0A, then chunks of length, type, data and CRC:
//   IHDR  width, height (4 bytes each), bit depth, colour type (1 colour, 2 palette bit, 4 alpha), 0, 0, interlace
//   PLTE, tRNS, pHYs, gAMA, iCCP, eXIf, tEXt, zTXt, iTXt, acTL ..., IDAT (deflated rows), IEND
//
// What the reader makes of it: palettes and greys of 1, 2, 4 and 8 bits without transparency keep their depth (greys with
// a grey palette); everything else becomes 24 bits, with an alpha plane where there is an alpha channel or a transparent
// colour. 16-bit samples are rounded to 8. Gamma is told, not applied. Of an animation (acTL) the default picture is shown.
// EXIF, XMP, ICC profile and resolution travel with the picture.
//
// The writer keeps the depth: palettes of 1, 4 and 8 bits (greys as grey), RGB, or RGBA with an alpha plane, compressed as
// PngCompression says.
// Source: W3C, "Portable Network Graphics (PNG) Specification (Third Edition)", 2025; libpng manual.
#include "formats/png.h"

#include <png.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <string>
#include <vector>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "core/limits.h"
#include "core/settings.h"
#include "formats/png_chunks.h"
#include "platform/file_view.h"

namespace fotomill {

namespace {

constexpr char kXmpKeyword[] = "XML:com.adobe.xmp";
constexpr double kInchesPerMetre = 39.3701;
constexpr png_uint_32 kMostSide = 0x7fffffff;
constexpr png_alloc_size_t kMostChunkMemory = 64u << 20;

// The library's errors end here: they are told by the status, never printed.
[[noreturn]] void OnError(png_structp png, png_const_charp) { png_longjmp(png, 1); }
void OnWarning(png_structp, png_const_charp) {}

// Runs library calls; false when one of them failed. Nothing with a destructor may live inside `action`.
template <typename Action>
bool Guarded(png_structp png, Action action) {
  if (setjmp(png_jmpbuf(png)) != 0) return false;
  action();
  return true;
}

// A file being read, with the library's two structures.
struct PngReader {
  explicit PngReader(std::span<const uint8_t> file) : bytes(file) {
    png = png_create_read_struct(PNG_LIBPNG_VER_STRING, nullptr, OnError, OnWarning);
    if (png != nullptr) info = png_create_info_struct(png);
  }
  ~PngReader() { png_destroy_read_struct(&png, &info, nullptr); }
  PngReader(const PngReader&) = delete;
  PngReader& operator=(const PngReader&) = delete;
  bool Ready() const { return info != nullptr; }
  // What a failed library call means.
  Status Failure() const { return bytes.Ok() ? Status::DamagedFile : Status::FileReadError; }

  ByteReader bytes;
  png_structp png = nullptr;
  png_infop info = nullptr;
};

void ReadBytes(png_structp png, png_bytep target, size_t count) {
  auto* reader = static_cast<PngReader*>(png_get_io_ptr(png));
  const auto bytes = reader->bytes.Take(count);
  if (bytes.size() != count) png_error(png, "cut short");
  std::memcpy(target, bytes.data(), count);
}

// How the rows come out of the library.
enum class PngRows {
  Direct,    // as the picture stores them
  TwoBits,   // one index a byte, to be packed into 4 bits
  WithAlpha  // blue, green, red, alpha
};

struct PngLayout {
  int32_t width = 0, height = 0;
  int32_t bitsPerPixel = 0;
  bool interlaced = false;
  PngRows rows = PngRows::Direct;
};

// Reads everything before the pixels and sets up the conversions.
Status ReadHeader(PngReader& reader) {
  if (!reader.Ready()) return Status::MemoryAllocationError;
  if (png_sig_cmp(reader.bytes.Peek(8).data(), 0, reader.bytes.Peek(8).size()) != 0) return Status::DamagedFile;
  const bool read = Guarded(reader.png, [&] {
    png_set_read_fn(reader.png, &reader, ReadBytes);
    png_set_user_limits(reader.png, kMostSide, kMostSide);
    png_set_chunk_malloc_max(reader.png, kMostChunkMemory);
    png_read_info(reader.png, reader.info);
  });
  return read ? Status::Ok : reader.Failure();
}

PngLayout ChooseLayout(const PngReader& reader) {
  const png_byte type = png_get_color_type(reader.png, reader.info);
  const png_byte depth = png_get_bit_depth(reader.png, reader.info);
  const bool transparent = (type & PNG_COLOR_MASK_ALPHA) != 0 || png_get_valid(reader.png, reader.info, PNG_INFO_tRNS) != 0;
  const bool indexed = type == PNG_COLOR_TYPE_PALETTE || type == PNG_COLOR_TYPE_GRAY;
  PngLayout layout;
  layout.width = static_cast<int32_t>(png_get_image_width(reader.png, reader.info));
  layout.height = static_cast<int32_t>(png_get_image_height(reader.png, reader.info));
  layout.interlaced = png_get_interlace_type(reader.png, reader.info) != PNG_INTERLACE_NONE;
  layout.bitsPerPixel = indexed && !transparent ? std::min<int32_t>(depth, 8) : 24;
  layout.rows = transparent                  ? PngRows::WithAlpha
                : layout.bitsPerPixel == 2   ? PngRows::TwoBits
                                             : PngRows::Direct;
  return layout;
}

void SetConversions(const PngReader& reader, const PngLayout& layout) {
  png_set_scale_16(reader.png);
  if (layout.rows == PngRows::TwoBits) png_set_packing(reader.png);
  if (layout.bitsPerPixel == 24) {
    png_set_expand(reader.png);
    png_set_gray_to_rgb(reader.png);
    png_set_bgr(reader.png);
    if (layout.rows == PngRows::WithAlpha) png_set_add_alpha(reader.png, 255, PNG_FILLER_AFTER);
  }
  png_set_interlace_handling(reader.png);
  png_read_update_info(reader.png, reader.info);
}

void TakePalette(const PngReader& reader, const PngLayout& layout, Palette& palette) {
  if (layout.bitsPerPixel == 24) {
    MakeDefaultPalette(&palette, nullptr, kDisplayPalette);
    return;
  }
  palette.fill(0);
  png_colorp colors = nullptr;
  int count = 0;
  if (png_get_PLTE(reader.png, reader.info, &colors, &count) != 0 &&
      png_get_color_type(reader.png, reader.info) == PNG_COLOR_TYPE_PALETTE) {
    for (int i = 0; i < count && i < 256; ++i) {
      const auto place = 3 * static_cast<size_t>(i);
      palette[place] = colors[i].red;
      palette[place + 1] = colors[i].green;
      palette[place + 2] = colors[i].blue;
    }
    return;
  }
  const int levels = 1 << layout.bitsPerPixel;
  for (int i = 0; i < 3 * levels; ++i) palette[static_cast<size_t>(i)] = static_cast<uint8_t>(i / 3 * 255 / (levels - 1));
}

void Assign(std::vector<uint8_t>& block, const uint8_t* data, size_t size) {
  block.clear();
  if (data != nullptr && size <= limits.metadataBytes) block.assign(data, data + size);
}

void TakeTexts(const PngReader& reader, PictureRecord& picture) {
  png_textp texts = nullptr;
  int count = 0;
  png_get_text(reader.png, reader.info, &texts, &count);
  for (int i = 0; i < count; ++i) {
    const size_t size = std::max(texts[i].text_length, texts[i].itxt_length);
    const auto* text = reinterpret_cast<const uint8_t*>(texts[i].text);
    if (std::strcmp(texts[i].key, kXmpKeyword) == 0) Assign(picture.metadata.xmp, text, size);
    if (std::strcmp(texts[i].key, "Comment") == 0) Assign(picture.comment, text, size);
  }
}

void TakeMetadata(const PngReader& reader, PictureRecord& picture) {
  picture.metadata = {};
  png_bytep exif = nullptr;
  png_uint_32 exifSize = 0;
  if (png_get_eXIf_1(reader.png, reader.info, &exifSize, &exif) != 0) Assign(picture.metadata.exif, exif, exifSize);
  png_charp name = nullptr;
  int method = 0;
  png_bytep profile = nullptr;
  png_uint_32 profileSize = 0;
  if (png_get_iCCP(reader.png, reader.info, &name, &method, &profile, &profileSize) != 0) {
    Assign(picture.metadata.icc, profile, profileSize);
  }
  TakeTexts(reader, picture);
  png_uint_32 x = 0, y = 0;
  int unit = 0;
  if (png_get_pHYs(reader.png, reader.info, &x, &y, &unit) != 0 && unit == PNG_RESOLUTION_METER) {
    picture.metadata.dpiX = x / kInchesPerMetre;
    picture.metadata.dpiY = y / kInchesPerMetre;
  }
}

// The number of frames that an animation's acTL chunk names, 1 for a still picture. It stands before the pixels.
int32_t FrameCount(std::span<const uint8_t> file) {
  PngChunks chunks(file);
  PngChunk chunk;
  while (chunks.Next(chunk) && chunk.type != "IDAT") {
    if (chunk.type == "acTL") return static_cast<int32_t>(std::clamp<uint32_t>(ByteReader(chunk.data).Be32(), 1, 1 << 20));
  }
  return 1;
}

// Fills the facts.
Status Describe(PngReader& reader, std::span<const uint8_t> file, PngLayout& layout, PictureRecord& picture) {
  RETURN_IF_BAD(ReadHeader(reader));
  layout = ChooseLayout(reader);
  picture.pageCount = settings.RecognizeAPNG != 0 ? FrameCount(file) : 1;
  picture.typeName.AssignCut(picture.pageCount > 1 ? "Animated PNG" : "Portable Network Graphics");
  picture.width = layout.width;
  picture.height = layout.height;
  picture.bitsPerPixel = layout.bitsPerPixel;
  const bool alpha = layout.rows == PngRows::WithAlpha;
  picture.alphaFlags = static_cast<uint8_t>((picture.alphaFlags & ~kHasAlpha) | (alpha ? kHasAlpha : 0));
  picture.imageBytes = EstimateImageBytes(layout.width, layout.height, layout.bitsPerPixel);
  TakePalette(reader, layout, picture.palette);
  TakeMetadata(reader, picture);
  return Status::Ok;
}

void SplitAlpha(const uint8_t* source, uint8_t* color, uint8_t* alpha, int32_t width) {
  for (int32_t x = 0; x < width; ++x, source += 4, color += 3) {
    color[0] = source[0];
    color[1] = source[1];
    color[2] = source[2];
    alpha[x] = source[3];
  }
}

void PackNibbles(const uint8_t* source, uint8_t* row, int32_t width) {
  for (int32_t x = 0; x < width; x += 2) {
    *row++ = static_cast<uint8_t>(source[x] << 4 | (x + 1 < width ? source[x + 1] : 0));
  }
}

struct PngTarget {
  PackedImage image, alpha;
};

void StoreRow(const PngLayout& layout, const uint8_t* source, int32_t y, PngTarget& target) {
  if (layout.rows == PngRows::WithAlpha) {
    SplitAlpha(source, target.image.Row(y).data(), target.alpha.Row(y).data(), layout.width);
  } else {
    PackNibbles(source, target.image.Row(y).data(), layout.width);
  }
}

// Rows that come in order: straight into the picture, or through one row.
Status ReadInOrder(PngReader& reader, const PngLayout& layout, const PictureRecord& picture, PngTarget& target) {
  std::vector<uint8_t> row(png_get_rowbytes(reader.png, reader.info));
  const bool read = Guarded(reader.png, [&] {
    for (int32_t y = 0; y < layout.height; ++y) {
      const bool direct = layout.rows == PngRows::Direct;
      png_read_row(reader.png, direct ? target.image.Row(y).data() : row.data(), nullptr);
      if (!direct) StoreRow(layout, row.data(), y, target);
      picture.ReportRow(y);
    }
  });
  return read ? Status::Ok : reader.Failure();
}

// Interlaced rows come in seven passes, each of which fills in pixels, so all of them must be held.
Status ReadInterlaced(PngReader& reader, const PngLayout& layout, const PictureRecord& picture, PngTarget& target) {
  const uint64_t rowBytes = png_get_rowbytes(reader.png, reader.info);
  platform::MemoryBlock buffer;
  if (layout.rows != PngRows::Direct && !buffer.Allocate(rowBytes * static_cast<uint64_t>(layout.height))) {
    return Status::MemoryAllocationError;
  }
  const auto rowAt = [&](int32_t y) {
    return buffer.Empty() ? target.image.Row(y).data() : buffer.Data() + rowBytes * static_cast<uint64_t>(y);
  };
  const bool read = Guarded(reader.png, [&] {
    constexpr int kPasses = 7;
    for (int pass = 0; pass < kPasses; ++pass) {
      for (int32_t y = 0; y < layout.height; ++y) png_read_row(reader.png, rowAt(y), nullptr);
      picture.ReportRow(layout.height / kPasses * pass);
    }
  });
  if (!read) return reader.Failure();
  for (int32_t y = 0; y < layout.height; ++y) {
    if (!buffer.Empty()) StoreRow(layout, rowAt(y), y, target);
    picture.ReportRow(y);
  }
  return Status::Ok;
}

Status ReadPixels(PngReader& reader, const PngLayout& layout, PictureRecord& picture) {
  PngTarget target;
  RETURN_IF_BAD(NewPackedImage(layout.width, layout.height, &picture.palette, layout.bitsPerPixel, target.image));
  if (layout.rows == PngRows::WithAlpha) RETURN_IF_BAD(NewAlphaPlane(layout.width, layout.height, target.alpha));
  // Only now: the library takes memory for rows of whatever width the file claims.
  if (!Guarded(reader.png, [&] { SetConversions(reader, layout); })) return reader.Failure();
  RETURN_IF_BAD(layout.interlaced ? ReadInterlaced(reader, layout, picture, target)
                                  : ReadInOrder(reader, layout, picture, target));
  picture.image = std::move(target.image);
  picture.alpha = std::move(target.alpha);
  return Status::Ok;
}

// A file being written.
struct PngWriter {
  explicit PngWriter(ByteWriter& target) : out(target) {
    png = png_create_write_struct(PNG_LIBPNG_VER_STRING, nullptr, OnError, OnWarning);
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

// Whether the palette is the grey ramp of its depth.
bool IsGrey(const Palette& palette, int32_t bits) {
  const int levels = 1 << bits;
  for (int i = 0; i < 3 * levels; ++i) {
    if (palette[static_cast<size_t>(i)] != i / 3 * 255 / (levels - 1)) return false;
  }
  return true;
}

int ColorType(const PictureRecord& picture) {
  const int32_t bits = picture.image.Bits();
  if (bits == 24) return picture.alpha.Empty() ? PNG_COLOR_TYPE_RGB : PNG_COLOR_TYPE_RGB_ALPHA;
  return IsGrey(picture.palette, bits) ? PNG_COLOR_TYPE_GRAY : PNG_COLOR_TYPE_PALETTE;
}

void SetMetadata(const PngWriter& writer, const PictureRecord& picture, bool keep, uint8_t& lost) {
  const PictureMetadata& metadata = picture.metadata;
  if (metadata.dpiX > 0 && metadata.dpiY > 0) {
    png_set_pHYs(writer.png, writer.info, static_cast<png_uint_32>(std::lround(metadata.dpiX * kInchesPerMetre)),
                 static_cast<png_uint_32>(std::lround(metadata.dpiY * kInchesPerMetre)), PNG_RESOLUTION_METER);
  }
  if (!keep) return;
  if (!metadata.icc.empty()) {
    png_set_benign_errors(writer.png, 1);  // an odd profile is left out, not the picture
    png_set_iCCP(writer.png, writer.info, "ICC profile", PNG_COMPRESSION_TYPE_BASE, metadata.icc.data(),
                 static_cast<png_uint_32>(metadata.icc.size()));
    if (png_get_valid(writer.png, writer.info, PNG_INFO_iCCP) == 0) lost |= kLostIcc;
  }
  if (!metadata.exif.empty()) {
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

void SetHeader(const PngWriter& writer, const PictureRecord& picture) {
  const PackedImage& image = picture.image;
  const int type = ColorType(picture);
  png_set_IHDR(writer.png, writer.info, static_cast<png_uint_32>(image.Width()), static_cast<png_uint_32>(image.Height()),
               image.Bits() == 24 ? 8 : image.Bits(), type, PNG_INTERLACE_NONE, PNG_COMPRESSION_TYPE_BASE,
               PNG_FILTER_TYPE_BASE);
  if (type == PNG_COLOR_TYPE_PALETTE) {
    png_color colors[256];
    for (size_t i = 0; i < static_cast<size_t>(image.Colors()); ++i) {
      colors[i] = {picture.palette[3 * i], picture.palette[3 * i + 1], picture.palette[3 * i + 2]};
    }
    png_set_PLTE(writer.png, writer.info, colors, image.Colors());
  }
  png_set_compression_level(writer.png, std::clamp<int>(settings.PngCompression, 0, 9));
}

void MergeAlpha(const uint8_t* color, const uint8_t* alpha, uint8_t* target, int32_t width) {
  for (int32_t x = 0; x < width; ++x, color += 3, target += 4) {
    target[0] = color[0];
    target[1] = color[1];
    target[2] = color[2];
    target[3] = alpha[x];
  }
}

// `keep`: whether metadata and comment go along; `lost`: what of them could not.
Status WriteAll(PngWriter& writer, const PictureRecord& picture, bool keep, uint8_t& lost) {
  const PackedImage& image = picture.image;
  const std::string xmp(picture.metadata.xmp.begin(), picture.metadata.xmp.end());
  const std::string comment(picture.comment.begin(), picture.comment.end());
  std::vector<uint8_t> merged(picture.alpha.Empty() ? 0 : 4 * static_cast<size_t>(image.Width()));
  const bool written = Guarded(writer.png, [&] {
    png_set_write_fn(writer.png, &writer, WriteBytes, FlushNothing);
    SetHeader(writer, picture);
    SetMetadata(writer, picture, keep, lost);
    if (keep && !xmp.empty()) SetText(writer, kXmpKeyword, xmp);
    if (keep && !comment.empty()) SetText(writer, "Comment", comment);
    png_write_info(writer.png, writer.info);
    if (image.Bits() == 24) png_set_bgr(writer.png);
    for (int32_t y = 0; y < image.Height(); ++y) {
      const uint8_t* row = image.Row(y).data();
      if (!merged.empty()) {
        MergeAlpha(row, picture.alpha.Row(y).data(), merged.data(), image.Width());
        row = merged.data();
      }
      png_write_row(writer.png, row);
      picture.ReportRow(y);
    }
    png_write_end(writer.png, writer.info);
  });
  return written ? Status::Ok : Status::ErrorWritingFile;
}

const char* ColorTypeName(png_byte type) {
  switch (type) {
    case PNG_COLOR_TYPE_GRAY:
      return "grey";
    case PNG_COLOR_TYPE_PALETTE:
      return "palette";
    case PNG_COLOR_TYPE_RGB:
      return "true color";
    case PNG_COLOR_TYPE_GRAY_ALPHA:
      return "grey with alpha";
    default:
      return "true color with alpha";
  }
}

void AddHeaderLines(const PngReader& reader, DetailLines& lines) {
  lines.AddFormat("   Color type: %s", ColorTypeName(png_get_color_type(reader.png, reader.info)));
  lines.AddFormat("    Bit depth: %d", png_get_bit_depth(reader.png, reader.info));
  const bool interlaced = png_get_interlace_type(reader.png, reader.info) != PNG_INTERLACE_NONE;
  lines.AddFormat("   Interlaced: %s", interlaced ? "yes" : "no");
  double gamma = 0;
  if (png_get_gAMA(reader.png, reader.info, &gamma) != 0) lines.AddFormat("        Gamma: %.5f", gamma);
  int intent = 0;
  if (png_get_sRGB(reader.png, reader.info, &intent) != 0) lines.Add("  Color space: sRGB");
}

void AddMetadataLines(const PictureRecord& picture, DetailLines& lines) {
  const PictureMetadata& metadata = picture.metadata;
  if (metadata.dpiX > 0) lines.AddFormat("   Resolution: %.0f x %.0f dpi", metadata.dpiX, metadata.dpiY);
  if (!metadata.icc.empty()) lines.AddFormat("  ICC profile: %zu bytes", metadata.icc.size());
  if (!metadata.exif.empty()) lines.AddFormat("         EXIF: %zu bytes", metadata.exif.size());
  if (!metadata.xmp.empty()) lines.AddFormat("          XMP: %zu bytes", metadata.xmp.size());
  if (picture.pageCount > 1) lines.AddFormat("       Frames: %d", picture.pageCount);
}

// The text chunks' keywords and the chunks' number.
void AddChunkLines(std::span<const uint8_t> file, DetailLines& lines) {
  PngChunks chunks(file);
  PngChunk chunk;
  int count = 0, pixels = 0;
  for (; chunks.Next(chunk); ++count) {
    pixels += chunk.type == "IDAT";
    if (chunk.type != "tEXt" && chunk.type != "zTXt" && chunk.type != "iTXt") continue;
    std::string line = "         Text: ";
    for (const uint8_t c : chunk.data.first(std::min<size_t>(chunk.data.size(), 79))) {
      if (c == 0) break;
      line += c < 0x20 ? '?' : static_cast<char>(c);
    }
    lines.Add(line);
  }
  lines.AddFormat("       Chunks: %d, %d of pixels", count, pixels);
}

}  // namespace

Status DescribePng(std::span<const uint8_t> file, PictureRecord& picture) {
  PngReader reader(file);
  PngLayout layout;
  return Describe(reader, file, layout, picture);
}

Status DecodePng(std::span<const uint8_t> file, PictureRecord& picture) {
  PngReader reader(file);
  PngLayout layout;
  RETURN_IF_BAD(Describe(reader, file, layout, picture));
  return ReadPixels(reader, layout, picture);
}

Status EncodePng(const PictureRecord& picture, ByteWriter& out) {
  PngWriter writer(out);
  if (!writer.Ready()) return Status::MemoryAllocationError;
  uint8_t lost = 0;
  return WriteAll(writer, picture, false, lost);
}

Status PngInfo(PictureRecord& picture, const char* fileName, uint32_t) {
  picture.typeName.Clear();
  platform::FileView file;
  if (!file.Open(fileName)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  return DescribePng(file.Bytes(), picture);
}

Status PngRead(PictureRecord& picture, const char* fileName) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  if (!file.Open(fileName)) return Status::FileOpenError;
  return DecodePng(file.Bytes(), picture);
}

Status PngWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  if (picture.image.Empty()) return Status::MemoryAllocationError;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  PngWriter writer(out);
  if (!writer.Ready()) return Status::MemoryAllocationError;
  RETURN_IF_BAD(WriteAll(writer, picture, options.keepMetadata && settings.PreserveEXIF != 0, picture.lostMetadata));
  return CommitOutput(out, options);
}

Status PngDetails(PictureRecord& picture) {
  picture.detailLines.Clear();
  platform::FileView file;
  if (!file.Open(picture.fileName.c_str())) return Status::FileOpenError;
  PngReader reader(file.Bytes());
  RETURN_IF_BAD(ReadHeader(reader));
  TakeMetadata(reader, picture);
  AddHeaderLines(reader, picture.detailLines);
  AddMetadataLines(picture, picture.detailLines);
  AddChunkLines(file.Bytes(), picture.detailLines);
  return Status::Ok;
}

}  // namespace fotomill
