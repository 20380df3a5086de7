#include "cli/frame/libraries.h"

#include <jconfig.h>
#include <lcms2.h>
#include <libdeflate.h>
#include <png.h>
#include <tiffio.h>
#include <webp/decode.h>
#include <zlib.h>

#include <CLI/Version.hpp>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

#include "formats/hdphoto/hdp.h"

namespace fotomill::cli {

namespace {

#define FOTOMILL_QUOTED(text) #text
#define FOTOMILL_QUOTED_VALUE(macro) FOTOMILL_QUOTED(macro)
#define FOTOMILL_VERSION_OF(major, minor, patch) FOTOMILL_QUOTED(major) "." FOTOMILL_QUOTED(minor) "." FOTOMILL_QUOTED(patch)

// "LIBTIFF, Version 4.5.0" and a copyright line.
std::string TiffVersion() {
  const std::string text = TIFFGetVersion();
  const size_t start = text.find_first_of("0123456789");
  return start == std::string::npos ? text : text.substr(start, text.find('\n', start) - start);
}

std::string WebpVersion() {
  const int version = WebPGetDecoderVersion();
  return std::to_string(version >> 16) + "." + std::to_string(version >> 8 & 255) + "." + std::to_string(version & 255);
}

// 2140 stands for 2.14.
std::string LcmsVersion() { return std::to_string(LCMS_VERSION / 1000) + "." + std::to_string(LCMS_VERSION % 1000 / 10); }

std::vector<Library> MakeLibraries() {
  return {
      {"CLI11", CLI11_VERSION, "the command line"},
      {"nlohmann-json",
       FOTOMILL_VERSION_OF(NLOHMANN_JSON_VERSION_MAJOR, NLOHMANN_JSON_VERSION_MINOR, NLOHMANN_JSON_VERSION_PATCH),
       "results as JSON"},
      {"libjpeg-turbo", FOTOMILL_QUOTED_VALUE(LIBJPEG_TURBO_VERSION), "JPEG"},
      {"libpng", PNG_LIBPNG_VER_STRING, "PNG"},
      {"zlib", zlibVersion(), "PNG"},
      {"libdeflate", LIBDEFLATE_VERSION_STRING, "PNG and TIFF"},
      {"libtiff", TiffVersion(), "TIFF"},
      {"libwebp", WebpVersion(), "WebP"},
      {"lcms2", LcmsVersion(), "color profiles, in the desktop program"},
      {"libjxr", HdpWorksHere() ? "present" : "missing", "HD Photo, loaded when needed"},
  };
}

}  // namespace

std::span<const Library> Libraries() {
  static const std::vector<Library> libraries = MakeLibraries();
  return libraries;
}

}  // namespace fotomill::cli
