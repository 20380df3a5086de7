#pragma once

#include <string>

#include "batch/job.h"

namespace fotomill::cli {

// Sets the job's format from an extension or a common alternative spelling. Returns an error
// message, a sentence: the format is unknown or cannot be written. Empty on success.
std::string ReadDestinationFormat(const std::string& extension, BatchJob& job);

// Finds the lowercase extension of the format given by --from. Returns an error message, a
// sentence: the format is unknown or cannot be read. Empty on success.
std::string ReadSourceFormat(const std::string& name, std::string& extension);

}  // namespace fotomill::cli
