#pragma once

#include <cstdio>

namespace fotomill::cli {

// Where a command reads and prints and what it may assume about the terminal; tests hand in files of their own.
struct Io {
  std::FILE* in = stdin;
  std::FILE* out = stdout;  // results only
  std::FILE* err = stderr;  // messages
  bool inTerminal = false;
  bool outTerminal = false;
  bool errTerminal = false;
  bool outStored = false;  // results go to a file: they may be kept for a moment and written together

  // Questions may be asked: someone sees them and can answer.
  bool Interactive() const { return inTerminal && errTerminal; }
};

}  // namespace fotomill::cli
