// Portable Network Graphics (PNG), big-endian; png_write.cpp is the writer.
//
//   signature 89 50 4E 47 0D 0A 1A 0A, then chunks of length, type, data and CRC:
//   IHDR  width, height (4 bytes each), bit depth, color type (1 color, 2 palette bit, 4 alpha), 0,
//         0, interlace
//   PLTE, tRNS, pHYs, gAMA, iCCP, eXIf, tEXt, zTXt, iTXt, acTL ..., IDAT (deflated rows), IEND
//
// Reader: palettes and grays of 1, 2, 4 and 8 bits without transparency keep their depth (grays
// with a gray palette); everything else becomes 24 bits, with an alpha plane if there is an alpha
// channel or a transparent color. 16-bit samples are rounded to 8. Gamma is reported, not applied.
// For an animation (acTL) the default picture is shown. EXIF, XMP, ICC profile and resolution are
// kept.
//
// libpng reads everything before the pixels. Non-interlaced pixels are inflated by libdeflate at
// once and unfiltered here, which takes half the time; interlaced ones, rare pixel formats and
// anything that looks damaged are left to libpng. Source: W3C, "Portable Network Graphics (PNG)
// Specification (Third Edition)", 2025; libpng manual.
#include "formats/png/png.h"

#include <libdeflate.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <string>
#include <vector>

#include "containers/png_chunks.h"
#include "core/byte_reader.h"
#include "core/limits.h"
#include "formats/metadata_blocks.h"
#include "formats/png/png_library.h"
#include "formats/png/png_pixels.h"
#include "formats/png/png_text.h"
#include "picture/gray_palette.h"
#include "picture/partial.h"
#include "platform/file_view.h"
#include "processing/flatten.h"
#include "processing/geometry/cut.h"
#include "processing/pixel_rows.h"

namespace fotomill {

namespace {

constexpr png_uint_32 kMostSide = 0x7fffffff;
constexpr png_alloc_size_t kMostChunkMemory = 64u << 20;
constexpr png_byte kTextChunks[] = "tEXt\0zTXt\0iTXt";

// A file being read, with libpng's two structures.
struct PngReader {
  explicit PngReader(std::span<const uint8_t> data) : file(data), bytes(data) {
    png = png_create_read_struct(PNG_LIBPNG_VER_STRING, nullptr, OnPngError, OnPngWarning);
    if (png != nullptr) info = png_create_info_struct(png);
  }
  ~PngReader() { png_destroy_read_struct(&png, &info, nullptr); }
  PngReader(const PngReader&) = delete;
  PngReader& operator=(const PngReader&) = delete;
  bool Ready() const { return info != nullptr; }
  // The status for a failed library call.
  Status Failure() const { return bytes.Ok() ? Status::DamagedFile : Status::FileReadError; }

  std::span<const uint8_t> file;
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

// Row format delivered by the library.
enum class RowForm {
  Direct,    // as stored in the picture
  TwoBits,   // one index per byte, to be packed into 4 bits
  WithAlpha  // blue, green, red, alpha
};

struct PngLayout {
  int32_t width = 0, height = 0;
  int32_t bitsPerPixel = 0;
  bool interlaced = false;
  RowForm rows = RowForm::Direct;
};

// Whether the chunks before the pixels are within the file: the library would allocate memory for
// any size they claim.
Status CheckHead(std::span<const uint8_t> file) {
  PngWalk walk(file);
  for (PngPlace chunk; walk.Next(chunk);) {
    if (chunk.type == "IDAT") return Status::Ok;
  }
  return walk.Outcome() == Status::DamagedFile ? Status::DamagedFile : Status::FileReadError;
}

// Reads everything before the pixels and sets up conversions.
Status ReadHeader(PngReader& reader) {
  if (!reader.Ready()) return Status::MemoryAllocationError;
  RETURN_IF_BAD(CheckHead(reader.file));
  const bool read = PngGuarded(reader.png, [&] {
    png_set_read_fn(reader.png, &reader, ReadBytes);
    png_set_user_limits(reader.png, kMostSide, kMostSide);
    png_set_chunk_malloc_max(reader.png, kMostChunkMemory);
    // The library would inflate all texts.
    png_set_keep_unknown_chunks(reader.png, PNG_HANDLE_CHUNK_NEVER, kTextChunks, 3);
    png_read_info(reader.png, reader.info);
  });
  return read ? Status::Ok : reader.Failure();
}

PngLayout ChooseLayout(const PngReader& reader) {
  const png_byte type = png_get_color_type(reader.png, reader.info);
  const png_byte depth = png_get_bit_depth(reader.png, reader.info);
  const bool transparent = (type & PNG_COLOR_MASK_ALPHA) != 0 ||
                           png_get_valid(reader.png, reader.info, PNG_INFO_tRNS) != 0;
  const bool indexed = type == PNG_COLOR_TYPE_PALETTE || type == PNG_COLOR_TYPE_GRAY;
  PngLayout layout;
  layout.width = static_cast<int32_t>(png_get_image_width(reader.png, reader.info));
  layout.height = static_cast<int32_t>(png_get_image_height(reader.png, reader.info));
  layout.interlaced = png_get_interlace_type(reader.png, reader.info) != PNG_INTERLACE_NONE;
  layout.bitsPerPixel = indexed && !transparent ? std::min<int32_t>(depth, 8) : 24;
  layout.rows = transparent                ? RowForm::WithAlpha
                : layout.bitsPerPixel == 2 ? RowForm::TwoBits
                                           : RowForm::Direct;
  return layout;
}

void SetConversions(const PngReader& reader, const PngLayout& layout) {
  png_set_scale_16(reader.png);
  if (layout.rows == RowForm::TwoBits) png_set_packing(reader.png);
  if (layout.bitsPerPixel == 24) {
    png_set_expand(reader.png);
    png_set_gray_to_rgb(reader.png);
    png_set_bgr(reader.png);
    if (layout.rows == RowForm::WithAlpha) png_set_add_alpha(reader.png, 255, PNG_FILLER_AFTER);
  }
  png_set_interlace_handling(reader.png);
  png_read_update_info(reader.png, reader.info);
}

void TakePalette(const PngReader& reader, const PngLayout& layout, Palette& palette) {
  if (layout.bitsPerPixel == 24) {
    MakeDefaultPalette(&palette, nullptr, kDisplayPalette);
    return;
  }
  png_colorp colors = nullptr;
  int count = 0;
  if (png_get_PLTE(reader.png, reader.info, &colors, &count) != 0 &&
      png_get_color_type(reader.png, reader.info) == PNG_COLOR_TYPE_PALETTE) {
    palette.fill(0);
    for (int i = 0; i < count && i < 256; ++i) {
      const auto place = 3 * static_cast<size_t>(i);
      palette[place] = colors[i].red;
      palette[place + 1] = colors[i].green;
      palette[place + 2] = colors[i].blue;
    }
    return;
  }
  palette = GrayLevels(layout.bitsPerPixel);
}

// The two texts that are kept with a picture, the last one of each keyword; no others are inflated.
void TakeTexts(std::span<const uint8_t> file, PictureRecord& picture) {
  PngChunks chunks(file);
  PngChunk chunk, xmp, comment;
  while (chunks.Next(chunk) && chunk.type != "IDAT") {
    if (chunk.type != "tEXt" && chunk.type != "zTXt" && chunk.type != "iTXt") continue;
    const std::string_view keyword = PngTextKeyword(chunk);
    if (keyword == kPngXmpKeyword) xmp = chunk;
    if (keyword == "Comment") comment = chunk;
  }
  if (!xmp.type.empty()) picture.metadata.xmp = PngTextOf(xmp, limits.pngTextBytes);
  if (!comment.type.empty()) picture.comment = PngTextOf(comment, limits.pngTextBytes);
}

void TakeMetadata(const PngReader& reader, PictureRecord& picture) {
  picture.metadata = {};
  png_bytep exif = nullptr;
  png_uint_32 exifSize = 0;
  if (png_get_eXIf_1(reader.png, reader.info, &exifSize, &exif) != 0)
    TakeBlock({exif, exifSize}, picture.metadata.exif);
  png_charp name = nullptr;
  int method = 0;
  png_bytep profile = nullptr;
  png_uint_32 profileSize = 0;
  if (png_get_iCCP(reader.png, reader.info, &name, &method, &profile, &profileSize) != 0) {
    TakeBlock({profile, profileSize}, picture.metadata.icc);
  }
  TakeTexts(reader.file, picture);
  png_uint_32 x = 0, y = 0;
  int unit = 0;
  if (png_get_pHYs(reader.png, reader.info, &x, &y, &unit) != 0 && unit == PNG_RESOLUTION_METER) {
    TakeResolution(x / kPngInchesPerMeter, y / kPngInchesPerMeter, picture.metadata);
  }
}

// The number of frames in an animation's acTL chunk, limited to those in the file, 1 for a still
// picture. The chunk precedes the pixels, and each frame has an fcTL chunk.
int32_t FrameCount(std::span<const uint8_t> file) {
  PngChunks chunks(file);
  PngChunk chunk;
  uint32_t named = 0, there = 0;
  while ((named == 0 || there < named) && chunks.Next(chunk)) {
    if (chunk.type == "IDAT" && named == 0) break;
    if (chunk.type == "acTL")
      named = std::min(ByteReader(chunk.data).Be32(), limits.animationFrames);
    if (chunk.type == "fcTL") ++there;
  }
  return static_cast<int32_t>(std::max(std::min(named, there), 1u));
}

// Fills in the record.
Status Describe(PngReader& reader, std::span<const uint8_t> file, PngLayout& layout,
                const ReadOptions& options, PictureRecord& picture) {
  RETURN_IF_BAD(ReadHeader(reader));
  layout = ChooseLayout(reader);
  const int32_t frames = FrameCount(file);
  picture.pageCount = options.recognizeApng ? frames : 1;
  const bool deep = png_get_bit_depth(reader.png, reader.info) > 8;
  picture.simplified = frames > 1 || deep;
  picture.unread = deep ? kUnreadDepth : uint8_t{0};
  picture.typeName.AssignCut(picture.pageCount > 1 ? "Animated PNG" : "Portable Network Graphics");
  picture.width = layout.width;
  picture.height = layout.height;
  picture.bitsPerPixel = layout.bitsPerPixel;
  const bool alpha = layout.rows == RowForm::WithAlpha;
  picture.alphaFlags =
      static_cast<uint8_t>((picture.alphaFlags & ~kHasAlpha) | (alpha ? kHasAlpha : 0));
  picture.imageBytes = EstimateImageBytes(layout.width, layout.height, layout.bitsPerPixel);
  TakePalette(reader, layout, picture.palette);
  TakeMetadata(reader, picture);
  return Status::Ok;
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
  if (layout.rows == RowForm::WithAlpha) {
    SplitAlpha(source, static_cast<size_t>(layout.width), target.image.Row(y).data(),
               target.alpha.Row(y).data());
  } else {
    PackNibbles(source, target.image.Row(y).data(), layout.width);
  }
}

// Reads non-interlaced rows, directly into the picture or through a row buffer. `done`: rows read.
Status ReadInOrder(PngReader& reader, const PngLayout& layout, const PictureRecord& picture,
                   PngTarget& target, int32_t& done) {
  std::vector<uint8_t> row(png_get_rowbytes(reader.png, reader.info));
  Status status = Status::Ok;
  const bool read = PngGuarded(reader.png, [&] {
    for (int32_t y = 0; y < layout.height && status == Status::Ok; ++y) {
      const bool direct = layout.rows == RowForm::Direct;
      png_read_row(reader.png, direct ? target.image.Row(y).data() : row.data(), nullptr);
      if (!direct) StoreRow(layout, row.data(), y, target);
      done = y + 1;
      status = picture.ReportRow(y);
    }
  });
  return read ? status : reader.Failure();
}

// Interlaced rows come in seven passes, each adding pixels, so all rows are kept in memory. `done`:
// 1 once there are pixels, in place of a row count.
Status ReadInterlaced(PngReader& reader, const PngLayout& layout, const PictureRecord& picture,
                      PngTarget& target, int32_t& done) {
  const uint64_t rowBytes = png_get_rowbytes(reader.png, reader.info);
  platform::MemoryBlock buffer;
  if (layout.rows != RowForm::Direct &&
      !buffer.Allocate(rowBytes * static_cast<uint64_t>(layout.height))) {
    return Status::MemoryAllocationError;
  }
  const auto rowAt = [&](int32_t y) {
    return buffer.Empty() ? target.image.Row(y).data()
                          : buffer.Data() + rowBytes * static_cast<uint64_t>(y);
  };
  Status status = Status::Ok;
  const bool read = PngGuarded(reader.png, [&] {
    constexpr int kPasses = 7;
    for (int pass = 0; pass < kPasses; ++pass) {
      for (int32_t y = 0; y < layout.height && status == Status::Ok; ++y) {
        png_read_row(reader.png, rowAt(y), nullptr);
        done = 1;
        status = picture.ReportRow(layout.height / kPasses * pass);
      }
    }
  });
  RETURN_IF_BAD(status);
  for (int32_t y = 0; y < layout.height; ++y) {
    if (!buffer.Empty()) StoreRow(layout, rowAt(y), y, target);
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  return read ? Status::Ok : reader.Failure();
}

// Converts a complete, unfiltered row of the file.
using StoreFileRow = void (*)(const uint8_t* source, size_t width, const PngReader& reader,
                              uint8_t* image, uint8_t* alpha);

uint8_t HighByte(const uint8_t* sample) {
  return static_cast<uint8_t>(((sample[0] << 8 | sample[1]) * 255u + 32895) >> 16);
}

template <int kBits>
void CopyPixels(const uint8_t* source, size_t width, const PngReader&, uint8_t* image, uint8_t*) {
  std::memcpy(image, source, (width * kBits + 7) / 8);
}

// gray or color, with alpha if the number is even; samples of one or two bytes
template <size_t kSamples, size_t kBytes>
void StoreSamples(const uint8_t* source, size_t width, const PngReader&, uint8_t* image,
                  uint8_t* alpha) {
  const auto sample = [](const uint8_t* at) { return kBytes == 1 ? *at : HighByte(at); };
  constexpr size_t kColors = kSamples < 3 ? 1 : 3;
  for (size_t x = 0; x < width; ++x, source += kSamples * kBytes, image += 3) {
    image[0] = sample(source + (kColors - 1) * kBytes);
    image[1] = sample(source + (kColors - 1) / 2 * kBytes);
    image[2] = sample(source);
    if constexpr (kSamples % 2 == 0) alpha[x] = sample(source + kColors * kBytes);
  }
}

void StoreColors(const uint8_t* source, size_t width, const PngReader&, uint8_t* image, uint8_t*) {
  SwapColors(source, width, image);
}

void StoreDeepGrays(const uint8_t* source, size_t width, const PngReader&, uint8_t* image,
                    uint8_t*) {
  for (size_t x = 0; x < width; ++x) image[x] = HighByte(source + 2 * x);
}

// Palette colors with alpha.
void StorePaletteAlpha(const uint8_t* source, size_t width, const PngReader& reader, uint8_t* image,
                       uint8_t* alpha) {
  png_bytep opacities = nullptr;
  png_colorp colors = nullptr;
  int opacityCount = 0, count = 0;
  png_get_tRNS(reader.png, reader.info, &opacities, &opacityCount, nullptr);
  png_get_PLTE(reader.png, reader.info, &colors, &count);
  for (size_t x = 0; x < width; ++x, image += 3) {
    const int index = source[x];
    const png_color color = index < count ? colors[index] : png_color{};
    image[0] = color.blue;
    image[1] = color.green;
    image[2] = color.red;
    alpha[x] = index < opacityCount ? opacities[index] : uint8_t{255};
  }
}

// Pixel formats with a fast path; the others are left to the library.
StoreFileRow FileRowStore(const PngReader& reader, const PngLayout& layout) {
  struct Form {
    int type, depth;
    bool transparentColor;
    StoreFileRow store;
  };
  constexpr Form kForms[] = {
      {PNG_COLOR_TYPE_GRAY, 1, false, CopyPixels<1>},
      {PNG_COLOR_TYPE_GRAY, 4, false, CopyPixels<4>},
      {PNG_COLOR_TYPE_GRAY, 8, false, CopyPixels<8>},
      {PNG_COLOR_TYPE_GRAY, 16, false, StoreDeepGrays},
      {PNG_COLOR_TYPE_PALETTE, 1, false, CopyPixels<1>},
      {PNG_COLOR_TYPE_PALETTE, 4, false, CopyPixels<4>},
      {PNG_COLOR_TYPE_PALETTE, 8, false, CopyPixels<8>},
      {PNG_COLOR_TYPE_PALETTE, 8, true, StorePaletteAlpha},
      {PNG_COLOR_TYPE_GRAY_ALPHA, 8, false, StoreSamples<2, 1>},
      {PNG_COLOR_TYPE_GRAY_ALPHA, 16, false, StoreSamples<2, 2>},
      {PNG_COLOR_TYPE_RGB, 8, false, StoreColors},
      {PNG_COLOR_TYPE_RGB, 16, false, StoreSamples<3, 2>},
      {PNG_COLOR_TYPE_RGB_ALPHA, 8, false, StoreSamples<4, 1>},
      {PNG_COLOR_TYPE_RGB_ALPHA, 16, false, StoreSamples<4, 2>},
  };
  const bool transparentColor = png_get_valid(reader.png, reader.info, PNG_INFO_tRNS) != 0;
  for (const Form& form : kForms) {
    const bool matches = form.type == png_get_color_type(reader.png, reader.info) &&
                         form.depth == png_get_bit_depth(reader.png, reader.info) &&
                         form.transparentColor == transparentColor;
    if (matches && !layout.interlaced) return form.store;
  }
  return nullptr;
}

// Reads all rows, inflated at once, within `room` bytes of memory. False, with the target in an
// undefined state, if the library must be used.
bool ReadAtOnce(const PngReader& reader, const PngLayout& layout, const PictureRecord& picture,
                uint64_t room, PngTarget& target) {
  const StoreFileRow store = FileRowStore(reader, layout);
  if (store == nullptr) return false;
  const uint32_t pixelBits = uint32_t{png_get_bit_depth(reader.png, reader.info)} *
                             png_get_channels(reader.png, reader.info);
  const uint64_t rowBytes = (static_cast<uint64_t>(layout.width) * pixelBits + 7) / 8;
  PngPixels pixels;
  if (!pixels.Inflate(reader.file, rowBytes, pixelBits, layout.height, room)) return false;
  for (int32_t y = 0; y < layout.height; ++y) {
    const uint8_t* row = pixels.NextRow();
    if (row == nullptr) return false;
    store(row, static_cast<size_t>(layout.width), reader, target.image.Row(y).data(),
          target.alpha.Empty() ? nullptr : target.alpha.Row(y).data());
    if (picture.ReportRow(y) != Status::Ok) return false;  // the library then stops at once
  }
  return true;
}

Status ReadPixels(PngReader& reader, const PngLayout& layout, bool partial,
                  PictureRecord& picture) {
  PngTarget target;
  const bool withAlpha = layout.rows == RowForm::WithAlpha;
  const uint64_t pixels =
      static_cast<uint64_t>(layout.width) * static_cast<uint64_t>(layout.height);
  const uint64_t held =
      PackedRowBytes(layout.width, layout.height, layout.bitsPerPixel) + (withAlpha ? pixels : 0);
  RETURN_IF_BAD(CheckFileMemory(held + (!layout.interlaced ? 0 : withAlpha ? 4 * pixels : layout.rows == RowForm::TwoBits ? pixels : 0)));
  RETURN_IF_BAD(NewPackedImage(layout.width, layout.height, &picture.palette, layout.bitsPerPixel, target.image));
  if (withAlpha) RETURN_IF_BAD(NewAlphaPlane(layout.width, layout.height, target.alpha));
  if (!ReadAtOnce(reader, layout, picture, limits.fileMemoryBytes - held, target)) {
    // Not earlier: the library allocates rows of whatever width the file claims.
    if (!PngGuarded(reader.png, [&] { SetConversions(reader, layout); })) return reader.Failure();
    int32_t rows = 0;
    const Status status = layout.interlaced ? ReadInterlaced(reader, layout, picture, target, rows)
                                            : ReadInOrder(reader, layout, picture, target, rows);
    RETURN_IF_BAD(TakePart(picture, partial, status, rows));
  }
  picture.image = std::move(target.image);
  picture.alpha = std::move(target.alpha);
  return Status::Ok;
}

const char* ColorTypeName(png_byte type) {
  switch (type) {
    case PNG_COLOR_TYPE_GRAY: return "gray";
    case PNG_COLOR_TYPE_PALETTE: return "palette";
    case PNG_COLOR_TYPE_RGB: return "true color";
    case PNG_COLOR_TYPE_GRAY_ALPHA: return "gray with alpha";
    default: return "true color with alpha";
  }
}

void AddHeaderLines(const PngReader& reader, DetailLines& lines) {
  lines.AddFormat("   Color type: %s", ColorTypeName(png_get_color_type(reader.png, reader.info)));
  lines.AddFormat("    Bit depth: %d", png_get_bit_depth(reader.png, reader.info));
  const bool interlaced = png_get_interlace_type(reader.png, reader.info) != PNG_INTERLACE_NONE;
  lines.AddFormat("   Interlaced: %s", interlaced ? "yes" : "no");
  double gamma = 0;
  if (png_get_gAMA(reader.png, reader.info, &gamma) != 0)
    lines.AddFormat("        Gamma: %.5f", gamma);
  int intent = 0;
  if (png_get_sRGB(reader.png, reader.info, &intent) != 0) lines.Add("  Color space: sRGB");
}

void AddMetadataLines(const PictureRecord& picture, DetailLines& lines) {
  const PictureMetadata& metadata = picture.metadata;
  if (metadata.dpiX > 0)
    lines.AddFormat("   Resolution: %.0f x %.0f dpi", metadata.dpiX, metadata.dpiY);
  if (!metadata.icc.empty()) lines.AddFormat("  ICC profile: %zu bytes", metadata.icc.size());
  if (!metadata.exif.empty()) lines.AddFormat("         EXIF: %zu bytes", metadata.exif.size());
  if (!metadata.xmp.empty()) lines.AddFormat("          XMP: %zu bytes", metadata.xmp.size());
  if (picture.pageCount > 1) lines.AddFormat("       Frames: %d", picture.pageCount);
}

// Keywords of the text chunks, and the number of chunks.
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

// Whether there are texts written by a person, besides those that are kept; other keywords are
// written by programs.
bool HoldsFurtherTexts(std::span<const uint8_t> file) {
  constexpr std::string_view kOthers[] = {kPngXmpKeyword, "Comment", "Software", "Creation Time"};
  PngChunks chunks(file);
  PngChunk chunk;
  while (chunks.Next(chunk)) {
    if (chunk.type != "tEXt" && chunk.type != "zTXt" && chunk.type != "iTXt") continue;
    const std::string_view text(reinterpret_cast<const char*>(chunk.data.data()),
                                chunk.data.size());
    const std::string_view key = text.substr(0, text.find('\0'));
    if (!key.starts_with("date:") && std::ranges::find(kOthers, key) == std::end(kOthers))
      return true;
  }
  return false;
}

}  // namespace

Status DescribePng(std::span<const uint8_t> file, const ReadOptions& options,
                   PictureRecord& picture) {
  PngReader reader(file);
  PngLayout layout;
  return Describe(reader, file, layout, options, picture);
}

Status DecodePng(std::span<const uint8_t> file, const ReadOptions& options, PictureRecord& picture,
                 bool partial) {
  PngReader reader(file);
  PngLayout layout;
  RETURN_IF_BAD(Describe(reader, file, layout, options, picture));
  return ReadPixels(reader, layout, partial, picture);
}

Status PngInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  return DescribePng(file.Bytes(), request.options, picture);
}

namespace {

// A copy of a truncated file with the size of its last chunk adjusted, so that the decoder gets all
// of it.
std::vector<uint8_t> Mended(std::span<const uint8_t> file) {
  std::vector<uint8_t> mended;
  PngWalk walk(file);
  for (PngPlace chunk; walk.Next(chunk);) {
    if (chunk.End() <= file.size()) continue;
    if (chunk.type != "IDAT" || chunk.data >= file.size()) break;
    mended.assign(file.begin(), file.end());
    const auto put = [&](size_t at, uint64_t value) {
      for (size_t i = 0; i < 4; ++i) mended[at + i] = static_cast<uint8_t>(value >> (24 - 8 * i));
    };
    put(chunk.data - 8, file.size() - chunk.data);
    const auto summed = std::span<const uint8_t>(mended).subspan(chunk.data - 4);
    const uint32_t crc = libdeflate_crc32(0, summed.data(), summed.size());
    mended.resize(mended.size() + 4);
    put(mended.size() - 4, crc);
    break;
  }
  return mended;
}

// Replaces the picture with a frame of the animation.
Status ReadFrame(const ReadRequest& request, PictureRecord& picture) {
  picture.image.Free();
  picture.alpha.Free();
  AnimationPointer animation;
  RETURN_IF_BAD(PngAnimate(request, animation));
  for (int32_t i = 0; i <= request.page; ++i) {
    RETURN_IF_BAD(animation->Next());
    RETURN_IF_BAD(picture.ReportRow(i, request.page + 1));
  }
  const Rectangle all{0, 0, picture.width, picture.height};
  PackedImage image, alpha;
  RETURN_IF_BAD(CutImage(animation->Frame().image, all, image));
  if (!IsOpaque(animation->Frame().alpha))
    RETURN_IF_BAD(CutImage(animation->Frame().alpha, all, alpha));
  picture.bitsPerPixel = 24;
  MakeDefaultPalette(&picture.palette, nullptr, kDisplayPalette);
  picture.image = std::move(image);
  picture.alpha = std::move(alpha);
  return Status::Ok;
}

}  // namespace

Status PngRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  Status status = DecodePng(file.Bytes(), request.options, picture);
  if (request.partial && status == Status::FileReadError) {
    const std::vector<uint8_t> mended = Mended(file.Bytes());
    if (!mended.empty()) status = DecodePng(mended, request.options, picture, true);
  } else if (request.partial && status == Status::DamagedFile) {
    status = DecodePng(file.Bytes(), request.options, picture, true);
  }
  RETURN_IF_BAD(status);
  if (request.page > 0 && picture.pageCount > 1) return ReadFrame(request, picture);
  if (HoldsFurtherTexts(file.Bytes())) {
    picture.simplified = true;
    picture.unread |= kUnreadTexts;
  }
  return Status::Ok;
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
