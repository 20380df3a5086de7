#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace fotomill::platform {

// What a volume is on; Unknown where the system does not tell.
enum class DriveKind { Unknown, Removable, Fixed, Network, Optical, Ram };

// The volume that holds a path: its label and serial number as the system tells them.
struct Volume {
  bool available = false;
  std::string label;    // empty when it has none
  uint32_t serial = 0;  // of FAT, exFAT and NTFS the same number on every system
  DriveKind kind = DriveKind::Unknown;
};

// Asks the system about the volume of a file or folder that is there, or whose folder is; any other
// is not available. Tests put a function of their own in its place.
Volume VolumeOf(const std::string& path);
using VolumeFunction = Volume (*)(const std::string& path);  // how tests stand in for the system
void ReplaceVolumeFunction(VolumeFunction function);  // null restores the system's

// Where volumes of the user are mounted: drives that were plugged in, discs, shares. In order,
// without asking the volumes.
std::vector<std::string> UserVolumes();

// Free bytes on the volume of a path (likewise), 0 when unknown.
uint64_t FreeSpace(const std::string& path);

}  // namespace fotomill::platform
