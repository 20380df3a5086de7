#pragma once

#include <cstdio>

namespace fotomill::cli {

// Streams and terminal properties; tests use their own files.
struct Io {
  std::FILE* in = stdin;
  std::FILE* out = stdout;  // results only
  std::FILE* err = stderr;  // messages
  bool inTerminal = false;
  bool outTerminal = false;
  bool errTerminal = false;
  bool outStored = false;  // results go to a file; may be buffered briefly

  // Whether questions may be asked.
  bool Interactive() const { return inTerminal && errTerminal; }
};

}  // namespace fotomill::cli
