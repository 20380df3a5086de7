// Dr. Halo (CUT), little-endian: 256 colors, with the palette in a second file of the same name.
//
//   offset size  field
//        0    4  width, height
//        4    2  reserved
//        6       rows, top first, each preceded by the size of its packed data, 2 bytes
//
// Packed data are runs, 128 + count and a value, and literals, count and that many bytes; 0 ends
// the row. For the palette see halo_palette.h.
//
// The reader fills incomplete rows with 0, and cuts those that are too long. Without a palette the
// picture is gray. Source: J. Murray and W. vanRyper, "Encyclopedia of Graphics File Formats", 2nd
// edition (1996).
#include "formats/drhalo/cut.h"

#include <algorithm>
#include <cstring>
#include <vector>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "formats/drhalo/halo_palette.h"
#include "formats/plain_codec.h"
#include "formats/split_runs.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr uint64_t kHeaderSize = 6;
constexpr uint8_t kRun = 0x80, kCount = 0x7f;
constexpr size_t kMostInToken = 127;
constexpr size_t kShortestRun = 3;
constexpr uint64_t kLeastRowSize = 2;  // the size field alone

struct CutHeader {
  int32_t width = 0, height = 0;
};

// FileReadError for a truncated header; DamagedFile also if the reserved field is not 0, as there
// is no other signature.
Status ParseHeader(std::span<const uint8_t> file, CutHeader& header) {
  ByteReader bytes(file);
  header.width = bytes.Le16();
  header.height = bytes.Le16();
  const uint16_t reserved = bytes.Le16();
  if (!bytes.Ok()) return Status::FileReadError;
  return header.width < 1 || header.height < 1 || reserved != 0 ? Status::DamagedFile : Status::Ok;
}

Status DescribePicture(const platform::FileView& file, const ReadRequest& request,
                       CutHeader& header, PictureRecord& picture) {
  RETURN_IF_BAD(ParseHeader(file.Bytes(), header));
  SetPlainFacts(picture, header.width, header.height, 8);
  picture.palette = GrayRamp();
  picture.warning.Clear();
  switch (ReadHaloPalette(request.fileName, picture.palette)) {
    case HaloPaletteResult::Read: picture.typeName.AssignCut("Dr. Halo with palette"); break;
    case HaloPaletteResult::Damaged:
      picture.warning.AssignCut("The palette file (PAL) is damaged.");
      [[fallthrough]];
    case HaloPaletteResult::Missing: picture.typeName.AssignCut("Dr. Halo without palette"); break;
  }
  return Status::Ok;
}

// FileReadError if the data end within a token.
Status DecodeRow(std::span<const uint8_t> code, std::span<uint8_t> row) {
  ByteReader bytes(code);
  for (size_t x = 0; bytes.Left() > 0;) {
    const uint8_t token = bytes.U8();
    const size_t count = token & kCount, room = std::min(count, row.size() - x);
    if (token == 0) break;
    if ((token & kRun) != 0) {
      std::memset(row.data() + x, bytes.U8(), room);
    } else {
      const auto plain = bytes.Take(count);
      std::copy_n(plain.begin(), std::min(room, plain.size()),
                  row.begin() + static_cast<ptrdiff_t>(x));
    }
    if (!bytes.Ok()) return Status::FileReadError;
    x += room;
  }
  return Status::Ok;
}

Status Decode(platform::FileView& file, const CutHeader& header, const PictureRecord& picture,
              PackedImage& image) {
  if (file.FileSize() - kHeaderSize < kLeastRowSize * static_cast<uint64_t>(header.height))
    return Status::FileReadError;
  RETURN_IF_BAD(NewPackedImage(header.width, header.height, &picture.palette, 8, image));
  ByteReader bytes(file.Bytes());
  bytes.Seek(kHeaderSize);
  for (int32_t y = 0; y < header.height; ++y) {
    const auto code = bytes.Take(bytes.Le16());
    if (!bytes.Ok()) return Status::FileReadError;
    RETURN_IF_BAD(DecodeRow(code, image.Row(y).first(static_cast<size_t>(header.width))));
    file.DropBefore(bytes.Position());
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  return Status::Ok;
}

void EncodeRow(std::span<const uint8_t> row, std::vector<uint8_t>& code) {
  code.clear();
  SplitRuns(
      row, kShortestRun, kMostInToken,
      [&](std::span<const uint8_t> bytes) { AppendCounted(bytes, kMostInToken, code); },
      [&](size_t count, uint8_t value) {
        code.insert(code.end(), {static_cast<uint8_t>(kRun | count), value});
      });
  code.push_back(0);
}

// UnsuitableImage if the packed data of a row are too long for the size field.
Status WriteRows(ByteWriter& out, const PictureRecord& picture, const PackedImage& image) {
  out.Le16(static_cast<uint16_t>(image.Width()));
  out.Le16(static_cast<uint16_t>(image.Height()));
  out.Le16(0);
  std::vector<uint8_t> code;
  for (int32_t y = 0; y < image.Height() && !out.Failed(); ++y) {
    RETURN_IF_BAD(picture.ReportRow(y));
    EncodeRow(image.Row(y).first(static_cast<size_t>(image.Width())), code);
    if (code.size() > UINT16_MAX) return Status::UnsuitableImage;
    out.Le16(static_cast<uint16_t>(code.size()));
    out.Bytes(code);
  }
  return out.WriteRest() ? Status::Ok : Status::ErrorWritingFile;
}

constexpr PlainCodec<CutHeader> kCodec = {kHeaderSize, DescribePicture, Decode};

}  // namespace

Status CutInfo(PictureRecord& picture, const ReadRequest& request) {
  if (request.signedOnly) return Status::UnsupportedFormat;
  return PlainInfo(kCodec, picture, request);
}

Status CutRead(PictureRecord& picture, const ReadRequest& request) {
  return PlainRead(kCodec, picture, request);
}

Status CutWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  if (picture.image.Empty()) return Status::MemoryAllocationError;
  if (picture.image.Bits() > 8) return Status::TooManyColors;
  PackedImage deeper;
  if (picture.image.Bits() < 8) RETURN_IF_BAD(PromoteImage(picture.image, 8, deeper));
  const PackedImage& image = deeper.Empty() ? picture.image : deeper;
  const std::string name(picture.fileName.view());
  ByteWriter out;
  if (!out.Create(name)) return Status::ErrorCreatingFile;
  RETURN_IF_BAD(WriteRows(out, picture, image));
  HaloPaletteFile palette;
  RETURN_IF_BAD(palette.Write(HaloPaletteName(name), picture.palette, options.existing));
  RETURN_IF_BAD(CommitOutput(out, options));
  palette.Keep();
  return Status::Ok;
}

}  // namespace fotomill
