#include "desktop/models/shell/event_log.h"

#include <cstdio>
#include <cstdlib>
#include <memory>
#include <string>

#include "core/shown_text.h"
#include "platform/clock.h"

namespace fotomill::desktop {

namespace {

struct CloseFile {
  void operator()(std::FILE* file) const { std::fclose(file); }
};
std::unique_ptr<std::FILE, CloseFile> logFile;
double startSeconds = 0;

}  // namespace

void StartEventLog() {
  startSeconds = platform::MonotonicSeconds();
  const char* path = std::getenv("FOTOMILL_DESKTOP_LOG");
  if (path != nullptr && *path != '\0') logFile.reset(std::fopen(path, "a"));
}

bool EventLogOn() { return logFile != nullptr; }

void LogEvent(std::string_view event, std::string_view text) {
  if (logFile == nullptr) return;
  const std::string line = std::string(event) + (text.empty() ? "" : " ") + EscapeControls(text);
  std::fprintf(logFile.get(), "%.3f %s\n", platform::MonotonicSeconds() - startSeconds,
               line.c_str());
  std::fflush(logFile.get());
}

}  // namespace fotomill::desktop
