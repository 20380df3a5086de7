#pragma once

#include <cstdint>

#include "core/status.h"
#include "plugins/fotomill_plugin.h"
#include "plugins/module_facts.h"

namespace fotomill {

// What is sent between the program and a worker process that runs modules. Both are the same
// program, so these are plain structures.

enum class ModuleOperation : int32_t { Facts, Describe, Read, Write, Transcode };

// The request, followed by the module's path, the file's path and a second path: to transcode, the
// destination, to write an animation, the file with its frames.
// The input is the configuration table, to read followed by the picture's comment.
struct ModuleOrder {
  ModuleOperation operation = ModuleOperation::Facts;
  int32_t page = 0, wantedSide = 0;
  int32_t quality = 0, lossless = 0, dpiX = 0, dpiY = 0;
  ModuleOptionValues options = {};
  uint32_t moduleSize = 0, fileSize = 0, destinationSize = 0;  // bytes of the paths
  uint64_t commentSize = 0;                                    // to read: in the input
  // To write: in the reply block, in this order, behind kModuleAnswerBytes.
  uint64_t bitmap = 0, exif = 0, xmp = 0, icc = 0, comment = 0, delays = 0;
  // To write an animation.
  int32_t width = 0, height = 0, rounds = 0, transparent = 0;
};

// The start of the reply; results are behind kModuleAnswerBytes, one after the other in this order.
struct ModuleAnswer {
  Status status = Status::DamagedFile;
  int32_t loaded = 0;  // 0: the module could not be used, and the text says why
  FMW_PICTURE_INFO info = {};
  int32_t pages = 0, rounds = 0;
  uint32_t lost = 0;
  uint64_t exif = 0, xmp = 0, icc = 0, comment = 0, delays = 0;  // bytes
  uint64_t bitmap = 0;                                           // or facts
  char text[256] = {};  // the status text, or why the module was not loaded
};
inline constexpr size_t kModuleAnswerBytes = 2048;
static_assert(sizeof(ModuleAnswer) <= kModuleAnswerBytes);
// Within the reply: where the status text of a running call is.
inline constexpr size_t kModuleTextPlace = kModuleAnswerBytes - 256;
static_assert(sizeof(ModuleAnswer) <= kModuleTextPlace);
inline constexpr size_t kModuleTextSize = 256;

// Numbers sent meanwhile: a step's `done` and then its `total`, or one of these.
enum ModuleSignal : int32_t { kModuleBegins = -1, kModuleEnds = -2, kModuleSaysText = -3 };

}  // namespace fotomill
