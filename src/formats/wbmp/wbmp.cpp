// Wireless bitmap (WBMP): black and white pictures for early mobile phones.
//
//   type, 0: uncompressed; a number as below
//   fixed header, 1 byte: bit 7 says that further header bytes follow, not used in type 0
//   width, height: numbers of 7 bits per byte, most significant first; bit 7 is set if another byte
//   follows
//   rows, top first, (width + 7) / 8 bytes each; a set bit is white
//
// The reader ignores data after the rows. The writer stores the darker of two colors as black.
// Source: WAP Forum, "Wireless Application Environment Specification", WAP-237-WAEMT (2001).
#include "formats/wbmp/wbmp.h"

#include <algorithm>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "formats/plain_codec.h"
#include "processing/palette/two_colors.h"

namespace fotomill {

namespace {

constexpr uint64_t kLongestHeader = 16;
constexpr uint8_t kMore = 0x80;
constexpr uint8_t kExtended = 0x9f;  // bits of the fixed header that are 0 in type 0

struct WbmpHeader {
  int32_t width = 0, height = 0;
  uint64_t pixelOffset = 0;

  size_t RowSize() const { return (static_cast<size_t>(width) + 7) / 8; }
};

// A number of at most 31 bits; 0, which is not a valid size, if it is larger.
int32_t ReadNumber(ByteReader& bytes) {
  uint32_t number = 0;
  for (int i = 0; i < 5; ++i) {
    const uint8_t byte = bytes.U8();
    if (number > INT32_MAX >> 7) return 0;
    number = number << 7 | (byte & 0x7f);
    if ((byte & kMore) == 0) return static_cast<int32_t>(number);
  }
  return 0;
}

Status ParseHeader(std::span<const uint8_t> file, WbmpHeader& header) {
  ByteReader bytes(file);
  const uint8_t type = bytes.U8(), fixed = bytes.U8();
  header.width = ReadNumber(bytes);
  header.height = ReadNumber(bytes);
  header.pixelOffset = bytes.Position();
  if (!bytes.Ok()) return Status::FileReadError;
  if (type != 0) return (type & kMore) != 0 ? Status::DamagedFile : Status::UnsupportedFormat;
  if ((fixed & kExtended) != 0) return Status::DamagedFile;
  return header.width < 1 || header.height < 1 ? Status::DamagedFile : Status::Ok;
}

Status DescribePicture(const platform::FileView& file, const ReadRequest&, WbmpHeader& header,
                       PictureRecord& picture) {
  RETURN_IF_BAD(ParseHeader(file.Bytes(), header));
  SetPlainFacts(picture, header.width, header.height, 1);
  picture.palette = BlackAndWhite(true);
  return Status::Ok;
}

Status Decode(platform::FileView& file, const WbmpHeader& header, const PictureRecord& picture,
              PackedImage& image) {
  if (file.FileSize() - header.pixelOffset <
      header.RowSize() * static_cast<uint64_t>(header.height))
    return Status::FileReadError;
  RETURN_IF_BAD(NewPackedImage(header.width, header.height, &picture.palette, 1, image));
  ByteReader bytes(file.Bytes());
  bytes.Seek(header.pixelOffset);
  for (int32_t y = 0; y < header.height; ++y) {
    std::ranges::copy(bytes.Take(header.RowSize()), image.Row(y).begin());
    file.DropBefore(bytes.Position());
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  return Status::Ok;
}

void WriteNumber(ByteWriter& out, int32_t number) {
  for (int shift = 28; shift > 0; shift -= 7) {
    if (number >> shift != 0) out.U8(static_cast<uint8_t>(kMore | (number >> shift & 0x7f)));
  }
  out.U8(static_cast<uint8_t>(number & 0x7f));
}

constexpr PlainCodec<WbmpHeader> kCodec = {kLongestHeader, DescribePicture, Decode};

}  // namespace

Status WbmpInfo(PictureRecord& picture, const ReadRequest& request) {
  return PlainInfo(kCodec, picture, request);
}

Status WbmpRead(PictureRecord& picture, const ReadRequest& request) {
  return PlainRead(kCodec, picture, request);
}

Status WbmpWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  const PackedImage& image = picture.image;
  if (image.Empty()) return Status::MemoryAllocationError;
  if (image.Bits() > 1) return Status::TooManyColors;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  out.U8(0);
  out.U8(0);
  WriteNumber(out, image.Width());
  WriteNumber(out, image.Height());
  BlackAndWhiteRows rows(image, picture.palette, 0);
  for (int32_t y = 0; y < image.Height() && !out.Failed(); ++y) {
    RETURN_IF_BAD(picture.ReportRow(y));
    out.Bytes(rows.Row(y));
  }
  return CommitOutput(out, options);
}

}  // namespace fotomill
