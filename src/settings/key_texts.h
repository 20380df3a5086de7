#pragma once

#include <string>
#include <string_view>

namespace fotomill {

// The value of a key in force, as the configuration file holds it; empty for a key that does not
// exist. What operations take the defaults of their parameters from.
std::string KeyTextInForce(std::string_view key);

}  // namespace fotomill
