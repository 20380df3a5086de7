#pragma once

#include <string>
#include <string_view>

#include "core/shown_text.h"

namespace fotomill::cli {

// The standard alphabet with padding (RFC 4648, section 4).
std::string Base64(std::string_view bytes);

}  // namespace fotomill::cli
