// Windows icons and cursors (ICO, CUR), little-endian.
//
//   offset size  field
//        0    2  reserved, 0
//        2    2  1: icons, 2: cursors
//        4    2  number of entries
//        6       entries of 16 bytes:
//       +0    2  width and height, 0 for 256
//       +2    2  number of colors, reserved
//       +4    4  icons: planes and bits per pixel; cursors: hot spot x and y
//       +8    4  size of the entry's picture
//      +12    4  its offset
//
// A picture is a complete PNG file, or a bitmap without file header: a 40-byte information header
// whose height is that of both following bitmaps together, the palette of blue, green, red, 0, the
// colors at 1, 4, 8, 16, 24 or 32 bits, then the AND mask at 1 bit (set: transparent). Rows are
// stored bottom-up, each padded to 4 bytes.
//
// The reader selects the largest entry, among equals the deepest, by the pictures' own headers: the
// numbers in the entries are often wrong. A bitmap of up to 8 bits without a transparent pixel
// keeps its palette; everything else becomes 24 bits with an alpha plane. The fourth byte of 32-bit
// pixels is alpha unless it is 0 everywhere, as written by old programs; then the mask is used. A
// missing mask is opaque.
//
// The writer stores one bitmap with its mask; 24 bits with an alpha plane as 32. ICOCompression
// selects PNG instead, for 256 x 256 pixels or for all sizes. Source: Microsoft, "Icons in Win32"
// (J. Hornick, 1995); "The evolution of the ICO file format" (R. Chen, 2010).
#include "formats/icon/ico.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <functional>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "core/choice_lists.h"
#include "core/text.h"
#include "formats/png/png.h"
#include "platform/file_view.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

constexpr uint16_t kIcons = 1, kCursors = 2;
constexpr uint32_t kInfoSize = 40;
constexpr int32_t kMostSide = 256;
constexpr uint32_t kFileHeaderSize = 6, kEntrySize = 16;

struct IcoEntry {
  uint16_t hotSpotX = 0, hotSpotY = 0;  // of a cursor
  uint16_t claimedBits = 32;            // from the directory, for pictures without their own
  std::span<const uint8_t> bytes;       // from the start of its picture to the end of the file
};

struct IcoFile {
  bool cursors = false;
  std::vector<IcoEntry> entries;
};

Status ParseDirectory(std::span<const uint8_t> file, IcoFile& icons) {
  ByteReader bytes(file);
  const uint16_t reserved = bytes.Le16(), type = bytes.Le16(), count = bytes.Le16();
  if (!bytes.Ok() || reserved != 0 || (type != kIcons && type != kCursors))
    return Status::DamagedFile;
  icons.cursors = type == kCursors;
  for (uint16_t i = 0; i < count; ++i) {
    bytes.Skip(4);
    IcoEntry entry;
    entry.hotSpotX = bytes.Le16();
    entry.hotSpotY = bytes.Le16();
    entry.claimedBits =
        icons.cursors || entry.hotSpotY == 0 || entry.hotSpotY > 32 ? uint16_t{32} : entry.hotSpotY;
    bytes.Skip(4);  // the size is often wrong and not needed
    const uint64_t offset = bytes.Le32();
    if (!bytes.Ok()) return Status::FileReadError;
    if (offset >= file.size()) continue;  // past the end; other entries may be valid
    entry.bytes = file.subspan(offset);
    icons.entries.push_back(entry);
  }
  return icons.entries.empty() ? Status::NoImages : Status::Ok;
}

// A bitmap entry, parsed.
struct IcoBitmap {
  int32_t width = 0, height = 0;  // of the picture, not of both bitmaps together
  uint16_t bits = 0;
  uint32_t compression = 0;
  std::span<const uint8_t> palette, colors, mask;  // mask: empty if missing

  uint64_t Stride() const { return RowStride(width, bits); }
  std::span<const uint8_t> Row(int32_t r) const {
    return colors.subspan(static_cast<uint64_t>(r) * Stride(), Stride());
  }
  // Whether the mask makes the pixel in stored row r transparent.
  bool Masked(int32_t x, int32_t r) const {
    if (mask.empty()) return false;
    const uint64_t place =
        static_cast<uint64_t>(r) * RowStride(width, 1) + static_cast<uint64_t>(x) / 8;
    return (mask[place] >> (7 - x % 8) & 1) != 0;
  }
};

// Ok; DamagedFile for an invalid header, UnsupportedFormat for compression, FileReadError if the
// colors are truncated.
Status ParseBitmap(std::span<const uint8_t> entry, IcoBitmap& bitmap) {
  ByteReader bytes(entry);
  const uint32_t infoSize = bytes.Le32();
  bitmap.width = static_cast<int32_t>(bytes.Le32());
  const auto bothHeights = static_cast<int32_t>(bytes.Le32());
  bytes.Skip(2);
  bitmap.bits = bytes.Le16();
  bitmap.compression = bytes.Le32();
  bytes.Skip(12);
  const uint32_t colorsUsed = bytes.Le32();
  if (!bytes.Ok()) return Status::FileReadError;
  if (infoSize < kInfoSize || bitmap.width < 1 || bothHeights < 2) return Status::DamagedFile;
  bitmap.height = bothHeights / 2;
  constexpr uint16_t kDepths[] = {1, 4, 8, 16, 24, 32};
  if (std::ranges::find(kDepths, bitmap.bits) == std::end(kDepths)) return Status::DamagedFile;
  if (bitmap.compression != 0) return Status::UnsupportedFormat;
  const uint32_t most = bitmap.bits <= 8 ? 1u << bitmap.bits : 0;
  bytes.Seek(infoSize);
  bitmap.palette =
      bytes.Take(uint64_t{4} * (colorsUsed == 0 || colorsUsed > most ? most : colorsUsed));
  if (bytes.Left() / bitmap.Stride() < static_cast<uint64_t>(bitmap.height))
    return Status::FileReadError;
  bitmap.colors = bytes.Take(bitmap.Stride() * static_cast<uint64_t>(bitmap.height));
  const uint64_t maskSize = RowStride(bitmap.width, 1) * static_cast<uint64_t>(bitmap.height);
  if (bytes.Left() >= maskSize) bitmap.mask = bytes.Take(maskSize);
  return bytes.Ok() ? Status::Ok : Status::FileReadError;
}

bool IsPng(std::span<const uint8_t> entry) {
  constexpr uint8_t kPngSignature[] = {0x89, 'P', 'N', 'G', '\r', '\n', 0x1A, '\n'};
  return entry.size() > 24 &&
         std::equal(std::begin(kPngSignature), std::end(kPngSignature), entry.begin());
}

// Rank of an entry: by area, then by depth; 0 if it cannot be read.
uint64_t Rank(const IcoEntry& entry) {
  if (IsPng(entry.bytes)) {
    ByteReader bytes(entry.bytes);
    bytes.Seek(16);  // width and height in the first chunk
    const uint64_t width = bytes.Be32(), height = bytes.Be32();
    return width > UINT16_MAX || height > UINT16_MAX ? 0 : width * height * 64 + entry.claimedBits;
  }
  IcoBitmap bitmap;
  if (ParseBitmap(entry.bytes, bitmap) != Status::Ok) return 0;
  return static_cast<uint64_t>(bitmap.width) * static_cast<uint64_t>(bitmap.height) * 64 +
         bitmap.bits;
}

// Entry `page` in order of rank; null past the end.
const IcoEntry* ChooseEntry(IcoFile& icons, int32_t page) {
  std::ranges::stable_sort(icons.entries, std::greater(), Rank);
  return static_cast<size_t>(page) < icons.entries.size()
             ? &icons.entries[static_cast<size_t>(page)]
             : nullptr;
}

bool AnyMasked(const IcoBitmap& bitmap) {
  for (int32_t r = 0; r < bitmap.height; ++r) {
    for (int32_t x = 0; x < bitmap.width; ++x) {
      if (bitmap.Masked(x, r)) return true;
    }
  }
  return false;
}

// Whether any fourth byte of 32-bit pixels is nonzero.
bool HasAlphaBytes(const IcoBitmap& bitmap) {
  if (bitmap.bits != 32) return false;
  for (size_t i = 3; i < bitmap.colors.size(); i += 4) {
    if (bitmap.colors[i] != 0) return true;
  }
  return false;
}

bool NeedsAlpha(const IcoBitmap& bitmap) { return HasAlphaBytes(bitmap) || AnyMasked(bitmap); }

void DescribeBitmap(const IcoBitmap& bitmap, PictureRecord& picture) {
  const bool alpha = NeedsAlpha(bitmap);
  picture.width = bitmap.width;
  picture.height = bitmap.height;
  picture.bitsPerPixel = alpha || bitmap.bits > 8 ? 24 : bitmap.bits;
  picture.alphaFlags =
      static_cast<uint8_t>((picture.alphaFlags & ~kHasAlpha) | (alpha ? kHasAlpha : 0));
  if (picture.bitsPerPixel == 24) {
    MakeDefaultPalette(&picture.palette, nullptr, kDisplayPalette);
    return;
  }
  picture.palette.fill(0);
  for (size_t i = 0; i < bitmap.palette.size() / 4; ++i) {
    picture.palette[3 * i] = bitmap.palette[4 * i + 2];
    picture.palette[3 * i + 1] = bitmap.palette[4 * i + 1];
    picture.palette[3 * i + 2] = bitmap.palette[4 * i];
  }
}

uint8_t FiveToEight(uint32_t value) { return static_cast<uint8_t>(value << 3 | value >> 2); }

// The color at column x as blue, green, red.
void ColorAt(const IcoBitmap& bitmap, std::span<const uint8_t> row, size_t x, uint8_t* color) {
  if (bitmap.bits == 16) {
    const uint32_t value = static_cast<uint32_t>(row[2 * x] | row[2 * x + 1] << 8);
    color[0] = FiveToEight(value & 31);
    color[1] = FiveToEight(value >> 5 & 31);
    color[2] = FiveToEight(value >> 10 & 31);
  } else if (bitmap.bits > 16) {
    std::memcpy(color, &row[x * (bitmap.bits / 8u)], 3);
  } else {
    const size_t perByte = 8u / bitmap.bits;
    const size_t shift = (perByte - 1 - x % perByte) * bitmap.bits;
    const size_t entry = 4 * (row[x / perByte] >> shift & ((1u << bitmap.bits) - 1));
    if (entry < bitmap.palette.size()) std::memcpy(color, &bitmap.palette[entry], 3);
  }
}

Status ReadBitmap(const IcoBitmap& bitmap, PictureRecord& picture, PackedImage& image,
                  PackedImage& alpha) {
  RETURN_IF_BAD(NewPackedImage(picture.width, picture.height, &picture.palette, picture.bitsPerPixel, image));
  const bool alphaBytes = HasAlphaBytes(bitmap);
  if ((picture.alphaFlags & kHasAlpha) != 0)
    RETURN_IF_BAD(NewAlphaPlane(picture.width, picture.height, alpha));
  for (int32_t r = 0; r < bitmap.height; ++r) {
    const auto source = bitmap.Row(r);
    const auto row = image.StoredRow(r);
    if (image.Bits() == bitmap.bits) {
      std::copy(source.begin(), source.end(), row.begin());
    } else {
      for (size_t x = 0; x < static_cast<size_t>(bitmap.width); ++x)
        ColorAt(bitmap, source, x, &row[3 * x]);
    }
    for (int32_t x = 0; x < bitmap.width && !alpha.Empty(); ++x) {
      const auto column = static_cast<size_t>(x);
      alpha.StoredRow(r)[column] = alphaBytes            ? source[4 * column + 3]
                                   : bitmap.Masked(x, r) ? 0
                                                         : 255;
    }
    RETURN_IF_BAD(picture.ReportRow(r));
  }
  return Status::Ok;
}

// A PNG entry is a complete file; file name and pages remain those of the icon.
Status LoadPngEntry(std::span<const uint8_t> entry, const ReadOptions& options,
                    PictureRecord& picture, PackedImage* image, PackedImage* alpha) {
  const FixedText<64> typeName = picture.typeName;
  const int32_t pages = picture.pageCount;
  const Status status =
      image == nullptr ? DescribePng(entry, options, picture) : DecodePng(entry, options, picture);
  picture.typeName = typeName;
  picture.pageCount = pages;
  RETURN_IF_BAD(status);
  if (image != nullptr) {
    *image = std::move(picture.image);
    *alpha = std::move(picture.alpha);
  }
  return Status::Ok;
}

// Facts, and with `image` the pixels, of the entry selected by the request's page.
Status LoadEntry(IcoFile& icons, const ReadRequest& request, PictureRecord& picture,
                 PackedImage* image, PackedImage* alpha) {
  const IcoEntry* entry = ChooseEntry(icons, request.page);
  if (entry == nullptr) return Status::NoImages;
  picture.typeName.AssignCut(icons.cursors ? "Windows cursor" : "Windows icon");
  picture.pageCount = static_cast<int32_t>(icons.entries.size());
  picture.hotSpotX = icons.cursors ? entry->hotSpotX : 0;
  picture.hotSpotY = icons.cursors ? entry->hotSpotY : 0;
  if (IsPng(entry->bytes))
    return LoadPngEntry(entry->bytes, request.options, picture, image, alpha);
  IcoBitmap bitmap;
  RETURN_IF_BAD(ParseBitmap(entry->bytes, bitmap));
  DescribeBitmap(bitmap, picture);
  picture.imageBytes = EstimateImageBytes(picture.width, picture.height, picture.bitsPerPixel);
  return image == nullptr ? Status::Ok : ReadBitmap(bitmap, picture, *image, *alpha);
}

// File layout for a picture to write.
struct IcoLayout {
  int32_t bits = 0;
  uint32_t colors = 0;
  uint32_t colorBytes = 0, maskBytes = 0;
  bool cursor = false;
  bool png = false;
};

IcoLayout ChooseLayout(const PictureRecord& picture, bool cursor, int32_t compression) {
  const PackedImage& image = picture.image;
  IcoLayout layout;
  layout.bits = image.Bits() == 24 && !picture.alpha.Empty() ? 32 : image.Bits();
  layout.colors = static_cast<uint32_t>(image.Colors());
  layout.colorBytes = static_cast<uint32_t>(RowStride(image.Width(), layout.bits)) *
                      static_cast<uint32_t>(image.Height());
  layout.maskBytes =
      static_cast<uint32_t>(RowStride(image.Width(), 1)) * static_cast<uint32_t>(image.Height());
  layout.cursor = cursor;
  const bool fullSize = image.Width() == kMostSide && image.Height() == kMostSide;
  layout.png =
      compression == choice::kIconPngAlways || (compression == choice::kIconPng256 && fullSize);
  return layout;
}

// A directory entry for a picture of `size` bytes at `offset`.
std::array<uint8_t, kEntrySize> MakeEntry(const PictureRecord& picture, const IcoLayout& layout,
                                          uint32_t size, uint32_t offset) {
  std::array<uint8_t, kEntrySize> entry = {};
  entry[0] = static_cast<uint8_t>(picture.image.Width());  // 256 becomes 0, as required
  entry[1] = static_cast<uint8_t>(picture.image.Height());
  entry[2] = static_cast<uint8_t>(layout.colors);
  const auto put = [&](size_t at, size_t bytes, uint32_t value) {
    for (size_t i = 0; i < bytes; ++i) entry[at + i] = static_cast<uint8_t>(value >> 8 * i);
  };
  put(4, 2, layout.cursor ? static_cast<uint32_t>(picture.hotSpotX) : 1);
  put(6, 2, static_cast<uint32_t>(layout.cursor ? picture.hotSpotY : layout.bits));
  put(8, 4, size);
  put(12, 4, offset);
  return entry;
}

void WriteBitmapHeader(ByteWriter& out, const PictureRecord& picture, const IcoLayout& layout) {
  out.Le32(kInfoSize);
  out.Le32(static_cast<uint32_t>(picture.image.Width()));
  out.Le32(2 * static_cast<uint32_t>(picture.image.Height()));
  out.Le16(1);
  out.Le16(static_cast<uint16_t>(layout.bits));
  out.Le32(0);
  out.Le32(layout.colorBytes + layout.maskBytes);
  out.Zeros(8);
  out.Le32(layout.colors);
  out.Le32(0);
  for (size_t i = 0; i < 3 * size_t{layout.colors}; i += 3) {
    out.U8(picture.palette[i + 2]);
    out.U8(picture.palette[i + 1]);
    out.U8(picture.palette[i]);
    out.U8(0);
  }
}

Status WriteColors(ByteWriter& out, const PictureRecord& picture, const IcoLayout& layout) {
  for (int32_t r = 0; r < picture.image.Height(); ++r) {
    const auto row = picture.image.StoredRow(r);
    RETURN_IF_BAD(picture.ReportRow(r));
    if (layout.bits != 32) {
      out.Bytes(row);
      continue;
    }
    const auto alpha = picture.alpha.StoredRow(r);
    for (size_t x = 0; x < static_cast<size_t>(picture.image.Width()); ++x) {
      out.Bytes(row.subspan(3 * x, 3));
      out.U8(alpha[x]);
    }
  }
  return Status::Ok;
}

// In the mask, pixels with less than half opacity are transparent.
void WriteMask(ByteWriter& out, const PictureRecord& picture) {
  std::vector<uint8_t> mask(RowStride(picture.image.Width(), 1));
  for (int32_t r = 0; r < picture.image.Height(); ++r) {
    std::ranges::fill(mask, uint8_t{0});
    for (size_t x = 0; x < static_cast<size_t>(picture.image.Width()) && !picture.alpha.Empty();
         ++x) {
      if (picture.alpha.StoredRow(r)[x] < 128) mask[x / 8] |= static_cast<uint8_t>(0x80 >> x % 8);
    }
    out.Bytes(mask);
  }
}

Status WriteBitmap(ByteWriter& out, const PictureRecord& picture, const IcoLayout& layout) {
  WriteBitmapHeader(out, picture, layout);
  RETURN_IF_BAD(WriteColors(out, picture, layout));
  WriteMask(out, picture);
  return Status::Ok;
}

class IcoSequence final : public SequenceWriter {
 public:
  IcoSequence(size_t count, const WriteOptions& options) : count_(count), options_(options) {}
  Status Create(const std::string& path) {
    if (count_ < 1 || count_ > UINT16_MAX) return Status::UnsuitableImage;
    if (!out_.Create(path)) return Status::ErrorCreatingFile;
    cursor_ = EqualIgnoringCase(platform::ExtensionOf(path), "cur");
    out_.Le16(0);
    out_.Le16(cursor_ ? kCursors : kIcons);
    out_.Le16(static_cast<uint16_t>(count_));
    out_.Zeros(count_ * kEntrySize);
    return Status::Ok;
  }

  Status Add(PictureRecord& picture, int32_t) override {
    if (picture.image.Empty()) return Status::EmptyImage;
    if (done_ == count_) return Status::UnsuitableImage;
    const IcoLayout layout = ChooseLayout(picture, cursor_, options_.encode.iconCompression);
    const uint64_t start = out_.Position();
    if (layout.png) {
      RETURN_IF_BAD(EncodePng(picture, options_.encode, out_));
    } else {
      RETURN_IF_BAD(WriteBitmap(out_, picture, layout));
    }
    const uint64_t end = out_.Position();
    if (end > UINT32_MAX) return Status::UnsuitableImage;
    out_.Patch(kFileHeaderSize + done_ * kEntrySize,
               MakeEntry(picture, layout, static_cast<uint32_t>(end - start),
                         static_cast<uint32_t>(start)));
    ++done_;
    return Status::Ok;
  }

  Status Finish() override {
    return done_ == count_ ? CommitOutput(out_, options_) : Status::UnsuitableImage;
  }

 private:
  const size_t count_;  // pictures, as in the file header
  const WriteOptions options_;
  ByteWriter out_;
  bool cursor_ = false;
  size_t done_ = 0;
};

}  // namespace

Status DescribeIcon(std::span<const uint8_t> file, const ReadRequest& request,
                    PictureRecord& picture) {
  IcoFile icons;
  RETURN_IF_BAD(ParseDirectory(file, icons));
  return LoadEntry(icons, request, picture, nullptr, nullptr);
}

Status DecodeIcon(std::span<const uint8_t> file, const ReadRequest& request,
                  PictureRecord& picture) {
  IcoFile icons;
  RETURN_IF_BAD(ParseDirectory(file, icons));
  PackedImage image, alpha;
  RETURN_IF_BAD(LoadEntry(icons, request, picture, &image, &alpha));
  picture.image = std::move(image);
  picture.alpha = std::move(alpha);
  return Status::Ok;
}

Status EncodeCursor(const PictureRecord& picture, ByteWriter& out) {
  const IcoLayout layout = ChooseLayout(picture, true, choice::kIconBitmaps);
  out.Le16(0);
  out.Le16(kCursors);
  out.Le16(1);
  const uint32_t size = kInfoSize + 4 * layout.colors + layout.colorBytes + layout.maskBytes;
  out.Bytes(MakeEntry(picture, layout, size, kFileHeaderSize + kEntrySize));
  return WriteBitmap(out, picture, layout);
}

Status IcoInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  return DescribeIcon(file.Bytes(), request, picture);
}

Status IcoRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  RETURN_IF_BAD(DecodeIcon(file.Bytes(), request, picture));
  if (file.Intact()) return Status::Ok;
  picture.image.Free();
  picture.alpha.Free();
  return Status::FileReadError;
}

Status IcoWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  if (picture.image.Empty()) return Status::MemoryAllocationError;
  IcoSequence file(1, options);
  RETURN_IF_BAD(file.Create(picture.fileName.c_str()));
  RETURN_IF_BAD(file.Add(picture, 0));
  return file.Finish();
}

Status IcoSequenceBegin(const std::string& path, const SequenceFacts& facts,
                        const WriteOptions& options, SequencePointer& sequence) {
  auto made = std::make_unique<IcoSequence>(facts.count, options);
  RETURN_IF_BAD(made->Create(path));
  sequence = std::move(made);
  return Status::Ok;
}

}  // namespace fotomill
