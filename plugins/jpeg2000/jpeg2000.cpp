// JPEG 2000 through OpenJPEG: JP2 files and bare codestreams, read and written.
// Source: ISO/IEC 15444-1.
#include <openjpeg.h>

#include <algorithm>
#include <memory>
#include <vector>

#include "fotomill_plugin_exports.h"

namespace {

constexpr int32_t kLossless = 100;  // quality
constexpr int32_t kStandardQuality = 80;
constexpr uint32_t kMostComponents = 64;

enum OptionPlace { kQuality, kOptions };
constexpr FMW_OPTION kOptionTable[] = {
    {"Quality", "Quality, 1 to 100 (lossless)", FMW_OPTION_NUMBER, 1, kLossless, kStandardQuality,
     nullptr},
};

struct CodecDeleter {
  void operator()(opj_codec_t* codec) const { opj_destroy_codec(codec); }
};
struct StreamDeleter {
  void operator()(opj_stream_t* stream) const { opj_stream_destroy(stream); }
};
struct ImageDeleter {
  void operator()(opj_image_t* image) const { opj_image_destroy(image); }
};
using Codec = std::unique_ptr<opj_codec_t, CodecDeleter>;
using Stream = std::unique_ptr<opj_stream_t, StreamDeleter>;
// opj_codec_t and opj_stream_t are void, so the pointers hold void*.
using Image = std::unique_ptr<opj_image_t, ImageDeleter>;

// Whether a file is a bare codestream; `known` if it is one of both.
bool IsCodestream(const char* fileName, bool& known) {
  FmwFile file;
  known = false;
  if (FmwReadFile(fileName, 12, &file) != 0) return false;
  const bool bare = file.size >= 4 && FmwGetBe(file.bytes, 4) == 0xff4fff51;
  const bool boxed =
      file.size >= 12 && FmwGetBe(file.bytes, 4) == 12 && FmwGetBe(file.bytes + 4, 4) == 0x6a502020;
  free(file.bytes);
  known = bare || boxed;
  return bare;
}

// A file whose header has been read.
struct Reading {
  Stream stream;
  Codec codec;
  Image image;
};

int32_t Open(const char* fileName, uint32_t reductions, Reading& reading) {
  bool known = false;
  const bool bare = IsCodestream(fileName, known);
  if (!known) return FMW_ERROR_DAMAGED;
  reading.stream.reset(opj_stream_create_default_file_stream(fileName, OPJ_TRUE));
  reading.codec.reset(opj_create_decompress(bare ? OPJ_CODEC_J2K : OPJ_CODEC_JP2));
  if (reading.stream == nullptr) return FMW_ERROR_OPEN;
  if (reading.codec == nullptr) return FMW_ERROR_MEMORY;
  opj_dparameters_t parameters;
  opj_set_default_decoder_parameters(&parameters);
  parameters.cp_reduce = reductions;
  if (opj_setup_decoder(reading.codec.get(), &parameters) == OPJ_FALSE) return FMW_ERROR_MEMORY;
  (void)opj_codec_set_threads(reading.codec.get(), opj_get_num_cpus());
  (void)opj_decoder_set_strict_mode(reading.codec.get(), OPJ_FALSE);
  opj_image_t* image = nullptr;
  const OPJ_BOOL done = opj_read_header(reading.stream.get(), reading.codec.get(), &image);
  reading.image.reset(image);
  if (done == OPJ_FALSE || image == nullptr) return FMW_ERROR_DAMAGED;
  if (image->numcomps < 1 || image->numcomps > kMostComponents || image->x1 <= image->x0 ||
      image->y1 <= image->y0)
    return FMW_ERROR_DAMAGED;
  const uint64_t width = image->x1 - image->x0, height = image->y1 - image->y0;
  return width * height > FMW_KIT_MOST_PIXELS ? FMW_ERROR_MEMORY : 0;
}

// How a picture is made from the components of a file.
struct Layout {
  uint32_t colors = 1;  // 1 or 3
  int alpha = -1;       // the component, -1: none
  bool yuv = false;
  int Bits() const { return alpha >= 0 ? 32 : colors == 1 ? 8 : 24; }
};

Layout LayoutOf(const opj_image_t& image) {
  Layout layout;
  for (uint32_t i = 0; i < image.numcomps; ++i) {
    if (image.comps[i].alpha != 0 && layout.alpha < 0) layout.alpha = static_cast<int>(i);
  }
  const uint32_t colors = layout.alpha > 0 ? static_cast<uint32_t>(layout.alpha) : image.numcomps;
  layout.colors = colors >= 3 ? 3 : 1;
  // without a definition of channels, a second or fourth one is alpha by custom
  if (layout.alpha < 0 && (image.numcomps == 2 || image.numcomps == 4) &&
      image.color_space != OPJ_CLRSPC_CMYK)
    layout.alpha = static_cast<int>(image.numcomps) - 1;
  layout.yuv = layout.colors == 3 && image.color_space == OPJ_CLRSPC_SYCC;
  if (layout.colors == 3 && image.comps[1].dx == 2 && image.comps[0].dx == 1) layout.yuv = true;
  return layout;
}

// The samples of a component as 8 bits, for each pixel.
class Plane {
 public:
  Plane(const opj_image_comp_t& component, const opj_image_comp_t& first)
      : component_(component),
        acrossX_(std::max(1u, component.dx / std::max(1u, first.dx))),
        acrossY_(std::max(1u, component.dy / std::max(1u, first.dy))),
        offset_(component.sgnd != 0 ? 1 << (component.prec - 1) : 0) {}
  bool Usable() const {
    return component_.data != nullptr && component_.w > 0 && component_.h > 0 &&
           component_.prec >= 1 && component_.prec <= 31;
  }
  // Writes row y: a sample for each pixel, to every `step`th byte.
  void CopyRow(uint32_t y, uint32_t width, size_t step, uint8_t* target) const {
    const uint32_t line = std::min(y / acrossY_, component_.h - 1);
    const int32_t* const samples = component_.data + size_t{line} * component_.w;
    const uint32_t whole = acrossX_ == 1 ? std::min(width, component_.w) : 0;
    for (uint32_t x = 0; x < whole; ++x, target += step) *target = ToByte(samples[x]);
    for (uint32_t x = whole; x < width; ++x, target += step)
      *target = ToByte(samples[std::min(x / acrossX_, component_.w - 1)]);
  }

 private:
  uint8_t ToByte(int32_t sample) const {
    if (component_.prec == 8) return static_cast<uint8_t>(std::clamp(sample + offset_, 0, 255));
    const int64_t most = (int64_t{1} << component_.prec) - 1;
    const int64_t value = std::clamp<int64_t>(int64_t{sample} + offset_, 0, most);
    return static_cast<uint8_t>(component_.prec > 8 ? value >> (component_.prec - 8)
                                                    : value * 255 / most);
  }

  const opj_image_comp_t& component_;
  uint32_t acrossX_, acrossY_;
  int32_t offset_;
};

uint8_t Clamped(double value) { return static_cast<uint8_t>(std::clamp(value, 0.0, 255.0)); }

// Full-range YCbCr of ITU-R BT.601.
void ToRgb(uint8_t* pixel) {
  const double y = pixel[2], cb = pixel[1] - 128.0, cr = pixel[0] - 128.0;
  pixel[2] = Clamped(y + 1.402 * cr);
  pixel[1] = Clamped(y - 0.344 * cb - 0.714 * cr);
  pixel[0] = Clamped(y + 1.772 * cb);
}

int32_t ToBitmap(const opj_image_t& image, const FMW_READ_REQUEST* request, FmwBitmap& bitmap) {
  const Layout layout = LayoutOf(image);
  std::vector<Plane> planes;  // in the order of a pixel's bytes
  for (uint32_t i = layout.colors; i-- > 0;) planes.emplace_back(image.comps[i], image.comps[0]);
  if (layout.alpha >= 0) {
    while (planes.size() < 3) planes.push_back(planes[0]);
    planes.emplace_back(image.comps[layout.alpha], image.comps[0]);
  }
  for (const Plane& plane : planes) {
    if (!plane.Usable()) return FMW_ERROR_DAMAGED;
  }
  bitmap = FmwNewBitmap(image.comps[0].w, image.comps[0].h, layout.Bits(), request);
  if (bitmap.block == nullptr) return FMW_ERROR_MEMORY;
  for (uint32_t y = 0; y < bitmap.height; ++y) {
    uint8_t* pixel = FmwRow(&bitmap, y);
    for (size_t i = 0; i < planes.size(); ++i)
      planes[i].CopyRow(y, bitmap.width, planes.size(), pixel + i);
    for (uint32_t x = 0; layout.yuv && x < bitmap.width; ++x, pixel += planes.size()) ToRgb(pixel);
  }
  return 0;
}

// Halvings after which the longer edge is still as long as wanted.
uint32_t ReductionsFor(int32_t wantedSide, const opj_image_t& image) {
  const uint32_t side = std::max(image.x1 - image.x0, image.y1 - image.y0);
  uint32_t reductions = 0;
  while (wantedSide > 0 && side >> (reductions + 1) >= static_cast<uint32_t>(wantedSide))
    ++reductions;
  return std::min(reductions, 5u);  // the usual number of resolutions; fewer fail below
}

int32_t Read(const char* fileName, const FMW_READ_REQUEST* request, FmwBitmap* bitmap) {
  Reading reading;
  const int32_t error = Open(fileName, 0, reading);
  if (error != 0) return error;
  const uint32_t reductions = ReductionsFor(request->wantedSide, *reading.image);
  if (reductions > 0) {
    Reading reduced;
    if (Open(fileName, reductions, reduced) == 0) reading = std::move(reduced);
  }
  if (opj_decode(reading.codec.get(), reading.stream.get(), reading.image.get()) == OPJ_FALSE)
    return FMW_ERROR_DAMAGED;
  return ToBitmap(*reading.image, request, *bitmap);
}

int32_t Describe(const char* fileName, FMW_PICTURE_INFO* info) {
  Reading reading;
  const int32_t error = Open(fileName, 0, reading);
  if (error != 0) return error;
  const opj_image_t& image = *reading.image;
  bool known = false;
  info->width = static_cast<int32_t>(image.comps[0].w);
  info->height = static_cast<int32_t>(image.comps[0].h);
  info->bitsPerPixel = LayoutOf(image).Bits();
  // The definition of channels is not known before decoding, so there may be alpha after all.
  FmwGrayPalette(info);
  snprintf(info->typeName, sizeof info->typeName, "JPEG 2000%s, %u bits per sample",
           IsCodestream(fileName, known) ? " codestream" : "", image.comps[0].prec);
  return info->width > 0 && info->height > 0 ? 0 : FMW_ERROR_DAMAGED;
}

int32_t ReadMetadata(const char* fileName, const FMW_READ_REQUEST*, FMW_METADATA* metadata) {
  Reading reading;
  const int32_t error = Open(fileName, 0, reading);
  if (error != 0) return error;
  if (reading.image->comps[0].prec > 8) metadata->lost |= FMW_LOST_DEPTH;
  if (reading.image->numcomps > 4) metadata->lost |= FMW_LOST_INKS;
  metadata->icc = FmwBlock(reading.image->icc_profile_buf, reading.image->icc_profile_len);
  return 0;
}

// ---- writing ----

Image NewImage(const FmwBitmap& given, uint32_t components, bool gray) {
  std::vector<opj_image_cmptparm_t> parameters(components);
  for (opj_image_cmptparm_t& one : parameters) {
    one = {};
    one.dx = one.dy = 1;
    one.w = given.width;
    one.h = given.height;
    one.prec = 8;
  }
  Image image(
      opj_image_create(components, parameters.data(), gray ? OPJ_CLRSPC_GRAY : OPJ_CLRSPC_SRGB));
  if (image == nullptr) return image;
  image->x1 = given.width;
  image->y1 = given.height;
  if (components == 4) image->comps[3].alpha = 1;
  std::vector<uint8_t> row(size_t{given.width} * 4);
  for (uint32_t y = 0; y < given.height; ++y) {
    FmwGivenRow(&given, y, 1, row.data());
    for (uint32_t c = 0; c < components; ++c) {
      int32_t* samples = image->comps[c].data + size_t{given.width} * y;
      for (uint32_t x = 0; x < given.width; ++x) samples[x] = row[4 * size_t{x} + c];
    }
  }
  return image;
}

bool IsBareName(const char* fileName) {
  const char* dot = strrchr(fileName, '.');
  return dot != nullptr && (dot[1] | 0x20) == 'j' && dot[2] != 'p' && dot[2] != 'P';
}

void AddProfile(const FMW_BLOCK& icc, opj_image_t& image) {
  if (icc.size == 0 || icc.size > UINT32_MAX) return;
  // the library frees it with free()
  image.icc_profile_buf = static_cast<uint8_t*>(malloc(static_cast<size_t>(icc.size)));
  if (image.icc_profile_buf == nullptr) return;
  memcpy(image.icc_profile_buf, icc.data, static_cast<size_t>(icc.size));
  image.icc_profile_len = static_cast<uint32_t>(icc.size);
}

int32_t Write(const char* fileName, const FmwBitmap* given, const FMW_WRITE_REQUEST* request) {
  const bool gray = FmwIsGray(given) != 0, bare = IsBareName(fileName);
  const uint32_t components = gray ? 1 : given->bits == 32 ? 4 : 3;
  const Image image = NewImage(*given, components, gray);
  const Codec codec(opj_create_compress(bare ? OPJ_CODEC_J2K : OPJ_CODEC_JP2));
  if (image == nullptr || codec == nullptr) return FMW_ERROR_MEMORY;
  if (!bare) AddProfile(request->icc, *image);
  opj_cparameters_t parameters;
  opj_set_default_encoder_parameters(&parameters);
  const int32_t quality = request->quality > 0 ? request->quality : request->options[kQuality];
  parameters.tcp_mct = components >= 3 ? 1 : 0;
  parameters.tcp_numlayers = 1;
  if (request->lossless != 0 || quality >= kLossless) {
    parameters.cp_disto_alloc = 1;
    parameters.tcp_rates[0] = 0;
  } else {  // a signal-to-noise ratio of 25 to 50 dB
    parameters.irreversible = 1;
    parameters.cp_fixed_quality = 1;
    parameters.tcp_distoratio[0] = 25.0F + static_cast<float>(quality) / 4;
  }
  while (parameters.numresolution > 1 &&
         std::min(given->width, given->height) >> (parameters.numresolution - 1) == 0)
    --parameters.numresolution;
  if (opj_setup_encoder(codec.get(), &parameters, image.get()) == OPJ_FALSE)
    return FMW_ERROR_UNSUITABLE;
  (void)opj_codec_set_threads(codec.get(), opj_get_num_cpus());
  const Stream stream(opj_stream_create_default_file_stream(fileName, OPJ_FALSE));
  if (stream == nullptr) return FMW_ERROR_CREATE;
  const bool done = opj_start_compress(codec.get(), image.get(), stream.get()) != OPJ_FALSE &&
                    opj_encode(codec.get(), stream.get()) != OPJ_FALSE &&
                    opj_end_compress(codec.get(), stream.get()) != OPJ_FALSE;
  return done ? 0 : FMW_ERROR_WRITE;
}

constexpr FmwModule kModule = {
    .name = "JPEG 2000",
    .extensions = "jp2;j2k;jpf;jpx;j2c;jpc",
    .description = "JPEG 2000",
    .bits = 24,
    .flags = FMW_FORMAT_BITMAP | FMW_FORMAT_ALPHA | FMW_FORMAT_ICC,
    .options = kOptionTable,
    .optionCount = kOptions,
};

}  // namespace

FMW_MODULE(kModule)
FMW_MODULE_LIBRARIES("OpenJPEG\t%s\tBSD-2-Clause", opj_version())
FMW_MODULE_READS(Describe, Read)
FMW_MODULE_METADATA(ReadMetadata)
FMW_MODULE_WRITES(Write)
