// Slow-scan television frames (HRZ): 256 x 240 pixels, top row first, red, green, blue, one byte
// each with 6 significant bits. There is no header, so files are identified by size only.
//
// The reader ignores the upper two bits of bytes. The writer drops the lower two bits of each
// color. Source: there is no official description; "HRZ" in the Just Solve the File Format Problem
// wiki (Archive Team).
#include "formats/hrz/hrz.h"

#include <array>

#include "core/byte_writer.h"
#include "formats/plain_codec.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr int32_t kWidth = kHrzWidth, kHeight = kHrzHeight;
constexpr size_t kRowSize = 3 * kWidth;
constexpr uint64_t kFileSize = kRowSize * kHeight;

struct HrzHeader {};  // these files have no header

constexpr uint8_t Widened(uint8_t level) {
  const uint8_t six = level & 63;
  return static_cast<uint8_t>(six << 2 | six >> 4);
}

Status DescribePicture(const platform::FileView& file, const ReadRequest&, HrzHeader&,
                       PictureRecord& picture) {
  if (file.FileSize() != kFileSize)
    return file.FileSize() < kFileSize ? Status::FileReadError : Status::DamagedFile;
  SetPlainFacts(picture, kWidth, kHeight, 24);
  MakeDefaultPalette(&picture.palette, nullptr, kDisplayPalette);
  return Status::Ok;
}

Status Decode(platform::FileView& file, const HrzHeader&, const PictureRecord& picture,
              PackedImage& image) {
  RETURN_IF_BAD(NewPackedImage(kWidth, kHeight, &picture.palette, 24, image));
  const uint8_t* source = file.Bytes().data();
  for (int32_t y = 0; y < kHeight; ++y) {
    uint8_t* row = image.Row(y).data();
    for (int32_t x = 0; x < kWidth; ++x, source += 3, row += 3) {
      row[0] = Widened(source[2]);
      row[1] = Widened(source[1]);
      row[2] = Widened(source[0]);
    }
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  return Status::Ok;
}

constexpr PlainCodec<HrzHeader> kCodec = {1, DescribePicture, Decode};

}  // namespace

Status HrzInfo(PictureRecord& picture, const ReadRequest& request) {
  return PlainInfo(kCodec, picture, request);
}

Status HrzRead(PictureRecord& picture, const ReadRequest& request) {
  return PlainRead(kCodec, picture, request);
}

Status HrzWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  if (picture.image.Empty()) return Status::MemoryAllocationError;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  BgrRows rows;
  RETURN_IF_BAD(rows.Open(picture.image));
  for (int32_t y = 0; y < kHeight; ++y) {
    RETURN_IF_BAD(picture.ReportRow(y));
    const uint8_t* bgr = rows.Row(y);
    std::array<uint8_t, kRowSize> bytes;
    for (size_t i = 0; i < bytes.size(); i += 3) {
      for (size_t c = 0; c < 3; ++c) bytes[i + c] = bgr[i + 2 - c] >> 2;
    }
    out.Bytes(bytes);
  }
  return CommitOutput(out, options);
}

}  // namespace fotomill
