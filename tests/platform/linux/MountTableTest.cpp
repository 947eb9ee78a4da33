#include "platform/linux/MountTable.h"

#include <doctest/doctest.h>

#include <string>
#include <vector>

using platform::isLocalVolume;
using platform::Mount;
using platform::MountTable;
using platform::parseMountTable;

namespace {

using Paths = std::vector<std::string>;

Paths reachable(const std::string& text)
{
    Paths paths;
    const MountTable table(parseMountTable(text));
    for (const Mount& mount : table.mounts())
        paths.push_back(mount.mountPoint + ' ' + mount.fileSystemType);
    return paths;
}

Paths volumes(const std::string& text)
{
    Paths paths;
    const MountTable table(parseMountTable(text));
    for (const Mount& mount : table.mounts()) {
        if (isLocalVolume(mount))
            paths.push_back(mount.mountPoint);
    }
    return paths;
}

bool isVolume(const std::string& line)
{
    const auto mounts = parseMountTable(line);
    REQUIRE(mounts.size() == 1);
    return isLocalVolume(mounts.front());
}

} // namespace

TEST_CASE("a line of the mount table is read field by field, with any number of optional fields")
{
    const auto mounts = parseMountTable("36 35 98:7 /root /mnt/a rw,noatime shared:1 master:2 - ext4 /dev/sdb1 rw,x=1\n"
                                        "37 36 0:40 / /b rw - fuse.sshfs me@host:/ rw");
    REQUIRE(mounts.size() == 2);
    CHECK(mounts[0].identifier == 36);
    CHECK(mounts[0].parent == 35);
    CHECK(mounts[0].device == platform::DeviceNumber { 98, 7 });
    CHECK(mounts[0].root == "/root");
    CHECK(mounts[0].mountPoint == "/mnt/a");
    CHECK(mounts[0].fileSystemType == "ext4");
    CHECK(mounts[0].source == "/dev/sdb1");
    CHECK(mounts[0].superOptions == "rw,x=1");
    CHECK(mounts[1].fileSystemType == "fuse.sshfs");
    CHECK(mounts[1].source == "me@host:/");
}

TEST_CASE("escapes are undone and other bytes taken as they are")
{
    const auto mounts
        = parseMountTable("1 0 8:1 / /a\\040b\\011c\\012d\\134e\xff#f\\9\\04 rw - ext4 /dev/x\\040y rw\n");
    REQUIRE(mounts.size() == 1);
    CHECK(mounts[0].mountPoint == "/a b\tc\nd\\e\xff#f\\9\\04");
    CHECK(mounts[0].source == "/dev/x y");
}

TEST_CASE("damaged lines are left out and the others read")
{
    const std::string whole = "1 0 8:1 / / rw - ext4 /dev/a rw\n";
    for (const char* line :
        { "", "\n\n", "x", "1", "1 2", "1 2 3", "1 2 3:", "1 2 x:1 / /a rw - ext4 b rw", "1 2 8:1 / a rw - ext4 b rw",
            "1 2 8:1 / /a rw", "1 2 8:1 / /a rw - ", "1 2 8:1  /a rw - ext4 b rw", "-1 2 8:1 / /a rw - ext4 b rw",
            "99999999999999999999 2 8:1 / /a rw - ext4 b", "1 2 8:1 / /a rw shared:1" }) {
        CAPTURE(line);
        CHECK(parseMountTable(std::string(line) + '\n' + whole).size() == 1);
    }
    for (std::size_t length = 0; length < whole.size(); ++length)
        CHECK(parseMountTable(whole.substr(0, length)).size() <= 1);
}

TEST_CASE("a mount under a later one at the same point cannot be reached")
{
    CHECK(reachable("1 0 8:1 / / rw - ext4 a rw\n"
                    "2 1 8:2 / /mnt rw - ext4 b rw\n"
                    "3 2 8:3 / /mnt rw - xfs c rw\n"
                    "4 2 8:4 / /mnt/inside rw - ext4 d rw\n"
                    "5 3 8:5 / /mnt/top rw - ext4 e rw\n")
        == Paths { "/ ext4", "/mnt xfs", "/mnt/top ext4" });
}

TEST_CASE("a mount below a folder that a later mount covers cannot be reached")
{
    CHECK(reachable("1 0 8:1 / / rw - ext4 a rw\n"
                    "2 1 8:2 / /mnt/disk rw - ext4 b rw\n"
                    "3 2 8:3 / /mnt/disk/deep rw - ext4 c rw\n"
                    "4 1 8:4 / /mnt rw - tmpfs d rw\n"
                    "5 1 8:5 / /mntx rw - ext4 e rw\n")
        == Paths { "/ ext4", "/mnt tmpfs", "/mntx ext4" });
}

TEST_CASE("a root that covers another root is the one that counts")
{
    CHECK(reachable("1 1 0:2 / / rw - rootfs none rw\n"
                    "2 1 8:1 / / rw - ext4 a rw\n"
                    "3 2 8:2 / /home rw - xfs b rw\n")
        == Paths { "/ ext4", "/home xfs" });
}

TEST_CASE("a table whose mounts are their own parents in circles harms nothing")
{
    CHECK(reachable("1 2 8:1 / /a rw - ext4 a rw\n2 1 8:2 / /b rw - ext4 b rw\n").empty());
    CHECK(reachable("1 1 8:1 / /a rw - ext4 a rw\n").size() == 1);
}

TEST_CASE("many mounts are sorted out quickly")
{
    std::string text = "1 0 8:1 / / rw - ext4 a rw\n";
    for (int number = 2; number < 50'000; ++number)
        text += std::to_string(number) + " 1 8:2 / /m/" + std::to_string(number) + " rw - ext4 b rw\n";
    CHECK(reachable(text).size() == 49'999);
}

TEST_CASE("disks are volumes, in mount order, and the system's own mounts are not")
{
    CHECK(volumes("20 1 254:0 / / rw - ext4 /dev/vda rw\n"
                  "21 20 0:21 / /proc rw - proc proc rw\n"
                  "22 20 0:22 / /sys rw - sysfs sysfs rw\n"
                  "23 20 0:23 / /sys/fs/cgroup rw - cgroup2 cgroup2 rw\n"
                  "24 20 0:6 / /dev rw - devtmpfs devtmpfs rw\n"
                  "25 20 8:33 / /media/me/Stick rw - vfat /dev/sdc1 rw\n"
                  "26 20 8:2 / /boot rw - ext4 /dev/sda2 rw\n"
                  "27 20 8:1 / /boot/efi rw - vfat /dev/sda1 rw\n"
                  "28 20 7:1 / /snap/core/1 ro - squashfs /dev/loop1 ro\n"
                  "29 20 0:50 / /tmp rw - tmpfs tmpfs rw\n"
                  "30 20 8:3 / /home rw - xfs /dev/sda3 rw\n"
                  "31 20 0:51 / /mnt/ssh rw - fuse.sshfs me@host: rw\n"
                  "32 20 0:52 / /mnt/nfs rw - nfs4 host:/x rw\n"
                  "33 20 0:53 / /run/user/0/gvfs rw - fuse.gvfsd-fuse gvfsd-fuse rw\n"
                  "34 20 0:54 / /net rw - autofs systemd-1 rw\n")
        == Paths { "/", "/media/me/Stick", "/home", "/mnt/ssh" });
}

TEST_CASE("the root is a volume whatever it is on")
{
    CHECK(isVolume("1 0 0:30 / / rw - overlay overlay rw,lowerdir=/l"));
    CHECK(isVolume("1 0 0:30 /@/snapshot / rw - btrfs /dev/sda1 rw,subvol=/@"));
}

TEST_CASE("a part of a file system that is mounted elsewhere is no volume, but a subvolume of btrfs is")
{
    CHECK(!isVolume("2 1 8:1 /home/me /mnt/home rw - ext4 /dev/sda1 rw"));
    CHECK(!isVolume("2 1 8:1 /etc/hosts /etc/hosts rw - ext4 /dev/sda1 rw"));
    CHECK(isVolume("2 1 0:30 /@home /home rw - btrfs /dev/sda1 rw,space_cache,subvolid=257,subvol=/@home"));
    CHECK(isVolume("2 1 0:30 /@home /home rw - btrfs /dev/sda1 subvol=/@home,rw"));
    CHECK(!isVolume("2 1 0:30 /@home/me /mnt/me rw - btrfs /dev/sda1 rw,subvolid=257,subvol=/@home"));
    CHECK(!isVolume("2 1 0:30 /@homework /mnt/w rw - btrfs /dev/sda1 rw,subvol=/@home"));
    CHECK(isVolume("2 1 0:31 / /tank rw - zfs tank rw"));
}

TEST_CASE("container layers, automount points and removed folders are no volumes")
{
    CHECK(!isVolume("2 1 0:30 / /var/lib/docker/overlay2/x/merged rw - overlay overlay rw"));
    CHECK(!isVolume("2 1 8:1 / /var/lib/docker/volumes/x rw - ext4 /dev/sdb rw"));
    CHECK(!isVolume("2 1 0:30 / /mnt/auto rw - autofs /etc/auto.misc rw"));
    CHECK(!isVolume("2 1 8:9 / /mnt/gone//deleted rw - ext4 /dev/sdb rw"));
    CHECK(!isVolume("2 1 0:44 / /tmp/.mount_Player123 ro - fuse.Player.AppImage Player.AppImage ro"));
}

TEST_CASE("a path belongs to the mount with the longest mount point above it, by whole components")
{
    const MountTable table(parseMountTable("1 0 8:1 / / rw - ext4 a rw\n2 1 8:2 / /mnt rw - xfs b rw\n"
                                           "3 2 8:3 / /mnt/deep rw - vfat c rw\n"));
    CHECK(table.mountHolding("/mnt/deep/x")->fileSystemType == "vfat");
    CHECK(table.mountHolding("/mnt/deeper")->fileSystemType == "xfs");
    CHECK(table.mountHolding("/mntx")->fileSystemType == "ext4");
    CHECK(table.mountAt("/mnt")->fileSystemType == "xfs");
    CHECK(!table.mountAt("/mnt/x"));
    CHECK(!MountTable().mountHolding("/"));
}

TEST_CASE("this machine's own table is read, and has a root")
{
    CHECK(MountTable::read("/proc").mountHolding("/proc")->fileSystemType == "proc");
    CHECK(MountTable::read("/nonexistent").mounts().empty());
}
