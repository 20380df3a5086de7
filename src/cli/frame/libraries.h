#pragma once

#include <span>
#include <string>

namespace fotomill::cli {

// A library that the program is linked with or loads.
struct Library {
  const char* name;
  std::string version;
  const char* purpose;  // in English
};

// All of them, for the version page and "doctor".
std::span<const Library> Libraries();

}  // namespace fotomill::cli
