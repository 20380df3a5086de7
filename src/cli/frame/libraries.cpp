#include "cli/frame/libraries.h"

#include <lcms2.h>

#include <CLI/Version.hpp>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

#include "registry/registry.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

#define FOTOMILL_QUOTED(text) #text
#define FOTOMILL_QUOTED_NUMBERS(major, minor, patch) \
  FOTOMILL_QUOTED(major) "." FOTOMILL_QUOTED(minor) "." FOTOMILL_QUOTED(patch)
#define FOTOMILL_VERSION_OF(major, minor, patch) FOTOMILL_QUOTED_NUMBERS(major, minor, patch)

// 2140 stands for 2.14.
std::string LcmsVersion() {
  return std::to_string(LCMS_VERSION / 1000) + "." + std::to_string(LCMS_VERSION % 1000 / 10);
}

std::vector<Library> MakeLibraries() {
  std::vector<Library> libraries = {
      {"CLI11", CLI11_VERSION, TrLater("the command line")},
      {"nlohmann-json",
       FOTOMILL_VERSION_OF(NLOHMANN_JSON_VERSION_MAJOR, NLOHMANN_JSON_VERSION_MINOR, NLOHMANN_JSON_VERSION_PATCH),
       TrLater("results as JSON")},
  };
  for (const FormatLibrary& library : LibrariesOfFormats())
    libraries.push_back({library.name, library.version(), library.purpose});
  libraries.push_back({"lcms2", LcmsVersion(), TrLater("color profiles, in the desktop program")});
  return libraries;
}

}  // namespace

std::span<const Library> Libraries() {
  static const std::vector<Library> libraries = MakeLibraries();
  return libraries;
}

}  // namespace fotomill::cli
