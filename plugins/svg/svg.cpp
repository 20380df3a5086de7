// SVG through librsvg, drawn as large as it says, or as small as the program asks for. Read only.
// Source: W3C, Scalable Vector Graphics (SVG) 1.1, second edition.
#include <librsvg/rsvg.h>

#include <algorithm>
#include <cmath>
#include <memory>

#include "fotomill_plugin_kit.h"

namespace {

constexpr double kDotsPerInch = 96;
constexpr double kStandardSide = 512;  // of a drawing without any size
constexpr double kMostSide = 16384;

enum OptionPlace { kScale, kOptions };
constexpr FMW_OPTION kOptionTable[] = {
    {"Scale", "Scale, in percent of the size in the file", FMW_OPTION_NUMBER, 1, 10000, 100,
     nullptr},
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

FMW_HANDLE Read(const char* fileName, int32_t percent, int32_t wantedSide,
                const FMW_READ_REQUEST* request, int32_t* error) {
  Handle handle;
  *error = Open(fileName, handle);
  if (*error != 0) return nullptr;
  Size size = SizeOf(handle.get(), percent);
  const double side = std::max(size.width, size.height);
  if (wantedSide > 0 && wantedSide < side) {
    size = {std::max(1.0, std::ceil(size.width * wantedSide / side)),
            std::max(1.0, std::ceil(size.height * wantedSide / side))};
  }
  FmwBitmap bitmap = {};
  *error = Draw(handle.get(), size, request, bitmap);
  return *error == 0 ? bitmap.block : nullptr;
}

int32_t Describe(const char* fileName, int32_t percent, FMW_PICTURE_INFO* info) {
  Handle handle;
  const int32_t error = Open(fileName, handle);
  if (error != 0) return error;
  const Size size = SizeOf(handle.get(), percent);
  info->width = static_cast<int32_t>(size.width);
  info->height = static_cast<int32_t>(size.height);
  info->bitsPerPixel = 32;
  strcpy(info->typeName, "SVG");
  return 0;
}

}  // namespace

extern "C" {

FMW_EXPORT const char* FMW_CALL PLUGIN11GetVersion() { return "1.0"; }

FMW_EXPORT const char* FMW_CALL PLUGIN12GetLibraries() {
  static char text[64];
  snprintf(text, sizeof text, "librsvg\t%u.%u.%u\tLGPL-2.1-or-later", rsvg_major_version,
           rsvg_minor_version, rsvg_micro_version);
  return text;
}

FMW_EXPORT int32_t FMW_CALL PLUGIN11GetPluginParams(FMW_PLUGIN_PARAMS* params, int32_t) {
  if (params->version < FMW_PLUGIN_VERSION) return 0;
  strcpy(params->textA, "SVG");
  strcpy(params->extensions, "svg;svgz");
  strcpy(params->textB, "Scalable Vector Graphics");
  params->flags2 = FMW_FORMAT_BITMAP;
  return 1;
}

FMW_EXPORT int32_t FMW_CALL PLUGIN11GetInfo(FMW_PICTURE_INFO* info, const char* fileName,
                                            int32_t* error, const FMW_HOST_SERVICES*) {
  *error = Describe(fileName, 100, info);
  return *error == 0;
}

FMW_EXPORT const FMW_OPTION* FMW_CALL PLUGIN12GetOptions(int32_t* count) {
  *count = kOptions;
  return kOptionTable;
}

FMW_EXPORT int32_t FMW_CALL PLUGIN12GetMetadata(FMW_METADATA* metadata, const char* fileName,
                                                const FMW_READ_REQUEST* request, int32_t* error,
                                                const FMW_HOST_SERVICES*) {
  FMW_PICTURE_INFO info = {};
  *error = Describe(fileName, request->options[kScale], &info);
  metadata->width = info.width;
  metadata->height = info.height;
  return *error == 0;
}

FMW_EXPORT FMW_HANDLE FMW_CALL PLUGIN12ReadImage(const char* fileName,
                                                 const FMW_READ_REQUEST* request, int32_t* error,
                                                 const FMW_HOST_SERVICES*) {
  return Read(fileName, request->options[kScale], request->wantedSide, request, error);
}

FMW_EXPORT FMW_HANDLE FMW_CALL PLUGIN11ReadImage(const char* fileName, int32_t* error,
                                                 const FMW_HOST_SERVICES*) {
  return Read(fileName, 100, 0, nullptr, error);
}

}  // extern "C"
