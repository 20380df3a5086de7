#pragma once

#include <cstdint>
#include <functional>
#include <string>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "platform/existence.h"

namespace fotomill {

// Whether a path is taken, so that a new file cannot have it.
using TakenTest = std::function<platform::Existence(const std::string& path)>;

// The result of the search for a numbered variant.
enum class VariantSearch {
  Found,
  AllTaken,  // every number of the range, or the range is empty
  GivenUp,   // kMostVariants are taken
  Unknown,   // the system cannot tell; it keeps the reason
  Stopped,
};
// So many numbers are tried.
inline constexpr int64_t kMostVariants = 100'000;

// Replaces `path` by the first of "NAME [first].EXT" to "NAME [last].EXT" that is not taken. `path`
// is unchanged unless Found. `stop` is checked before each try.
VariantSearch MakeNumberedVariant(std::string& path, int64_t first, int64_t last,
                                  const TakenTest& taken, const StopToken& stop = {});

// Whether a new file could not be written because another program took its name after it was found
// free. `status` is the writer's.
bool LostRace(Status status, const std::string& path);

// Calls `attempt`, which chooses a free name and writes a new file, again as long as it returns
// false: it lost the race for the name. False when it has lost a hundred times.
bool RetryLostRaces(const std::function<bool()>& attempt);

}  // namespace fotomill
