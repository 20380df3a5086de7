#pragma once

#include <cstdint>
#include <string>

namespace fotomill::platform {

enum class DriveKind { Unknown, Removable, Fixed, Network, Optical, Ram };

// The volume that holds a path: its label and serial number as the system tells them.
struct Volume {
  bool available = false;
  std::string label;
  uint32_t serial = 0;
  DriveKind kind = DriveKind::Unknown;
};

// Asks the system; tests put a function of their own in its place.
Volume VolumeOf(const std::string& path);
using VolumeFunction = Volume (*)(const std::string& path);
void ReplaceVolumeFunction(VolumeFunction function);  // null restores the system's

// Free bytes on the volume of a path, 0 when unknown.
uint64_t FreeSpace(const std::string& path);

}  // namespace fotomill::platform
