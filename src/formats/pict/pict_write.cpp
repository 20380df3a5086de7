// The writer of Macintosh pictures: version 2 with the 512-byte preamble, one bitmap of direct
// pixels, packed by components.
#include <vector>

#include "core/byte_writer.h"
#include "core/pack_bits.h"
#include "formats/pict/pict.h"
#include "processing/pixel_rows.h"

namespace fotomill {

namespace {

constexpr uint32_t kScreenResolution = 72 << 16;
// pixel type, bits per pixel, components, bits per component
constexpr uint16_t kDirectPixels[] = {16, 32, 3, 8};
constexpr size_t kLongRow = 250;
constexpr uint64_t kPreamble = 512;

void WriteFrame(ByteWriter& out, const PackedImage& image) {
  out.Be32(0);
  out.Be16(static_cast<uint16_t>(image.Height()));
  out.Be16(static_cast<uint16_t>(image.Width()));
}

void WriteHead(ByteWriter& out, const PackedImage& image) {
  out.Zeros(kPreamble);
  out.Be16(0);  // low half of the size, patched at the end
  WriteFrame(out, image);
  for (const int word : {0x0011, 0x02ff, 0x0c00, 0xfffe, 0}) out.Be16(static_cast<uint16_t>(word));
  out.Be32(kScreenResolution);
  out.Be32(kScreenResolution);
  WriteFrame(out, image);
  out.Be32(0);
  out.Be16(0x0001);  // clip to the whole frame
  out.Be16(10);
  WriteFrame(out, image);
}

void WritePixelMap(ByteWriter& out, const PackedImage& image) {
  out.Be16(0x009a);
  out.Be32(0xff);
  out.Be16(static_cast<uint16_t>(0x8000 | 4 * image.Width()));
  WriteFrame(out, image);
  out.Be16(0);
  out.Be16(4);  // packed by components
  out.Be32(0);
  out.Be32(kScreenResolution);
  out.Be32(kScreenResolution);
  for (const uint16_t word : kDirectPixels) out.Be16(word);
  out.Zeros(12);
  WriteFrame(out, image);
  WriteFrame(out, image);
  out.Be16(0);  // copy mode
}

// The red, then the green, then the blue components of a row.
void GatherRow(const PictureRecord& picture, int32_t y, std::span<uint8_t> parts) {
  const auto width = static_cast<size_t>(picture.image.Width());
  if (picture.image.Bits() == 24) {
    SplitColors(picture.image.Row(y).data(), width, &parts[2 * width], &parts[width], parts.data());
    return;
  }
  for (size_t x = 0; x < width; ++x) {
    const auto index = static_cast<size_t>(picture.image.PixelAt(static_cast<int32_t>(x), y));
    for (size_t c = 0; c < 3; ++c) parts[c * width + x] = picture.palette[3 * index + c];
  }
}

Status WriteRows(ByteWriter& out, const PictureRecord& picture) {
  const auto width = static_cast<size_t>(picture.image.Width());
  std::vector<uint8_t> parts(3 * width), code(MostPackedBits(3 * width));
  for (int32_t y = 0; y < picture.image.Height() && !out.Failed(); ++y) {
    RETURN_IF_BAD(picture.ReportRow(y, picture.image.Height()));
    GatherRow(picture, y, parts);
    if (4 * width < 8) {  // too short to be packed: an unused byte, red, green, blue
      for (size_t x = 0; x < width; ++x) {
        out.U8(0);
        for (size_t c = 0; c < 3; ++c) out.U8(parts[c * width + x]);
      }
      continue;
    }
    const size_t size = PackBits(parts, code.data());
    if (4 * width > kLongRow) {
      out.Be16(static_cast<uint16_t>(size));
    } else {
      out.U8(static_cast<uint8_t>(size));
    }
    out.Bytes(std::span(code).first(size));
  }
  return Status::Ok;
}

}  // namespace

Status PictWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  const PackedImage& image = picture.image;
  if (image.Empty()) return Status::MemoryAllocationError;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  WriteHead(out, image);
  WritePixelMap(out, image);
  RETURN_IF_BAD(WriteRows(out, picture));
  out.Zeros(out.Position() % 2);
  out.Be16(0x00ff);
  const uint64_t size = out.Position() - kPreamble;
  const uint8_t low[] = {static_cast<uint8_t>(size >> 8), static_cast<uint8_t>(size)};
  if (!out.Failed()) out.Patch(kPreamble, low);
  return CommitOutput(out, options);
}

}  // namespace fotomill
