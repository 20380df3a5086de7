#include "catalog/thumbnails/thumbnail_drawing.h"
#include "catalog/thumbnails/thumbnail_file.h"
#include "support/scratch_file.h"

// A thumbnail file must read completely or fail, and what was read must be drawable and writable.
extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  using namespace fotomill;
  using fuzz::Require;
  static const std::string path = fuzz::ScratchPath("a") + ".THN";
  static fuzz::MemoryFile file;
  const std::string& name = file.Fill(data, size);
  AnyThumbnailRecord any;
  ThumbnailRecord& record = std::get<ThumbnailRecord>(any);
  record.bytes.fill(7);
  const ThumbnailRecord before = record;
  const bool read = ReadThumbnailFile(record, name);
  Require(read ==
          (size >= 4 && before.bytes != record.bytes && record.HasMagic(kSmallThumbnailMagic)));
  if (!read) {
    Require(record.bytes == before.bytes);
    return 0;
  }
  static PackedImage bitmap;
  if (bitmap.Empty()) Require(NewPackedImage(180, 180, nullptr, 24, bitmap) == Status::Ok);
  // Enlarging tests little but takes most of the time.
  const uint32_t flags = data[size / 2] & (size % 64 == 0 ? 0xff : ~kDrawLargeView);
  Require(DrawThumbnailRecord(bitmap, any, static_cast<int8_t>(data[size - 1]), 0, flags, {}));
  ThumbnailRecord again;
  Require(WriteThumbnailFile(record, path, true) && ReadThumbnailFile(again, path) &&
          again.bytes == record.bytes);
  return 0;
}
