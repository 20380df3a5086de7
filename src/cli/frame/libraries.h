#pragma once

#include <span>

#include "registry/about.h"

namespace fotomill::cli {

// The libraries of the command line program, for the version page and "doctor".
std::span<const Library> Libraries();

}  // namespace fotomill::cli
