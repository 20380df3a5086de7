#include "cli/libraries.h"

#include <CLI/Version.hpp>
#include <nlohmann/json.hpp>

namespace fotomill::cli {

namespace {

#define FOTOMILL_QUOTED(text) #text
#define FOTOMILL_VERSION_OF(major, minor, patch) \
  FOTOMILL_QUOTED(major) "." FOTOMILL_QUOTED(minor) "." FOTOMILL_QUOTED(patch)

constexpr Library kLibraries[] = {
    {"CLI11", CLI11_VERSION, "the command line"},
    {"nlohmann-json",
     FOTOMILL_VERSION_OF(NLOHMANN_JSON_VERSION_MAJOR, NLOHMANN_JSON_VERSION_MINOR, NLOHMANN_JSON_VERSION_PATCH),
     "results as JSON"},
};

}  // namespace

std::span<const Library> Libraries() {
  return kLibraries;
}

}  // namespace fotomill::cli
