// OS/2 bitmap arrays (BGA), little-endian: several versions of one bitmap, icon or pointer.
//
//   offset size  field
//        0    2  "BA"
//        2    4  size of this structure
//        6    4  file offset of the next array header, 0 in the last one
//       10    4  width and height of the device, 0 for any
//       14       a file header:
//       +0    2  "BM" bitmap, "IC" icon, "PT" pointer, "CI" color icon, "CP" color pointer
//       +2    4  size of this structure
//       +6    4  hot spot x, and y from the bottom
//      +10    4  file offset of the pixels
//      +14       an information header, then the palette:
//
//   12 bytes: its size 4, width 2, height 2, planes 2, bits 2; palette entries of 3 bytes
//   16 and more: its size 4, width 4, height 4, planes 2, bits 2, and depending on its size
//      compression 4, size of the pixels 4, resolutions 8, colors used 4, important 4; palette
//      entries of 4 bytes
//
// Colors are blue, green, red (and 0); rows are stored bottom-up, each padded to 4 bytes. Icons and
// pointers have 1 bit and twice the height: the upper half is the AND mask (set: transparent), the
// lower half the XOR mask. For color icons and pointers, the palette is followed by a second file
// header for the picture itself; the first one is for the masks.
//
// The reader also accepts files with a single entry and no array. It stops at an array header whose
// offset is not after the previous one. Masked pixels become transparent, even inverting ones; a
// fourth byte that is 0 in all pixels is not alpha. The writer stores one bitmap, with a 12-byte
// header if possible, otherwise with 40 bytes: for pictures with alpha, as 32 bits, and for sides
// above 65535. Source: IBM, "OS/2 Presentation Manager Programming Reference", bitmap file format.
#include "formats/bmp/bga.h"

#include <algorithm>
#include <cstring>
#include <vector>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "core/limits.h"
#include "formats/bmp/bmp_runs.h"
#include "platform/file_view.h"
#include "processing/pixel_rows.h"

namespace fotomill {

namespace {

constexpr uint64_t kArrayHeaderSize = 14, kFileHeaderSize = 14;
constexpr uint32_t kCoreSize = 12, kLeastInfoSize = 16, kMostInfoSize = 64, kWindowsInfoSize = 40;
constexpr uint32_t kPlain = 0, kRle8 = 1, kRle4 = 2;
constexpr int32_t kMostCoreSide = UINT16_MAX;

enum class Kind { Bitmap, Icon, Pointer, ColorIcon, ColorPointer };
struct KindName {
  std::string_view signature;
  Kind kind;
  const char* name;
};
// clang-format off
constexpr KindName kKinds[] = {
    {"BM", Kind::Bitmap,       "OS/2 bitmap"},
    {"IC", Kind::Icon,         "OS/2 icon"},
    {"PT", Kind::Pointer,      "OS/2 pointer"},
    {"CI", Kind::ColorIcon,    "OS/2 color icon"},
    {"CP", Kind::ColorPointer, "OS/2 color pointer"},
};
// clang-format on

// Headers of one bitmap in the file.
struct Bitmap {
  const KindName* kind = nullptr;
  uint16_t hotSpotX = 0, hotSpotY = 0;
  uint32_t infoSize = 0;
  int32_t width = 0, height = 0;  // the height is never negative
  bool topDown = false;
  uint16_t bits = 0;
  uint32_t compression = kPlain, colorsUsed = 0;
  uint64_t paletteOffset = 0, pixelOffset = 0;

  bool Masks() const { return kind->kind != Kind::Bitmap; }
  uint64_t Stride() const { return RowStride(width, bits); }
  uint64_t ColorSize() const { return infoSize == kCoreSize ? 3 : 4; }
  uint64_t Colors() const {
    const uint64_t all = bits > 8 ? 0 : uint64_t{1} << bits;
    return colorsUsed == 0 || colorsUsed > all ? all : colorsUsed;
  }
  // Row r in stored order, which must be within the file.
  std::span<const uint8_t> Row(std::span<const uint8_t> file, int32_t r) const {
    const int32_t stored = topDown ? height - 1 - r : r;
    return file.subspan(pixelOffset + static_cast<uint64_t>(stored) * Stride(), Stride());
  }
};

// One entry: its picture, and the masks of icons and pointers.
struct Entry {
  Bitmap color, masks;
  bool masked = false;       // `masks` is used
  bool transparent = false;  // at least one pixel is masked
};

const KindName* FindKind(std::span<const uint8_t> signature) {
  const auto* const found = std::ranges::find_if(kKinds, [&](const KindName& row) {
    return std::ranges::equal(signature, row.signature, {}, {},
                              [](char c) { return static_cast<uint8_t>(c); });
  });
  return found == std::end(kKinds) ? nullptr : found;
}

void ParseInfo(ByteReader& bytes, Bitmap& bitmap) {
  if (bitmap.infoSize == kCoreSize) {
    bitmap.width = bytes.Le16();
    bitmap.height = bytes.Le16();
    bytes.Skip(2);
    bitmap.bits = bytes.Le16();
    return;
  }
  const uint64_t end = bytes.Position() - 4 + bitmap.infoSize;
  bitmap.width = static_cast<int32_t>(bytes.Le32());
  const auto height = static_cast<int32_t>(bytes.Le32());
  bitmap.topDown = height < 0;
  bitmap.height = height == INT32_MIN ? 0 : std::abs(height);
  bytes.Skip(2);
  bitmap.bits = bytes.Le16();
  const auto field = [&] { return bytes.Position() + 4 <= end ? bytes.Le32() : 0; };
  bitmap.compression = field();
  for (int i = 0; i < 3; ++i) (void)field();
  bitmap.colorsUsed = field();
  bytes.Seek(end);
}

// Parses the headers at an offset. DamagedFile, FileReadError, UnsupportedFormat.
Status ParseBitmap(std::span<const uint8_t> file, uint64_t offset, Bitmap& bitmap) {
  ByteReader bytes(file);
  bytes.Seek(offset);
  const auto signature = bytes.Take(2);
  if (!bytes.Ok()) return Status::FileReadError;
  bitmap.kind = FindKind(signature);
  if (bitmap.kind == nullptr) return Status::DamagedFile;
  bytes.Skip(4);
  bitmap.hotSpotX = bytes.Le16();
  bitmap.hotSpotY = bytes.Le16();
  bitmap.pixelOffset = bytes.Le32();
  bitmap.infoSize = bytes.Le32();
  const bool known = bitmap.infoSize == kCoreSize ||
                     (bitmap.infoSize >= kLeastInfoSize && bitmap.infoSize <= kMostInfoSize);
  if (bytes.Ok() && !known) return Status::DamagedFile;
  ParseInfo(bytes, bitmap);
  bitmap.paletteOffset = bytes.Position();
  if (!bytes.Ok()) return Status::FileReadError;
  if (bitmap.width < 1 || bitmap.height < 1) return Status::DamagedFile;
  constexpr uint16_t kDepths[] = {1, 4, 8, 16, 24, 32};
  if (std::ranges::find(kDepths, bitmap.bits) == std::end(kDepths))
    return Status::UnsupportedFormat;
  const bool decoded = bitmap.compression == kPlain ||
                       (bitmap.compression == kRle8 && bitmap.bits == 8) ||
                       (bitmap.compression == kRle4 && bitmap.bits == 4);
  return decoded ? Status::Ok : Status::UnsupportedFormat;
}

// FileReadError if the rows of an uncompressed bitmap do not fit into the file.
Status CheckRowsFit(std::span<const uint8_t> file, const Bitmap& bitmap) {
  if (bitmap.pixelOffset > file.size()) return Status::FileReadError;
  if (bitmap.compression != kPlain) return Status::Ok;
  const uint64_t rows = (file.size() - bitmap.pixelOffset) / bitmap.Stride();
  return rows < static_cast<uint64_t>(bitmap.height) ? Status::FileReadError : Status::Ok;
}

bool BitOf(std::span<const uint8_t> row, int32_t x) {
  return (row[static_cast<size_t>(x) / 8] >> (7 - x % 8) & 1) != 0;
}

// Whether the mask makes the pixel in stored row r transparent.
bool IsMasked(std::span<const uint8_t> file, const Entry& entry, int32_t x, int32_t r) {
  return BitOf(entry.masks.Row(file, entry.masks.height / 2 + r), x);
}

bool AnyMasked(std::span<const uint8_t> file, const Entry& entry) {
  for (int32_t r = 0; r < entry.color.height; ++r) {
    for (int32_t x = 0; x < entry.color.width; ++x) {
      if (IsMasked(file, entry, x, r)) return true;
    }
  }
  return false;
}

// Parses an entry's headers, and checks whether a mask hides any pixel.
Status ParseEntry(std::span<const uint8_t> file, uint64_t offset, Entry& entry) {
  RETURN_IF_BAD(ParseBitmap(file, offset, entry.color));
  RETURN_IF_BAD(CheckRowsFit(file, entry.color));
  entry.masked = entry.color.Masks();
  if (!entry.masked) return Status::Ok;
  entry.masks = entry.color;
  const Bitmap& masks = entry.masks;
  if (masks.bits != 1 || masks.compression != kPlain || masks.height < 2)
    return Status::DamagedFile;
  if (masks.kind->kind == Kind::ColorIcon || masks.kind->kind == Kind::ColorPointer) {
    const uint64_t second = masks.paletteOffset + masks.Colors() * masks.ColorSize();
    RETURN_IF_BAD(ParseBitmap(file, second, entry.color));
    RETURN_IF_BAD(CheckRowsFit(file, entry.color));
  } else {
    entry.color.height /= 2;  // the lower half, which is stored first
  }
  if (entry.color.width != masks.width || entry.color.height != masks.height / 2 || masks.topDown ||
      entry.color.topDown)
    return Status::DamagedFile;
  entry.transparent = AnyMasked(file, entry);
  return Status::Ok;
}

// File offsets of the entries' file headers, in file order.
Status FindEntries(std::span<const uint8_t> file, std::vector<uint64_t>& entries) {
  if (file.size() < 2) return Status::FileReadError;
  if (FindKind(file.first(2)) != nullptr) {
    entries.push_back(0);
    return Status::Ok;
  }
  for (uint64_t offset = 0; entries.size() < limits.filePages;) {
    ByteReader bytes(file);
    bytes.Seek(offset);
    const bool array = bytes.Match("BA");
    bytes.Skip(4);
    const uint32_t next = bytes.Le32();
    if (!array && offset == 0) return Status::DamagedFile;
    if (!array || !bytes.Ok()) break;
    entries.push_back(offset + kArrayHeaderSize);
    if (next <= offset) break;
    offset = next;
  }
  return entries.empty() ? Status::FileReadError : Status::Ok;
}

void ReadPalette(std::span<const uint8_t> file, const Bitmap& bitmap, Palette& palette) {
  MakeDefaultPalette(&palette, nullptr, bitmap.bits > 8 ? kDisplayPalette : kBlackAndWhitePalette);
  ByteReader bytes(file);
  bytes.Seek(bitmap.paletteOffset);
  for (size_t i = 0; i < 3 * bitmap.Colors() && bytes.Left() >= bitmap.ColorSize(); i += 3) {
    const auto color = bytes.Take(bitmap.ColorSize());
    std::reverse_copy(color.begin(), color.begin() + 3, &palette[i]);
  }
}

Status DescribeEntry(std::span<const uint8_t> file, const ReadRequest& request,
                     PictureRecord& picture, Entry& entry) {
  picture.typeName.Clear();
  std::vector<uint64_t> entries;
  RETURN_IF_BAD(FindEntries(file, entries));
  picture.pageCount = static_cast<int32_t>(entries.size());
  if (request.page < 0 || request.page >= picture.pageCount) return Status::NoImages;
  RETURN_IF_BAD(ParseEntry(file, entries[static_cast<size_t>(request.page)], entry));
  const Bitmap& color = entry.color;
  picture.typeName.AssignCut(color.kind->name);
  picture.width = color.width;
  picture.height = color.height;
  picture.bitsPerPixel = entry.transparent || color.bits > 8 ? 24 : color.bits;
  picture.imageBytes = EstimateImageBytes(color.width, color.height, picture.bitsPerPixel);
  const bool alpha = entry.transparent || color.bits == 32;
  picture.alphaFlags =
      static_cast<uint8_t>((picture.alphaFlags & ~kHasAlpha) | (alpha ? kHasAlpha : 0));
  const bool pointer = color.kind->kind == Kind::Pointer || color.kind->kind == Kind::ColorPointer;
  picture.hotSpotX = pointer ? std::min<int32_t>(color.hotSpotX, color.width - 1) : 0;
  picture.hotSpotY = pointer ? std::max(0, color.height - 1 - color.hotSpotY) : 0;
  ReadPalette(file, color, picture.palette);
  return CheckPackedSize(picture.width, picture.height, picture.bitsPerPixel);
}

// Converts a row of the file to the picture.
void SpreadColors16(std::span<const uint8_t> source, size_t width, uint8_t* row) {
  const auto widen = [](uint32_t value) { return static_cast<uint8_t>(value << 3 | value >> 2); };
  for (size_t x = 0; x < width; ++x) {
    const uint32_t pixel = static_cast<uint32_t>(source[2 * x] | source[2 * x + 1] << 8);
    for (unsigned c = 0; c < 3; ++c) row[3 * x + c] = widen(pixel >> 5 * c & 31);
  }
}
void SpreadIndices(std::span<const uint8_t> source, const Bitmap& bitmap, const Palette& palette,
                   uint8_t* row) {
  const size_t perByte = 8u / bitmap.bits, mask = (1u << bitmap.bits) - 1;
  for (size_t x = 0; x < static_cast<size_t>(bitmap.width); ++x) {
    const size_t shift = (perByte - 1 - x % perByte) * bitmap.bits;
    const uint8_t* const color = &palette[3 * (source[x / perByte] >> shift & mask)];
    std::reverse_copy(color, color + 3, row + 3 * x);
  }
}

// Fills the rows of `image`, and of `alpha` if pixels have alpha or a mask hides some. `stored`
// returns rows at the file's depth.
template <typename StoredRows>
Status PutRows(std::span<const uint8_t> file, const Entry& entry, const PictureRecord& picture,
               StoredRows stored, PackedImage& image, PackedImage& alpha) {
  const Bitmap& color = entry.color;
  const auto width = static_cast<size_t>(color.width);
  for (int32_t r = 0; r < color.height; ++r) {
    const std::span<const uint8_t> source = stored(r);
    const auto row = image.StoredRow(r);
    if (color.bits == image.Bits()) {
      std::memcpy(row.data(), source.data(), row.size());
    } else if (color.bits == 16) {
      SpreadColors16(source, width, row.data());
    } else if (color.bits < 16) {
      SpreadIndices(source, color, picture.palette, row.data());
    } else if (alpha.Empty() || entry.transparent) {
      DropFourth(source.data(), width, row.data());
    } else {
      SplitAlpha(source.data(), width, row.data(), alpha.StoredRow(r).data());
    }
    for (int32_t x = 0; x < color.width && entry.transparent && !alpha.Empty(); ++x)
      alpha.StoredRow(r)[static_cast<size_t>(x)] = IsMasked(file, entry, x, r) ? 0 : 255;
    RETURN_IF_BAD(picture.ReportRow(r));
  }
  return Status::Ok;
}

Status DecodeEntry(platform::FileView& file, const Entry& entry, const PictureRecord& picture,
                   PackedImage& image, PackedImage& alpha) {
  const Bitmap& color = entry.color;
  if (color.compression == kPlain) {
    const auto stored = [&](int32_t r) { return color.Row(file.Bytes(), r); };
    return PutRows(file.Bytes(), entry, picture, stored, image, alpha);
  }
  const BmpRuns runs{color.pixelOffset, color.compression == kRle4, color.topDown};
  if (image.Bits() == color.bits) return DecodeBmpRuns(file, runs, picture, image);
  PackedImage indices;
  RETURN_IF_BAD(NewPackedImage(color.width, color.height, nullptr, color.bits, indices));
  RETURN_IF_BAD(DecodeBmpRuns(file, runs, picture, indices));
  const auto stored = [&](int32_t r) { return std::span<const uint8_t>(indices.StoredRow(r)); };
  return PutRows(file.Bytes(), entry, picture, stored, image, alpha);
}

bool IsAllZero(std::span<const uint8_t> bytes) {
  return std::ranges::all_of(bytes, [](uint8_t byte) { return byte == 0; });
}

// File layout for a picture to write.
struct BgaLayout {
  bool alpha = false, core = true;
  uint32_t bits = 24, colors = 0, infoSize = kCoreSize, pixelOffset = 0;
};

BgaLayout ChooseLayout(const PictureRecord& picture) {
  const PackedImage& image = picture.image;
  BgaLayout layout;
  layout.alpha = image.Bits() == 24 && picture.alpha.Width() == image.Width() &&
                 picture.alpha.Height() == image.Height();
  layout.core = !layout.alpha && image.Width() <= kMostCoreSide && image.Height() <= kMostCoreSide;
  layout.bits = layout.alpha ? 32 : static_cast<uint32_t>(image.Bits());
  layout.colors = static_cast<uint32_t>(image.Colors());
  layout.infoSize = layout.core ? kCoreSize : kWindowsInfoSize;
  layout.pixelOffset = static_cast<uint32_t>(kArrayHeaderSize + kFileHeaderSize) + layout.infoSize +
                       (layout.core ? 3 : 4) * layout.colors;
  return layout;
}

void WriteHead(ByteWriter& out, const PictureRecord& picture, const BgaLayout& layout) {
  const auto width = static_cast<uint32_t>(picture.image.Width()),
             height = static_cast<uint32_t>(picture.image.Height());
  out.Text("BA");
  out.Le32(static_cast<uint32_t>(kArrayHeaderSize + kFileHeaderSize) + layout.infoSize);
  out.Zeros(8);
  out.Text("BM");
  out.Le32(static_cast<uint32_t>(kFileHeaderSize) + layout.infoSize);
  out.Zeros(4);
  out.Le32(layout.pixelOffset);
  out.Le32(layout.infoSize);
  const auto side = [&](uint32_t value) {
    if (layout.core) {
      out.Le16(static_cast<uint16_t>(value));
    } else {
      out.Le32(value);
    }
  };
  side(width);
  side(height);
  out.Le16(1);
  out.Le16(static_cast<uint16_t>(layout.bits));
  if (!layout.core) out.Zeros(24);
  for (size_t i = 0; i < 3 * size_t{layout.colors}; i += 3) {
    for (size_t c = 3; c > 0; --c) out.U8(picture.palette[i + c - 1]);
    if (!layout.core) out.U8(0);
  }
}

Status WriteRows(ByteWriter& out, const PictureRecord& picture, bool withAlpha) {
  const PackedImage& image = picture.image;
  const auto width = static_cast<size_t>(image.Width());
  std::vector<uint8_t> row(withAlpha ? 4 * width : 0);
  for (int32_t r = 0; r < image.Height() && !out.Failed(); ++r) {
    RETURN_IF_BAD(picture.ReportRow(r));
    if (withAlpha)
      MergeAlpha(image.StoredRow(r).data(), picture.alpha.StoredRow(r).data(), width, row.data());
    out.Bytes(withAlpha ? std::span<const uint8_t>(row) : image.StoredRow(r));
  }
  return Status::Ok;
}

}  // namespace

Status BgaInfo(PictureRecord& picture, const ReadRequest& request) {
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  Entry entry;
  return DescribeEntry(file.Bytes(), request, picture, entry);
}

Status BgaRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  Entry entry;
  RETURN_IF_BAD(DescribeEntry(file.Bytes(), request, picture, entry));
  PackedImage image, alpha;
  RETURN_IF_BAD(
      NewPackedImage(picture.width, picture.height, &picture.palette, picture.bitsPerPixel, image));
  const bool wanted = entry.transparent || request.options.alphaChannels;
  if (wanted && (picture.alphaFlags & kHasAlpha) != 0)
    RETURN_IF_BAD(NewAlphaPlane(picture.width, picture.height, alpha));
  RETURN_IF_BAD(DecodeEntry(file, entry, picture, image, alpha));
  if (!file.Intact()) return Status::FileReadError;
  if (!alpha.Empty() && !entry.transparent && IsAllZero(alpha.Rows())) {
    alpha.Free();
    picture.alphaFlags = static_cast<uint8_t>(picture.alphaFlags & ~kHasAlpha);
  }
  picture.image = std::move(image);
  picture.alpha = std::move(alpha);
  return Status::Ok;
}

Status BgaWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  if (picture.image.Empty()) return Status::MemoryAllocationError;
  const BgaLayout layout = ChooseLayout(picture);
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  WriteHead(out, picture, layout);
  RETURN_IF_BAD(WriteRows(out, picture, layout.alpha));
  return CommitOutput(out, options);
}

}  // namespace fotomill
