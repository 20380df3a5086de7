#pragma once

#include <string_view>

namespace fotomill::desktop {

// The program's own log of what it did and when: lines "SECONDS EVENT TEXT", seconds since the
// start with milliseconds, appended to the file that the environment variable FOTOMILL_DESKTOP_LOG
// names. Without it nothing is written.
void StartEventLog();
bool EventLogOn();  // the environment named a log file
void LogEvent(std::string_view event, std::string_view text = {});

}  // namespace fotomill::desktop
