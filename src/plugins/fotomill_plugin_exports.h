/*
 * The exports of a module, made from plain functions that return 0 or an error number. Optional, as
 * is fotomill_plugin_kit.h, on which it builds; for C and C++. A module writes, once:
 *
 *   static const FmwModule module = {"QOI", "qoi", "Quite OK Image", 24, FMW_FORMAT_BITMAP, 0, 0};
 *   FMW_MODULE(module)
 *   FMW_MODULE_READS(Describe, Read)
 *
 * and, as far as it has them, FMW_MODULE_METADATA, FMW_MODULE_WRITES, FMW_MODULE_WRITES_FRAMES and
 * FMW_MODULE_LIBRARIES.
 */
#ifndef FOTOMILL_PLUGIN_EXPORTS_H
#define FOTOMILL_PLUGIN_EXPORTS_H

#include "fotomill_plugin_kit.h"

#ifdef __cplusplus
#define FMW_EXPORT_C extern "C" FMW_EXPORT
#else
#define FMW_EXPORT_C FMW_EXPORT
#endif

/* What a module says about itself; see FMW_PLUGIN_PARAMS. */
typedef struct FmwModule {
  const char* name;
  const char* extensions;
  const char* description;
  uint32_t bits;             /* flags1: bits per pixel for the writer, 0 if there is none */
  uint32_t flags;            /* flags2 */
  const FMW_OPTION* options; /* 0 if there are none */
  int32_t optionCount;
} FmwModule;

static inline int32_t FmwFillParams(const FmwModule* module, FMW_PLUGIN_PARAMS* params) {
  if (params->version < FMW_PLUGIN_VERSION) return 0;
  snprintf(params->textA, sizeof params->textA, "%s", module->name);
  snprintf(params->extensions, sizeof params->extensions, "%s", module->extensions);
  snprintf(params->textB, sizeof params->textB, "%s", module->description);
  params->flags1 = module->bits;
  params->flags2 = module->flags;
  return 1;
}

static inline void FmwStandardOptions(const FmwModule* module, int32_t* options) {
  for (int32_t i = 0; i < module->optionCount; ++i) options[i] = module->options[i].standard;
}

/* What an older program asks for: the first picture in its full size, with standard options. Its
 * version is FMW_PLUGIN_VERSION, and it brings no memory. */
static inline FMW_READ_REQUEST FmwOldReadRequest(const FmwModule* module) {
  FMW_READ_REQUEST request;
  memset(&request, 0, sizeof request);
  request.size = sizeof request;
  request.version = FMW_PLUGIN_VERSION;
  FmwStandardOptions(module, request.options);
  return request;
}

static inline FMW_WRITE_REQUEST FmwOldWriteRequest(const FmwModule* module, const char* comment) {
  FMW_WRITE_REQUEST request;
  memset(&request, 0, sizeof request);
  request.size = sizeof request;
  request.version = FMW_PLUGIN_VERSION;
  request.comment = comment;
  FmwStandardOptions(module, request.options);
  return request;
}

/* The gray color table that FmwNewBitmap gives bitmaps of 8 bits. */
static inline void FmwGrayPalette(FMW_PICTURE_INFO* info) {
  for (int i = 0; i < 768; ++i) info->palette[i] = (uint8_t)(i / 3);
}

/* `module` is an FmwModule. */
#define FMW_MODULE(module)                                                                         \
  FMW_EXPORT_C const char* FMW_CALL PLUGIN11GetVersion(void) { return "1.0"; }                     \
  FMW_EXPORT_C int32_t FMW_CALL PLUGIN11GetPluginParams(FMW_PLUGIN_PARAMS* params, int32_t zero) { \
    (void)zero;                                                                                    \
    return FmwFillParams(&module, params);                                                         \
  }                                                                                                \
  FMW_EXPORT_C const FMW_OPTION* FMW_CALL PLUGIN12GetOptions(int32_t* count) {                     \
    *count = module.optionCount;                                                                   \
    return module.options;                                                                         \
  }                                                                                                \
  static inline const FmwModule* FmwThisModule(void) { return &module; }

/* int32_t describe(const char* fileName, FMW_PICTURE_INFO* info)
 * int32_t read(const char* fileName, const FMW_READ_REQUEST* request, FmwBitmap* bitmap)
 * The bitmap is made by FmwNewBitmap with the request. */
#define FMW_MODULE_READS(describe, read)                                                      \
  FMW_EXPORT_C int32_t FMW_CALL PLUGIN11GetInfo(FMW_PICTURE_INFO* info, const char* fileName, \
                                                int32_t* error,                               \
                                                const FMW_HOST_SERVICES* services) {          \
    (void)services;                                                                           \
    *error = describe(fileName, info);                                                        \
    return *error == 0;                                                                       \
  }                                                                                           \
  FMW_EXPORT_C FMW_HANDLE FMW_CALL PLUGIN12ReadImage(                                         \
      const char* fileName, const FMW_READ_REQUEST* request, int32_t* error,                  \
      const FMW_HOST_SERVICES* services) {                                                    \
    FmwBitmap bitmap = {0, 0, 0, 0, 0, 0};                                                    \
    (void)services;                                                                           \
    *error = read(fileName, request, &bitmap);                                                \
    if (*error != 0) FmwFreeBitmap(&bitmap, request);                                         \
    return bitmap.block;                                                                      \
  }                                                                                           \
  FMW_EXPORT_C FMW_HANDLE FMW_CALL PLUGIN11ReadImage(const char* fileName, int32_t* error,    \
                                                     const FMW_HOST_SERVICES* services) {     \
    const FMW_READ_REQUEST request = FmwOldReadRequest(FmwThisModule());                      \
    return PLUGIN12ReadImage(fileName, &request, error, services);                            \
  }

/* int32_t metadata(const char* fileName, const FMW_READ_REQUEST* request, FMW_METADATA* metadata)
 */
#define FMW_MODULE_METADATA(describe)                                                \
  FMW_EXPORT_C int32_t FMW_CALL PLUGIN12GetMetadata(                                 \
      FMW_METADATA* metadata, const char* fileName, const FMW_READ_REQUEST* request, \
      int32_t* error, const FMW_HOST_SERVICES* services) {                           \
    (void)services;                                                                  \
    *error = describe(fileName, request, metadata);                                  \
    return *error == 0;                                                              \
  }

/* int32_t write(const char* fileName, const FmwBitmap* given, const FMW_WRITE_REQUEST* request) */
#define FMW_MODULE_WRITES(write)                                                                 \
  FMW_EXPORT_C int32_t FMW_CALL PLUGIN12WriteImage(                                              \
      const char* fileName, FMW_HANDLE bitmap, const FMW_WRITE_REQUEST* request, int32_t* error, \
      const FMW_HOST_SERVICES* services) {                                                       \
    const FmwBitmap given = FmwGivenBitmap(bitmap);                                              \
    (void)services;                                                                              \
    *error = write(fileName, &given, request);                                                   \
    return *error == 0;                                                                          \
  }                                                                                              \
  FMW_EXPORT_C int32_t FMW_CALL PLUGIN11WriteImage(const char* fileName, FMW_HANDLE bitmap,      \
                                                   const char* comment, int32_t* error,          \
                                                   const FMW_HOST_SERVICES* services) {          \
    const FMW_WRITE_REQUEST request = FmwOldWriteRequest(FmwThisModule(), comment);              \
    return PLUGIN12WriteImage(fileName, bitmap, &request, error, services);                      \
  }

/* int32_t write(const char* fileName, const FMW_FRAMES* frames, const FMW_WRITE_REQUEST* request)
 */
#define FMW_MODULE_WRITES_FRAMES(write)                                                 \
  FMW_EXPORT_C int32_t FMW_CALL PLUGIN12WriteAnimation(                                 \
      const char* fileName, const FMW_FRAMES* frames, const FMW_WRITE_REQUEST* request, \
      int32_t* error, const FMW_HOST_SERVICES* services) {                              \
    (void)services;                                                                     \
    *error = write(fileName, frames, request);                                          \
    return *error == 0;                                                                 \
  }

/* The libraries of FMW_GET_LIBRARIES, as arguments of printf. */
#define FMW_MODULE_LIBRARIES(...)                                \
  FMW_EXPORT_C const char* FMW_CALL PLUGIN12GetLibraries(void) { \
    static char text[256];                                       \
    snprintf(text, sizeof text, __VA_ARGS__);                    \
    return text;                                                 \
  }

#endif
