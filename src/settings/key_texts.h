#pragma once

#include <string>
#include <string_view>

namespace fotomill {

// A key's current value, in configuration file syntax; empty for unknown keys. Source of the
// default parameters of operations.
std::string KeyTextInForce(std::string_view key);

}  // namespace fotomill
