#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill::test {

// Whether an external program is installed.
bool HasProgram(const std::string& name);
// Runs a shell command. True if its exit status is 0.
bool RunShell(const std::string& commandLine);

// A picture written by netpbm (raw PBM or PGM): one value per pixel, top row first; in a PBM
// 1 is black.
struct PnmPicture {
  int32_t width = 0, height = 0;
  std::vector<uint8_t> values;
  bool operator==(const PnmPicture&) const = default;
};
// An empty picture if it is neither.
PnmPicture ReadPnm(const std::string& path);

}  // namespace fotomill::test
