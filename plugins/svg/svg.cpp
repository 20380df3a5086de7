// SVG through librsvg, drawn as large as it says, or as small as the program asks for. Read only.
// Source: W3C, Scalable Vector Graphics (SVG) 1.1, second edition.
#include <librsvg/rsvg.h>

#include <algorithm>
#include <cmath>
#include <memory>

#include "fotomill_plugin_exports.h"

namespace {

constexpr double kDotsPerInch = 96;
constexpr double kStandardSide = 512;  // of a drawing without any size
constexpr double kMostSide = 16384;
constexpr int32_t kStandardScale = 100;  // percent

enum OptionPlace { kScale, kOptions };
constexpr FMW_OPTION kOptionTable[] = {
    {"Scale", "Scale, in percent of the size in the file", FMW_OPTION_NUMBER, 1, 10000,
     kStandardScale, nullptr},
};

struct Unreference {
  void operator()(void* object) const { g_object_unref(object); }
  void operator()(cairo_surface_t* surface) const { cairo_surface_destroy(surface); }
  void operator()(cairo_t* context) const { cairo_destroy(context); }
};
using Handle = std::unique_ptr<RsvgHandle, Unreference>;

int32_t Open(const char* fileName, Handle& handle) {
  FILE* file = fopen(fileName, "rb");
  if (file == nullptr) return FMW_ERROR_OPEN;
  fclose(file);
  GError* fault = nullptr;
  handle.reset(rsvg_handle_new_from_file(fileName, &fault));
  if (fault != nullptr) g_error_free(fault);
  if (handle == nullptr) return FMW_ERROR_DAMAGED;
  rsvg_handle_set_dpi(handle.get(), kDotsPerInch);
  return 0;
}

struct Size {
  double width = 0, height = 0;
};

// The size in the file, else that of its view box, else a square.
Size SizeOf(RsvgHandle* handle, int32_t percent) {
  Size size;
  if (!rsvg_handle_get_intrinsic_size_in_pixels(handle, &size.width, &size.height)) {
    gboolean hasWidth = FALSE, hasHeight = FALSE, hasBox = FALSE;
    RsvgLength width, height;
    RsvgRectangle box = {0, 0, 0, 0};
    rsvg_handle_get_intrinsic_dimensions(handle, &hasWidth, &width, &hasHeight, &height, &hasBox,
                                         &box);
    if (hasBox != FALSE) size = {box.width, box.height};
  }
  if (!(size.width > 0 && size.height > 0)) size = {kStandardSide, kStandardSide};
  const double scale = percent / 100.0;
  const double most = std::min(1.0, kMostSide / (scale * std::max(size.width, size.height)));
  return {std::max(1.0, std::ceil(size.width * scale * most)),
          std::max(1.0, std::ceil(size.height * scale * most))};
}

// Opaque colors from ones that were multiplied with their alpha.
void PutRow(const uint8_t* source, uint32_t width, uint8_t* target) {
  for (uint32_t x = 0; x < width; ++x, source += 4, target += 4) {
    uint32_t pixel = 0;
    memcpy(&pixel, source, sizeof pixel);
    const uint32_t alpha = pixel >> 24;
    for (uint32_t i = 0; i < 3; ++i) {
      const uint32_t value = pixel >> (8 * i) & 255;
      target[i] =
          static_cast<uint8_t>(alpha == 0 ? 0 : std::min((value * 255 + alpha / 2) / alpha, 255u));
    }
    target[3] = static_cast<uint8_t>(alpha);
  }
}

int32_t Draw(RsvgHandle* handle, Size size, const FMW_READ_REQUEST* request, FmwBitmap& bitmap) {
  const std::unique_ptr<cairo_surface_t, Unreference> surface(cairo_image_surface_create(
      CAIRO_FORMAT_ARGB32, static_cast<int>(size.width), static_cast<int>(size.height)));
  if (cairo_surface_status(surface.get()) != CAIRO_STATUS_SUCCESS) return FMW_ERROR_MEMORY;
  const std::unique_ptr<cairo_t, Unreference> context(cairo_create(surface.get()));
  const RsvgRectangle all = {0, 0, size.width, size.height};
  GError* fault = nullptr;
  const gboolean drawn = rsvg_handle_render_document(handle, context.get(), &all, &fault);
  if (fault != nullptr) g_error_free(fault);
  if (drawn == FALSE) return FMW_ERROR_DAMAGED;
  cairo_surface_flush(surface.get());
  bitmap = FmwNewBitmap(static_cast<uint32_t>(size.width), static_cast<uint32_t>(size.height), 32,
                        request);
  if (bitmap.block == nullptr) return FMW_ERROR_MEMORY;
  const uint8_t* rows = cairo_image_surface_get_data(surface.get());
  const auto stride = static_cast<size_t>(cairo_image_surface_get_stride(surface.get()));
  for (uint32_t y = 0; y < bitmap.height; ++y)
    PutRow(rows + stride * y, bitmap.width, FmwRow(&bitmap, y));
  return 0;
}

int32_t Read(const char* fileName, const FMW_READ_REQUEST* request, FmwBitmap* bitmap) {
  Handle handle;
  const int32_t error = Open(fileName, handle);
  if (error != 0) return error;
  Size size = SizeOf(handle.get(), request->options[kScale]);
  const double side = std::max(size.width, size.height);
  const double wanted = request->wantedSide;
  if (wanted > 0 && wanted < side) {
    size = {std::max(1.0, std::ceil(size.width * wanted / side)),
            std::max(1.0, std::ceil(size.height * wanted / side))};
  }
  return Draw(handle.get(), size, request, *bitmap);
}

int32_t Measure(const char* fileName, int32_t percent, Size& size) {
  Handle handle;
  const int32_t error = Open(fileName, handle);
  if (error == 0) size = SizeOf(handle.get(), percent);
  return error;
}

int32_t Describe(const char* fileName, FMW_PICTURE_INFO* info) {
  Size size;
  const int32_t error = Measure(fileName, kStandardScale, size);
  info->width = static_cast<int32_t>(size.width);
  info->height = static_cast<int32_t>(size.height);
  info->bitsPerPixel = 32;
  strcpy(info->typeName, "SVG");
  return error;
}

int32_t ReadMetadata(const char* fileName, const FMW_READ_REQUEST* request,
                     FMW_METADATA* metadata) {
  Size size;
  const int32_t error = Measure(fileName, request->options[kScale], size);
  metadata->width = static_cast<int32_t>(size.width);
  metadata->height = static_cast<int32_t>(size.height);
  return error;
}

constexpr FmwModule kModule = {
    .name = "SVG",
    .extensions = "svg;svgz",
    .description = "Scalable Vector Graphics",
    .bits = 0,
    .flags = FMW_FORMAT_BITMAP,
    .options = kOptionTable,
    .optionCount = kOptions,
};

}  // namespace

FMW_MODULE(kModule)
FMW_MODULE_LIBRARIES("librsvg\t%u.%u.%u\tLGPL-2.1-or-later", rsvg_major_version, rsvg_minor_version,
                     rsvg_micro_version)
FMW_MODULE_READS(Describe, Read)
FMW_MODULE_METADATA(ReadMetadata)
