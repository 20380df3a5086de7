#pragma once

#include <string>

#include "core/status.h"

namespace fotomill {

// The user message of a status, in the user's language. A number outside the table comes from a
// plug-in: "error 42 of the plug-in". Never empty.
std::string StatusText(Status status);
// The same in English, for what programs read.
std::string EnglishStatusText(Status status);

}  // namespace fotomill
