// Raw files of cameras through LibRaw: the preview in the file, or the picture developed from the
// sensor's values. Read only.
#include <libraw/libraw.h>

#include <csetjmp>
#include <cstdio>

#include <jpeglib.h>

#include <algorithm>
#include <memory>
#include <vector>

#include "fotomill_plugin_exports.h"
#include "raw_exif.h"

namespace {

enum Picture { kPreview, kHalf, kDeveloped };
enum OptionPlace { kPicture, kOptions };
constexpr FMW_OPTION kOptionTable[] = {
    {"Picture", "Picture", FMW_OPTION_CHOICE, 0, 0, kPreview,
     "Preview in the file, if it is large;Developed, half size;Developed"},
};

struct RawCloser {
  void operator()(libraw_data_t* raw) const { libraw_close(raw); }
};
struct MemoryFreer {
  void operator()(libraw_processed_image_t* image) const { libraw_dcraw_clear_mem(image); }
};
using Raw = std::unique_ptr<libraw_data_t, RawCloser>;
using Memory = std::unique_ptr<libraw_processed_image_t, MemoryFreer>;

int32_t ErrorOf(int result) {
  switch (result) {
    case LIBRAW_SUCCESS: return 0;
    case LIBRAW_FILE_UNSUPPORTED: return FMW_ERROR_FORMAT;
    case LIBRAW_UNSUFFICIENT_MEMORY: return FMW_ERROR_MEMORY;
    case LIBRAW_IO_ERROR: return FMW_ERROR_READ;
    default: return FMW_ERROR_DAMAGED;
  }
}

int32_t Open(const char* fileName, Raw& raw) {
  FILE* file = fopen(fileName, "rb");
  if (file == nullptr) return FMW_ERROR_OPEN;
  fclose(file);
  raw.reset(libraw_init(0));
  return raw == nullptr ? FMW_ERROR_MEMORY : ErrorOf(libraw_open_file(raw.get(), fileName));
}

struct Size {
  uint32_t width = 0, height = 0;
  uint32_t Side() const { return std::max(width, height); }
};

bool IsAcross(const libraw_data_t& raw) { return (raw.sizes.flip & 4) != 0; }

// Opens the file for itself: pixels cannot be unpacked after the library was asked for the size.
Size DevelopedSize(const char* fileName, bool half) {
  Raw raw;
  if (Open(fileName, raw) != 0) return {};
  raw->params.half_size = half ? 1 : 0;
  if (libraw_adjust_sizes_info_only(raw.get()) != LIBRAW_SUCCESS) return {};
  return {raw->sizes.iwidth, raw->sizes.iheight};
}

// ---- the preview ----

struct JpegFault {
  jpeg_error_mgr manager;
  std::jmp_buf back;
};

[[noreturn]] void OnJpegFault(j_common_ptr jpeg) {
  std::longjmp(reinterpret_cast<JpegFault*>(jpeg->err)->back, 1);
}

// Decodes a JPEG file to red, green, blue, reduced while its longer edge stays at `leastSide`; with
// no pixels, only its size. False if it is damaged. No objects: errors jump.
bool DecodeJpeg(const uint8_t* bytes, size_t count, uint32_t leastSide, Size* size,
                std::vector<uint8_t>* pixels) {
  jpeg_decompress_struct jpeg;
  JpegFault fault;
  jpeg.err = jpeg_std_error(&fault.manager);
  fault.manager.error_exit = OnJpegFault;
  fault.manager.output_message = [](j_common_ptr) {};
  jpeg_create_decompress(&jpeg);
  if (setjmp(fault.back) != 0) {
    jpeg_destroy_decompress(&jpeg);
    return false;
  }
  jpeg_mem_src(&jpeg, bytes, static_cast<unsigned long>(count));
  jpeg_read_header(&jpeg, TRUE);
  jpeg.out_color_space = JCS_RGB;
  jpeg.scale_num = 8;
  jpeg.scale_denom = 8;
  while (leastSide > 0 && jpeg.scale_num > 1 &&
         std::max(jpeg.image_width, jpeg.image_height) / 8 * (jpeg.scale_num / 2) >= leastSide)
    jpeg.scale_num /= 2;
  jpeg_calc_output_dimensions(&jpeg);
  *size = {jpeg.output_width, jpeg.output_height};
  const bool fits = uint64_t{jpeg.output_width} * jpeg.output_height <= FMW_KIT_MOST_PIXELS;
  if (pixels != nullptr && fits) {
    pixels->resize(size_t{3} * jpeg.output_width * jpeg.output_height);
    jpeg_start_decompress(&jpeg);
    while (jpeg.output_scanline < jpeg.output_height) {
      uint8_t* row = pixels->data() + size_t{3} * jpeg.output_width * jpeg.output_scanline;
      jpeg_read_scanlines(&jpeg, &row, 1);
    }
    jpeg_finish_decompress(&jpeg);
  }
  jpeg_destroy_decompress(&jpeg);
  return fits;
}

struct Preview {
  Memory file;
  Size size;                    // as stored, before it is turned upright
  std::vector<uint8_t> pixels;  // red, green, blue

  bool Find(libraw_data_t& raw) {
    if (libraw_unpack_thumb(&raw) != LIBRAW_SUCCESS) return false;
    int fault = 0;
    file.reset(libraw_dcraw_make_mem_thumb(&raw, &fault));
    if (file == nullptr) return false;
    if (file->type == LIBRAW_IMAGE_JPEG)
      return DecodeJpeg(file->data, file->data_size, 0, &size, nullptr);
    size = {file->width, file->height};
    return file->colors == 3 && file->bits == 8 && size.width > 0 &&
           file->data_size >= uint64_t{3} * size.width * size.height;
  }
  bool Decode(uint32_t leastSide) {
    if (file->type == LIBRAW_IMAGE_JPEG)
      return DecodeJpeg(file->data, file->data_size, leastSide, &size, &pixels);
    pixels.assign(file->data, file->data + size_t{3} * size.width * size.height);
    return true;
  }
};

// Copies pixels into a new bitmap, turned upright: bit 0 of `flip` mirrors left and right, bit 1
// top and bottom, bit 2 then exchanges rows and columns.
int32_t ToBitmap(const uint8_t* pixels, Size size, int flip, const FMW_READ_REQUEST* request,
                 FmwBitmap& bitmap) {
  const bool across = (flip & 4) != 0;
  bitmap = FmwNewBitmap(across ? size.height : size.width, across ? size.width : size.height, 24,
                        request);
  if (bitmap.block == nullptr) return FMW_ERROR_MEMORY;
  for (uint32_t y = 0; y < bitmap.height; ++y) {
    uint8_t* target = FmwRow(&bitmap, y);
    for (uint32_t x = 0; x < bitmap.width; ++x, target += 3) {
      uint32_t column = across ? y : x, line = across ? x : y;
      if ((flip & 1) != 0) column = size.width - 1 - column;
      if ((flip & 2) != 0) line = size.height - 1 - line;
      const uint8_t* source = pixels + 3 * (size_t{size.width} * line + column);
      target[0] = source[2];
      target[1] = source[1];
      target[2] = source[0];
    }
  }
  return 0;
}

// Whether the preview stands for the picture: at least half as large.
bool IsLarge(const Preview& preview, Size developed) {
  return 2 * preview.size.Side() >= developed.Side();
}

// ---- developing ----

// Opens the file for itself, as a failed search for a preview leaves nothing to develop.
int32_t Develop(const char* fileName, bool half, const FMW_READ_REQUEST* request,
                FmwBitmap& bitmap) {
  Raw opened;
  int32_t error = Open(fileName, opened);
  if (error != 0) return error;
  libraw_data_t& raw = *opened;
  raw.params.half_size = half ? 1 : 0;
  raw.params.use_camera_wb = 1;
  raw.params.output_bps = 8;
  raw.params.gamm[0] = 1 / 2.4;  // the sRGB curve
  raw.params.gamm[1] = 12.92;
  error = ErrorOf(libraw_unpack(&raw));
  if (error == 0) error = ErrorOf(libraw_dcraw_process(&raw));
  if (error != 0) return error;
  int fault = 0;
  const Memory image(libraw_dcraw_make_mem_image(&raw, &fault));
  if (image == nullptr) return FMW_ERROR_MEMORY;
  const uint64_t pixels = uint64_t{image->width} * image->height;
  if (image->type != LIBRAW_IMAGE_BITMAP || image->bits != 8 ||
      (image->colors != 3 && image->colors != 1) || image->data_size < pixels * image->colors)
    return FMW_ERROR_DAMAGED;
  if (image->colors == 3)
    return ToBitmap(image->data, {image->width, image->height}, 0, request, bitmap);
  std::vector<uint8_t> gray(3 * static_cast<size_t>(pixels));
  for (size_t i = 0; i < gray.size(); ++i) gray[i] = image->data[i / 3];
  return ToBitmap(gray.data(), {image->width, image->height}, 0, request, bitmap);
}

int32_t Read(const char* fileName, const FMW_READ_REQUEST* request, FmwBitmap* bitmap) {
  Raw raw;
  const int32_t error = Open(fileName, raw);
  if (error != 0) return error;
  const Size developed = DevelopedSize(fileName, false);
  const auto wanted = static_cast<uint32_t>(std::max(request->wantedSide, 0));
  // Older programs know no other size than that of the developed picture.
  const bool old = request->version < FMW_PLUGIN_VERSION_12;
  const int32_t picture = old ? kDeveloped : request->options[kPicture];
  Preview preview;
  const bool fast = wanted > 0 || picture == kPreview;
  if (fast && preview.Find(*raw) &&
      (wanted > 0 ? preview.size.Side() >= wanted : IsLarge(preview, developed)) &&
      preview.Decode(wanted))
    return ToBitmap(preview.pixels.data(), preview.size, raw->sizes.flip, request, *bitmap);
  const bool half = picture == kHalf || (wanted > 0 && developed.Side() / 2 >= wanted);
  return Develop(fileName, half, request, *bitmap);
}

int32_t Describe(const char* fileName, FMW_PICTURE_INFO* info) {
  Raw raw;
  const int32_t error = Open(fileName, raw);
  if (error != 0) return error;
  const Size size = DevelopedSize(fileName, false);
  info->width = static_cast<int32_t>(size.width);
  info->height = static_cast<int32_t>(size.height);
  info->bitsPerPixel = 24;
  snprintf(info->typeName, sizeof info->typeName, "%.30s %.30s", raw->idata.make, raw->idata.model);
  return 0;
}

int32_t ReadMetadata(const char* fileName, const FMW_READ_REQUEST* request,
                     FMW_METADATA* metadata) {
  Raw raw;
  const int32_t error = Open(fileName, raw);
  if (error != 0) return error;
  metadata->lost = FMW_LOST_DEPTH;
  const std::vector<uint8_t> exif = ExifOf(*raw);
  metadata->exif = FmwBlock(exif.data(), exif.size());
  Size size = DevelopedSize(fileName, false);
  Preview preview;
  const int32_t picture = request->options[kPicture];
  if (picture == kPreview && preview.Find(*raw) && IsLarge(preview, size)) {
    size = preview.size;
    if (IsAcross(*raw)) std::swap(size.width, size.height);
  } else if (picture == kHalf) {
    size = DevelopedSize(fileName, true);
  }
  metadata->width = static_cast<int32_t>(size.width);
  metadata->height = static_cast<int32_t>(size.height);
  return 0;
}

constexpr FmwModule kModule = {
    .name = "Camera raw",
    .extensions =
        "dng;cr2;cr3;crw;nef;nrw;arw;sr2;srf;raf;rw2;orf;pef;srw;rwl;3fr;iiq;mef;mrw;erf;"
        "x3f;dcr;k25;mos;raw",
    .description = "Camera raw",
    .bits = 0,
    .flags = FMW_FORMAT_BITMAP,
    .options = kOptionTable,
    .optionCount = kOptions,
};

}  // namespace

FMW_MODULE(kModule)
FMW_MODULE_LIBRARIES("LibRaw\t%s\tLGPL-2.1-only OR CDDL-1.0", libraw_version())
FMW_MODULE_READS(Describe, Read)
FMW_MODULE_METADATA(ReadMetadata)
