#pragma once

#include <cstdint>
#include <string>

#include "core/workers/stop_token.h"

namespace fotomill {

// Keeps a thumbnail database from growing with pictures that have vanished: compacts it if its last
// check was `days` ago or more and at least a quarter of its records are deleted or of missing
// pictures (see PurgesMissing). False if it was not checked; it is unchanged then. The time of the
// check is kept with those of LastOrphanRemoval. May take long. With `hidden`, the new file is
// hidden.
bool PurgeDatabaseWhenDue(const std::string& path, int32_t days, bool hidden,
                          const StopToken& stop);

}  // namespace fotomill
