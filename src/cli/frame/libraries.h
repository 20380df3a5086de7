#pragma once

#include <span>

#include "registry/about.h"

namespace fotomill::cli {

// The libraries of the command line program, for the version page and "doctor".
std::span<const Library> Libraries();

// A library's version as people read it; without one, whether the library is there.
std::string VersionText(const Library& library);

}  // namespace fotomill::cli
