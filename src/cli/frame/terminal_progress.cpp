#include "cli/frame/terminal_progress.h"

#include <algorithm>
#include <cmath>

#include "platform/clock.h"
#include "platform/process.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

constexpr double kFirstShown = 0.5, kRedrawn = 0.1;  // seconds
constexpr int kLongestBar = 30, kShortestBar = 5;

// "4:05", "1:02:09".
std::string DurationText(double seconds) {
  const auto whole = static_cast<int64_t>(std::ceil(std::min(seconds, 360000.0)));
  char text[48];
  if (whole >= 3600) {
    std::snprintf(text, sizeof text, "%d:%02d:%02d", static_cast<int>(whole / 3600),
                  static_cast<int>(whole / 60 % 60), static_cast<int>(whole % 60));
  } else {
    std::snprintf(text, sizeof text, "%d:%02d", static_cast<int>(whole / 60),
                  static_cast<int>(whole % 60));
  }
  return text;
}

}  // namespace

std::string ProgressText(uint64_t done, uint64_t total, double seconds, int width) {
  std::string text = Tr("%1 of %2", done, total);
  if (done > 0 && seconds > 0) {
    const double rate = static_cast<double>(done) / seconds;
    char number[32];
    std::snprintf(number, sizeof number, rate < 10 ? ", %.1f/s" : ", %.0f/s", rate);
    text += number;
    if (done < total)
      text += ", " + Tr("%1 left", DurationText(static_cast<double>(total - done) / rate));
  }
  const int room = std::min(width - static_cast<int>(text.size()) - 3, kLongestBar);
  if (room < kShortestBar) return text.substr(0, static_cast<size_t>(std::max(width, 0)));
  const auto full =
      static_cast<size_t>(total == 0 ? 0 : done * static_cast<uint64_t>(room) / total);
  return "[" + std::string(full, '#') + std::string(static_cast<size_t>(room) - full, '.') + "] " +
         text;
}

void TerminalProgress::Begin(uint64_t total) {
  total_ = total;
  begun_ = platform::MonotonicSeconds();
}

void TerminalProgress::Done(uint64_t done) {
  done_ = done;
  Tick();
}

void TerminalProgress::Tick() {
  if (!shown_ || total_ < 2) return;
  const double now = platform::MonotonicSeconds();
  if (now - begun_ < kFirstShown || (!hidden_ && now - drawn_ < kRedrawn)) return;
  const std::string line =
      "\r" + ProgressText(done_, total_, now - begun_, platform::TerminalWidth() - 1) + "\x1b[K";
  std::fwrite(line.data(), 1, line.size(), terminal_);
  std::fflush(terminal_);
  drawn_ = now;
  visible_ = true;
  hidden_ = false;
}

void TerminalProgress::Clear() {
  if (!visible_) return;
  std::fputs("\r\x1b[K", terminal_);
  std::fflush(terminal_);
  visible_ = false;
  hidden_ = true;
}

}  // namespace fotomill::cli
