#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "platform/volumes.h"

namespace fotomill::platform {

// One line of /proc/self/mountinfo (proc(5)), escapes decoded.
struct Mount {
  uint64_t id = 0;
  std::string device;  // "8:1", major and minor number; major 0: no block device of its own
  std::string type;    // file system type, "ext4", "fuse.sshfs"
  std::string source;  // "/dev/sda1", "server:/share"
  std::string place;   // the folder that it is mounted on
};

// The well-formed lines of a mount table.
std::vector<Mount> ParseMountTable(std::string_view text);

// Where volumes of the user are mounted: drives that were plugged in, discs, shares. In order.
std::vector<std::string> UserVolumesAmong(const std::vector<Mount>& mounts);

// What label, number and kind a mount has, read from the trees /dev/disk and /sys below `root`
// (empty: the system's own). `fileSystemId` stands in as the number where the device has none on
// record.
Volume DescribeMount(const Mount& mount, uint32_t fileSystemId, const std::string& root);

}  // namespace fotomill::platform
