#include "registry/about.h"

#include <ft2build.h>
#include FT_FREETYPE_H

#include <algorithm>

#include "drawing/text_libraries.h"
#include "processing/faces/face_finder.h"
#include "registry/registry.h"
#include "texts/texts.h"

namespace fotomill {

const char* const kProgramName = "Fotomill Professional";
const char* const kProgramVersion = FOTOMILL_VERSION;
const char* const kBuildDate = FOTOMILL_BUILD_DATE;
const char* const kLicenseNote =
    TrLater("No license has been stated for this program yet: all rights are reserved.");

namespace {

#define FOTOMILL_QUOTED(text) #text
#define FOTOMILL_NUMBERS(major, minor, patch) \
  FOTOMILL_QUOTED(major) "." FOTOMILL_QUOTED(minor) "." FOTOMILL_QUOTED(patch)
constexpr char kFreeTypeVersion[] =
    FOTOMILL_NUMBERS(FREETYPE_MAJOR, FREETYPE_MINOR, FREETYPE_PATCH);

// Version information for a library that is loaded at run time, or that reports its
// version better itself.
struct Loaded {
  bool present = false;
  std::string version = {};
};

Loaded FindHarfBuzz() {
  const HarfBuzz* const library = LoadedHarfBuzz();
  if (library == nullptr) return {};
  const auto version =
      library->library.FunctionNamed<decltype(hb_version_string)>("hb_version_string");
  return {true, version != nullptr ? version() : ""};
}

Loaded FindFontconfig() {
  const Fontconfig* const library = LoadedFontconfig();
  if (library == nullptr) return {};
  const auto version = library->library.FunctionNamed<decltype(FcGetVersion)>("FcGetVersion");
  if (version == nullptr) return {true};
  const int number = version();
  return {true, std::to_string(number / 10000) + "." + std::to_string(number / 100 % 100) + "." +
                    std::to_string(number % 100)};
}

Loaded FindOpenCv() { return {CanFindFaces({})}; }

// Build-independent facts about a library. Licenses are SPDX expressions.
struct Row {
  const char* name;
  const char* linked;  // pkg-config names; null if not linked
  const char* license;
  const char* copyright;
  const char* purpose;            // null: the formats that use it
  Loaded (*loaded)() = nullptr;   // finds a library loaded at run time
  const char* version = nullptr;  // from its headers, if pkg-config uses another numbering
};

// clang-format off
constexpr Row kRows[] = {
    {"CLI11", nullptr, "BSD-3-Clause", "2017-2024 University of Cincinnati, developed by Henry Schreiner", TrLater("the command line")},
    {"nlohmann-json", nullptr, "MIT", "2013-2022 Niels Lohmann", TrLater("results as JSON")},
    {"wxWidgets", nullptr, "LGPL-2.0-or-later WITH WxWindows-exception-3.1", "1992-2022 the wxWidgets contributors", TrLater("windows")},
    {"GLib", nullptr, "LGPL-2.1-or-later", "the GLib contributors", TrLater("programs that open files")},
    {"libjpeg-turbo", "jpeg", "IJG AND BSD-3-Clause AND Zlib", "2009-2024 D. R. Commander; 1991-2020 Thomas G. Lane, Guido Vollbeding and others", nullptr},
    {"libpng", "png16", "libpng-2.0", "1995-2024 the PNG Reference Library Authors", nullptr},
    {"zlib", "z", "Zlib", "1995-2024 Jean-loup Gailly and Mark Adler", nullptr},
    {"libdeflate", "deflate", "MIT", "2016 Eric Biggers", nullptr},
    {"libtiff", "tiff", "libtiff", "1988-1997 Sam Leffler; 1991-1997 Silicon Graphics, Inc.", nullptr},
    {"Lerc", "Lerc", "Apache-2.0", "2015-2024 Esri", TrLater("compressions of TIFF")},
    {"JBIG-KIT", "jbig", "GPL-2.0-or-later", "1995-2014 Markus Kuhn", TrLater("compressions of TIFF")},
    {"Zstandard", "zstd", "BSD-3-Clause OR GPL-2.0-only", "Meta Platforms, Inc. and affiliates", TrLater("compressions of TIFF")},
    {"liblzma", "lzma", "0BSD OR LicenseRef-Public-Domain", "Lasse Collin and others", TrLater("compressions of TIFF")},
    {"libwebp", "webp sharpyuv", "BSD-3-Clause", "2010 Google Inc.", nullptr},
    {"libjxr", nullptr, "BSD-2-Clause", "Microsoft Corp.", nullptr},
    {"LibRaw", nullptr, "LGPL-2.1-only OR CDDL-1.0", "2008-2024 LibRaw LLC", nullptr},
    {"libavif", nullptr, "BSD-2-Clause", "2019 Joe Drago", TrLater("AVIF, in a plug-in")},
    {"libheif", nullptr, "LGPL-3.0-or-later", "2017-2023 Dirk Farin and others", TrLater("HEIC, in a plug-in")},
    {"libjxl", nullptr, "BSD-3-Clause", "the JPEG XL Project Authors", TrLater("JPEG XL, in a plug-in")},
    {"OpenJPEG", nullptr, "BSD-2-Clause", "2002-2014 Universite catholique de Louvain and others", TrLater("JPEG 2000, in a plug-in")},
    {"OpenEXR", nullptr, "BSD-3-Clause", "the contributors to the OpenEXR project", TrLater("OpenEXR, in a plug-in")},
    {"librsvg", nullptr, "LGPL-2.1-or-later", "the librsvg contributors", TrLater("SVG, in a plug-in")},
    {"libarchive", nullptr, "BSD-2-Clause", "2003-2018 Tim Kientzle", nullptr},
    {"lcms2", "lcms2", "MIT", "1998-2023 Marti Maria Saguer", TrLater("color profiles")},
    {"pugixml", "pugixml", "MIT", "2006-2023 Arseny Kapoulkine", TrLater("GPX tracks")},
    {"FreeType", "freetype", "FTL OR GPL-2.0-only", "1996-2024 David Turner, Robert Wilhelm and Werner Lemberg", TrLater("outlines of letters"), nullptr, kFreeTypeVersion},
    {"Brotli", "brotlidec brotlicommon", "MIT", "2009-2015 the Brotli Authors", TrLater("compressed fonts")},
    {"bzip2", "bz2", "bzip2-1.0.6", "1996-2019 Julian Seward", TrLater("compressed fonts")},
    {"FriBidi", "fribidi", "LGPL-2.1-or-later", "2001-2015 Behdad Esfahbod and others", TrLater("texts from right to left")},
    {"HarfBuzz", nullptr, "MIT-Modern-Variant", "2010-2024 Google, Inc., Behdad Esfahbod and others", TrLater("shaping text, loaded when needed"), FindHarfBuzz},
    {"fontconfig", nullptr, "HPND-sell-variant", "2001-2003 Keith Packard and others", TrLater("finding fonts, loaded when needed"), FindFontconfig},
    {"OpenCV", nullptr, "Apache-2.0", "2000-2024 the OpenCV contributors", TrLater("finding faces, loaded when needed"), FindOpenCv},
    {"libstdc++", nullptr, "GPL-3.0-or-later WITH GCC-exception-3.1", "Free Software Foundation, Inc.", TrLater("the C++ library")},
};
// clang-format on

// A library linked by the build, from FOTOMILL_LINKED_LIBRARIES, a blank-separated
// list of NAME=VERSION=inside|shared.
struct LinkedLibrary {
  std::string_view name, version;
  Linking linking;
};

std::vector<LinkedLibrary> LinkedLibraries() {
  std::vector<LinkedLibrary> libraries;
  std::string_view rest = FOTOMILL_LINKED_LIBRARIES;
  for (size_t end = rest.find(' '); end != std::string_view::npos; end = rest.find(' ')) {
    const std::string_view item = rest.substr(0, end);
    const size_t first = item.find('='), second = item.rfind('=');
    libraries.push_back({item.substr(0, first), item.substr(first + 1, second - first - 1),
                         item.substr(second + 1) == "inside" ? Linking::Inside : Linking::Shared});
    rest.remove_prefix(end + 1);
  }
  return libraries;
}

bool HasWord(std::string_view list, std::string_view word) {
  while (!list.empty()) {
    const std::string_view first = list.substr(0, list.find(' '));
    if (first == word) return true;
    list.remove_prefix(std::min(first.size() + 1, list.size()));
  }
  return false;
}

// Combines a row with what the build, the codecs and the front end know about the library; false if
// none of them does. Removes it from `linked`.
bool Complete(const Row& row, std::vector<LinkedLibrary>& linked,
              const std::vector<FormatLibrary>& ofFormats,
              const std::vector<PluginLibrary>& ofPlugins, std::span<const OwnLibrary> own,
              Library& library) {
  bool known = false;
  std::erase_if(linked, [&](const LinkedLibrary& one) {
    if (row.linked == nullptr || !HasWord(row.linked, one.name)) return false;
    if (!known) library.version = row.version != nullptr ? row.version : one.version;
    library.linking = one.linking;
    known = true;
    return true;
  });
  if (row.loaded != nullptr) {
    const Loaded loaded = row.loaded();
    library.version = loaded.version;
    library.present = loaded.present;
    known = true;
  }
  for (const FormatLibrary& codec : ofFormats) {
    if (library.name != codec.name) continue;
    const std::string version = codec.version();  // or a message of two words
    library.present = version != "missing";
    if (version != "missing" && version != "present") library.version = version;
    library.purpose = codec.purpose;
    known = true;
  }
  for (const PluginLibrary& one : ofPlugins) {
    if (known || library.name != one.name) continue;
    library.version = one.version;
    known = true;
  }
  for (const OwnLibrary& one : own) {
    if (library.name != one.name) continue;
    library.version = one.version;
    library.linking = one.linking;
    known = true;
  }
  return known;
}

}  // namespace

std::vector<Library> LibrariesOf(std::span<const OwnLibrary> own) {
  std::vector<LinkedLibrary> linked = LinkedLibraries();
  const std::vector<FormatLibrary> ofFormats = LibrariesOfFormats();
  const std::vector<PluginLibrary> ofPlugins = LibrariesOfPlugins();
  std::vector<Library> libraries;
  for (const Row& row : kRows) {
    Library library{row.name, {}, row.license, row.copyright, row.purpose, Linking::Loaded, true};
    if (Complete(row, linked, ofFormats, ofPlugins, own, library))
      libraries.push_back(std::move(library));
  }
  for (const LinkedLibrary& one : linked) {  // those without a row above
    libraries.push_back({std::string(one.name), std::string(one.version), "", "",
                         TrLater("unknown"), one.linking, true});
  }
  return libraries;
}

std::string VersionText(const Library& library) {
  if (!library.version.empty()) return library.version;
  return library.present ? "present" : "missing";
}

std::string LicensesText(std::span<const Library> libraries) {
  std::string text;
  for (const Library& library : libraries) {
    text += "\n" + library.name + " " + VersionText(library) + ": " + library.license + "\n";
    text += "  Copyright " + std::string(library.copyright) + "\n";
    text += "  " + std::string(Tr(library.purpose)) + "; " +
            Tr(library.linking == Linking::Inside ? TrLater("part of the program")
                                                  : TrLater("a library of the system")) +
            "\n";
  }
  return text;
}

}  // namespace fotomill
