#pragma once

#include <string>

namespace fotomill::cli {

// How --version prints what the program is and what it is made of.
struct VersionOptions {
  bool json = false;      // one JSON object with everything
  bool licenses = false;  // with licenses and whose the libraries are
};

// Name and version of the program, then of each library, one per line or as the options say.
std::string VersionPage(const VersionOptions& options);

}  // namespace fotomill::cli
