#pragma once

#include <span>

namespace fotomill::cli {

// A library that the program is built with.
struct Library {
  const char* name;
  const char* version;
  const char* purpose;
};

// All of them, for the version page and the check-up.
std::span<const Library> Libraries();

}  // namespace fotomill::cli
