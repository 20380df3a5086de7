#include "support/peers.h"

#include <cstdlib>
#include <sstream>

#include "support/files.h"

namespace fotomill::test {

bool RunShell(const std::string& commandLine) {
  return std::system(("(" + commandLine + ") 2>/dev/null").c_str()) == 0;
}

bool HasProgram(const std::string& name) { return RunShell("command -v " + name + " >/dev/null"); }

PnmPicture ReadPnm(const std::string& path) {
  std::istringstream file(ReadText(path));
  std::string kind;
  PnmPicture picture;
  int most = 1;
  file >> kind >> picture.width >> picture.height;
  if (kind == "P5") file >> most;
  if ((kind != "P4" && kind != "P5") || most > 255 || !file) return {};
  file.get();
  for (int32_t y = 0; y < picture.height; ++y) {
    int bits = 0;
    for (int32_t x = 0; x < picture.width; ++x) {
      if (kind == "P5" || x % 8 == 0) bits = file.get();
      picture.values.push_back(static_cast<uint8_t>(kind == "P5" ? bits : bits >> (7 - x % 8) & 1));
    }
  }
  return file ? picture : PnmPicture{};
}

}  // namespace fotomill::test
