#pragma once

#include <string>

#include "batch/job.h"

namespace fotomill::cli {

// Takes the format that an extension names in full, or one of the other spellings that people use, into the job. Returns what
// is wrong with it, a whole sentence: there is none of that name, or it cannot be written. Empty when all is well.
std::string ReadDestinationFormat(const std::string& extension, BatchJob& job);

}  // namespace fotomill::cli
