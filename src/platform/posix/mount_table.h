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
  std::string device;  // "8:1", major and minor number; major 0: no block device
  std::string type;    // file system type, "ext4", "fuse.sshfs"
  std::string source;  // "/dev/sda1", "server:/share"
  std::string place;   // mount point
};

// The well-formed lines of a mount table.
std::vector<Mount> ParseMountTable(std::string_view text);

// Mount points of the user's volumes: removable drives, discs, shares. Sorted.
std::vector<std::string> UserVolumesAmong(const std::vector<Mount>& mounts);

// Label, serial number and kind of a mount, from /dev/disk and
// /sys below `root` (empty: the real ones). `fileSystemId` is
// used as the number if the device has none.
Volume DescribeMount(const Mount& mount, uint32_t fileSystemId, const std::string& root);

}  // namespace fotomill::platform
