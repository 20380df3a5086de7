#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "platform/work_apart.h"

namespace fotomill {

// The decoder of cameras' raw files is LibRaw, which is loaded with the first file that needs it
// and may not be there. It trusts what it reads, so it works apart: a fault in the data that brings
// it down is DamagedFile like any other.
bool HasRawLibrary();
std::string RawLibraryVersion();  // "missing" without it

// What the library says of a file, upright as it develops it.
struct RawFacts {
  int32_t width = 0, height = 0;  // pixels
  char camera[64] = {};           // maker and model, as text
};

// FeatureDisabled (22) without the library, UnsupportedFormat (8) for files of cameras that it does
// not know, DamagedFile (2), MemoryAllocationError (6), FunctionCancelled (4).
Status DescribeRaw(std::span<const uint8_t> file, const StopToken& stop, RawFacts& facts);

// A developed picture: rows from the top, red, green, blue.
struct RawPixels {
  platform::SharedBlock block;
  bool damaged = false;  // the data have faults; what they leave is there
  const uint8_t* Row(const RawFacts& facts, int32_t y) const;
};
// Develops a file that DescribeRaw knows, with the camera's own white balance, into sRGB. Statuses
// as above.
Status DevelopRaw(std::span<const uint8_t> file, const RawFacts& facts, const StopToken& stop,
                  RawPixels& pixels);

// The part of it that runs apart: a row of the program's table of such work.
bool RunRawTask(const platform::ApartCall& call);
inline constexpr platform::ApartTask kRawTask = {"raw-decode", RunRawTask};

}  // namespace fotomill
