// Microsoft Paint of Windows 1 and 2 (MSP), little-endian: black and white.
//
//   offset size  field
//        0    4  "DanM": version 1, "LinS": version 2
//        4    4  width, height
//        8    8  pixel aspect ratio of screen and printer, written as 1
//       16    4  size of the printer's page, written as that of the picture
//       20    4  unused
//       24    2  checksum: the XOR of all header words is 0
//       26    6  unused
//       32       version 1: rows, top first, (width + 7) / 8 bytes each
//       32       version 2: the packed size of each row, 2 bytes each; then the packed rows
//
// A set bit is white. Packed data are runs, 0, count and value, and literals, count and that many
// bytes. A row of packed size 0 is white.
//
// The reader ignores the checksum, fills incomplete rows with white, and cuts those that are too
// long. The writer creates version 2 and stores the darker of two colors as black. Source: J.
// Murray and W. vanRyper, "Encyclopedia of Graphics File Formats", 2nd edition (1996).
#include "formats/mspaint/msp.h"

#include <algorithm>
#include <cstring>
#include <vector>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "formats/plain_codec.h"
#include "formats/split_runs.h"
#include "processing/palette/two_colors.h"

namespace fotomill {

namespace {

constexpr uint64_t kHeaderSize = 32;
constexpr std::string_view kPlain = "DanM", kCoded = "LinS";
constexpr uint8_t kWhite = 0xff;
constexpr size_t kMostInToken = 255;
constexpr size_t kShortestRun = 4;  // a run takes three bytes

struct MspHeader {
  bool coded = false;
  int32_t width = 0, height = 0;

  size_t RowSize() const { return (static_cast<size_t>(width) + 7) / 8; }
};

Status ParseHeader(std::span<const uint8_t> file, MspHeader& header) {
  ByteReader bytes(file);
  header.coded = bytes.Match(kCoded);
  if (!header.coded && !bytes.Match(kPlain))
    return file.size() < 4 ? Status::FileReadError : Status::DamagedFile;
  header.width = bytes.Le16();
  header.height = bytes.Le16();
  bytes.Seek(kHeaderSize);
  if (!bytes.Ok()) return Status::FileReadError;
  return header.width < 1 || header.height < 1 ? Status::DamagedFile : Status::Ok;
}

Status DescribePicture(const platform::FileView& file, const ReadRequest&, MspHeader& header,
                       PictureRecord& picture) {
  RETURN_IF_BAD(ParseHeader(file.Bytes(), header));
  picture.typeName.AssignCut(header.coded ? "Microsoft Paint, version 2"
                                          : "Microsoft Paint, version 1");
  SetPlainFacts(picture, header.width, header.height, 1);
  picture.palette = BlackAndWhite(true);
  return Status::Ok;
}

void DecodeRow(std::span<const uint8_t> code, std::span<uint8_t> row) {
  std::ranges::fill(row, kWhite);
  ByteReader bytes(code);
  for (size_t x = 0; bytes.Left() > 0 && x < row.size();) {
    const uint8_t token = bytes.U8();
    const size_t count = token == 0 ? bytes.U8() : token, room = std::min(count, row.size() - x);
    if (token == 0) {
      const uint8_t value = bytes.U8();
      if (bytes.Ok()) std::memset(&row[x], value, room);
    } else {
      std::ranges::copy(bytes.Take(std::min<uint64_t>(room, bytes.Left())), &row[x]);
    }
    x += room;
  }
}

Status Decode(platform::FileView& file, const MspHeader& header, const PictureRecord& picture,
              PackedImage& image) {
  const uint64_t least = header.coded ? 2 : header.RowSize();
  if (file.FileSize() - kHeaderSize < least * static_cast<uint64_t>(header.height))
    return Status::FileReadError;
  RETURN_IF_BAD(NewPackedImage(header.width, header.height, &picture.palette, 1, image));
  ByteReader sizes(file.Bytes()), bytes(file.Bytes());
  sizes.Seek(kHeaderSize);
  bytes.Seek(kHeaderSize + (header.coded ? 2 * static_cast<uint64_t>(header.height) : 0));
  for (int32_t y = 0; y < header.height; ++y) {
    const auto row = image.Row(y).first(header.RowSize());
    const auto code = bytes.Take(header.coded ? sizes.Le16() : header.RowSize());
    if (!bytes.Ok() || !sizes.Ok()) return Status::FileReadError;
    if (header.coded) {
      DecodeRow(code, row);
    } else {
      std::ranges::copy(code, row.begin());
    }
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  return Status::Ok;
}

void WriteHeader(ByteWriter& out, const PackedImage& image) {
  const auto width = static_cast<uint16_t>(image.Width()),
             height = static_cast<uint16_t>(image.Height());
  const uint16_t words[] = {0x694c, 0x536e, width, height, 1, 1, 1, 1, width, height, 0, 0};
  uint16_t check = 0;
  for (const uint16_t word : words) {
    out.Le16(word);
    check ^= word;
  }
  out.Le16(check);
  out.Zeros(6);
}

void EncodeRow(std::span<const uint8_t> row, std::vector<uint8_t>& code) {
  code.clear();
  if (std::ranges::all_of(row, [](uint8_t byte) { return byte == kWhite; })) return;
  SplitRuns(
      row, kShortestRun, kMostInToken,
      [&](std::span<const uint8_t> bytes) { AppendCounted(bytes, kMostInToken, code); },
      [&](size_t count, uint8_t value) {
        code.insert(code.end(), {0, static_cast<uint8_t>(count), value});
      });
}

// UnsuitableImage if a packed row is too long for its size field.
Status WriteRows(ByteWriter& out, const PictureRecord& picture) {
  const PackedImage& image = picture.image;
  const auto width = static_cast<size_t>(image.Width());
  BlackAndWhiteRows rows(image, picture.palette, 0);
  std::vector<uint8_t> code, sizes;
  out.Zeros(2 * static_cast<uint64_t>(image.Height()));
  for (int32_t y = 0; y < image.Height() && !out.Failed(); ++y) {
    RETURN_IF_BAD(picture.ReportRow(y));
    const auto row = rows.Row(y);
    if (width % 8 != 0) row.back() |= static_cast<uint8_t>(0xff >> width % 8);
    EncodeRow(row, code);
    if (code.size() > UINT16_MAX) return Status::UnsuitableImage;
    sizes.push_back(static_cast<uint8_t>(code.size()));
    sizes.push_back(static_cast<uint8_t>(code.size() >> 8));
    out.Bytes(code);
  }
  if (!out.Failed()) out.Patch(kHeaderSize, sizes);
  return Status::Ok;
}

constexpr PlainCodec<MspHeader> kCodec = {kHeaderSize, DescribePicture, Decode};

}  // namespace

Status MspInfo(PictureRecord& picture, const ReadRequest& request) {
  return PlainInfo(kCodec, picture, request);
}

Status MspRead(PictureRecord& picture, const ReadRequest& request) {
  return PlainRead(kCodec, picture, request);
}

Status MspWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  const PackedImage& image = picture.image;
  if (image.Empty()) return Status::MemoryAllocationError;
  if (image.Bits() > 1) return Status::TooManyColors;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  WriteHeader(out, image);
  RETURN_IF_BAD(WriteRows(out, picture));
  return CommitOutput(out, options);
}

}  // namespace fotomill
