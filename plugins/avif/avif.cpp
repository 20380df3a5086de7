// AVIF through libavif: still pictures and animations, read and written.
//
// Rotation and mirroring stored in the file are applied to the pixels, so EXIF is passed on with
// orientation 1. Source: ISO/IEC 23008-12 (HEIF), 6.5.10 and 6.5.12.
#include <avif/avif.h>

#include <algorithm>
#include <cmath>
#include <memory>
#include <thread>
#include <vector>

#include "fotomill_plugin_exports.h"

namespace {

constexpr int32_t kStandardQuality = 60;
constexpr int32_t kStandardSpeed = 6;
constexpr int32_t kBestQuality = 100;
constexpr int32_t kMostFrames = 1 << 16;

enum OptionPlace { kQuality, kSpeed, kSampling, kOptions };
constexpr FMW_OPTION kOptionTable[] = {
    {"Quality", "Quality, 1 to 100", FMW_OPTION_NUMBER, 1, kBestQuality, kStandardQuality, nullptr},
    {"Speed", "Speed, 0 (smallest files) to 10", FMW_OPTION_NUMBER, 0, 10, kStandardSpeed, nullptr},
    {"Subsampling", "Color subsampling", FMW_OPTION_CHOICE, 0, 2, 0, "4:2:0;4:2:2;4:4:4"},
};
static_assert(std::size(kOptionTable) == kOptions);

int ThreadCount() {
  return static_cast<int>(std::clamp(std::thread::hardware_concurrency(), 1u, 8u));
}

int32_t ErrorOf(avifResult result) {
  switch (result) {
    case AVIF_RESULT_OK: return 0;
    case AVIF_RESULT_IO_ERROR: return FMW_ERROR_OPEN;
    case AVIF_RESULT_TRUNCATED_DATA: return FMW_ERROR_READ;
    case AVIF_RESULT_OUT_OF_MEMORY: return FMW_ERROR_MEMORY;
    case AVIF_RESULT_UNSUPPORTED_DEPTH:
    case AVIF_RESULT_NO_CODEC_AVAILABLE:
    case AVIF_RESULT_NOT_IMPLEMENTED: return FMW_ERROR_FORMAT;
    default: return FMW_ERROR_DAMAGED;
  }
}

struct DecoderDeleter {
  void operator()(avifDecoder* decoder) const { avifDecoderDestroy(decoder); }
};
using Decoder = std::unique_ptr<avifDecoder, DecoderDeleter>;

int32_t Open(const char* fileName, Decoder& decoder) {
  decoder.reset(avifDecoderCreate());
  if (decoder == nullptr) return FMW_ERROR_MEMORY;
  decoder->maxThreads = ThreadCount();
  decoder->strictFlags = AVIF_STRICT_DISABLED;
  decoder->imageCountLimit = kMostFrames;
  const int32_t error = ErrorOf(avifDecoderSetIOFile(decoder.get(), fileName));
  if (error != 0) return error;
  return ErrorOf(avifDecoderParse(decoder.get()));
}

// How a picture is to be turned: quarter turns against the clock, then mirrored.
struct Turn {
  int quarters = 0;
  bool upsideDown = false, leftToRight = false;
  bool Any() const { return quarters != 0 || upsideDown || leftToRight; }
};

Turn TurnOf(const avifImage& image) {
  Turn turn;
  if ((image.transformFlags & AVIF_TRANSFORM_IROT) != 0) turn.quarters = image.irot.angle & 3;
  if ((image.transformFlags & AVIF_TRANSFORM_IMIR) != 0) {
#if AVIF_VERSION_MAJOR >= 1
    const int axis = image.imir.axis;
#else
    const int axis = image.imir.mode;
#endif
    (axis == 0 ? turn.upsideDown : turn.leftToRight) = true;
  }
  return turn;
}

// Copies the pixels of `from`, turned, to `to`, which has the size for it.
void CopyTurned(const FmwBitmap& from, const Turn& turn, const FmwBitmap& to) {
  const auto bytes = static_cast<size_t>(from.bits / 8);
  for (uint32_t y = 0; y < to.height; ++y) {
    uint8_t* target = FmwRow(&to, y);
    for (uint32_t x = 0; x < to.width; ++x, target += bytes) {
      const uint32_t column = turn.leftToRight ? to.width - 1 - x : x;
      const uint32_t line = turn.upsideDown ? to.height - 1 - y : y;
      uint32_t sourceX = column, sourceY = line;
      if (turn.quarters == 1) sourceX = from.width - 1 - line, sourceY = column;
      if (turn.quarters == 2) sourceX = from.width - 1 - column, sourceY = from.height - 1 - line;
      if (turn.quarters == 3) sourceX = line, sourceY = from.height - 1 - column;
      std::copy_n(FmwRow(&from, sourceY) + bytes * sourceX, bytes, target);
    }
  }
}

int32_t ToBitmap(const avifImage& image, bool alpha, const FMW_READ_REQUEST* request,
                 FmwBitmap& bitmap) {
  const Turn turn = TurnOf(image);
  bitmap = FmwNewBitmap(image.width, image.height, alpha ? 32 : 24, turn.Any() ? nullptr : request);
  if (bitmap.block == nullptr) return FMW_ERROR_MEMORY;
  avifRGBImage rgb;
  avifRGBImageSetDefaults(&rgb, &image);
  rgb.depth = 8;
  rgb.format = alpha ? AVIF_RGB_FORMAT_BGRA : AVIF_RGB_FORMAT_BGR;
  rgb.pixels = bitmap.rows;
  rgb.rowBytes = static_cast<uint32_t>(bitmap.stride);
  const int32_t error = ErrorOf(avifImageYUVToRGB(&image, &rgb));
  if (error != 0) {
    FmwFreeBitmap(&bitmap, turn.Any() ? nullptr : request);
    return error;
  }
  if (!turn.Any()) return 0;
  FmwBitmap straight = bitmap;
  const bool across = turn.quarters % 2 != 0;
  bitmap = FmwNewBitmap(across ? image.height : image.width, across ? image.width : image.height,
                        straight.bits, request);
  if (bitmap.block != nullptr) CopyTurned(straight, turn, bitmap);
  FmwFreeBitmap(&straight, nullptr);
  return bitmap.block == nullptr ? FMW_ERROR_MEMORY : 0;
}

int32_t Read(const char* fileName, const FMW_READ_REQUEST* request, FmwBitmap* bitmap) {
  Decoder decoder;
  const int32_t page = request->page;
  int32_t error = Open(fileName, decoder);
  if (error == 0 && (page < 0 || page >= decoder->imageCount)) error = FMW_ERROR_DAMAGED;
  if (error != 0) return error;
  error = ErrorOf(page == 0 ? avifDecoderNextImage(decoder.get())
                            : avifDecoderNthImage(decoder.get(), static_cast<uint32_t>(page)));
  if (error != 0) return error;
  return ToBitmap(*decoder->image, decoder->alphaPresent != 0, request, *bitmap);
}

int32_t Describe(const char* fileName, FMW_PICTURE_INFO* info) {
  Decoder decoder;
  const int32_t error = Open(fileName, decoder);
  if (error != 0) return error;
  const avifImage& image = *decoder->image;
  const bool across = TurnOf(image).quarters % 2 != 0;
  info->width = static_cast<int32_t>(across ? image.height : image.width);
  info->height = static_cast<int32_t>(across ? image.width : image.height);
  info->bitsPerPixel = decoder->alphaPresent != 0 ? 32 : 24;
  info->frame = decoder->imageCount;
  snprintf(info->typeName, sizeof info->typeName, "AVIF%s, %s, %u bits per sample",
           decoder->imageCount > 1 ? " animation" : "", avifPixelFormatToString(image.yuvFormat),
           image.depth);
  return 0;
}

FMW_BLOCK FrameDelays(avifDecoder* decoder) {
  std::vector<int32_t> delays(static_cast<size_t>(decoder->imageCount));
  for (size_t i = 0; i < delays.size(); ++i) {
    avifImageTiming timing;
    if (avifDecoderNthImageTiming(decoder, static_cast<uint32_t>(i), &timing) == AVIF_RESULT_OK)
      delays[i] =
          static_cast<int32_t>(std::clamp(std::lround(timing.duration * 1000), 0L, 1L << 30));
  }
  return FmwBlock(delays.data(), delays.size() * sizeof delays[0]);
}

// Some writers put "Exif" and two zeros first.
FMW_BLOCK ExifOf(const avifImage& image) {
  constexpr size_t kPrefix = 6;
  const bool prefixed =
      image.exif.size > kPrefix && memcmp(image.exif.data, "Exif\0\0", kPrefix) == 0;
  const size_t skipped = prefixed ? kPrefix : 0;
  return FmwBlock(image.exif.data + skipped, image.exif.size - skipped);
}

int32_t ReadMetadata(const char* fileName, const FMW_READ_REQUEST*, FMW_METADATA* metadata) {
  Decoder decoder;
  const int32_t error = Open(fileName, decoder);
  if (error != 0) return error;
  const avifImage& image = *decoder->image;
  if (image.depth > 8) metadata->lost |= FMW_LOST_DEPTH;
  metadata->exif = ExifOf(image);
  FmwSetUpright(static_cast<uint8_t*>(metadata->exif.data), metadata->exif.size);
  metadata->xmp = FmwBlock(image.xmp.data, image.xmp.size);
  metadata->icc = FmwBlock(image.icc.data, image.icc.size);
  if (decoder->imageCount > 1) metadata->delays = FrameDelays(decoder.get());
#if AVIF_VERSION_MAJOR >= 1
  if (decoder->repetitionCount >= 0) metadata->rounds = decoder->repetitionCount + 1;
#endif
  return 0;
}

// ---- writing ----

struct ImageDeleter {
  void operator()(avifImage* image) const { avifImageDestroy(image); }
};
using Image = std::unique_ptr<avifImage, ImageDeleter>;
struct EncoderDeleter {
  void operator()(avifEncoder* encoder) const { avifEncoderDestroy(encoder); }
};
struct Output {
  avifRWData data = AVIF_DATA_EMPTY;
  Output() = default;
  ~Output() { avifRWDataFree(&data); }
  Output(const Output&) = delete;
  Output& operator=(const Output&) = delete;
};

avifPixelFormat SamplingOf(const FmwBitmap& given, int32_t choice, bool lossless) {
  if (lossless) return AVIF_PIXEL_FORMAT_YUV444;
  if (FmwIsGray(&given)) return AVIF_PIXEL_FORMAT_YUV400;
  constexpr avifPixelFormat kChoices[] = {AVIF_PIXEL_FORMAT_YUV420, AVIF_PIXEL_FORMAT_YUV422,
                                          AVIF_PIXEL_FORMAT_YUV444};
  return kChoices[std::clamp(choice, 0, 2)];
}

// The picture in YUV; with `lossless`, red, green and blue as they are.
int32_t ToImage(const FmwBitmap& given, bool lossless, int32_t sampling, Image& image) {
  image.reset(avifImageCreate(given.width, given.height, 8, SamplingOf(given, sampling, lossless)));
  if (image == nullptr) return FMW_ERROR_MEMORY;
  image->colorPrimaries = AVIF_COLOR_PRIMARIES_BT709;
  image->transferCharacteristics = AVIF_TRANSFER_CHARACTERISTICS_SRGB;
  image->matrixCoefficients =
      lossless ? AVIF_MATRIX_COEFFICIENTS_IDENTITY : AVIF_MATRIX_COEFFICIENTS_BT601;
  image->yuvRange = AVIF_RANGE_FULL;
  const bool alpha = given.bits == 32;
  std::vector<uint8_t> pixels(size_t{given.width} * given.height * (alpha ? 4 : 3));
  avifRGBImage rgb;
  avifRGBImageSetDefaults(&rgb, image.get());
  rgb.format = alpha ? AVIF_RGB_FORMAT_RGBA : AVIF_RGB_FORMAT_RGB;
  rgb.pixels = pixels.data();
  rgb.rowBytes = given.width * (alpha ? 4 : 3);
  for (uint32_t y = 0; y < given.height; ++y)
    FmwGivenRow(&given, y, alpha, pixels.data() + size_t{y} * rgb.rowBytes);
  return ErrorOf(avifImageRGBToYUV(image.get(), &rgb));
}

void SetQuality(avifEncoder& encoder, int32_t quality, bool lossless) {
#if AVIF_VERSION_MAJOR >= 1
  encoder.quality = lossless ? AVIF_QUALITY_LOSSLESS : quality;
  encoder.qualityAlpha = AVIF_QUALITY_LOSSLESS;
#else
  const int lossy =
      ((kBestQuality - quality) * AVIF_QUANTIZER_WORST_QUALITY + kBestQuality / 2) / kBestQuality;
  const int quantizer = lossless ? AVIF_QUANTIZER_LOSSLESS : lossy;
  encoder.minQuantizer = encoder.maxQuantizer = quantizer;
  encoder.minQuantizerAlpha = encoder.maxQuantizerAlpha = AVIF_QUANTIZER_LOSSLESS;
#endif
}

void AddMetadata(const FMW_WRITE_REQUEST& request, avifImage& image) {
  const auto* icc = static_cast<const uint8_t*>(request.icc.data);
  const auto* xmp = static_cast<const uint8_t*>(request.xmp.data);
  if (request.icc.size > 0) (void)avifImageSetProfileICC(&image, icc, request.icc.size);
  if (request.xmp.size > 0) (void)avifImageSetMetadataXMP(&image, xmp, request.xmp.size);
  if (request.exif.size == 0) return;
  // The library turns the orientation into a rotation of the picture, which readers apply; the tag
  // itself is then upright.
  (void)avifImageSetMetadataExif(&image, static_cast<const uint8_t*>(request.exif.data),
                                 request.exif.size);
  if (image.exif.size > 0) FmwSetUpright(image.exif.data, image.exif.size);
}

using Encoder = std::unique_ptr<avifEncoder, EncoderDeleter>;

Encoder NewEncoder(const FMW_WRITE_REQUEST& request) {
  Encoder encoder(avifEncoderCreate());
  if (encoder == nullptr) return encoder;
  encoder->maxThreads = ThreadCount();
  encoder->speed = std::clamp(request.options[kSpeed], 0, 10);
  const int32_t quality = request.quality > 0 ? request.quality : request.options[kQuality];
  SetQuality(*encoder, quality, request.lossless != 0);
  return encoder;
}

int32_t WriteOutput(const char* fileName, avifResult result, const Output& output) {
  const int32_t error = ErrorOf(result);
  if (error != 0) return error == FMW_ERROR_DAMAGED ? FMW_ERROR_UNSUITABLE : error;
  return FmwWriteFile(fileName, output.data.data, output.data.size);
}

int32_t Write(const char* fileName, const FmwBitmap* given, const FMW_WRITE_REQUEST* request) {
  Image image;
  const int32_t error = ToImage(*given, request->lossless != 0, request->options[kSampling], image);
  if (error != 0) return error;
  AddMetadata(*request, *image);
  const Encoder encoder = NewEncoder(*request);
  if (encoder == nullptr) return FMW_ERROR_MEMORY;
  Output output;
  return WriteOutput(fileName, avifEncoderWrite(encoder.get(), image.get(), &output.data), output);
}

// Older versions of the library have no place for the number of rounds; readers then repeat the
// animation without end.
void SetRounds(avifEncoder& encoder, int32_t rounds) {
#if AVIF_VERSION_MAJOR >= 1
  encoder.repetitionCount = rounds == 0 ? AVIF_REPETITION_COUNT_INFINITE : rounds - 1;
#else
  (void)encoder;
  (void)rounds;
#endif
}

int32_t WriteFrames(const char* fileName, const FMW_FRAMES* frames,
                    const FMW_WRITE_REQUEST* request) {
  const Encoder encoder = NewEncoder(*request);
  if (encoder == nullptr) return FMW_ERROR_MEMORY;
  encoder->timescale = 1000;
  SetRounds(*encoder, frames->rounds);
  for (int32_t i = 0; i < frames->count; ++i) {
    const FMW_HANDLE bitmap = frames->frame(frames, i);
    if (bitmap == nullptr) return FMW_ERROR_READ;
    Image image;
    int32_t error =
        ToImage(FmwGivenBitmap(bitmap), request->lossless != 0, request->options[kSampling], image);
    if (error != 0) return error;
    AddMetadata(*request, *image);
    const auto delay = static_cast<uint64_t>(std::max(frames->delays[i], 1));
    error =
        ErrorOf(avifEncoderAddImage(encoder.get(), image.get(), delay, AVIF_ADD_IMAGE_FLAG_NONE));
    if (error != 0) return error == FMW_ERROR_DAMAGED ? FMW_ERROR_UNSUITABLE : error;
  }
  Output output;
  return WriteOutput(fileName, avifEncoderFinish(encoder.get(), &output.data), output);
}

constexpr FmwModule kModule = {
    .name = "AVIF",
    .extensions = "avif;avifs",
    .description = "AV1 Image File Format",
    .bits = 24,
    .flags = FMW_FORMAT_BITMAP | FMW_FORMAT_MULTI | FMW_FORMAT_FRAMES | FMW_FORMAT_ALPHA |
             FMW_FORMAT_EXIF | FMW_FORMAT_XMP | FMW_FORMAT_ICC,
    .options = kOptionTable,
    .optionCount = kOptions,
};

}  // namespace

FMW_MODULE(kModule)
FMW_MODULE_LIBRARIES("libavif\t%s\tBSD-2-Clause", avifVersion())
FMW_MODULE_READS(Describe, Read)
FMW_MODULE_METADATA(ReadMetadata)
FMW_MODULE_WRITES(Write)
FMW_MODULE_WRITES_FRAMES(WriteFrames)
