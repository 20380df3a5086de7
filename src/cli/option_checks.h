#pragma once

#include <CLI/CLI.hpp>
#include <string>

namespace fotomill::cli {

// For options whose value names something: an empty one is a slip, mostly of a script whose variable is not set.
inline CLI::Validator NotEmpty() {
  return CLI::Validator([](const std::string& value) { return value.empty() ? "is empty" : std::string(); }, "");
}

}  // namespace fotomill::cli
