// Windows bitmaps with run-length encoding (RLE), little-endian: the headers and palette of bmp.cpp
// with 8 bits and compression 1, then the codes of bmp_runs.h, bottom line first.
//
// Such files may contain any bitmap, so they are read as BMP. The writer always stores 256 colors.
// Source: Microsoft, "Bitmap Storage" and "Bitmap Compression", Windows GDI reference.
#include "formats/bmp/rle.h"

#include "core/byte_writer.h"
#include "formats/bmp/bmp_runs.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr uint32_t kColors = 256;
constexpr uint32_t kPixelOffset = 54 + 4 * kColors;
constexpr uint64_t kFileSizeOffset = 2, kImageSizeOffset = 34;

void WriteHead(ByteWriter& out, const PackedImage& image, const Palette& palette) {
  out.Text("BM");
  out.Le32(0);  // file size, patched at the end
  out.Le32(0);
  out.Le32(kPixelOffset);
  out.Le32(40);
  out.Le32(static_cast<uint32_t>(image.Width()));
  out.Le32(static_cast<uint32_t>(image.Height()));
  out.Le16(1);
  out.Le16(8);
  out.Le32(1);  // RLE8
  out.Le32(0);  // data size, patched at the end
  out.Zeros(16);
  for (size_t i = 0; i < 3 * size_t{kColors}; i += 3) {
    for (const uint8_t value : {palette[i + 2], palette[i + 1], palette[i], uint8_t{0}})
      out.U8(value);
  }
}

Status WriteRows(ByteWriter& out, const PictureRecord& picture, const PackedImage& image) {
  for (int32_t r = 0; r < image.Height() && !out.Failed(); ++r) {
    RETURN_IF_BAD(picture.ReportRow(r));
    EncodeRle8Row(image.StoredRow(r).first(static_cast<size_t>(image.Width())), out);
    out.Le16(0);  // end of line
  }
  out.U8(0);
  out.U8(1);
  return Status::Ok;
}

}  // namespace

Status RleWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  if (picture.image.Empty()) return Status::MemoryAllocationError;
  if (picture.image.Bits() > 8) return Status::TooManyColors;
  PackedImage deeper;
  if (picture.image.Bits() < 8) RETURN_IF_BAD(PromoteImage(picture.image, 8, deeper));
  const PackedImage& image = deeper.Empty() ? picture.image : deeper;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  WriteHead(out, image, picture.palette);
  RETURN_IF_BAD(WriteRows(out, picture, image));
  const auto size = static_cast<uint32_t>(out.Position());
  out.PatchLe32(kFileSizeOffset, size);
  out.PatchLe32(kImageSizeOffset, size - kPixelOffset);
  return CommitOutput(out, options);
}

}  // namespace fotomill
