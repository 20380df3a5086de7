#pragma once

#include <string>

#include "core/status.h"

namespace fotomill {

// The user message of a status, in the user's language. Numbers outside the table come from
// plug-ins: "error 42 of the plug-in". Never empty.
std::string StatusText(Status status);
// As StatusText, in English, for machine-readable output.
std::string EnglishStatusText(Status status);

}  // namespace fotomill
