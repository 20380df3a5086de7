#pragma once

#include <cstdint>
#include <functional>
#include <string>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "platform/existence.h"

namespace fotomill {

// Whether a path exists, so that a new file cannot use it.
using TakenTest = std::function<platform::Existence(const std::string& path)>;

// The result of the search for a numbered variant.
enum class VariantSearch {
  Found,
  AllTaken,  // all numbers of the range, or the range is empty
  GivenUp,   // after kMostVariants attempts
  Unknown,   // existence cannot be determined; the system error is kept
  Stopped,
};
// Most numbers tried.
inline constexpr int64_t kMostVariants = 100'000;

// Replaces `path` with the first free one of "NAME [first].EXT" to "NAME [last].EXT". `path` is
// unchanged unless Found. `stop` is polled before each attempt.
VariantSearch MakeNumberedVariant(std::string& path, int64_t first, int64_t last,
                                  const TakenTest& taken, const StopToken& stop = {});

// Whether a new file could not be written because another program created it after the name was
// found free. `status` is the writer's.
bool LostRace(Status status, const std::string& path);

// Calls `attempt`, which chooses a free name and writes a new file, until it returns true; false
// means it lost the race for the name. Gives up after a hundred times with false.
bool RetryLostRaces(const std::function<bool()>& attempt);

}  // namespace fotomill
