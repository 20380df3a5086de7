#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "core/status.h"
#include "picture/read_request.h"
#include "plugins/frame_file.h"
#include "plugins/loaded_module.h"

namespace fotomill {

// Calls into a module that is loaded into this process. The module may crash or never return; see
// module_apart.h for calls that survive that.

// Receives what a module reports during a call.
class ModuleListener {
 public:
  virtual ~ModuleListener() = default;
  virtual void Begin() = 0;
  virtual void Step(int32_t done, int32_t total) = 0;
  virtual void End() = 0;
  virtual void SetText(const char* text) = 0;
  // For pictures that the module loads meanwhile.
  virtual ReadOptions Options() const = 0;
};

// What a call needs besides the module. Not owned.
struct ModuleSurroundings {
  ModuleListener* listener = nullptr;  // may be null
  std::span<const FMW_CONFIG_ENTRY> configuration = {};
  // memory for the result of a read, which saves a copy; may be empty
  std::span<uint8_t> result = {};
};

// A file to describe or read.
struct ModuleQuestion {
  std::string fileName;
  int32_t page = 0;
  int32_t wantedSide = 0;  // above 0: the longer edge of a reduced picture, at least
  ModuleOptionValues options = {};
  std::string comment;  // the picture's, for the reader
};

// What a module knows about a file without decoding it.
struct ModuleDescription {
  FMW_PICTURE_INFO info = {};
  int32_t pages = 0;  // 0: as in `info`
  int32_t rounds = 0;
  uint32_t lost = 0;  // FMW_LOST_ bits
  std::vector<uint8_t> exif, xmp, icc, comment;
  std::vector<uint8_t> delays;  // an int32_t for each frame
};

// A picture to write. Not owned.
struct ModuleOutput {
  std::string fileName;
  int32_t quality = 0;
  bool lossless = false;
  int32_t dpiX = 0, dpiY = 0;
  ModuleOptionValues options = {};
  std::span<const uint8_t> bitmap;     // a packed bitmap
  const FrameFacts* frames = nullptr;  // instead of the bitmap, for an animation
  std::span<const uint8_t> exif, xmp, icc;
  const char* comment = nullptr;
};

// Each returns the module's error number as a status: any number, but not Ok if the call failed.
Status DescribeHere(const LoadedModule& module, const ModuleQuestion& question,
                    const ModuleSurroundings& surroundings, ModuleDescription& description);
// `handle` receives a packed bitmap to be freed with FreeModuleResult, which may be in the memory
// given for it.
Status ReadHere(const LoadedModule& module, const ModuleQuestion& question,
                const ModuleSurroundings& surroundings, void*& handle);
Status WriteHere(const LoadedModule& module, const ModuleOutput& output,
                 const ModuleSurroundings& surroundings);
Status TranscodeHere(const LoadedModule& module, const std::string& source,
                     const std::string& destination, const ModuleSurroundings& surroundings);
void FreeModuleResult(void* handle, const ModuleSurroundings& surroundings);

}  // namespace fotomill
