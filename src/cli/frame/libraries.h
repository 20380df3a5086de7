#pragma once

#include <span>
#include <string>

namespace fotomill::cli {

// A library that the program is built with, or that it loads.
struct Library {
  const char* name;
  std::string version;
  const char* purpose;
};

// All of them, for the version page and the check-up.
std::span<const Library> Libraries();

}  // namespace fotomill::cli
