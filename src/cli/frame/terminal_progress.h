#pragma once

#include <cstdint>
#include <cstdio>
#include <string>

namespace fotomill::cli {

// The progress line at the bottom of the terminal: bar, count, rate and remaining time. Appears
// after half a second, redrawn ten times a second.
class TerminalProgress {
 public:
  // `shown` false: never draw.
  TerminalProgress(std::FILE* terminal, bool shown) : terminal_(terminal), shown_(shown) {}
  TerminalProgress(const TerminalProgress&) = delete;
  TerminalProgress& operator=(const TerminalProgress&) = delete;
  ~TerminalProgress() { Clear(); }

  // Starts at 0 of `total`.
  void Begin(uint64_t total);
  void Done(uint64_t done);  // amount done so far; drawn by Tick
  // Draws the line if due.
  void Tick();
  // Clears the line; call before printing anything else.
  void Clear();

 private:
  std::FILE* terminal_;
  const bool shown_;
  uint64_t done_ = 0, total_ = 0;
  double begun_ = 0, drawn_ = 0;  // clock, in seconds
  bool visible_ = false;
  bool hidden_ = false;  // was visible before the last Clear
};

// The text for `done` of `total` after `seconds`, at most `width` columns.
std::string ProgressText(uint64_t done, uint64_t total, double seconds, int width);

}  // namespace fotomill::cli
