// JPEG XL through libjxl: still pictures and animations, read and written, and JPEG files stored
// in it without loss and restored from it byte for byte.
//
// The decoder applies the orientation, so EXIF is passed on with orientation 1.
// Source: ISO/IEC 18181-1 and -2.
#include <jxl/decode.h>
#include <jxl/encode.h>
#include <jxl/thread_parallel_runner.h>

#include <algorithm>
#include <cmath>
#include <memory>
#include <type_traits>
#include <vector>

#include "fotomill_plugin_kit.h"

namespace {

constexpr int32_t kStandardQuality = 90;
constexpr int32_t kStandardEffort = 5;
constexpr size_t kMostFrames = 1 << 16;
constexpr size_t kMostBoxBytes = size_t{64} << 20;
constexpr uint32_t kDcScale = 8;  // pixels per sample of the first pass of a frame

enum OptionPlace { kQuality, kLossless, kEffort, kOptions };
constexpr FMW_OPTION kOptionTable[] = {
    {"Quality", "Quality, 1 to 100", FMW_OPTION_NUMBER, 1, 100, kStandardQuality, nullptr},
    {"Lossless", "Lossless", FMW_OPTION_SWITCH, 0, 1, 0, nullptr},
    {"Effort", "Effort, 1 (fastest) to 9", FMW_OPTION_NUMBER, 1, 9, kStandardEffort, nullptr},
};
static_assert(std::size(kOptionTable) == kOptions);

struct DecoderDeleter {
  void operator()(JxlDecoder* decoder) const { JxlDecoderDestroy(decoder); }
};
struct EncoderDeleter {
  void operator()(JxlEncoder* encoder) const { JxlEncoderDestroy(encoder); }
};
struct RunnerDeleter {
  void operator()(void* runner) const { JxlThreadParallelRunnerDestroy(runner); }
};
using Decoder = std::unique_ptr<JxlDecoder, DecoderDeleter>;
using Runner = std::unique_ptr<void, RunnerDeleter>;

Runner NewRunner() {
  return Runner(JxlThreadParallelRunnerCreate(
      nullptr, std::min<size_t>(JxlThreadParallelRunnerDefaultNumWorkerThreads(), 8)));
}

// A file in memory, freed with it.
struct Bytes {
  FmwFile file = {nullptr, 0};
  Bytes() = default;
  ~Bytes() { free(file.bytes); }
  Bytes(const Bytes&) = delete;
  Bytes& operator=(const Bytes&) = delete;
  bool IsSame(const Bytes& other) const {
    return file.size == other.file.size && memcmp(file.bytes, other.file.bytes, file.size) == 0;
  }
};

// The error of a decoder that has stopped before it was done.
int32_t ErrorOf(JxlDecoderStatus status) {
  return status == JXL_DEC_NEED_MORE_INPUT ? FMW_ERROR_READ : FMW_ERROR_DAMAGED;
}

int32_t Begin(const Bytes& bytes, int events, Decoder& decoder) {
  decoder.reset(JxlDecoderCreate(nullptr));
  if (decoder == nullptr) return FMW_ERROR_MEMORY;
  if (JxlSignatureCheck(bytes.file.bytes, bytes.file.size) < JXL_SIG_CODESTREAM)
    return FMW_ERROR_DAMAGED;
  JxlDecoderSubscribeEvents(decoder.get(), events);
  JxlDecoderSetInput(decoder.get(), bytes.file.bytes, bytes.file.size);
  JxlDecoderCloseInput(decoder.get());
  return 0;
}

// The size after the orientation has been applied.
struct Size {
  uint32_t width, height;
};
Size SizeOf(const JxlBasicInfo& info) {
  return info.orientation >= JXL_ORIENT_TRANSPOSE ? Size{info.ysize, info.xsize}
                                                  : Size{info.xsize, info.ysize};
}

int BitsOf(const JxlBasicInfo& info) {
  if (info.alpha_bits > 0) return 32;
  return info.num_color_channels == 1 ? 8 : 24;
}

// The library's older versions take a pixel format in addition, which they ignore.
template <class Function>
JxlDecoderStatus ProfileSize(Function function, const JxlDecoder* decoder, size_t* size) {
  if constexpr (std::is_invocable_v<Function, const JxlDecoder*, const JxlPixelFormat*,
                                    JxlColorProfileTarget, size_t*>) {
    return function(decoder, nullptr, JXL_COLOR_PROFILE_TARGET_DATA, size);
  } else {
    return function(decoder, JXL_COLOR_PROFILE_TARGET_DATA, size);
  }
}
template <class Function, class Out, class... More>
JxlDecoderStatus Profile(Function function, const JxlDecoder* decoder, Out* out, More... more) {
  if constexpr (std::is_invocable_v<Function, const JxlDecoder*, const JxlPixelFormat*,
                                    JxlColorProfileTarget, Out*, More...>) {
    return function(decoder, nullptr, JXL_COLOR_PROFILE_TARGET_DATA, out, more...);
  } else {
    return function(decoder, JXL_COLOR_PROFILE_TARGET_DATA, out, more...);
  }
}

bool IsSrgb(const JxlDecoder* decoder) {
  JxlColorEncoding encoding;
  if (Profile(JxlDecoderGetColorAsEncodedProfile, decoder, &encoding) != JXL_DEC_SUCCESS)
    return false;
  const bool gray = encoding.color_space == JXL_COLOR_SPACE_GRAY;
  return encoding.white_point == JXL_WHITE_POINT_D65 &&
         encoding.transfer_function == JXL_TRANSFER_FUNCTION_SRGB &&
         (gray || (encoding.color_space == JXL_COLOR_SPACE_RGB &&
                   encoding.primaries == JXL_PRIMARIES_SRGB));
}

FMW_BLOCK ReadProfile(const JxlDecoder* decoder) {
  size_t size = 0;
  FMW_BLOCK block = {nullptr, 0};
  if (IsSrgb(decoder) ||
      ProfileSize(JxlDecoderGetICCProfileSize, decoder, &size) != JXL_DEC_SUCCESS || size == 0 ||
      size > kMostBoxBytes)
    return block;
  block.data = malloc(size);
  if (block.data != nullptr && Profile(JxlDecoderGetColorAsICCProfile, decoder,
                                       static_cast<uint8_t*>(block.data), size) == JXL_DEC_SUCCESS)
    block.size = size;
  return block;
}

// What can be known of a file without decoding pixels.
struct Facts {
  JxlBasicInfo info = {};
  std::vector<int32_t> delays;  // of an animation's frames, milliseconds
  std::vector<uint8_t> exif, xmp;
  FMW_BLOCK icc = {nullptr, 0};  // owned by the caller
  bool fromJpeg = false;
};

int32_t DelayOf(const JxlDecoder* decoder, const JxlBasicInfo& info) {
  JxlFrameHeader header;
  const auto& animation = info.animation;
  if (JxlDecoderGetFrameHeader(decoder, &header) != JXL_DEC_SUCCESS || animation.tps_numerator == 0)
    return 0;
  const double milliseconds =
      1000.0 * header.duration * animation.tps_denominator / animation.tps_numerator;
  return static_cast<int32_t>(std::clamp(std::round(milliseconds), 0.0, 1e9));
}

// Collects the box that the decoder is in; grows the buffer as the decoder asks for it.
class BoxReader {
 public:
  explicit BoxReader(JxlDecoder* decoder) : decoder_(decoder) {}
  void Start(std::vector<uint8_t>* target) {
    End();
    target_ = target;
    if (target_ == nullptr) return;
    target_->resize(1 << 16);
    JxlDecoderSetBoxBuffer(decoder_, target_->data(), target_->size());
  }
  bool Grow() {
    if (target_ == nullptr || target_->size() > kMostBoxBytes) return false;
    const size_t done = target_->size() - JxlDecoderReleaseBoxBuffer(decoder_);
    target_->resize(2 * target_->size());
    JxlDecoderSetBoxBuffer(decoder_, target_->data() + done, target_->size() - done);
    return true;
  }
  void End() {
    if (target_ != nullptr) target_->resize(target_->size() - JxlDecoderReleaseBoxBuffer(decoder_));
    target_ = nullptr;
  }

 private:
  JxlDecoder* decoder_;
  std::vector<uint8_t>* target_ = nullptr;
};

std::vector<uint8_t>* TargetOf(JxlDecoder* decoder, Facts& facts) {
  JxlBoxType type;
  if (JxlDecoderGetBoxType(decoder, type, JXL_TRUE) != JXL_DEC_SUCCESS) return nullptr;
  if (memcmp(type, "jbrd", 4) == 0) facts.fromJpeg = true;
  if (memcmp(type, "Exif", 4) == 0 && facts.exif.empty()) return &facts.exif;
  if (memcmp(type, "xml ", 4) == 0 && facts.xmp.empty()) return &facts.xmp;
  return nullptr;
}

// EXIF starts with the big-endian offset of its TIFF header.
void TrimExif(std::vector<uint8_t>& exif) {
  const uint64_t start = exif.size() < 4 ? exif.size() : 4 + uint64_t{FmwGetBe(exif.data(), 4)};
  exif.erase(exif.begin(),
             exif.begin() + static_cast<ptrdiff_t>(std::min<uint64_t>(start, exif.size())));
  FmwSetUpright(exif.data(), exif.size());
}

// Reads the header; with `all`, also boxes and frame headers.
int32_t ReadFacts(const Bytes& bytes, bool all, Facts& facts) {
  Decoder decoder;
  const int events = JXL_DEC_BASIC_INFO |
                     (all ? JXL_DEC_COLOR_ENCODING | JXL_DEC_FRAME | JXL_DEC_BOX : JXL_DEC_FRAME);
  const int32_t error = Begin(bytes, events, decoder);
  if (error != 0) return error;
  JxlDecoderSetDecompressBoxes(decoder.get(), JXL_TRUE);
  BoxReader boxes(decoder.get());
  for (bool known = false;;) {
    const JxlDecoderStatus status = JxlDecoderProcessInput(decoder.get());
    if (status == JXL_DEC_BASIC_INFO) {
      if (JxlDecoderGetBasicInfo(decoder.get(), &facts.info) != JXL_DEC_SUCCESS)
        return FMW_ERROR_DAMAGED;
      known = true;
      if (!all && facts.info.have_animation == 0) return 0;
    } else if (status == JXL_DEC_COLOR_ENCODING) {
      facts.icc = ReadProfile(decoder.get());
    } else if (status == JXL_DEC_BOX) {
      boxes.Start(TargetOf(decoder.get(), facts));
    } else if (status == JXL_DEC_FRAME && facts.delays.size() < kMostFrames) {
      facts.delays.push_back(DelayOf(decoder.get(), facts.info));
    } else if (status != JXL_DEC_BOX_NEED_MORE_OUTPUT || !boxes.Grow()) {
      boxes.End();
      TrimExif(facts.exif);
      return known ? 0 : ErrorOf(status);  // pixels that are damaged are found when they are read
    }
  }
}

// ---- pixels ----

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

FMW_HANDLE Read(const char* fileName, int32_t page, int32_t wantedSide,
                const FMW_READ_REQUEST* request, int32_t* error) {
  auto reading = std::make_unique<Reading>();
  *error = FmwReadFile(fileName, UINT64_MAX, &reading->bytes.file);
  if (*error != 0) return nullptr;
  const bool dcOnly = IsDcEnough(reading->bytes, wantedSide);
  if (!dcOnly && page > 0 && Kept() != nullptr && Kept()->next == page &&
      Kept()->bytes.IsSame(reading->bytes)) {
    reading = std::move(Kept());
  } else {
    *error = Start(*reading, page, dcOnly);
  }
  Kept().reset();
  FmwBitmap bitmap = {};
  if (*error == 0) *error = ReadFrame(*reading, dcOnly, request, bitmap);
  if (*error != 0) return nullptr;
  if (reading->info.have_animation != 0) Kept() = std::move(reading);
  return bitmap.block;
}

// ---- writing ----

// Runs the encoder to its end and writes what it gives.
int32_t Finish(JxlEncoder* encoder, const char* fileName) {
  JxlEncoderCloseInput(encoder);
  std::vector<uint8_t> out(1 << 16);
  size_t done = 0;
  for (;;) {
    uint8_t* next = out.data() + done;
    size_t left = out.size() - done;
    const JxlEncoderStatus status = JxlEncoderProcessOutput(encoder, &next, &left);
    done = static_cast<size_t>(next - out.data());
    if (status == JXL_ENC_SUCCESS) break;
    if (status != JXL_ENC_NEED_MORE_OUTPUT) return FMW_ERROR_UNSUITABLE;
    out.resize(2 * out.size());
  }
  return FmwWriteFile(fileName, out.data(), done);
}

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

bool SetHeader(JxlEncoder* encoder, const FmwBitmap& given, bool lossless,
               const FMW_WRITE_REQUEST& request) {
  JxlBasicInfo info;
  JxlEncoderInitBasicInfo(&info);
  const bool gray = FmwIsGray(&given) != 0;
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

bool AddPixels(JxlEncoderFrameSettings* settings, const FmwBitmap& given) {
  const bool gray = FmwIsGray(&given) != 0;
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

int32_t Write(const char* fileName, const FmwBitmap& given, const FMW_WRITE_REQUEST& request) {
  const std::unique_ptr<JxlEncoder, EncoderDeleter> encoder(JxlEncoderCreate(nullptr));
  const Runner runner = NewRunner();
  if (encoder == nullptr || runner == nullptr) return FMW_ERROR_MEMORY;
  JxlEncoderSetParallelRunner(encoder.get(), JxlThreadParallelRunner, runner.get());
  const bool lossless =
      request.lossless != 0 || (request.quality == 0 && request.options[kLossless] != 0);
  const int32_t quality = request.quality > 0 ? request.quality : request.options[kQuality];
  if (!AddMetadata(encoder.get(), request) || !SetHeader(encoder.get(), given, lossless, request))
    return FMW_ERROR_UNSUITABLE;
  JxlEncoderFrameSettings* settings = JxlEncoderFrameSettingsCreate(encoder.get(), nullptr);
  JxlEncoderFrameSettingsSetOption(settings, JXL_ENC_FRAME_SETTING_EFFORT,
                                   std::clamp(request.options[kEffort], 1, 9));
  if (lossless) {
    JxlEncoderSetFrameLossless(settings, JXL_TRUE);
  } else {
    JxlEncoderSetFrameDistance(settings, DistanceOf(quality));
  }
  if (!AddPixels(settings, given)) return FMW_ERROR_UNSUITABLE;
  return Finish(encoder.get(), fileName);
}

// ---- JPEG ----

int32_t StoreJpeg(const Bytes& jpeg, const char* destination) {
  const std::unique_ptr<JxlEncoder, EncoderDeleter> encoder(JxlEncoderCreate(nullptr));
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

extern "C" {

FMW_EXPORT const char* FMW_CALL PLUGIN11GetVersion() { return "1.0"; }

FMW_EXPORT const char* FMW_CALL PLUGIN12GetLibraries() {
  static char text[64];
  const uint32_t version = JxlDecoderVersion();
  snprintf(text, sizeof text, "libjxl\t%u.%u.%u\tBSD-3-Clause", version / 1000000,
           version / 1000 % 1000, version % 1000);
  return text;
}

FMW_EXPORT int32_t FMW_CALL PLUGIN11GetPluginParams(FMW_PLUGIN_PARAMS* params, int32_t) {
  if (params->version < FMW_PLUGIN_VERSION) return 0;
  strcpy(params->textA, "JPEG XL");
  strcpy(params->extensions, "jxl");
  strcpy(params->textB, "JPEG XL");
  params->flags1 = 24;
  params->flags2 = FMW_FORMAT_BITMAP | FMW_FORMAT_MULTI | FMW_FORMAT_FRAMES | FMW_FORMAT_ALPHA |
                   FMW_FORMAT_EXIF | FMW_FORMAT_XMP | FMW_FORMAT_ICC;
  return 1;
}

FMW_EXPORT const FMW_OPTION* FMW_CALL PLUGIN12GetOptions(int32_t* count) {
  *count = kOptions;
  return kOptionTable;
}

FMW_EXPORT int32_t FMW_CALL PLUGIN11GetInfo(FMW_PICTURE_INFO* info, const char* fileName,
                                            int32_t* error, const FMW_HOST_SERVICES*) {
  Bytes bytes;
  Facts facts;
  *error = FmwReadFile(fileName, UINT64_MAX, &bytes.file);
  if (*error == 0) *error = ReadFacts(bytes, false, facts);
  if (*error != 0) return 0;
  const Size size = SizeOf(facts.info);
  if (size.width > INT32_MAX || size.height > INT32_MAX) {
    *error = FMW_ERROR_DAMAGED;
    return 0;
  }
  info->width = static_cast<int32_t>(size.width);
  info->height = static_cast<int32_t>(size.height);
  info->bitsPerPixel = BitsOf(facts.info);
  for (int i = 0; i < 768; ++i) info->palette[i] = static_cast<uint8_t>(i / 3);
  info->frame = static_cast<int32_t>(facts.delays.size());
  snprintf(info->typeName, sizeof info->typeName, "JPEG XL%s, %s%u bits per sample",
           facts.info.have_animation != 0 ? " animation" : "",
           facts.info.exponent_bits_per_sample > 0 ? "float, " : "", facts.info.bits_per_sample);
  return 1;
}

FMW_EXPORT int32_t FMW_CALL PLUGIN12GetMetadata(FMW_METADATA* metadata, const char* fileName,
                                                const FMW_READ_REQUEST*, int32_t* error,
                                                const FMW_HOST_SERVICES*) {
  Bytes bytes;
  Facts facts;
  *error = FmwReadFile(fileName, UINT64_MAX, &bytes.file);
  if (*error == 0) *error = ReadFacts(bytes, true, facts);
  metadata->icc = facts.icc;
  if (*error != 0) return 0;
  if (facts.info.bits_per_sample > 8) metadata->lost |= FMW_LOST_DEPTH;
  if (facts.info.num_extra_channels > (facts.info.alpha_bits > 0 ? 1u : 0u))
    metadata->lost |= FMW_LOST_INKS;
  metadata->exif = FmwBlock(facts.exif.data(), facts.exif.size());
  metadata->xmp = FmwBlock(facts.xmp.data(), facts.xmp.size());
  if (facts.info.have_animation != 0) {
    metadata->rounds =
        static_cast<int32_t>(std::min<uint32_t>(facts.info.animation.num_loops, 1 << 20));
    metadata->delays = FmwBlock(facts.delays.data(), facts.delays.size() * sizeof facts.delays[0]);
  }
  return 1;
}

FMW_EXPORT FMW_HANDLE FMW_CALL PLUGIN12ReadImage(const char* fileName,
                                                 const FMW_READ_REQUEST* request, int32_t* error,
                                                 const FMW_HOST_SERVICES*) {
  return Read(fileName, request->page, request->wantedSide, request, error);
}

FMW_EXPORT FMW_HANDLE FMW_CALL PLUGIN11ReadImage(const char* fileName, int32_t* error,
                                                 const FMW_HOST_SERVICES*) {
  return Read(fileName, 0, 0, nullptr, error);
}

FMW_EXPORT int32_t FMW_CALL PLUGIN12WriteImage(const char* fileName, FMW_HANDLE bitmap,
                                               const FMW_WRITE_REQUEST* request, int32_t* error,
                                               const FMW_HOST_SERVICES*) {
  *error = Write(fileName, FmwGivenBitmap(bitmap), *request);
  return *error == 0;
}

FMW_EXPORT int32_t FMW_CALL PLUGIN11WriteImage(const char* fileName, FMW_HANDLE bitmap, const char*,
                                               int32_t* error, const FMW_HOST_SERVICES*) {
  FMW_WRITE_REQUEST request = {};
  for (int i = 0; i < kOptions; ++i) request.options[i] = kOptionTable[i].standard;
  *error = Write(fileName, FmwGivenBitmap(bitmap), request);
  return *error == 0;
}

FMW_EXPORT int32_t FMW_CALL PLUGIN12Transcode(const char* source, const char* destination,
                                              int32_t* error, const FMW_HOST_SERVICES*) {
  Bytes bytes;
  *error = FmwReadFile(source, UINT64_MAX, &bytes.file);
  if (*error != 0) return 0;
  const bool jpeg =
      bytes.file.size > 2 && bytes.file.bytes[0] == 0xff && bytes.file.bytes[1] == 0xd8;
  *error = jpeg ? StoreJpeg(bytes, destination) : RestoreJpeg(bytes, destination);
  return *error == 0;
}

}  // extern "C"
