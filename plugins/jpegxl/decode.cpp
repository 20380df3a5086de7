// Decodes pixels: pictures, frames, and the first pass of pictures for thumbnails.
#include <algorithm>

#include "jpegxl.h"

namespace jpegxl {

namespace {

constexpr uint32_t kDcScale = 8;  // pixels per sample of the first pass of a frame

void SwapRedAndBlue(const FmwBitmap& bitmap) {
  const size_t bytes = static_cast<size_t>(bitmap.bits / 8);
  if (bytes < 3) return;
  for (uint32_t y = 0; y < bitmap.height; ++y) {
    uint8_t* pixel = FmwRow(&bitmap, y);
    for (uint32_t x = 0; x < bitmap.width; ++x, pixel += bytes) std::swap(pixel[0], pixel[2]);
  }
}

// A file being decoded frame by frame. Kept between calls: whoever reads an animation asks for one
// frame after the other.
struct Reading {
  Bytes bytes;
  Runner runner;
  Decoder decoder;
  JxlBasicInfo info = {};
  int32_t next = 0;  // frame
};

bool IsSame(const FmwFile& one, const FmwFile& other) {
  return one.size == other.size && memcmp(one.bytes, other.bytes, one.size) == 0;
}

std::unique_ptr<Reading>& Kept() {
  static std::unique_ptr<Reading> reading;
  return reading;
}

int32_t Start(Reading& reading, int32_t frame, bool dcOnly) {
  const int32_t error =
      Begin(reading.bytes,
            JXL_DEC_BASIC_INFO | JXL_DEC_FULL_IMAGE | (dcOnly ? JXL_DEC_FRAME_PROGRESSION : 0),
            reading.decoder);
  if (error != 0) return error;
  reading.runner = NewRunner();
  JxlDecoderSetParallelRunner(reading.decoder.get(), JxlThreadParallelRunner, reading.runner.get());
  JxlDecoderSetUnpremultiplyAlpha(reading.decoder.get(), JXL_TRUE);
  if (dcOnly) JxlDecoderSetProgressiveDetail(reading.decoder.get(), kDC);
  if (frame > 0) JxlDecoderSkipFrames(reading.decoder.get(), static_cast<size_t>(frame));
  reading.next = frame;
  const JxlDecoderStatus status = JxlDecoderProcessInput(reading.decoder.get());
  if (status != JXL_DEC_BASIC_INFO) return ErrorOf(status);
  return JxlDecoderGetBasicInfo(reading.decoder.get(), &reading.info) == JXL_DEC_SUCCESS
             ? 0
             : FMW_ERROR_DAMAGED;
}

// Decodes the next frame, or with `dcOnly` its first pass.
int32_t DecodeFrame(Reading& reading, const FmwBitmap& bitmap, bool dcOnly) {
  const JxlPixelFormat format = {static_cast<uint32_t>(bitmap.bits / 8), JXL_TYPE_UINT8,
                                 JXL_NATIVE_ENDIAN, 4};
  JxlDecoder* const decoder = reading.decoder.get();
  for (;;) {
    const JxlDecoderStatus status = JxlDecoderProcessInput(decoder);
    size_t size = 0;
    switch (status) {
      case JXL_DEC_NEED_IMAGE_OUT_BUFFER:
        if (JxlDecoderImageOutBufferSize(decoder, &format, &size) != JXL_DEC_SUCCESS ||
            size > bitmap.stride * bitmap.height ||
            JxlDecoderSetImageOutBuffer(decoder, &format, bitmap.rows,
                                        bitmap.stride * bitmap.height) != JXL_DEC_SUCCESS)
          return FMW_ERROR_DAMAGED;
        break;
      case JXL_DEC_FRAME_PROGRESSION:
        if (dcOnly && JxlDecoderFlushImage(decoder) == JXL_DEC_SUCCESS) return 0;
        break;
      case JXL_DEC_FULL_IMAGE: ++reading.next; return 0;
      default: return status == JXL_DEC_SUCCESS ? FMW_ERROR_DAMAGED : ErrorOf(status);
    }
  }
}

// Averages squares of `scale` pixels; the last ones of a row or column may be smaller.
FmwBitmap Reduced(const FmwBitmap& bitmap, uint32_t scale, const FMW_READ_REQUEST* request) {
  FmwBitmap small = FmwNewBitmap((bitmap.width + scale - 1) / scale,
                                 (bitmap.height + scale - 1) / scale, bitmap.bits, request);
  if (small.block == nullptr) return small;
  const auto bytes = static_cast<uint32_t>(bitmap.bits / 8);
  for (uint32_t y = 0; y < small.height; ++y) {
    const uint32_t bottom = std::min(bitmap.height, (y + 1) * scale);
    for (uint32_t i = 0; i < small.width * bytes; ++i) {
      const uint32_t left = i / bytes * scale, right = std::min(bitmap.width, left + scale);
      uint32_t sum = 0;
      for (uint32_t row = y * scale; row < bottom; ++row) {
        const uint8_t* sample = FmwRow(&bitmap, row) + size_t{left} * bytes + i % bytes;
        for (uint32_t x = left; x < right; ++x, sample += bytes) sum += *sample;
      }
      const uint32_t count = (right - left) * (bottom - y * scale);
      FmwRow(&small, y)[i] = static_cast<uint8_t>((sum + count / 2) / count);
    }
  }
  return small;
}

int32_t ReadFrame(Reading& reading, bool dcOnly, const FMW_READ_REQUEST* request,
                  FmwBitmap& bitmap) {
  const Size size = SizeOf(reading.info);
  bitmap = FmwNewBitmap(size.width, size.height, BitsOf(reading.info), dcOnly ? nullptr : request);
  if (bitmap.block == nullptr) return FMW_ERROR_MEMORY;
  const int32_t error = DecodeFrame(reading, bitmap, dcOnly);
  if (error != 0) {
    FmwFreeBitmap(&bitmap, dcOnly ? nullptr : request);
    return error;
  }
  SwapRedAndBlue(bitmap);
  if (!dcOnly) return 0;
  FmwBitmap large = bitmap;
  bitmap = Reduced(large, kDcScale, request);
  FmwFreeBitmap(&large, nullptr);
  return bitmap.block == nullptr ? FMW_ERROR_MEMORY : 0;
}

// The first pass of a frame is enough for a picture an eighth as large; it exists unless the
// picture is stored without loss.
bool IsDcEnough(const Bytes& bytes, int32_t wantedSide) {
  Facts facts;
  if (wantedSide <= 0 || ReadFacts(bytes, false, facts) != 0) return false;
  const Size size = SizeOf(facts.info);
  return facts.info.have_animation == 0 && facts.info.uses_original_profile == 0 &&
         std::max(size.width, size.height) / kDcScale >= static_cast<uint32_t>(wantedSide);
}

}  // namespace

int32_t Read(const char* fileName, const FMW_READ_REQUEST* request, FmwBitmap* bitmap) {
  const int32_t page = request->page;
  auto reading = std::make_unique<Reading>();
  int32_t error = FmwReadFile(fileName, UINT64_MAX, &reading->bytes.file);
  if (error != 0) return error;
  const bool dcOnly = IsDcEnough(reading->bytes, request->wantedSide);
  if (!dcOnly && page > 0 && Kept() != nullptr && Kept()->next == page &&
      IsSame(Kept()->bytes.file, reading->bytes.file)) {
    reading = std::move(Kept());
  } else {
    error = Start(*reading, page, dcOnly);
  }
  Kept().reset();
  if (error == 0) error = ReadFrame(*reading, dcOnly, request, *bitmap);
  if (error == 0 && reading->info.have_animation != 0) Kept() = std::move(reading);
  return error;
}

}  // namespace jpegxl
