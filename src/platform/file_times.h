#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "platform/clock.h"
#include "platform/files.h"

namespace fotomill::platform {

// The moment of a local time, in seconds since 1970-01-01 UTC. A time that clocks skip in spring
// is moved forward; of a time that comes twice in autumn, the system chooses one. nullopt if it
// cannot be expressed, or a field is out of range.
std::optional<int64_t> SecondsOfLocalTime(const LocalTime& time);

// The times of a file that can be set; those of the access only if they are of interest.
struct FileTimes {
  std::optional<ExactTime> accessed = {};
  ExactTime modified = {};
};
// Both times of the file that a path refers to, following links. nullopt, with the reason kept, if
// it does not exist or permission is denied.
std::optional<FileTimes> FileTimesOf(const std::string& path);

// Sets the times of the file that a path refers to, following links; nullopt keeps a time. False,
// with the reason kept, if the system refuses.
[[nodiscard]] bool SetFileTimes(const std::string& path, std::optional<ExactTime> accessed,
                                std::optional<ExactTime> modified);

}  // namespace fotomill::platform
