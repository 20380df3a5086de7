#include "formats/jpeg/jpeg_encode.h"

#include <cstdlib>

#include "formats/jpeg/jpeg_library.h"
#include "processing/pixel_rows.h"

namespace fotomill {

namespace {

constexpr int32_t kFullChroma = 90;  // quality

// A compressor that writes to memory, with its error handler.
struct MemoryEncoder {
  MemoryEncoder() {
    errors.Set();
    info.err = &errors.base;
  }
  ~MemoryEncoder() {
    jpeg_destroy_compress(&info);
    std::free(bytes);
  }
  MemoryEncoder(const MemoryEncoder&) = delete;
  MemoryEncoder& operator=(const MemoryEncoder&) = delete;

  JpegErrors errors;
  jpeg_compress_struct info = {};
  unsigned char* bytes = nullptr;  // allocated by the library
  unsigned long size = 0;
};

void Compress(MemoryEncoder& encoder, const PackedImage& image, int32_t quality,
              std::vector<uint8_t>& row) {
  jpeg_compress_struct& info = encoder.info;
  jpeg_create_compress(&info);
  jpeg_mem_dest(&info, &encoder.bytes, &encoder.size);
  info.image_width = static_cast<JDIMENSION>(image.Width());
  info.image_height = static_cast<JDIMENSION>(image.Height());
  info.input_components = 3;
  info.in_color_space = JCS_RGB;
  jpeg_set_defaults(&info);
  jpeg_set_quality(&info, quality, TRUE);
  if (quality >= kFullChroma) info.comp_info[0].h_samp_factor = info.comp_info[0].v_samp_factor = 1;
  info.optimize_coding = TRUE;
  jpeg_start_compress(&info, TRUE);
  for (int32_t y = 0; y < image.Height(); ++y) {
    SwapColors(image.Row(y).data(), static_cast<size_t>(image.Width()), row.data());
    JSAMPROW line = row.data();
    jpeg_write_scanlines(&info, &line, 1);
  }
  jpeg_finish_compress(&info);
}

}  // namespace

Status EncodeJpeg(const PackedImage& image, int32_t quality, std::vector<uint8_t>& bytes) {
  if (image.Empty() || image.Bits() != 24) return Status::UnsuitableImage;
  MemoryEncoder encoder;
  std::vector<uint8_t> row(static_cast<size_t>(image.Width()) * 3);
  const bool done = Guarded(encoder.errors, [&] { Compress(encoder, image, quality, row); });
  if (!done) {
    const Status status =
        encoder.errors.Meaning(static_cast<j_common_ptr>(static_cast<void*>(&encoder.info)));
    return status == Status::MemoryAllocationError ? status : Status::UnsuitableImage;
  }
  bytes.assign(encoder.bytes, encoder.bytes + encoder.size);
  return Status::Ok;
}

}  // namespace fotomill
