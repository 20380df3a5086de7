// JPEG files stored as they are, and restored.
#include "jpegxl.h"

namespace jpegxl {

namespace {

int32_t StoreJpeg(const Bytes& jpeg, const char* destination) {
  const Encoder encoder(JxlEncoderCreate(nullptr));
  const Runner runner = NewRunner();
  if (encoder == nullptr || runner == nullptr) return FMW_ERROR_MEMORY;
  JxlEncoderSetParallelRunner(encoder.get(), JxlThreadParallelRunner, runner.get());
  JxlEncoderUseContainer(encoder.get(), JXL_TRUE);
  JxlEncoderStoreJPEGMetadata(encoder.get(), JXL_TRUE);
  JxlEncoderFrameSettings* settings = JxlEncoderFrameSettingsCreate(encoder.get(), nullptr);
  if (JxlEncoderAddJPEGFrame(settings, jpeg.file.bytes, jpeg.file.size) != JXL_ENC_SUCCESS)
    return FMW_ERROR_FORMAT;
  return Finish(encoder.get(), destination);
}

int32_t RestoreJpeg(const Bytes& bytes, const char* destination) {
  Decoder decoder;
  const int32_t error = Begin(bytes, JXL_DEC_JPEG_RECONSTRUCTION | JXL_DEC_FULL_IMAGE, decoder);
  if (error != 0) return error;
  std::vector<uint8_t> jpeg(1 << 16);
  size_t done = 0;
  for (bool restores = false;;) {
    switch (const JxlDecoderStatus status = JxlDecoderProcessInput(decoder.get())) {
      case JXL_DEC_JPEG_RECONSTRUCTION:
        restores = true;
        JxlDecoderSetJPEGBuffer(decoder.get(), jpeg.data(), jpeg.size());
        break;
      case JXL_DEC_JPEG_NEED_MORE_OUTPUT:
        done = jpeg.size() - JxlDecoderReleaseJPEGBuffer(decoder.get());
        jpeg.resize(2 * jpeg.size());
        JxlDecoderSetJPEGBuffer(decoder.get(), jpeg.data() + done, jpeg.size() - done);
        break;
      case JXL_DEC_FULL_IMAGE:
        if (!restores) return FMW_ERROR_FORMAT;
        done = jpeg.size() - JxlDecoderReleaseJPEGBuffer(decoder.get());
        return FmwWriteFile(destination, jpeg.data(), done);
      case JXL_DEC_NEED_IMAGE_OUT_BUFFER: return FMW_ERROR_FORMAT;  // not made from a JPEG file
      default: return ErrorOf(status);
    }
  }
}

}  // namespace

int32_t Transcode(const char* source, const char* destination) {
  Bytes bytes;
  const int32_t error = FmwReadFile(source, UINT64_MAX, &bytes.file);
  if (error != 0) return error;
  const bool jpeg =
      bytes.file.size > 2 && bytes.file.bytes[0] == 0xff && bytes.file.bytes[1] == 0xd8;
  return jpeg ? StoreJpeg(bytes, destination) : RestoreJpeg(bytes, destination);
}

}  // namespace jpegxl
