#pragma once

#include <cstdio>

namespace fotomill::cli {

// The streams of a command and what is known about the terminal; tests pass files of their own.
struct Io {
  std::FILE* in = stdin;
  std::FILE* out = stdout;  // results only
  std::FILE* err = stderr;  // messages
  bool inTerminal = false;
  bool outTerminal = false;
  bool errTerminal = false;
  bool outStored = false;  // results go to a file and may be buffered for a moment

  // Whether questions may be asked.
  bool Interactive() const { return inTerminal && errTerminal; }
};

}  // namespace fotomill::cli
