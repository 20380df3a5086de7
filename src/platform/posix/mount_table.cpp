#include "platform/posix/mount_table.h"

#include <stdlib.h>
#include <unistd.h>

#include <algorithm>
#include <charconv>
#include <climits>
#include <memory>

#include "platform/files.h"
#include "platform/paths.h"

namespace fotomill::platform {

namespace {

struct TypeRow {
  std::string_view type;
  DriveKind kind;
};

// File system types whose kind is independent of the device.
// clang-format off
constexpr TypeRow typeRows[] = {
    {"nfs", DriveKind::Network},         {"nfs4", DriveKind::Network},           {"cifs", DriveKind::Network},
    {"smb3", DriveKind::Network},        {"smbfs", DriveKind::Network},          {"afs", DriveKind::Network},
    {"ceph", DriveKind::Network},        {"coda", DriveKind::Network},           {"davfs", DriveKind::Network},
    {"9p", DriveKind::Network},          {"virtiofs", DriveKind::Network},       {"vboxsf", DriveKind::Network},
    {"fuse.sshfs", DriveKind::Network},  {"fuse.davfs2", DriveKind::Network},    {"fuse.rclone", DriveKind::Network},
    {"fuse.s3fs", DriveKind::Network},   {"fuse.curlftpfs", DriveKind::Network}, {"fuse.gvfsd-fuse", DriveKind::Network},
    {"fuse.glusterfs", DriveKind::Network}, {"fuse.vmhgfs-fuse", DriveKind::Network}, {"fuse.ceph", DriveKind::Network},
    {"iso9660", DriveKind::Optical},     {"udf", DriveKind::Optical},
    {"tmpfs", DriveKind::Ram},           {"ramfs", DriveKind::Ram},
    {"overlay", DriveKind::Fixed},       {"zfs", DriveKind::Fixed},              {"btrfs", DriveKind::Fixed},
};
// clang-format on

int HexDigit(char c) {
  if (c >= '0' && c <= '9') return c - '0';
  if (c >= 'a' && c <= 'f') return c - 'a' + 10;
  return c >= 'A' && c <= 'F' ? c - 'A' + 10 : -1;
}

bool IsOctalDigit(char c) { return c >= '0' && c <= '7'; }

// In the mount table, "\040" is a blank.
std::string DecodeOctal(std::string_view text) {
  std::string result;
  for (size_t i = 0; i < text.size(); ++i) {
    if (text[i] == '\\' && i + 3 < text.size() && IsOctalDigit(text[i + 1]) &&
        IsOctalDigit(text[i + 2]) && IsOctalDigit(text[i + 3])) {
      result += static_cast<char>((text[i + 1] - '0') << 6 | (text[i + 2] - '0') << 3 |
                                  (text[i + 3] - '0'));
      i += 3;
    } else {
      result += text[i];
    }
  }
  return result;
}

// In names below /dev/disk, "\x20" is a blank.
std::string DecodeHex(std::string_view text) {
  std::string result;
  for (size_t i = 0; i < text.size(); ++i) {
    const bool escaped = text[i] == '\\' && i + 3 < text.size() && text[i + 1] == 'x';
    if (escaped && HexDigit(text[i + 2]) >= 0 && HexDigit(text[i + 3]) >= 0) {
      result += static_cast<char>(HexDigit(text[i + 2]) << 4 | HexDigit(text[i + 3]));
      i += 3;
    } else {
      result += text[i];
    }
  }
  return result;
}

std::string LinkTarget(const std::string& path) {
  char target[PATH_MAX];
  const ssize_t length = readlink(path.c_str(), target, sizeof target);
  return length > 0 ? std::string(target, static_cast<size_t>(length)) : std::string();
}

// The kernel name of a mount's device ("sda1"), empty if there is none.
std::string DeviceName(const Mount& mount, const std::string& root) {
  const std::string known = LinkTarget(root + "/sys/dev/block/" + mount.device);
  if (!known.empty()) return std::string(FileNameOf(known));
  if (!mount.source.starts_with("/dev/")) return {};
  const std::unique_ptr<char, decltype(&free)> real(
      realpath((root + mount.source).c_str(), nullptr), free);
  return std::string(FileNameOf(real != nullptr ? real.get() : mount.source));
}

// The decoded name of the link in a folder that points to the device; empty if there is none.
std::string NameAmong(const std::string& folder, const std::string& device) {
  const auto entries = ListFolder(folder);
  if (!entries || device.empty()) return {};
  for (const FolderEntry& entry : *entries) {
    if (entry.link && FileNameOf(LinkTarget(JoinFolder(folder, entry.name))) == device)
      return DecodeHex(entry.name);
  }
  return {};
}

// A 32-bit serial number from a file system's id: for FAT and exFAT, "1A2B-3C4D" is that number;
// for NTFS it is the lower half of the 16 digits, as on Windows. Longer ids are hashed (FNV-1a).
uint32_t SerialFrom(std::string_view identity) {
  uint64_t number = 0;
  size_t digits = 0;
  for (const char c : identity) {
    if (HexDigit(c) < 0) continue;
    number = number << 4 | static_cast<unsigned>(HexDigit(c));
    ++digits;
  }
  if ((digits == 8 && identity.size() == 9) || (digits == 16 && identity.size() == 16))
    return static_cast<uint32_t>(number);
  uint32_t hash = 2166136261;
  for (const char c : identity) hash = (hash ^ static_cast<uint8_t>(c)) * 16777619;
  return hash;
}

DriveKind KindFrom(const Mount& mount, const std::string& device, const std::string& root) {
  const auto row = std::find_if(std::begin(typeRows), std::end(typeRows),
                                [&](const TypeRow& r) { return r.type == mount.type; });
  if (row != std::end(typeRows) && (device.empty() || row->kind != DriveKind::Fixed))
    return row->kind;
  if (device.empty()) return DriveKind::Unknown;
  // major number 11: SCSI and SATA optical drives
  if (mount.device.starts_with("11:")) return DriveKind::Optical;
  if (mount.device.starts_with("1:")) return DriveKind::Ram;
  const std::string folder = root + "/sys/class/block/" + device;
  std::string flag;
  for (const char* name : {"/removable", "/../removable"}) {  // partitions have it on their disk
    if (ReadWholeFile(folder + name, 4096, flag) == ReadResult::Done) break;
  }
  return flag.starts_with('1') ? DriveKind::Removable : DriveKind::Fixed;
}

}  // namespace

// 36 35 98:0 /mnt1 /mnt2 rw,noatime master:1 - ext3 /dev/root rw,errors=continue
// id    device                     optional  -  type source
std::vector<Mount> ParseMountTable(std::string_view text) {
  std::vector<Mount> mounts;
  for (std::string_view rest = text; !rest.empty();) {
    std::string_view line = rest.substr(0, rest.find('\n'));
    rest.remove_prefix(std::min(line.size() + 1, rest.size()));
    std::vector<std::string_view> words;
    while (!line.empty()) {
      words.push_back(line.substr(0, line.find(' ')));
      line.remove_prefix(std::min(words.back().size() + 1, line.size()));
    }
    const auto dash =
        std::find(words.size() > 6 ? words.begin() + 6 : words.end(), words.end(), "-");
    if (words.end() - dash < 3) continue;
    Mount mount{0, std::string(words[2]), DecodeOctal(dash[1]), DecodeOctal(dash[2]),
                DecodeOctal(words[4])};
    const char* end = words[0].data() + words[0].size();
    if (std::from_chars(words[0].data(), end, mount.id).ptr == end)
      mounts.push_back(std::move(mount));
  }
  return mounts;
}

std::vector<std::string> UserVolumesAmong(const std::vector<Mount>& mounts) {
  constexpr std::string_view kFolders[] = {"/media/", "/run/media/", "/mnt/"};
  std::vector<std::string> places;
  for (const Mount& mount : mounts) {
    const auto holds = [&](std::string_view folder) {
      return mount.place.size() > folder.size() && mount.place.starts_with(folder);
    };
    if (std::ranges::any_of(kFolders, holds)) places.push_back(mount.place);
  }
  std::ranges::sort(places);
  places.erase(std::unique(places.begin(), places.end()), places.end());
  return places;
}

Volume DescribeMount(const Mount& mount, uint32_t fileSystemId, const std::string& root) {
  const std::string device = DeviceName(mount, root);
  const std::string identity = NameAmong(root + "/dev/disk/by-uuid", device);
  return {true, NameAmong(root + "/dev/disk/by-label", device),
          identity.empty() ? fileSystemId : SerialFrom(identity), KindFrom(mount, device, root)};
}

}  // namespace fotomill::platform
