#include "jpegxl.h"

#include <algorithm>

#include "fotomill_plugin_exports.h"

namespace jpegxl {

namespace {

constexpr int32_t kStandardQuality = 90;
constexpr int32_t kStandardEffort = 5;

constexpr FMW_OPTION kOptionTable[] = {
    {"Quality", "Quality, 1 to 100", FMW_OPTION_NUMBER, 1, 100, kStandardQuality, nullptr},
    {"Lossless", "Lossless", FMW_OPTION_SWITCH, 0, 1, 0, nullptr},
    {"Effort", "Effort, 1 (fastest) to 9", FMW_OPTION_NUMBER, 1, 9, kStandardEffort, nullptr},
};
static_assert(std::size(kOptionTable) == kOptions);

int32_t Describe(const char* fileName, FMW_PICTURE_INFO* info) {
  Bytes bytes;
  Facts facts;
  int32_t error = FmwReadFile(fileName, UINT64_MAX, &bytes.file);
  if (error == 0) error = ReadFacts(bytes, false, facts);
  if (error != 0) return error;
  const Size size = SizeOf(facts.info);
  if (size.width > INT32_MAX || size.height > INT32_MAX) return FMW_ERROR_DAMAGED;
  info->width = static_cast<int32_t>(size.width);
  info->height = static_cast<int32_t>(size.height);
  info->bitsPerPixel = BitsOf(facts.info);
  FmwGrayPalette(info);
  info->frame = static_cast<int32_t>(facts.delays.size());
  snprintf(info->typeName, sizeof info->typeName, "JPEG XL%s, %s%u bits per sample",
           facts.info.have_animation != 0 ? " animation" : "",
           facts.info.exponent_bits_per_sample > 0 ? "float, " : "", facts.info.bits_per_sample);
  return 0;
}

int32_t ReadMetadata(const char* fileName, const FMW_READ_REQUEST*, FMW_METADATA* metadata) {
  Bytes bytes;
  Facts facts;
  int32_t error = FmwReadFile(fileName, UINT64_MAX, &bytes.file);
  if (error == 0) error = ReadFacts(bytes, true, facts);
  metadata->icc = facts.icc;
  if (error != 0) return error;
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
  return 0;
}

constexpr FmwModule kModule = {
    .name = "JPEG XL",
    .extensions = "jxl",
    .description = "JPEG XL",
    .bits = 24,
    .flags = FMW_FORMAT_BITMAP | FMW_FORMAT_MULTI | FMW_FORMAT_FRAMES | FMW_FORMAT_ALPHA |
             FMW_FORMAT_EXIF | FMW_FORMAT_XMP | FMW_FORMAT_ICC,
    .options = kOptionTable,
    .optionCount = kOptions,
};

}  // namespace

FMW_MODULE(kModule)
FMW_MODULE_LIBRARIES("libjxl\t%u.%u.%u\tBSD-3-Clause", JxlDecoderVersion() / 1000000,
                     JxlDecoderVersion() / 1000 % 1000, JxlDecoderVersion() % 1000)
FMW_MODULE_READS(Describe, Read)
FMW_MODULE_METADATA(ReadMetadata)
FMW_MODULE_WRITES(Write)
FMW_MODULE_WRITES_FRAMES(WriteFrames)

FMW_EXPORT_C int32_t FMW_CALL PLUGIN12Transcode(const char* source, const char* destination,
                                                int32_t* error, const FMW_HOST_SERVICES*) {
  *error = Transcode(source, destination);
  return *error == 0;
}

}  // namespace jpegxl
