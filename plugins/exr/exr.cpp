// OpenEXR pictures through the library of that name, read only: the colors and the alpha of the
// first part, in the display window. The preview in the file serves for thumbnails.
// Source: OpenEXR file layout, https://openexr.com/en/latest/OpenEXRFileLayout.html.
#include <OpenEXR/ImfChannelList.h>
#include <OpenEXR/ImfInputFile.h>
#include <OpenEXR/ImfPreviewImage.h>
#include <OpenEXR/ImfRgbaFile.h>
#include <OpenEXR/ImfStandardAttributes.h>
#include <OpenEXR/OpenEXRConfig.h>

#include <algorithm>
#include <exception>
#include <vector>

#include "fotomill_plugin_exports.h"
#include "fotomill_plugin_light.h"

namespace {

enum OptionPlace { kExposure, kHighlights, kOptions };
constexpr FMW_OPTION kOptionTable[] = {FMW_LIGHT_OPTIONS};
static_assert(std::size(kOptionTable) == kOptions);

// The library reports all errors by exceptions, which must not leave the module.
template <class Work>
int32_t Caught(const char* fileName, Work work) {
  FILE* file = fopen(fileName, "rb");
  if (file == nullptr) return FMW_ERROR_OPEN;
  uint8_t magic[4] = {};
  const bool known = fread(magic, 1, 4, file) == 4 && FmwGetLe(magic, 4) == 20000630;
  fclose(file);
  if (!known) return FMW_ERROR_DAMAGED;
  try {
    Imf::RgbaInputFile exr(fileName, 0);
    // only layers with names of their own, or depths
    if ((exr.channels() & (Imf::WRITE_RGB | Imf::WRITE_Y)) == 0) return FMW_ERROR_FORMAT;
    return work(exr);
  } catch (const std::bad_alloc&) {
    return FMW_ERROR_MEMORY;
  } catch (const std::exception&) {
    return FMW_ERROR_DAMAGED;
  }
}

struct Area {
  int64_t left, top, right, bottom;  // the last pixels included
  int64_t Width() const { return right - left + 1; }
  int64_t Height() const { return bottom - top + 1; }
  bool Usable() const {
    return Width() > 0 && Height() > 0 && Width() <= FMW_KIT_MOST_PIXELS / Height();
  }
};

Area AreaOf(const Imath::Box2i& box) { return {box.min.x, box.min.y, box.max.x, box.max.y}; }

bool HasAlpha(const Imf::RgbaInputFile& exr) { return (exr.channels() & Imf::WRITE_A) != 0; }

bool IsPreviewEnough(const Imf::RgbaInputFile& exr, int32_t wantedSide) {
  if (wantedSide <= 0 || !exr.header().hasPreviewImage()) return false;
  const Imf::PreviewImage& preview = exr.header().previewImage();
  return std::max(preview.width(), preview.height()) >= static_cast<uint32_t>(wantedSide);
}

int32_t ReadPreview(const Imf::PreviewImage& preview, const FMW_READ_REQUEST* request,
                    FmwBitmap& bitmap) {
  bitmap = FmwNewBitmap(preview.width(), preview.height(), 24, request);
  if (bitmap.block == nullptr) return FMW_ERROR_MEMORY;
  const Imf::PreviewRgba* pixel = preview.pixels();
  for (uint32_t y = 0; y < bitmap.height; ++y) {
    uint8_t* target = FmwRow(&bitmap, y);
    for (uint32_t x = 0; x < bitmap.width; ++x, ++pixel, target += 3) {
      target[0] = pixel->b;
      target[1] = pixel->g;
      target[2] = pixel->r;
    }
  }
  return 0;
}

// Colors are stored multiplied by alpha.
void PutPixel(const FmwLight& light, const Imf::Rgba& pixel, size_t bytes, uint8_t* target) {
  const float alpha = pixel.a;
  const float scale = bytes == 4 && alpha > 0 && alpha < 1 ? 1 / alpha : 1;
  FmwLightPixel(&light, scale * pixel.r, scale * pixel.g, scale * pixel.b, target);
  if (bytes == 4)
    target[3] = static_cast<uint8_t>(alpha > 0 ? std::min(alpha, 1.0F) * 255 + 0.5F : 0);
}

int32_t ReadPixels(Imf::RgbaInputFile& exr, const FMW_READ_REQUEST* request, FmwBitmap& bitmap) {
  const Area shown = AreaOf(exr.displayWindow()), stored = AreaOf(exr.dataWindow());
  if (!shown.Usable() || !stored.Usable()) return FMW_ERROR_MEMORY;
  const size_t bytes = HasAlpha(exr) ? 4 : 3;
  bitmap = FmwNewBitmap(static_cast<uint32_t>(shown.Width()), static_cast<uint32_t>(shown.Height()),
                        static_cast<int>(8 * bytes), request);
  if (bitmap.block == nullptr) return FMW_ERROR_MEMORY;
  for (uint32_t y = 0; y < bitmap.height; ++y) memset(FmwRow(&bitmap, y), 0, bytes * bitmap.width);
  FmwLight light;
  FmwInitLight(&light, request->options[kExposure], request->options[kHighlights]);
  const int64_t left = std::max(shown.left, stored.left),
                right = std::min(shown.right, stored.right);
  const int64_t top = std::max(shown.top, stored.top);
  const int64_t bottom = std::min(shown.bottom, stored.bottom);
  std::vector<Imf::Rgba> line(static_cast<size_t>(stored.Width()));
  for (int64_t y = top; y <= bottom; ++y) {
    exr.setFrameBuffer(line.data() - stored.left, 1, 0);
    exr.readPixels(static_cast<int>(y));
    uint8_t* target = FmwRow(&bitmap, static_cast<uint32_t>(y - shown.top)) +
                      bytes * static_cast<size_t>(left - shown.left);
    for (int64_t x = left; x <= right; ++x, target += bytes)
      PutPixel(light, line[static_cast<size_t>(x - stored.left)], bytes, target);
  }
  return 0;
}

int32_t Read(const char* fileName, const FMW_READ_REQUEST* request, FmwBitmap* bitmap) {
  return Caught(fileName, [&](Imf::RgbaInputFile& exr) {
    if (IsPreviewEnough(exr, request->wantedSide))
      return ReadPreview(exr.header().previewImage(), request, *bitmap);
    return ReadPixels(exr, request, *bitmap);
  });
}

int32_t Describe(const char* fileName, FMW_PICTURE_INFO* info) {
  return Caught(fileName, [&](const Imf::RgbaInputFile& exr) {
    const Area shown = AreaOf(exr.displayWindow());
    if (!shown.Usable()) return FMW_ERROR_MEMORY;
    info->width = static_cast<int32_t>(shown.Width());
    info->height = static_cast<int32_t>(shown.Height());
    info->bitsPerPixel = HasAlpha(exr) ? 32 : 24;
    strcpy(info->typeName, "OpenEXR");
    return 0;
  });
}

// Whether there are channels besides those of the picture.
bool HasOthers(const Imf::Header& header) {
  for (auto i = header.channels().begin(); i != header.channels().end(); ++i) {
    const std::string_view name = i.name();
    if (name != "R" && name != "G" && name != "B" && name != "A" && name != "Y" && name != "RY" &&
        name != "BY")
      return true;
  }
  return false;
}

int32_t ReadMetadata(const char* fileName, const FMW_READ_REQUEST*, FMW_METADATA* metadata) {
  return Caught(fileName, [&](const Imf::RgbaInputFile& exr) {
    metadata->lost = FMW_LOST_DEPTH | (HasOthers(exr.header()) ? FMW_LOST_INKS : 0);
    return 0;
  });
}

constexpr FmwModule kModule = {
    .name = "OpenEXR",
    .extensions = "exr",
    .description = "OpenEXR",
    .bits = 0,
    .flags = FMW_FORMAT_BITMAP,
    .options = kOptionTable,
    .optionCount = kOptions,
};

}  // namespace

FMW_MODULE(kModule)
FMW_MODULE_LIBRARIES("OpenEXR\t%s\tBSD-3-Clause", OPENEXR_VERSION_STRING)
FMW_MODULE_READS(Describe, Read)
FMW_MODULE_METADATA(ReadMetadata)
