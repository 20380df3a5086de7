// Checks the layouts of the plug-in ABI field by field: exact offsets with 4-byte pointers, shifted
// accordingly with 8-byte pointers.

// not <cstddef>: also compiled freestanding, for the other pointer width
#include <stddef.h>

#include "plugins/fotomill_plugin.h"

namespace {

// extra bytes per pointer field compared to the 32-bit layout
constexpr size_t kWider = sizeof(void*) - 4;

static_assert(sizeof(FMW_PLUGIN_PARAMS) == 863 + kWider);
static_assert(offsetof(FMW_PLUGIN_PARAMS, size) == 0 && offsetof(FMW_PLUGIN_PARAMS, version) == 4);
static_assert(offsetof(FMW_PLUGIN_PARAMS, textA) == 12 &&
              offsetof(FMW_PLUGIN_PARAMS, extensions) == 273);
static_assert(offsetof(FMW_PLUGIN_PARAMS, textB) == 534 &&
              offsetof(FMW_PLUGIN_PARAMS, flags1) == 795);
static_assert(offsetof(FMW_PLUGIN_PARAMS, flags2) == 799 &&
              offsetof(FMW_PLUGIN_PARAMS, instance) == 803);
static_assert(offsetof(FMW_PLUGIN_PARAMS, reserved2) == 807 + kWider);

static_assert(sizeof(FMW_HOST_SERVICES) == 64 + 8 * kWider);
static_assert(offsetof(FMW_HOST_SERVICES, zero) == 8 && offsetof(FMW_HOST_SERVICES, mark) == 12);
static_assert(offsetof(FMW_HOST_SERVICES, zero2) == 16 &&
              offsetof(FMW_HOST_SERVICES, loadPicture) == 28);
static_assert(offsetof(FMW_HOST_SERVICES, freePicture) == 32 + kWider);
static_assert(offsetof(FMW_HOST_SERVICES, progressBegin) == 36 + 2 * kWider);
static_assert(offsetof(FMW_HOST_SERVICES, progressStep) == 40 + 3 * kWider);
static_assert(offsetof(FMW_HOST_SERVICES, progressEnd) == 44 + 4 * kWider);
static_assert(offsetof(FMW_HOST_SERVICES, setStatus) == 48 + 5 * kWider);
static_assert(offsetof(FMW_HOST_SERVICES, configuration) == 52 + 6 * kWider);
static_assert(offsetof(FMW_HOST_SERVICES, configurationCount) == 56 + 7 * kWider);
static_assert(offsetof(FMW_HOST_SERVICES, comment) == 60 + 7 * kWider);

static_assert(sizeof(FMW_PICTURE_INFO) == 949);
static_assert(offsetof(FMW_PICTURE_INFO, width) == 12 && offsetof(FMW_PICTURE_INFO, height) == 16);
static_assert(offsetof(FMW_PICTURE_INFO, bitsPerPixel) == 24 &&
              offsetof(FMW_PICTURE_INFO, frame) == 32);
static_assert(offsetof(FMW_PICTURE_INFO, dpiX) == 40 && offsetof(FMW_PICTURE_INFO, dpiY) == 44);
static_assert(offsetof(FMW_PICTURE_INFO, imageBytes) == 48 &&
              offsetof(FMW_PICTURE_INFO, palette) == 52);
static_assert(offsetof(FMW_PICTURE_INFO, background) == 820 &&
              offsetof(FMW_PICTURE_INFO, typeName) == 884);

static_assert(sizeof(FMW_CONFIGURE) == 48);
static_assert(sizeof(FMW_CONFIG_ENTRY) == 20 + 3 * kWider);

}  // namespace
