#pragma once

#include <cstdint>
#include <cstdio>
#include <string>

namespace fotomill::cli {

// The progress line at the bottom of a terminal: a bar, the count, the rate and the time left. It
// appears after half a second and is redrawn ten times a second.
class TerminalProgress {
 public:
  // `shown` false: nothing is ever drawn.
  TerminalProgress(std::FILE* terminal, bool shown) : terminal_(terminal), shown_(shown) {}
  TerminalProgress(const TerminalProgress&) = delete;
  TerminalProgress& operator=(const TerminalProgress&) = delete;
  ~TerminalProgress() { Clear(); }

  // Starts at 0 of `total`, and counts on to `done` of them; Tick draws it.
  void Begin(uint64_t total);
  void Done(uint64_t done);  // how much of the total is done; Tick draws it
  // Draws the line if it is time.
  void Tick();
  // Clears the line, before anything else is printed.
  void Clear();

 private:
  std::FILE* terminal_;
  const bool shown_;
  uint64_t done_ = 0, total_ = 0;
  double begun_ = 0, drawn_ = 0;  // seconds of the clock
  bool visible_ = false;
  bool hidden_ = false;  // it was visible before the last Clear
};

// The line for `done` of `total` after `seconds`, at most `width` columns.
std::string ProgressText(uint64_t done, uint64_t total, double seconds, int width);

}  // namespace fotomill::cli
