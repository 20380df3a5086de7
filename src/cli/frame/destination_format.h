#pragma once

#include <string>

#include "batch/job.h"

namespace fotomill::cli {

// Puts the format with this extension, or a common other spelling of it, into the job. Returns what
// is wrong, a whole sentence: the format is unknown or cannot be written. Empty if nothing is.
std::string ReadDestinationFormat(const std::string& extension, BatchJob& job);

}  // namespace fotomill::cli
