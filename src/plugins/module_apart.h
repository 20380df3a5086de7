#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "picture/packed_image.h"
#include "platform/work_apart.h"
#include "plugins/module_facts.h"
#include "plugins/module_work.h"

namespace fotomill {

// Calls into modules in worker processes. Each process loads the modules that it is asked for and
// keeps them. A module that crashes, takes too long or too much memory costs the call: DamagedFile
// (2), for a writer ErrorWritingFile (11). What it returns is checked like a file.

// Limits of one call. Changed only at start-up and by tests.
struct ModuleLimits {
  unsigned describeSeconds = 10;  // CPU time to read a header
  unsigned readSeconds = 60;      // to decode, plus a second for each `pixelsPerSecond`
  unsigned writeSeconds = 600;    // to encode
  uint64_t pixelsPerSecond = 1000000;
  unsigned patience = 3;                // wall-clock time, in multiples of the CPU time
  uint64_t memory = uint64_t{2} << 30;  // besides the picture
};
extern ModuleLimits moduleLimits;

// What a call needs besides the module. Not owned.
struct ApartSurroundings {
  ModuleListener* listener = nullptr;           // may be null
  std::span<const uint8_t> configuration = {};  // CarriedConfiguration
  StopToken stop = {};
};

// How asking a module about itself went.
enum class FactsResult {
  Known,
  Declined,  // it cannot be loaded, lacks a required export or declines
  Crashed,   // or never answered
  Unasked,   // out of system resources
};
// `error` receives the system's message for a module that it cannot load.
FactsResult AskFactsApart(const std::string& module, ModuleFacts& facts, std::string& error);

Status DescribeApart(const std::string& module, const ModuleQuestion& question,
                     const ApartSurroundings& surroundings, ModuleDescription& description);

// A bitmap that a module returned, in memory that the worker process may still write to.
struct ApartBitmap {
  platform::SharedBlock block;
  std::span<const uint8_t> bytes;
};
// `width` and `height` are those of the picture as described, which the bitmap may not exceed.
Status ReadApart(const std::string& module, const ModuleQuestion& question, int32_t width,
                 int32_t height, const ApartSurroundings& surroundings, ApartBitmap& bitmap);
// The bitmap of `output` is replaced by `image` and `alpha`, which may be empty, unless it has
// frames.
Status WriteApart(const std::string& module, const ModuleOutput& output, const PackedImage& image,
                  const PackedImage& alpha, const ApartSurroundings& surroundings);
Status TranscodeApart(const std::string& module, const std::string& source,
                      const std::string& destination, const ApartSurroundings& surroundings);

// The task in the worker process.
bool RunModuleTask(const platform::ApartCall& call);
inline constexpr platform::ApartTask kModuleTask = {"plug-in", RunModuleTask};

}  // namespace fotomill
