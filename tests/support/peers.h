#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill::test {

// Whether a program of others is installed.
bool HasProgram(const std::string& name);
// Runs a command line of the shell. True when it ends with exit status 0.
bool RunShell(const std::string& commandLine);

// A picture as netpbm's programs write it (raw PBM or PGM): one value a pixel, from the top; 1 is
// black in a PBM.
struct PnmPicture {
  int32_t width = 0, height = 0;
  std::vector<uint8_t> values;
  bool operator==(const PnmPicture&) const = default;
};
// An empty picture when the file is none of them.
PnmPicture ReadPnm(const std::string& path);

}  // namespace fotomill::test
