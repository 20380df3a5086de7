#pragma once

#include <string>

#include "core/status.h"

namespace fotomill {

// A file of the selection.
struct BatchFile {
  std::string name;
  // subfolder relative to the given folder, "" or "a/b": to recreate the tree
  std::string below;
  // a known error; the file is reported but not opened
  Status status = Status::Ok;
  std::string hint;  // printed after that error message
};

}  // namespace fotomill
