#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace fotomill::platform {

// Kind of a volume's device; Unknown if the system does not say.
enum class DriveKind { Unknown, Removable, Fixed, Network, Optical, Ram };

// The volume of a path: its label and serial number as reported by the system.
struct Volume {
  bool available = false;
  std::string label;    // empty when it has none
  uint32_t serial = 0;  // for FAT, exFAT and NTFS the same on all systems
  DriveKind kind = DriveKind::Unknown;
};

// The volume of an existing file or folder, or of a missing file in an existing folder; otherwise
// not available. Tests may replace this function.
Volume VolumeOf(const std::string& path);
using VolumeFunction = Volume (*)(const std::string& path);  // test hook
void ReplaceVolumeFunction(VolumeFunction function);  // null restores the default

// Mount points of the user's volumes: removable drives, discs, shares. Sorted; the volumes
// themselves are not accessed.
std::vector<std::string> UserVolumes();

// Free bytes on the volume of a path (as above), 0 if unknown.
uint64_t FreeSpace(const std::string& path);

}  // namespace fotomill::platform
