#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "platform/work_apart.h"

namespace fotomill {

// Camera raw files are decoded by LibRaw, loaded when first
// needed, if installed. It trusts its input, so it runs in a
// worker process: a crash on bad data is reported as DamagedFile.
bool HasRawLibrary();
std::string RawLibraryVersion();  // "missing" if not installed

// Properties of a file, after LibRaw has rotated it upright.
struct RawFacts {
  int32_t width = 0, height = 0;  // pixels
  char camera[64] = {};           // maker and model, as text
};

// FeatureDisabled (22) without LibRaw, UnsupportedFormat (8) for unsupported cameras, DamagedFile
// (2), MemoryAllocationError (6), FunctionCancelled (4).
Status DescribeRaw(std::span<const uint8_t> file, const StopToken& stop, RawFacts& facts);

// A decoded picture: rows of red, green, blue, top row first.
struct RawPixels {
  platform::SharedBlock block;
  bool damaged = false;  // parts of the data are damaged; the rest was decoded
  const uint8_t* Row(const RawFacts& facts, int32_t y) const;
};
// Decodes a file described by DescribeRaw to sRGB, with the camera's white balance.
// Statuses as above.
Status DevelopRaw(std::span<const uint8_t> file, const RawFacts& facts, const StopToken& stop,
                  RawPixels& pixels);

// The task for the worker process, a row of the program's task table.
bool RunRawTask(const platform::ApartCall& call);
inline constexpr platform::ApartTask kRawTask = {"raw-decode", RunRawTask};

}  // namespace fotomill
