#pragma once

#include <string>

#include "core/status.h"

namespace fotomill {

// Why pages could not be drawn or written to a file: what is missing, or what the system says.
// Translated; may be empty.
std::string PageFailureHint(Status status, const std::string& path);

}  // namespace fotomill
