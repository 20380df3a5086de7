#include "platform/volumes.h"

#include <gtest/gtest.h>

#include "platform/posix/mount_table.h"
#include "support/files.h"

namespace fotomill::platform {
namespace {

namespace fs = std::filesystem;
using test::TemporaryFolder;
using test::WriteText;

constexpr std::string_view mountTable =
    "22 27 8:2 / / rw,relatime shared:1 - ext4 /dev/sda2 rw\n"
    "36 22 8:17 / /media/my\\040stick rw master:1 propagate_from:2 - vfat /dev/sdb1 rw,uid=1000\n"
    "37 22 0:50 / /net rw - nfs4 server:/a\\040b rw\n"
    "38 22 0:51 /sub /pool rw - btrfs /dev/mapper/vg-data rw,subvol=/sub\n"
    "39 22 11:0 / /media/disc ro - iso9660 /dev/sr0 ro\n"
    "40 22 0:52 / /tmp rw - tmpfs tmpfs rw\n"
    "41 22 0:53 / /odd rw - fuse.odd odd rw\n"
    "42 22 259:5 / /windows rw - ntfs3 /dev/nvme0n1p5 rw\n"
    "43 22 8:33 / /copy rw - exfat /dev/sdc1 rw\n"
    "no line of the table\n"
    "44 22 8:1 / /cut rw - ext4\n"
    "45x 22 8:1 / /number rw - ext4 /dev/sda1 rw\n"
    "46 22 8:1 /\n\n";

// A tree as created by the kernel and udev, with the devices of the table above.
class MountTest : public testing::Test {
 protected:
  MountTest() {
    Disk("sda", "0", {{"sda2", "8:2"}});
    Disk("sdb", "1", {{"sdb1", "8:17"}});
    Disk("sdc", "0", {{"sdc1", "8:33"}});
    Disk("nvme0n1", "0", {{"nvme0n1p5", "259:5"}});
    Disk("sr0", "1", {});
    Disk("dm-0", "0", {});
    Link("../../devices/sr0", "sys/dev/block/11:0");
    WriteText(Make("dev/dm-0"), "");
    Link("../dm-0", "dev/mapper/vg-data");
    Link("../../sda2", "dev/disk/by-uuid/0a1b2c3d-0000-4000-8000-112233445566");
    Link("../../sdb1", "dev/disk/by-uuid/1A2b-3C4D");
    Link("../../sdb1", "dev/disk/by-label/MY\\x20STICK\\x2f\xC3\xA9");
    Link("../../dm-0", "dev/disk/by-label/data");
    Link("../../dm-0", "dev/disk/by-uuid/ffffffff-0000-4000-8000-112233445566");
    Link("../../sr0", "dev/disk/by-label/DISC");
    Link("../../nvme0n1p5", "dev/disk/by-uuid/01D9C0DEFEEDBEEF");
    WriteText(Make("dev/disk/by-label/sdc1"), "no link");
  }

  std::string Make(const std::string& name) const {
    const std::string path = root_.Path(name);
    fs::create_directories(fs::path(path).parent_path());
    return path;
  }
  void Link(const std::string& target, const std::string& name) const {
    fs::create_symlink(target, Make(name));
  }
  void Disk(const std::string& disk, const char* removable,
            std::vector<std::pair<std::string, std::string>> partitions) const {
    WriteText(Make("sys/devices/" + disk + "/removable"), std::string(removable) + "\n");
    Link("../../devices/" + disk, "sys/class/block/" + disk);
    for (const auto& [name, number] : partitions) {
      fs::create_directories(root_.Path("sys/devices/" + disk + "/" + name));
      Link("../../devices/" + disk + "/" + name, "sys/class/block/" + name);
      Link("../../devices/" + disk + "/" + name, "sys/dev/block/" + number);
    }
  }
  TemporaryFolder root_;
};

TEST_F(MountTest, EveryMountIsDescribed) {
  const struct {
    uint64_t id;
    const char *source, *label;
    uint32_t serial;  // 0: any value except the fallback
    DriveKind kind;
  } rows[] = {
      {22, "/dev/sda2", "", 0, DriveKind::Fixed},       {36, "/dev/sdb1", "MY STICK/\xC3\xA9", 0x1A2B3C4D, DriveKind::Removable},
      {37, "server:/a b", "", 99, DriveKind::Network},  {38, "/dev/mapper/vg-data", "data", 0, DriveKind::Fixed},
      {39, "/dev/sr0", "DISC", 99, DriveKind::Optical}, {40, "tmpfs", "", 99, DriveKind::Ram},
      {41, "odd", "", 99, DriveKind::Unknown},          {42, "/dev/nvme0n1p5", "", 0xFEEDBEEF, DriveKind::Fixed},
      {43, "/dev/sdc1", "", 99, DriveKind::Fixed},
  };
  const std::vector<Mount> mounts = ParseMountTable(mountTable);
  ASSERT_EQ(mounts.size(), std::size(rows));
  for (size_t i = 0; i < mounts.size(); ++i) {
    SCOPED_TRACE(rows[i].source);
    EXPECT_EQ(mounts[i].id, rows[i].id);
    EXPECT_EQ(mounts[i].source, rows[i].source);
    const Volume volume = DescribeMount(mounts[i], 99, root_.Path());
    EXPECT_TRUE(volume.available);
    EXPECT_EQ(volume.label, rows[i].label);
    EXPECT_EQ(volume.kind, rows[i].kind);
    if (rows[i].serial != 0) {
      EXPECT_EQ(volume.serial, rows[i].serial);
    } else {
      EXPECT_NE(volume.serial, 99u);
    }
  }
  EXPECT_NE(DescribeMount(mounts[0], 99, root_.Path()).serial, DescribeMount(mounts[3], 99, root_.Path()).serial);
}

TEST(Volumes, UserVolumes) {
  const auto mounts = ParseMountTable(
      "1 0 8:1 / / rw - ext4 /dev/sda1 rw\n2 1 8:2 / /mnt/d\\040e rw - ext4 /dev/sda2 rw\n3 1 8:3 / /media/me/A rw - vfat "
      "/dev/sdb1 rw\n"
      "4 1 8:3 / /media/me/A rw - vfat /dev/sdb1 rw\n5 1 0:9 / /mnt rw - tmpfs x rw\n");
  EXPECT_EQ(UserVolumesAmong(mounts), (std::vector<std::string>{"/media/me/A", "/mnt/d e"}));
}

TEST(Volumes, SystemVolume) {
  const TemporaryFolder folder;
  WriteText(folder.Path("file"), "");
  const Volume volume = VolumeOf(folder.Path("file"));
  EXPECT_TRUE(volume.available);
  EXPECT_EQ(VolumeOf(folder.Path("not yet")).serial, volume.serial);
  EXPECT_FALSE(VolumeOf(folder.Path("no/such")).available);
  EXPECT_GT(FreeSpace(folder.Path("not yet")), 0u);
  EXPECT_EQ(FreeSpace(folder.Path("no/such")), 0u);

  ReplaceVolumeFunction([](const std::string& path) {
    return Volume{true, path, 7, DriveKind::Optical};
  });
  EXPECT_EQ(VolumeOf("any").label, "any");
  ReplaceVolumeFunction(nullptr);
  EXPECT_EQ(VolumeOf(folder.Path("file")).serial, volume.serial);
}

}  // namespace
}  // namespace fotomill::platform
