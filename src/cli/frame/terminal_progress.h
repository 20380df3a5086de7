#pragma once

#include <cstdint>
#include <cstdio>
#include <string>

namespace fotomill::cli {

// A line at the bottom of a terminal that tells how far a command is: a bar, the count, the rate and the time left. It shows
// up once the command has taken a moment, and is redrawn a few times a second.
class TerminalProgress {
 public:
  // `shown` false: nothing is ever drawn.
  TerminalProgress(std::FILE* terminal, bool shown) : terminal_(terminal), shown_(shown) {}
  TerminalProgress(const TerminalProgress&) = delete;
  TerminalProgress& operator=(const TerminalProgress&) = delete;
  ~TerminalProgress() { Clear(); }

  // Starts at 0 of `total`, and counts on to `done` of them; Tick draws it.
  void Begin(uint64_t total);
  void Done(uint64_t done);
  // Draws the line when it is time to.
  void Tick();
  // Takes the line away: before anything else goes to the terminal.
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
