#pragma once

#include <cstdio>

namespace fotomill::cli {

// Where a command prints and what it may assume about the terminal; tests hand in files of their own.
struct Io {
  std::FILE* out = stdout;       // results only
  std::FILE* err = stderr;       // messages
  bool interactive = false;      // questions may be asked: standard input and standard error are terminals
};

}  // namespace fotomill::cli
