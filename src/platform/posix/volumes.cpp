#include "platform/volumes.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <sys/statfs.h>
#include <sys/statvfs.h>

#include <atomic>
#include <cstring>

#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/posix/mount_table.h"

#ifndef STATX_MNT_ID
#define STATX_MNT_ID 0x1000U
#endif

namespace fotomill::platform {

namespace {

constexpr uint64_t kLongestMountTable = uint64_t{16} << 20;

// `path` if it exists, else its folder.
std::string NearestFile(const std::string& path) {
  if (FactsOf(path).kind != FileKind::Missing) return path;
  const std::string folder(SplitPath(path).folder);
  return folder.empty() ? "." : folder;
}

uint32_t FileSystemId(const std::string& path) {
  struct statfs facts;
  if (statfs(path.c_str(), &facts) != 0) return 0;
  uint32_t halves[2];
  static_assert(sizeof halves == sizeof facts.f_fsid);
  std::memcpy(halves, &facts.f_fsid, sizeof halves);
  return halves[0] ^ halves[1];
}

bool ReadMountTable(std::string& table) {
  return ReadWholeFile("/proc/self/mountinfo", kLongestMountTable, table) == ReadResult::Done;
}

Volume AskSystem(const std::string& path) {
  const std::string file = NearestFile(path);
  struct statx facts;
  if (statx(AT_FDCWD, file.c_str(), AT_STATX_SYNC_AS_STAT, STATX_BASIC_STATS | STATX_MNT_ID,
            &facts) != 0)
    return {};
  Volume volume;
  volume.available = true;
  volume.serial = FileSystemId(file);
  std::string table;
  if (!ReadMountTable(table)) return volume;
  const std::string device =
      std::to_string(facts.stx_dev_major) + ":" + std::to_string(facts.stx_dev_minor);
  const bool idKnown = (facts.stx_mask & STATX_MNT_ID) != 0;
  for (const Mount& mount : ParseMountTable(table)) {
    const bool holdsFile = idKnown ? mount.id == facts.stx_mnt_id : mount.device == device;
    if (holdsFile) return DescribeMount(mount, volume.serial, "");
  }
  // with a changed root, the table lacks the root's own volume
  volume.kind = DriveKind::Fixed;
  return volume;
}

std::atomic<VolumeFunction> volumeFunction{AskSystem};

}  // namespace

Volume VolumeOf(const std::string& path) { return volumeFunction.load()(path); }

void ReplaceVolumeFunction(VolumeFunction function) {
  volumeFunction = function != nullptr ? function : AskSystem;
}

std::vector<std::string> UserVolumes() {
  std::string table;
  return ReadMountTable(table) ? UserVolumesAmong(ParseMountTable(table))
                               : std::vector<std::string>();
}

uint64_t FreeSpace(const std::string& path) {
  struct statvfs facts;
  if (statvfs(NearestFile(path).c_str(), &facts) != 0) return 0;
  return uint64_t{facts.f_bavail} * facts.f_frsize;
}

}  // namespace fotomill::platform
