#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

// Version and libraries of the program: for --version, "doctor" and the About box.
namespace fotomill {

enum class Linking : uint8_t {
  Inside,  // part of the program
  Shared,  // a system library, loaded with the program
  Loaded,  // a system library, loaded when needed
};

// A third-party library in this build.
struct Library {
  std::string name;
  std::string version;    // empty if unknown, or not installed
  const char* license;    // an SPDX expression; empty if not in the table
  const char* copyright;  // the holder, without the sign
  const char* purpose;    // in English
  Linking linking;
  bool present;  // false: would be loaded, but is not installed
};

// A library used by a front end only.
struct OwnLibrary {
  std::string_view name;  // as in the table
  std::string version;
  Linking linking;
};

// The libraries of this build, including a front end's `own` ones, in table order.
std::vector<Library> LibrariesOf(std::span<const OwnLibrary> own);

// A library's version as people read it; without one, whether the library is there.
std::string VersionText(const Library& library);
// Name, version, license, copyright and purpose of each library, in paragraphs of three lines.
std::string LicensesText(std::span<const Library> libraries);

// The program's name, version and build date, YYYY-MM-DD.
extern const char* const kProgramName;
extern const char* const kProgramVersion;
extern const char* const kBuildDate;
// The license, as one sentence in English.
extern const char* const kLicenseNote;

}  // namespace fotomill
