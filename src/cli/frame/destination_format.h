#pragma once

#include <string>

#include "batch/job.h"

namespace fotomill::cli {

// Puts the format with this extension, or a common other spelling of it, into the job. Returns what
// is wrong, a whole sentence: the format is unknown or cannot be written. Empty if nothing is.
std::string ReadDestinationFormat(const std::string& extension, BatchJob& job);

// Finds the extension of the format that --from names, in lower case. Returns what is wrong, a
// whole sentence: the format is unknown or cannot be read. Empty if nothing is.
std::string ReadSourceFormat(const std::string& name, std::string& extension);

}  // namespace fotomill::cli
