#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

// What the program is and what it is made of: for --version, "doctor" and the About box.
namespace fotomill {

enum class Linking : uint8_t {
  Inside,  // part of the program
  Shared,  // a library of the system, loaded with the program
  Loaded,  // a library of the system, loaded when it is needed
};

// A library of others in this build.
struct Library {
  std::string name;
  std::string version;    // empty if it does not tell, or is not installed
  const char* license;    // an SPDX expression; empty for a library that the table lacks
  const char* copyright;  // whose it is, without the sign
  const char* purpose;    // in English
  Linking linking;
  bool present;  // false: it would be loaded, but is not installed
};

// What a front end knows of a library that only it uses.
struct OwnLibrary {
  std::string_view name;  // as the table has it
  std::string version;
  Linking linking;
};

// The libraries of this build and the `own` ones of a front end, in the order of the table.
std::vector<Library> LibrariesOf(std::span<const OwnLibrary> own);

// The program's name and version, and the day it was built, YYYY-MM-DD.
extern const char* const kProgramName;
extern const char* const kProgramVersion;
extern const char* const kBuildDate;
// What may be done with it, as one sentence in English.
extern const char* const kLicenseNote;

}  // namespace fotomill
