#pragma once

#include <string>

namespace fotomill::cli {

// Options of --version.
struct VersionOptions {
  bool json = false;      // print everything as a JSON object
  bool licenses = false;  // add licenses and copyright holders
};

// Name and version of the program and of each library, one per line or as the options say.
std::string VersionPage(const VersionOptions& options);

}  // namespace fotomill::cli
