#include "cli/frame/libraries.h"

#include <CLI/Version.hpp>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

namespace fotomill::cli {

namespace {

#define FOTOMILL_QUOTED(text) #text
#define FOTOMILL_QUOTED_NUMBERS(major, minor, patch) \
  FOTOMILL_QUOTED(major) "." FOTOMILL_QUOTED(minor) "." FOTOMILL_QUOTED(patch)
#define FOTOMILL_VERSION_OF(major, minor, patch) FOTOMILL_QUOTED_NUMBERS(major, minor, patch)

#ifdef FOTOMILL_STATIC_RUNTIME
constexpr Linking kRuntime = Linking::Inside;
#else
constexpr Linking kRuntime = Linking::Shared;
#endif

std::vector<Library> MakeLibraries() {
  const OwnLibrary own[] = {
      {"CLI11", CLI11_VERSION, Linking::Inside},
      {"nlohmann-json",
       FOTOMILL_VERSION_OF(NLOHMANN_JSON_VERSION_MAJOR, NLOHMANN_JSON_VERSION_MINOR,
                           NLOHMANN_JSON_VERSION_PATCH),
       Linking::Inside},
      {"libstdc++", FOTOMILL_VERSION_OF(__GNUC__, __GNUC_MINOR__, __GNUC_PATCHLEVEL__), kRuntime},
  };
  return LibrariesOf(own);
}

}  // namespace

std::span<const Library> Libraries() {
  static const std::vector<Library> libraries = MakeLibraries();
  return libraries;
}

}  // namespace fotomill::cli
