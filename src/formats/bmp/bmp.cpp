// Windows and OS/2 bitmaps (BMP, DIB), little-endian.
//
//   offset size  field
//        0    2  "BM"
//        2    4  file size
//        6    4  reserved, written as 0
//       10    4  file offset of the pixels
//       14    4  header size: 12 for OS/2; any other value is read as Windows, written as 40
//
//   Windows      field                                   OS/2         field
//       18    4  width                                       18    2  width
//       22    4  height; negative: top row first             20    2  height
//       26    2  planes, written as 1                        22    2  planes, written as 1
//       28    2  bits per pixel                              24    2  bits per pixel
//       30    4  compression, written as 0                   26       3-byte palette, then the rows
//       34    4  size of all rows
//       38    8  two resolutions, written as 0
//       46    8  colors used and important
//       54       4-byte palette
//
// Palette entries are blue, green, red (and 0). Rows are stored bottom-up, each padded to 4 bytes;
// pixels are indices of 1, 4 or 8 bits, or blue, green, red (and alpha).
//
// The reader supports compressions 1 (RLE8) and 2 (RLE4); all others are treated as uncompressed.
// Its quirks:
// - Both dialects need 54 header bytes. The palette always has 2^bits entries and follows the
//   40-byte header, regardless of header size and colors used; OS/2 pixels follow the palette,
//   regardless of the pixel offset.
// - 16 bits with compression 3: the pixel offset does not include the three masks after the header,
//   so pixels start 12 bytes after it. 5-6-5 masks give blue, green, red; all other 16-bit files
//   are 5-5-5 and give red, green, blue.
// - A 16-bit file may end within its last row.
// - Depths without a specific conversion (2, 12, 64) are copied byte for byte as far as they fit a
//   row.
// - Run-length data must end with an end-of-bitmap code; pixels outside the picture are ignored.
//
// The writer stores uncompressed rows, 32-bit ones if there is an alpha plane; OS/2 files have no
// alpha. Source: Microsoft, "BITMAPINFOHEADER structure" and "Bitmap Compression", Windows GDI
// reference; IBM, OS/2 2.0 "Presentation Manager Programming Reference", bitmap file format.
#include "formats/bmp/bmp.h"

#include <algorithm>
#include <cstring>
#include <limits>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "core/checked.h"
#include "core/text.h"
#include "formats/bmp/bmp_runs.h"
#include "picture/partial.h"
#include "platform/file_view.h"
#include "processing/pixel_rows.h"

namespace fotomill {

namespace {

// both headers of the Windows dialect; also required for OS/2 files
constexpr uint64_t kHeaderSize = 54;
constexpr uint64_t kOs2HeaderSize = 26;
constexpr uint32_t kOs2InfoSize = 12;
constexpr uint32_t kWindowsInfoSize = 40;
constexpr uint64_t kMasksSize = 12;
// rows are read and written in chunks of about this size
constexpr uint64_t kChunkSize = 16 << 20;

constexpr uint32_t kRle8 = 1, kRle4 = 2, kBitFields = 3;

struct BmpHeader {
  uint32_t fileSize = 0;  // as stored, unchecked
  uint32_t pixelOffset = 0;
  uint32_t infoSize = 0;  // size of the second header
  int32_t width = 0;
  int32_t height = 0;  // negative: top row first
  uint16_t planes = 0;
  uint16_t bits = 0;  // as stored, any value
  uint32_t compression = 0;
  uint32_t imageBytes = 0;
  uint32_t resolutionX = 0, resolutionY = 0;  // pixels per meter
  uint32_t colorsUsed = 0, colorsImportant = 0;

  bool IsOs2() const { return infoSize == kOs2InfoSize; }
  // Whether other programs may read it differently; never the case for files of our writer.
  bool IsPeculiar() const {
    return (!IsOs2() && infoSize != kWindowsInfoSize) || bits == 16 ||
           (bits > 8 && compression != 0);
  }
  bool TopDown() const { return height < 0; }
  // Number of rows, 0 if it is out of range.
  int32_t Rows() const {
    return height == std::numeric_limits<int32_t>::min() ? 0 : std::abs(height);
  }
  // Depth of the picture: as stored up to 8, else 24.
  int32_t Depth() const { return bits > 8 ? 24 : bits; }
  uint64_t FileStride() const { return RowStride(width, bits); }
  uint64_t PaletteOffset() const { return IsOs2() ? kOs2HeaderSize : kHeaderSize; }
  uint64_t PaletteEntrySize() const { return IsOs2() ? 3 : 4; }
  uint64_t PaletteSize() const { return bits > 8 ? 0 : (uint64_t{1} << bits) * PaletteEntrySize(); }
  bool HasMasks() const { return compression == kBitFields && bits == 16; }
  uint64_t PixelOffset() const {
    return IsOs2() ? PaletteOffset() + PaletteSize() : pixelOffset + (HasMasks() ? kMasksSize : 0);
  }
};

// Ok, or DamagedFile if the signature is wrong or the header is truncated.
Status ParseHeader(std::span<const uint8_t> file, BmpHeader& header) {
  ByteReader bytes(file.first(std::min<size_t>(file.size(), kHeaderSize)));
  const bool signature = bytes.Match("BM");
  header.fileSize = bytes.Le32();
  bytes.Skip(4);
  header.pixelOffset = bytes.Le32();
  header.infoSize = bytes.Le32();
  if (header.IsOs2()) {
    header.width = bytes.Le16();
    header.height = bytes.Le16();
    header.planes = bytes.Le16();
    header.bits = bytes.Le16();
    bytes.Seek(kHeaderSize);
  } else {
    header.width = static_cast<int32_t>(bytes.Le32());
    header.height = static_cast<int32_t>(bytes.Le32());
    header.planes = bytes.Le16();
    header.bits = bytes.Le16();
    header.compression = bytes.Le32();
    header.imageBytes = bytes.Le32();
    header.resolutionX = bytes.Le32();
    header.resolutionY = bytes.Le32();
    header.colorsUsed = bytes.Le32();
    header.colorsImportant = bytes.Le32();
  }
  return signature && bytes.Ok() ? Status::Ok : Status::DamagedFile;
}

// Reads `palette` for the header's depth. Entries missing in the file keep their value in the black
// and white palette.
void ReadPalette(std::span<const uint8_t> file, const BmpHeader& header, Palette& palette) {
  MakeDefaultPalette(&palette, nullptr, header.bits > 8 ? kDisplayPalette : kBlackAndWhitePalette);
  const uint64_t begin = std::min<uint64_t>(header.PaletteOffset(), file.size());
  const uint64_t size = std::min<uint64_t>(header.PaletteSize(), file.size() - begin);
  ByteReader bytes(file.subspan(begin, size));
  for (size_t i = 0; bytes.Left() >= header.PaletteEntrySize(); i += 3) {
    const std::span<const uint8_t> entry = bytes.Take(header.PaletteEntrySize());
    palette[i] = entry[2];
    palette[i + 1] = entry[1];
    palette[i + 2] = entry[0];
  }
}

// Fills in the record's header fields. DamagedFile if nothing can be decoded.
Status DescribePicture(const platform::FileView& file, const BmpHeader& header,
                       PictureRecord& picture) {
  if (header.width < 1 || header.Rows() < 1 || header.bits < 1) return Status::DamagedFile;
  picture.typeName.AssignCut(header.IsOs2() ? "OS/2 bitmap" : "Windows bitmap");
  picture.width = header.width;
  picture.height = header.Rows();
  picture.bitsPerPixel = header.Depth();
  picture.simplified = header.IsPeculiar();
  picture.imageBytes = EstimateImageBytes(picture.width, picture.height, picture.bitsPerPixel);
  picture.alphaFlags =
      static_cast<uint8_t>((picture.alphaFlags & ~kHasAlpha) | (header.bits > 24 ? kHasAlpha : 0));
  ReadPalette(file.Bytes(), header, picture.palette);
  return Status::Ok;
}

// Converts one row. `source` is a row of the file, which may be truncated only if the reader allows
// it; `row` is a row of the picture and `alpha` one of its alpha plane (empty if there is none),
// padding included. Must write all of `row`.
using RowReader = void (*)(std::span<const uint8_t> source, int32_t width, std::span<uint8_t> row,
                           std::span<uint8_t> alpha);

void CopyRow(std::span<const uint8_t> source, int32_t, std::span<uint8_t> row, std::span<uint8_t>) {
  const size_t count = std::min(source.size(), row.size());
  std::memcpy(row.data(), source.data(), count);
  std::memset(row.data() + count, 0, row.size() - count);
}

// Calls `spread(pixel, place)` for each complete 16-bit pixel of a row.
template <typename Spread>
void ReadRow16(std::span<const uint8_t> source, int32_t width, std::span<uint8_t> row,
               Spread spread) {
  const size_t count = std::min<size_t>(source.size() / 2, width);
  for (size_t x = 0; x < count; ++x) {
    spread(static_cast<uint32_t>(source[2 * x] | source[2 * x + 1] << 8), row.data() + 3 * x);
  }
  std::memset(row.data() + 3 * count, 0, row.size() - 3 * count);
}

void ReadRow565(std::span<const uint8_t> source, int32_t width, std::span<uint8_t> row,
                std::span<uint8_t>) {
  ReadRow16(source, width, row, [](uint32_t pixel, uint8_t* place) {
    place[0] = static_cast<uint8_t>((pixel & 31) * 8);
    place[1] = static_cast<uint8_t>((pixel >> 5 & 63) * 4);
    place[2] = static_cast<uint8_t>((pixel >> 11) * 8);
  });
}

// Red first, unlike in all other rows: a quirk of the format's first support,
// kept for compatibility.
void ReadRow555(std::span<const uint8_t> source, int32_t width, std::span<uint8_t> row,
                std::span<uint8_t>) {
  ReadRow16(source, width, row, [](uint32_t pixel, uint8_t* place) {
    place[0] = static_cast<uint8_t>((pixel >> 10 & 31) * 8);
    place[1] = static_cast<uint8_t>((pixel >> 5 & 31) * 8);
    place[2] = static_cast<uint8_t>((pixel & 31) * 8);
  });
}

void ReadRow32(std::span<const uint8_t> source, int32_t width, std::span<uint8_t> row,
               std::span<uint8_t>) {
  const size_t count = static_cast<size_t>(width);
  DropFourth(source.data(), count, row.data());
  std::memset(row.data() + 3 * count, 0, row.size() - 3 * count);
}

void ReadRow32Alpha(std::span<const uint8_t> source, int32_t width, std::span<uint8_t> row,
                    std::span<uint8_t> alpha) {
  const size_t count = static_cast<size_t>(width);
  SplitAlpha(source.data(), count, row.data(), alpha.data());
  std::memset(row.data() + 3 * count, 0, row.size() - 3 * count);
}

// Whether the masks after the header are for 5-6-5 pixels. FileReadError if they are truncated.
Status ReadMasks(std::span<const uint8_t> file, bool& is565) {
  ByteReader bytes(file);
  bytes.Seek(kHeaderSize);
  const uint32_t red = bytes.Le32(), green = bytes.Le32(), blue = bytes.Le32();
  is565 = red == 0xF800 && green == 0x07E0 && blue == 0x001F;
  return bytes.Ok() ? Status::Ok : Status::FileReadError;
}

Status ChooseRowReader(const platform::FileView& file, const BmpHeader& header,
                       const PackedImage& alpha, RowReader& reader) {
  reader = CopyRow;
  if (header.bits == 16) {
    bool is565 = false;
    if (header.HasMasks()) RETURN_IF_BAD(ReadMasks(file.Bytes(), is565));
    reader = is565 ? ReadRow565 : ReadRow555;
  } else if (header.bits == 32) {
    reader = alpha.Empty() ? ReadRow32 : ReadRow32Alpha;
  }
  return Status::Ok;
}

// FileReadError if the rows do not fit into the file. The last row of 16-bit pixels
// may be truncated.
Status CheckRowsFit(const platform::FileView& file, const BmpHeader& header) {
  const uint64_t rows = static_cast<uint64_t>(header.Rows()) - (header.bits == 16 ? 1 : 0);
  uint64_t size = 0, end = 0;
  const bool counted = CheckedMultiply(header.FileStride(), rows, size) &&
                       CheckedAdd(size, header.PixelOffset(), end);
  return counted && end <= file.FileSize() ? Status::Ok : Status::FileReadError;
}

// Number of complete rows in the file, at most all.
int32_t RowsInFile(const platform::FileView& file, const BmpHeader& header) {
  const uint64_t bytes = file.FileSize() - header.PixelOffset();
  const uint64_t stride = std::max<uint64_t>(header.FileStride(), 1);
  return static_cast<int32_t>(
      std::min<uint64_t>(bytes / stride, static_cast<uint64_t>(header.Rows())));
}

int32_t RowsPerChunk(uint64_t stride) {
  return static_cast<int32_t>(std::max<uint64_t>(kChunkSize / stride, 1));
}

// Copies the first `rows` rows, whose layout is the same in memory.
Status ReadRowsUnchanged(const platform::FileView& file, const BmpHeader& header, int32_t rows,
                         const PictureRecord& picture, PackedImage& image) {
  const int32_t height = image.Height();
  const uint64_t stride = image.Stride();
  const int32_t step = header.TopDown() ? 1 : RowsPerChunk(stride);
  for (int32_t r = 0; r < rows; r += step) {
    const int32_t count = std::min(step, rows - r);
    const uint64_t place = static_cast<uint64_t>(header.TopDown() ? height - 1 - r : r) * stride;
    const std::span<uint8_t> target =
        image.Rows().subspan(place, static_cast<uint64_t>(count) * stride);
    if (!file.ReadAt(header.PixelOffset() + static_cast<uint64_t>(r) * stride, target))
      return Status::FileReadError;
    for (int32_t i = 0; i < count; ++i) RETURN_IF_BAD(picture.ReportRow(r + i));
  }
  return Status::Ok;
}

Status ReadRowsConverted(platform::FileView& file, const BmpHeader& header, int32_t rows,
                         const PictureRecord& picture, RowReader readRow, PackedImage& image,
                         PackedImage& alpha) {
  const int32_t height = image.Height();
  const uint64_t stride = header.FileStride();
  for (int32_t r = 0; r < rows; ++r) {
    const uint64_t offset = header.PixelOffset() + static_cast<uint64_t>(r) * stride;
    const std::span<const uint8_t> source =
        file.Bytes().subspan(offset, std::min(stride, file.FileSize() - offset));
    const int32_t stored = header.TopDown() ? height - 1 - r : r;
    readRow(source, header.width, image.StoredRow(stored),
            alpha.Empty() ? std::span<uint8_t>() : alpha.StoredRow(stored));
    file.DropBefore(offset);
    RETURN_IF_BAD(picture.ReportRow(r));
  }
  return file.Intact() ? Status::Ok : Status::FileReadError;
}

// File layout for a picture to write.
struct BmpLayout {
  bool os2 = false;
  bool alpha = false;
  int32_t width = 0, height = 0;
  int32_t bits = 0;     // 1, 4, 8, 24, or 32 with alpha
  uint32_t colors = 0;  // palette entries
  uint32_t pixelOffset = 0;
  uint32_t rowBytes = 0;  // all rows
  uint32_t fileSize = 0;
};

// UnsuitableImage if a size does not fit its field.
Status ChooseLayout(const PictureRecord& picture, bool os2, BmpLayout& layout) {
  const PackedImage& image = picture.image;
  layout.os2 = os2;
  layout.alpha = !layout.os2 && image.Bits() == 24 && picture.alpha.Width() == image.Width() &&
                 picture.alpha.Height() == image.Height();
  layout.width = image.Width();
  layout.height = image.Height();
  layout.bits = layout.alpha ? 32 : image.Bits();
  layout.colors = static_cast<uint32_t>(image.Colors());
  layout.pixelOffset = static_cast<uint32_t>(layout.os2 ? kOs2HeaderSize + 3 * layout.colors
                                                        : kHeaderSize + 4 * layout.colors);
  const uint64_t rowBytes =
      RowStride(layout.width, layout.bits) * static_cast<uint64_t>(layout.height);
  if (rowBytes > UINT32_MAX - layout.pixelOffset) return Status::UnsuitableImage;
  if (layout.os2 && (layout.width > UINT16_MAX || layout.height > UINT16_MAX))
    return Status::UnsuitableImage;
  layout.rowBytes = static_cast<uint32_t>(rowBytes);
  layout.fileSize = layout.rowBytes + layout.pixelOffset;
  return Status::Ok;
}

void WriteHeader(ByteWriter& out, const BmpLayout& layout) {
  out.Text("BM");
  out.Le32(layout.fileSize);
  out.Le32(0);
  out.Le32(layout.pixelOffset);
  if (layout.os2) {
    out.Le32(kOs2InfoSize);
    out.Le16(static_cast<uint16_t>(layout.width));
    out.Le16(static_cast<uint16_t>(layout.height));
    out.Le16(1);
    out.Le16(static_cast<uint16_t>(layout.bits));
    return;
  }
  out.Le32(kWindowsInfoSize);
  out.Le32(static_cast<uint32_t>(layout.width));
  out.Le32(static_cast<uint32_t>(layout.height));
  out.Le16(1);
  out.Le16(static_cast<uint16_t>(layout.bits));
  out.Le32(0);
  out.Le32(layout.rowBytes);
  out.Zeros(8);
  out.Le32(layout.colors);
  out.Le32(layout.colors);
}

void WritePalette(ByteWriter& out, const BmpLayout& layout, const Palette& palette) {
  for (uint32_t i = 0; i < 3 * layout.colors; i += 3) {
    out.U8(palette[i + 2]);
    out.U8(palette[i + 1]);
    out.U8(palette[i]);
    if (!layout.os2) out.U8(0);
  }
}

Status WriteRowsUnchanged(ByteWriter& out, const PictureRecord& picture) {
  const PackedImage& image = picture.image;
  const int32_t step = RowsPerChunk(image.Stride());
  for (int32_t r = 0; r < image.Height() && !out.Failed(); r += step) {
    const int32_t count = std::min(step, image.Height() - r);
    for (int32_t i = 0; i < count; ++i) RETURN_IF_BAD(picture.ReportRow(r + i));
    out.Bytes(image.Rows().subspan(static_cast<uint64_t>(r) * image.Stride(),
                                   static_cast<uint64_t>(count) * image.Stride()));
  }
  return Status::Ok;
}

Status WriteRowsWithAlpha(ByteWriter& out, const PictureRecord& picture) {
  constexpr int32_t kPiece = ByteWriter::kMostReserved / 4;  // pixels
  const int32_t width = picture.image.Width();
  for (int32_t r = 0; r < picture.image.Height() && !out.Failed(); ++r) {
    RETURN_IF_BAD(picture.ReportRow(r));
    const uint8_t* color = picture.image.StoredRow(r).data();
    const uint8_t* alpha = picture.alpha.StoredRow(r).data();
    for (int32_t x = 0; x < width; x += kPiece) {
      const int32_t end = std::min(x + kPiece, width);
      const size_t count = static_cast<size_t>(end - x);
      MergeAlpha(color + 3 * x, alpha + x, count, out.Reserve(4 * count));
      out.Used(4 * count);
    }
  }
  return Status::Ok;
}

// A header value with commas as thousands separators.
std::string Number(int64_t number) {
  std::string text(number < 0 ? "-" : "");
  text += WithThousands(static_cast<uint64_t>(std::abs(number)));
  return text;
}

}  // namespace

Status BmpInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView file;
  if (!file.OpenHead(request.fileName.c_str(), kHeaderSize + 1024)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  BmpHeader header;
  RETURN_IF_BAD(ParseHeader(file.Bytes(), header));
  return DescribePicture(file, header, picture);
}

Status BmpRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  if (file.FileSize() < kHeaderSize) return Status::FileReadError;
  BmpHeader header;
  RETURN_IF_BAD(ParseHeader(file.Bytes(), header));
  RETURN_IF_BAD(DescribePicture(file, header, picture));

  const bool runLength = header.compression == kRle8 || header.compression == kRle4;
  if (header.PixelOffset() > file.FileSize()) return Status::FileReadError;
  const Status fits = runLength ? Status::Ok : CheckRowsFit(file, header);
  const int32_t rows = fits == Status::Ok ? header.Rows() : RowsInFile(file, header);
  RETURN_IF_BAD(TakePart(picture, request.partial, fits, rows));

  PackedImage image, alpha;
  RETURN_IF_BAD(NewPackedImage(
      picture.width, picture.height, &picture.palette, picture.bitsPerPixel, image,
      runLength || fits != Status::Ok ? platform::Fill::Zero : platform::Fill::Unset));
  if (header.bits > 24 && request.options.alphaChannels) {
    RETURN_IF_BAD(NewAlphaPlane(picture.width, picture.height, alpha));
  }

  if (runLength) {
    const BmpRuns runs{header.PixelOffset(), header.compression == kRle4, header.TopDown()};
    const Status decoded = DecodeBmpRuns(file, runs, picture, image);
    RETURN_IF_BAD(TakePart(picture, request.partial, decoded,
                           file.FileSize() > header.PixelOffset() ? 1 : 0));
  } else if (header.bits == image.Bits()) {
    RETURN_IF_BAD(ReadRowsUnchanged(file, header, rows, picture, image));
  } else {
    RowReader reader = nullptr;
    RETURN_IF_BAD(ChooseRowReader(file, header, alpha, reader));
    RETURN_IF_BAD(ReadRowsConverted(file, header, rows, picture, reader, image, alpha));
  }
  picture.image = std::move(image);
  picture.alpha = std::move(alpha);
  return Status::Ok;
}

Status BmpWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  if (picture.image.Empty()) return Status::MemoryAllocationError;
  BmpLayout layout;
  RETURN_IF_BAD(ChooseLayout(picture, options.encode.bmpOs2, layout));
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  WriteHeader(out, layout);
  WritePalette(out, layout, picture.palette);
  RETURN_IF_BAD(layout.alpha ? WriteRowsWithAlpha(out, picture) : WriteRowsUnchanged(out, picture));
  return CommitOutput(out, options);
}

Status BmpDetails(PictureRecord& picture) {
  picture.detailLines.Clear();
  platform::FileView file;
  if (!file.OpenHead(picture.fileName.c_str(), kHeaderSize)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  MakeDefaultPalette(&picture.palette, nullptr, kBlackAndWhitePalette);
  BmpHeader header;
  RETURN_IF_BAD(ParseHeader(file.Bytes(), header));
  DetailLines& lines = picture.detailLines;
  lines.Add(header.IsOs2() ? "OS/2 BITMAP" : "WINDOWS BITMAP");
  lines.AddFormat("            File size: %s", Number(header.fileSize).c_str());
  lines.AddFormat("          Header size: %u", header.pixelOffset);
  lines.AddFormat("            Info size: %u", header.infoSize);
  lines.AddFormat("                Width: %s", Number(header.width).c_str());
  lines.AddFormat("                Depth: %s", Number(header.height).c_str());
  lines.AddFormat("               Planes: %u", header.planes);
  lines.AddFormat("                 Bits: %u", header.bits);
  if (header.IsOs2()) return Status::Ok;
  lines.AddFormat("          Compression: %u", header.compression);
  lines.AddFormat("           Image size: %s", Number(header.imageBytes).c_str());
  lines.AddFormat("Horizontal resolution: %u", header.resolutionX);
  lines.AddFormat("  Vertical resolution: %u", header.resolutionY);
  lines.AddFormat("          Colors used: %s", Number(header.colorsUsed).c_str());
  lines.AddFormat("     Colors important: %s", Number(header.colorsImportant).c_str());
  return Status::Ok;
}

}  // namespace fotomill
