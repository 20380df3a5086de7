// Encodes pictures.
#include <algorithm>
#include <cmath>

#include "jpegxl.h"

namespace jpegxl {

namespace {

// The scale of the encoder's command line: 100 is without visible loss at close look, 90 is a
// distance of 1, at which differences just begin to show.
float DistanceOf(int32_t quality) {
  if (quality >= 100) return 0.1F;
  if (quality >= 30) return 0.1F + static_cast<float>(100 - quality) * 0.09F;
  return std::min(25.0F, 6.4F + std::pow(2.5F, static_cast<float>(30 - quality) / 5) / 6.25F);
}

JxlOrientation OrientationOf(const FMW_BLOCK& exif) {
  int bigEndian = 0;
  const auto* bytes = static_cast<const uint8_t*>(exif.data);
  const size_t place = FmwOrientationPlace(bytes, exif.size, &bigEndian);
  const uint32_t value = place == 0 ? 1 : bytes[place + (bigEndian != 0 ? 1 : 0)];
  return static_cast<JxlOrientation>(value >= 1 && value <= 8 ? value : 1);
}

bool SetHeader(JxlEncoder* encoder, const FmwBitmap& given, bool gray, const FMW_FRAMES* frames,
               bool lossless, const FMW_WRITE_REQUEST& request) {
  JxlBasicInfo info;
  JxlEncoderInitBasicInfo(&info);
  if (frames != nullptr) {
    info.have_animation = JXL_TRUE;
    info.animation.tps_numerator = 1000;
    info.animation.tps_denominator = 1;
    info.animation.num_loops = static_cast<uint32_t>(std::max(frames->rounds, 0));
  }
  info.xsize = given.width;
  info.ysize = given.height;
  info.bits_per_sample = 8;
  info.num_color_channels = gray ? 1 : 3;
  info.uses_original_profile = lossless ? JXL_TRUE : JXL_FALSE;
  info.orientation = OrientationOf(request.exif);
  if (given.bits == 32) {
    info.num_extra_channels = 1;
    info.alpha_bits = 8;
  }
  if (JxlEncoderSetBasicInfo(encoder, &info) != JXL_ENC_SUCCESS) return false;
  if (request.icc.size > 0 &&
      JxlEncoderSetICCProfile(encoder, static_cast<const uint8_t*>(request.icc.data),
                              request.icc.size) == JXL_ENC_SUCCESS)
    return true;
  JxlColorEncoding encoding;
  JxlColorEncodingSetToSRGB(&encoding, gray ? JXL_TRUE : JXL_FALSE);
  return JxlEncoderSetColorEncoding(encoder, &encoding) == JXL_ENC_SUCCESS;
}

bool AddMetadata(JxlEncoder* encoder, const FMW_WRITE_REQUEST& request) {
  if (request.exif.size + request.xmp.size == 0) return true;
  if (JxlEncoderUseBoxes(encoder) != JXL_ENC_SUCCESS) return false;
  std::vector<uint8_t> exif(4);
  const auto* bytes = static_cast<const uint8_t*>(request.exif.data);
  exif.insert(exif.end(), bytes, bytes + request.exif.size);
  bool done = true;
  if (request.exif.size > 0)
    done =
        JxlEncoderAddBox(encoder, "Exif", exif.data(), exif.size(), JXL_FALSE) == JXL_ENC_SUCCESS;
  if (request.xmp.size > 0)
    done = JxlEncoderAddBox(encoder, "xml ", static_cast<const uint8_t*>(request.xmp.data),
                            request.xmp.size, JXL_FALSE) == JXL_ENC_SUCCESS &&
           done;
  JxlEncoderCloseBoxes(encoder);
  return done;
}

bool AddPixels(JxlEncoderFrameSettings* settings, const FmwBitmap& given, bool gray) {
  const uint32_t channels = gray ? 1 : given.bits == 32 ? 4 : 3;
  const JxlPixelFormat format = {channels, JXL_TYPE_UINT8, JXL_NATIVE_ENDIAN, 0};
  std::vector<uint8_t> pixels(size_t{given.width} * given.height * channels);
  std::vector<uint8_t> row(size_t{given.width} * 3);
  for (uint32_t y = 0; y < given.height; ++y) {
    uint8_t* target = pixels.data() + size_t{given.width} * y * channels;
    FmwGivenRow(&given, y, channels == 4, gray ? row.data() : target);
    for (uint32_t x = 0; gray && x < given.width; ++x) target[x] = row[3 * size_t{x}];
  }
  return JxlEncoderAddImageFrame(settings, &format, pixels.data(), pixels.size()) ==
         JXL_ENC_SUCCESS;
}

// An encoder with all settings made. With frames, it encodes an animation.
struct Encoding {
  Runner runner;  // outlives the encoder
  Encoder encoder;
  JxlEncoderFrameSettings* settings = nullptr;  // owned by the encoder

  int32_t Start(const FmwBitmap& given, bool gray, const FMW_FRAMES* frames,
                const FMW_WRITE_REQUEST& request) {
    encoder.reset(JxlEncoderCreate(nullptr));
    runner = NewRunner();
    if (encoder == nullptr || runner == nullptr) return FMW_ERROR_MEMORY;
    JxlEncoderSetParallelRunner(encoder.get(), JxlThreadParallelRunner, runner.get());
    const bool lossless =
        request.lossless != 0 || (request.quality == 0 && request.options[kLossless] != 0);
    const int32_t quality = request.quality > 0 ? request.quality : request.options[kQuality];
    if (!AddMetadata(encoder.get(), request) ||
        !SetHeader(encoder.get(), given, gray, frames, lossless, request))
      return FMW_ERROR_UNSUITABLE;
    settings = JxlEncoderFrameSettingsCreate(encoder.get(), nullptr);
    JxlEncoderFrameSettingsSetOption(settings, JXL_ENC_FRAME_SETTING_EFFORT,
                                     std::clamp(request.options[kEffort], 1, 9));
    if (lossless) {
      JxlEncoderSetFrameLossless(settings, JXL_TRUE);
    } else {
      JxlEncoderSetFrameDistance(settings, DistanceOf(quality));
    }
    return 0;
  }
};

// Encodes what the encoder was given so far, to the end of `out`.
int32_t Drain(JxlEncoder* encoder, std::vector<uint8_t>& out, size_t& done) {
  for (;;) {
    if (out.size() - done < 1 << 15) out.resize(2 * out.size() + (1 << 16));
    uint8_t* next = out.data() + done;
    size_t left = out.size() - done;
    const JxlEncoderStatus status = JxlEncoderProcessOutput(encoder, &next, &left);
    done = static_cast<size_t>(next - out.data());
    if (status == JXL_ENC_SUCCESS) return 0;
    if (status != JXL_ENC_NEED_MORE_OUTPUT) return FMW_ERROR_UNSUITABLE;
  }
}

}  // namespace

int32_t Finish(JxlEncoder* encoder, const char* fileName) {
  JxlEncoderCloseInput(encoder);
  std::vector<uint8_t> out;
  size_t done = 0;
  const int32_t error = Drain(encoder, out, done);
  return error != 0 ? error : FmwWriteFile(fileName, out.data(), done);
}

int32_t Write(const char* fileName, const FmwBitmap* given, const FMW_WRITE_REQUEST* request) {
  Encoding encoding;
  const int32_t error = encoding.Start(*given, FmwIsGray(given) != 0, nullptr, *request);
  if (error != 0) return error;
  if (!AddPixels(encoding.settings, *given, FmwIsGray(given) != 0)) return FMW_ERROR_UNSUITABLE;
  return Finish(encoding.encoder.get(), fileName);
}

int32_t WriteFrames(const char* fileName, const FMW_FRAMES* frames,
                    const FMW_WRITE_REQUEST* request) {
  Encoding encoding;
  std::vector<uint8_t> out;
  size_t done = 0;
  for (int32_t i = 0; i < frames->count; ++i) {
    const FMW_HANDLE bitmap = frames->frame(frames, i);
    if (bitmap == nullptr) return FMW_ERROR_READ;
    const FmwBitmap given = FmwGivenBitmap(bitmap);
    int32_t error = i == 0 ? encoding.Start(given, false, frames, *request) : 0;
    if (error != 0) return error;
    JxlFrameHeader header;
    JxlEncoderInitFrameHeader(&header);
    // a frame without duration is no frame but a layer of the next one
    header.duration = static_cast<uint32_t>(std::max(frames->delays[i], 1));
    if (JxlEncoderSetFrameHeader(encoding.settings, &header) != JXL_ENC_SUCCESS ||
        !AddPixels(encoding.settings, given, false))
      return FMW_ERROR_UNSUITABLE;
    if (i + 1 == frames->count) JxlEncoderCloseInput(encoding.encoder.get());
    error = Drain(encoding.encoder.get(), out, done);
    if (error != 0) return error;
  }
  return FmwWriteFile(fileName, out.data(), done);
}

}  // namespace jpegxl
