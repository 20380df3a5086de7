#pragma once

#include <string_view>

namespace fotomill::desktop {

// The program's event log: lines "SECONDS EVENT TEXT", seconds since startup with milliseconds,
// appended to the file in the environment variable FOTOMILL_DESKTOP_LOG. If not set, nothing is
// written.
void StartEventLog();
bool EventLogOn();  // FOTOMILL_DESKTOP_LOG is set
void LogEvent(std::string_view event, std::string_view text = {});

}  // namespace fotomill::desktop
