// DirectDraw surfaces (DDS): uncompressed ones and BC1 to BC5 and BC7 read, uncompressed ones
// written. The surfaces of an array and the sides of a cube are pages; of smaller copies of a
// surface, the one that is large enough serves for thumbnails.
//
//   "DDS ", a header of 124 bytes; with the code "DX10" a second header of 20 bytes; the surfaces,
//   each followed by its smaller copies; all little-endian
//
// Source: Microsoft, "Programming Guide for DDS" and the enumeration DXGI_FORMAT.
#include <algorithm>
#include <bit>
#include <filesystem>
#include <system_error>
#include <vector>

#include "blocks.h"
#include "fotomill_plugin_exports.h"

namespace {

using dds::Square;

constexpr size_t kHeaderSize = 128, kSecondHeaderSize = 20;
constexpr uint32_t kHasCode = 0x4, kHasAlpha = 0x1, kOnlyAlpha = 0x2, kHasColors = 0x40,
                   kHasGray = 0x20000;                     // of the pixels
constexpr uint32_t kIsCube = 0x200, kIsVolume = 0x200000;  // of the surface
constexpr uint32_t kMostSide = 65536, kMostSurfaces = 4096;

constexpr uint32_t Code(const char (&text)[5]) {
  return static_cast<uint32_t>(text[0]) | static_cast<uint32_t>(text[1]) << 8 |
         static_cast<uint32_t>(text[2]) << 16 | static_cast<uint32_t>(text[3]) << 24;
}

// A compression, by its code in the first header or its number in the second one.
struct Compression {
  uint32_t code;
  uint32_t numbers[2];
  const char* name;
  uint32_t blockSize;
  bool alpha;
  void (*decode)(const uint8_t*, Square&);
};
constexpr Compression kCompressions[] = {
    {Code("DXT1"), {71, 72}, "BC1", 8, true, dds::DecodeBc1},
    {Code("DXT2"), {0, 0}, "BC2", 16, true, dds::DecodeBc2},
    {Code("DXT3"), {74, 75}, "BC2", 16, true, dds::DecodeBc2},
    {Code("DXT4"), {0, 0}, "BC3", 16, true, dds::DecodeBc3},
    {Code("DXT5"), {77, 78}, "BC3", 16, true, dds::DecodeBc3},
    {Code("ATI1"), {80, 0}, "BC4", 8, false, dds::DecodeBc4},
    {Code("BC4U"), {80, 0}, "BC4", 8, false, dds::DecodeBc4},
    {Code("BC4S"), {81, 0}, "BC4", 8, false, dds::DecodeBc4Signed},
    {Code("ATI2"), {83, 0}, "BC5", 16, false, dds::DecodeBc5},
    {Code("BC5U"), {83, 0}, "BC5", 16, false, dds::DecodeBc5},
    {Code("BC5S"), {84, 0}, "BC5", 16, false, dds::DecodeBc5Signed},
    {0, {98, 99}, "BC7", 16, true, dds::DecodeBc7},
};

// Uncompressed pixels: where red, green, blue and alpha are, 0 for none; gray is in red.
struct Layout {
  uint32_t bits = 0, masks[4] = {};
  bool gray = false;
};
struct NumberedLayout {
  uint32_t number;
  Layout layout;
};
constexpr NumberedLayout kLayouts[] = {
    {24, {32, {0x3ff, 0xffc00, 0x3ff00000, 0xc0000000}, false}},
    {28, {32, {0xff, 0xff00, 0xff0000, 0xff000000}, false}},
    {29, {32, {0xff, 0xff00, 0xff0000, 0xff000000}, false}},
    {49, {16, {0xff, 0xff00, 0, 0}, false}},
    {61, {8, {0xff, 0, 0, 0}, true}},
    {65, {8, {0, 0, 0, 0xff}, false}},
    {85, {16, {0xf800, 0x7e0, 0x1f, 0}, false}},
    {86, {16, {0x7c00, 0x3e0, 0x1f, 0x8000}, false}},
    {87, {32, {0xff0000, 0xff00, 0xff, 0xff000000}, false}},
    {88, {32, {0xff0000, 0xff00, 0xff, 0}, false}},
    {91, {32, {0xff0000, 0xff00, 0xff, 0xff000000}, false}},
    {93, {32, {0xff0000, 0xff00, 0xff, 0}, false}},
    {115, {16, {0xf00, 0xf0, 0xf, 0xf000}, false}},
};

struct Header {
  uint32_t width = 0, height = 0, copies = 1, surfaces = 1;
  const Compression* compression = nullptr;  // null: as in `layout`
  Layout layout;
  size_t start = kHeaderSize;

  int Bits() const {
    if (compression != nullptr) return compression->alpha ? 32 : 24;
    if (layout.masks[3] != 0) return 32;
    return layout.gray ? 8 : 24;
  }
  uint32_t WidthOf(uint32_t copy) const { return std::max(1u, width >> copy); }
  uint32_t HeightOf(uint32_t copy) const { return std::max(1u, height >> copy); }
  uint64_t RowSize(uint32_t copy) const { return (uint64_t{WidthOf(copy)} * layout.bits + 7) / 8; }
  uint64_t SizeOf(uint32_t copy) const {
    if (compression == nullptr) return RowSize(copy) * HeightOf(copy);
    return uint64_t{(WidthOf(copy) + 3) / 4} * ((HeightOf(copy) + 3) / 4) * compression->blockSize;
  }
  // Where a copy of a surface starts in the file.
  uint64_t PlaceOf(uint32_t surface, uint32_t copy) const {
    return start + surface * SizeOfCopies(copies) + SizeOfCopies(copy);
  }
  // What a file is said to have, but no more than one that is missing.
  uint32_t SurfacesOf(uint64_t fileSize) const {
    const uint64_t there = fileSize / SizeOfCopies(copies);
    return static_cast<uint32_t>(std::min<uint64_t>(surfaces, there + 1));
  }

 private:
  uint64_t SizeOfCopies(uint32_t count) const {
    uint64_t size = 0;
    for (uint32_t i = 0; i < count; ++i) size += SizeOf(i);
    return size;
  }
};

int32_t TakeSecondHeader(const uint8_t* second, Header& header) {
  const uint32_t number = FmwGetLe(second, 4);
  for (const Compression& one : kCompressions) {
    if (number != 0 && (number == one.numbers[0] || number == one.numbers[1]))
      header.compression = &one;
  }
  for (const NumberedLayout& one : kLayouts) {
    if (one.number == number) header.layout = one.layout;
  }
  if (FmwGetLe(second + 4, 4) == 4) return FMW_ERROR_FORMAT;  // volumes
  const bool cube = (FmwGetLe(second + 8, 4) & 4) != 0;
  const uint64_t surfaces = uint64_t{std::max(1u, FmwGetLe(second + 12, 4))} * (cube ? 6 : 1);
  header.surfaces = static_cast<uint32_t>(std::min<uint64_t>(surfaces, kMostSurfaces));
  header.start += kSecondHeaderSize;
  return 0;
}

int32_t TakeLayout(const uint8_t* pixels, Header& header) {
  const uint32_t flags = FmwGetLe(pixels + 4, 4);
  Layout& layout = header.layout;
  layout.bits = FmwGetLe(pixels + 12, 4);
  layout.gray = (flags & kHasGray) != 0;
  if ((flags & (kHasColors | kHasGray)) != 0) {
    for (size_t i = 0; i < (layout.gray ? 1u : 3u); ++i)
      layout.masks[i] = FmwGetLe(pixels + 16 + 4 * i, 4);
  }
  if ((flags & (kHasAlpha | kOnlyAlpha)) != 0) layout.masks[3] = FmwGetLe(pixels + 28, 4);
  const bool any = (flags & (kHasColors | kHasGray | kOnlyAlpha)) != 0;
  return any && layout.bits % 8 == 0 && layout.bits >= 8 && layout.bits <= 32 ? 0
                                                                              : FMW_ERROR_FORMAT;
}

int32_t ParseHeader(const FmwFile& file, Header& header) {
  const uint8_t* const bytes = file.bytes;
  if (file.size < 4 || memcmp(bytes, "DDS ", 4) != 0) return FMW_ERROR_DAMAGED;
  if (file.size < kHeaderSize) return FMW_ERROR_READ;
  if (FmwGetLe(bytes + 4, 4) != 124 || FmwGetLe(bytes + 76, 4) != 32) return FMW_ERROR_DAMAGED;
  header.height = FmwGetLe(bytes + 12, 4);
  header.width = FmwGetLe(bytes + 16, 4);
  if (header.width < 1 || header.height < 1 || header.width > kMostSide ||
      header.height > kMostSide)
    return FMW_ERROR_DAMAGED;
  const auto most = static_cast<uint32_t>(std::bit_width(std::max(header.width, header.height)));
  header.copies = std::clamp(FmwGetLe(bytes + 28, 4), 1u, most);
  const uint32_t surface = FmwGetLe(bytes + 112, 4);
  if ((surface & kIsVolume) != 0) return FMW_ERROR_FORMAT;
  if ((surface & kIsCube) != 0)
    header.surfaces = static_cast<uint32_t>(std::max(1, std::popcount(surface & 0xfc00u)));
  if ((FmwGetLe(bytes + 80, 4) & kHasCode) == 0) return TakeLayout(bytes + 76, header);
  const uint32_t code = FmwGetLe(bytes + 84, 4);
  if (code == Code("DX10")) {
    if (file.size < kHeaderSize + kSecondHeaderSize) return FMW_ERROR_READ;
    const int32_t error = TakeSecondHeader(bytes + kHeaderSize, header);
    if (error != 0) return error;
  } else {
    const auto* found = std::ranges::find(kCompressions, code, &Compression::code);
    if (found != std::end(kCompressions)) header.compression = found;
  }
  return header.compression != nullptr || header.layout.bits > 0 ? 0 : FMW_ERROR_FORMAT;
}

// ---- reading ----

// Copies what of a square is within the picture.
void PutSquare(const Square& square, uint32_t left, uint32_t top, const FmwBitmap& bitmap) {
  const auto bytes = static_cast<size_t>(bitmap.bits / 8);
  const uint32_t width = std::min(4u, bitmap.width - left),
                 height = std::min(4u, bitmap.height - top);
  for (uint32_t y = 0; y < height; ++y) {
    uint8_t* target = FmwRow(&bitmap, top + y) + bytes * left;
    for (uint32_t x = 0; x < width; ++x, target += bytes)
      std::copy_n(square[4 * y + x].begin(), bytes, target);
  }
}

void ReadBlocks(const Compression& compression, const uint8_t* block, const FmwBitmap& bitmap) {
  Square square;
  for (uint32_t y = 0; y < bitmap.height; y += 4) {
    for (uint32_t x = 0; x < bitmap.width; x += 4, block += compression.blockSize) {
      compression.decode(block, square);
      PutSquare(square, x, y, bitmap);
    }
  }
}

// The samples of one component, from the bits of a pixel.
class Component {
 public:
  Component(uint32_t mask, uint8_t absent) : mask_(mask), absent_(absent) {
    if (mask == 0) return;
    shift_ = std::countr_zero(mask);
    most_ = mask >> shift_;
  }
  uint8_t Of(uint32_t pixel) const {
    if (mask_ == 0) return absent_;
    const uint64_t value = (pixel & mask_) >> shift_;
    return static_cast<uint8_t>(most_ == 255 ? value : (value * 255 + most_ / 2) / most_);
  }

 private:
  uint32_t mask_;
  uint8_t absent_;
  int shift_ = 0;
  uint32_t most_ = 1;
};

void ReadPlain(const Layout& layout, const uint8_t* pixel, const FmwBitmap& bitmap) {
  const Component red(layout.masks[0], 0), alpha(layout.masks[3], 255);
  const Component green(layout.masks[layout.gray ? 0 : 1], 0);
  const Component blue(layout.masks[layout.gray ? 0 : 2], 0);
  const auto bytes = static_cast<size_t>(bitmap.bits / 8);
  const int size = static_cast<int>(layout.bits / 8);
  for (uint32_t y = 0; y < bitmap.height; ++y) {
    uint8_t* target = FmwRow(&bitmap, y);
    for (uint32_t x = 0; x < bitmap.width; ++x, pixel += size, target += bytes) {
      const uint32_t value = FmwGetLe(pixel, size);
      const uint8_t samples[4] = {blue.Of(value), green.Of(value), red.Of(value), alpha.Of(value)};
      std::copy_n(samples, bytes, target);
    }
  }
}

int32_t Read(const char* fileName, const FMW_READ_REQUEST* request, FmwBitmap* bitmap) {
  FmwOwnedFile whole;
  Header header;
  int32_t error = FmwReadFile(fileName, UINT64_MAX, &whole.file);
  if (error == 0) error = ParseHeader(whole.file, header);
  if (error != 0) return error;
  const auto surface = static_cast<uint32_t>(std::max(request->page, 0));
  if (surface >= header.surfaces) return FMW_ERROR_DAMAGED;
  uint32_t copy = 0;
  while (request->wantedSide > 0 && copy + 1 < header.copies &&
         std::max(header.WidthOf(copy + 1), header.HeightOf(copy + 1)) >=
             static_cast<uint32_t>(request->wantedSide))
    ++copy;
  const uint64_t place = header.PlaceOf(surface, copy);
  if (place > whole.file.size || header.SizeOf(copy) > whole.file.size - place)
    return FMW_ERROR_READ;
  *bitmap = FmwNewBitmap(header.WidthOf(copy), header.HeightOf(copy), header.Bits(), request);
  if (bitmap->block == nullptr) return FMW_ERROR_MEMORY;
  const uint8_t* const start = whole.file.bytes + place;
  if (header.compression != nullptr) {
    ReadBlocks(*header.compression, start, *bitmap);
  } else {
    ReadPlain(header.layout, start, *bitmap);
  }
  return 0;
}

int32_t ReadHeader(const char* fileName, Header& header) {
  FmwOwnedFile start;
  const int32_t error = FmwReadFile(fileName, kHeaderSize + kSecondHeaderSize, &start.file);
  return error != 0 ? error : ParseHeader(start.file, header);
}

int32_t Describe(const char* fileName, FMW_PICTURE_INFO* info) {
  Header header;
  const int32_t error = ReadHeader(fileName, header);
  if (error != 0) return error;
  info->width = static_cast<int32_t>(header.width);
  info->height = static_cast<int32_t>(header.height);
  info->bitsPerPixel = header.Bits();
  std::error_code unknown;
  const uint64_t size = std::filesystem::file_size(fileName, unknown);
  if (unknown) return FMW_ERROR_READ;
  info->frame = static_cast<int32_t>(header.SurfacesOf(size));
  FmwGrayPalette(info);
  if (header.compression != nullptr) {
    snprintf(info->typeName, sizeof info->typeName, "DDS, %s", header.compression->name);
  } else {
    snprintf(info->typeName, sizeof info->typeName, "DDS, %u bits per pixel", header.layout.bits);
  }
  return 0;
}

// ---- writing ----

int32_t Write(const char* fileName, const FmwBitmap* given, const FMW_WRITE_REQUEST*) {
  const bool alpha = given->bits == 32;
  const uint32_t bytes = alpha ? 4 : 3;
  const uint32_t pitch = bytes * given->width;
  std::vector<uint8_t> out(kHeaderSize + size_t{pitch} * given->height);
  const struct {
    size_t place;
    uint32_t value;
  } fields[] = {
      {0, Code("DDS ")},
      {4, 124},
      {8, 0x100f},
      {12, given->height},
      {16, given->width},
      {20, pitch},
      {76, 32},
      {80, kHasColors | (alpha ? kHasAlpha : 0)},
      {88, 8 * bytes},
      {92, 0xff0000},
      {96, 0xff00},
      {100, 0xff},
      {104, alpha ? 0xff000000 : 0},
      {108, 0x1000},
  };
  for (const auto& field : fields) FmwPutLe(&out[field.place], field.value, 4);
  for (uint32_t y = 0; y < given->height; ++y) {
    uint8_t* const row = &out[kHeaderSize + size_t{pitch} * y];
    FmwGivenRow(given, y, alpha ? 1 : 0, row);
    for (uint32_t x = 0; x < pitch; x += bytes) std::swap(row[x], row[x + 2]);
  }
  return FmwWriteFile(fileName, out.data(), out.size());
}

constexpr FmwModule kModule = {
    .name = "DDS",
    .extensions = "dds",
    .description = "DirectDraw Surface",
    .bits = 24,
    .flags = FMW_FORMAT_BITMAP | FMW_FORMAT_MULTI | FMW_FORMAT_ALPHA,
    .options = nullptr,
    .optionCount = 0,
};

}  // namespace

FMW_MODULE(kModule)
FMW_MODULE_READS(Describe, Read)
FMW_MODULE_WRITES(Write)
