#include "platform/linux/BlockDevices.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <string>

using platform::BlockDevices;
using platform::Mount;
using platform::MountTable;
using tests::TemporaryFolder;

namespace {

/// A made-up /sys and /dev.
class Machine {
public:
    Machine()
    {
        temporary.folder("sys/dev/block");
        temporary.folder("dev");
    }

    /// A disk with its place below sys/devices; answers that place.
    std::string disk(const std::string& place, const std::string& number, const std::string& removable = "0") const
    {
        std::string folder = "sys/devices/" + place;
        temporary.file(folder + "/removable", removable + "\n");
        publish(folder, number);
        return folder;
    }
    std::string partition(const std::string& disk, const std::string& name, const std::string& number) const
    {
        std::string folder = disk + "/" + name;
        temporary.file(folder + "/partition", "1\n");
        publish(folder, number);
        return folder;
    }
    void bus(const std::string& place, const std::string& name) const
    {
        temporary.folder("sys/bus/" + name);
        temporary.link("sys/devices/" + place + "/subsystem", temporary.path("sys/bus/" + name));
    }
    void slave(const std::string& disk, const std::string& below) const
    {
        temporary.link(disk + "/slaves/" + below.substr(below.rfind('/') + 1), temporary.path(below));
    }

    BlockDevices devices() const
    {
        return BlockDevices({ temporary.path("proc"), temporary.path("sys"), temporary.path("dev") });
    }
    bool isRemovable(const std::string& line, const std::string& table = {}) const
    {
        const auto mounts = platform::parseMountTable(line);
        REQUIRE(mounts.size() == 1);
        return devices().isRemovable(mounts.front(), MountTable(platform::parseMountTable(table)));
    }

    TemporaryFolder temporary;

private:
    void publish(const std::string& folder, const std::string& number) const
    {
        temporary.link("sys/dev/block/" + number, temporary.path(folder));
        temporary.link("sys/class/block/" + folder.substr(folder.rfind('/') + 1), temporary.path(folder));
    }
};

Mount mountOfSource(const std::string& source)
{
    Mount mount;
    mount.mountPoint = "/mnt/x";
    mount.fileSystemType = "ext4";
    mount.source = source;
    return mount;
}

} // namespace

TEST_CASE("a disk that says it is removable is, and so are its partitions")
{
    const Machine machine;
    machine.partition(machine.disk("pci0/card/sdb", "8:16", "1"), "sdb1", "8:17");
    machine.partition(machine.disk("pci0/ata/sda", "8:0"), "sda1", "8:1");
    CHECK(machine.isRemovable("2 1 8:17 / /media/a rw - vfat /dev/sdb1 rw"));
    CHECK(machine.isRemovable("2 1 8:16 / /media/b rw - vfat /dev/sdb rw"));
    CHECK(!machine.isRemovable("2 1 8:1 / / rw - ext4 /dev/sda1 rw"));
    CHECK(!machine.isRemovable("2 1 8:99 / /media/c rw - ext4 /dev/sdz rw"));
}

TEST_CASE("a disk behind a plug is removable though it says otherwise")
{
    const Machine machine;
    for (const char* bus : { "usb", "ieee1394", "firewire", "pcmcia", "mmc", "scsi" }) {
        const std::string place = std::string("pci0/") + bus + "1";
        const std::string number = "9:" + std::to_string(std::string(bus).size() + static_cast<unsigned>(bus[0]));
        machine.disk(place + "/host/disk" + bus, number);
        machine.bus(place, bus);
        CAPTURE(bus);
        CHECK(machine.isRemovable("2 1 " + number + " / /mnt rw - ext4 x rw") == (std::string(bus) != "scsi"));
    }
}

TEST_CASE("a memory chip on the board is no card")
{
    const Machine machine;
    machine.disk("host/mmc0:1/block/mmcblk0", "179:0");
    machine.bus("host/mmc0:1", "mmc");
    machine.temporary.file("sys/devices/host/mmc0:1/type", "MMC\n");
    machine.disk("host/mmc1:1/block/mmcblk1", "179:8");
    machine.bus("host/mmc1:1", "mmc");
    machine.temporary.file("sys/devices/host/mmc1:1/type", "SD\n");
    CHECK(!machine.isRemovable("2 1 179:0 / / rw - ext4 x rw"));
    CHECK(machine.isRemovable("2 1 179:8 / /mnt rw - ext4 x rw"));
}

TEST_CASE("a disk behind a port that is open to the outside is removable")
{
    const Machine machine;
    machine.disk("pci0/port/nvme/nvme0n1", "259:0");
    machine.temporary.file("sys/devices/pci0/port/removable", "removable\n");
    machine.disk("pci0/inner/nvme/nvme1n1", "259:1");
    machine.temporary.file("sys/devices/pci0/inner/removable", "fixed\n");
    CHECK(machine.isRemovable("2 1 259:0 / /mnt rw - ext4 x rw"));
    CHECK(!machine.isRemovable("2 1 259:1 / /mnt rw - ext4 x rw"));
}

TEST_CASE("an encrypted volume is as removable as the disks below it")
{
    const Machine machine;
    const std::string stick = machine.partition(machine.disk("usb/sdc", "8:32", "1"), "sdc1", "8:33");
    const std::string fixed = machine.disk("ata/sda", "8:0");
    const std::string pool = machine.disk("virtual/dm-0", "253:0");
    machine.slave(pool, stick);
    const std::string volume = machine.disk("virtual/dm-1", "253:1");
    machine.slave(volume, pool);
    const std::string other = machine.disk("virtual/dm-2", "253:2");
    machine.slave(other, fixed);
    CHECK(machine.isRemovable("2 1 253:1 / /mnt rw - ext4 x rw"));
    CHECK(!machine.isRemovable("2 1 253:2 / /mnt rw - ext4 x rw"));
}

TEST_CASE("devices that lie on one another in circles come to an end")
{
    const Machine machine;
    const std::string one = machine.disk("virtual/dm-0", "253:0");
    const std::string two = machine.disk("virtual/dm-1", "253:1");
    machine.slave(one, two);
    machine.slave(two, one);
    CHECK(!machine.isRemovable("2 1 253:0 / /mnt rw - ext4 x rw"));
}

TEST_CASE("a disk image is as removable as the disk that its file lies on")
{
    const Machine machine;
    machine.disk("usb/sdb", "8:16", "1");
    machine.temporary.file(machine.disk("virtual/loop0", "7:0") + "/loop/backing_file", "/media/stick/image\n");
    const std::string table = "1 0 8:0 / / rw - ext4 /dev/sda rw\n2 1 8:16 / /media/stick rw - vfat /dev/sdb rw\n";
    CHECK(machine.isRemovable("3 1 7:0 / /mnt rw - ext4 /dev/loop0 rw", table));
    CHECK(!machine.isRemovable("3 1 7:0 / /mnt rw - ext4 /dev/loop0 rw"));
}

TEST_CASE("a file system without a device number is found by its source")
{
    const Machine machine;
    machine.disk("usb/sdb", "8:16", "1");
    machine.temporary.file("dev/sdb");
    machine.temporary.link("dev/mapper/stick", "../sdb");
    CHECK(machine.isRemovable("2 1 0:40 /@ /mnt rw - btrfs /dev/sdb rw,subvol=/@"));
    CHECK(machine.isRemovable("2 1 0:40 / /mnt rw - btrfs /dev/mapper/stick rw"));
    CHECK(!machine.isRemovable("2 1 0:40 / /mnt rw - btrfs /dev/unknown rw"));
}

TEST_CASE("a device in a folder of its own below /dev is found")
{
    const Machine machine;
    machine.disk("pci/cciss!c0d0", "104:0", "1");
    machine.temporary.file("dev/cciss/c0d0");
    CHECK(machine.isRemovable("2 1 0:40 / /mnt rw - btrfs /dev/cciss/c0d0 rw"));
}

TEST_CASE("without a device the place tells, and without /sys nothing does")
{
    const Machine machine;
    CHECK(machine.isRemovable("2 1 0:40 / /media/me/x rw - fuse.sshfs host: rw"));
    CHECK(machine.isRemovable("2 1 0:40 / /run/media/me/x rw - fuse.sshfs host: rw"));
    CHECK(!machine.isRemovable("2 1 0:40 / /mediax rw - fuse.sshfs host: rw"));
    CHECK(!machine.isRemovable("1 0 0:40 / / rw - overlay overlay rw"));
    const BlockDevices none({ "/nonexistent", "/nonexistent", "/nonexistent" });
    CHECK(!none.isRemovable(platform::parseMountTable("2 1 0:40 / /media/x rw - fuse.sshfs h: rw").front(), {}));
    CHECK(!none.isRemovable(platform::parseMountTable("2 1 8:16 / /media/x rw - ext4 /dev/sdb rw").front(), {}));
}

TEST_CASE("the label is the name of the link to the device, escapes undone")
{
    const Machine machine;
    machine.temporary.file("dev/sdb1");
    machine.temporary.file("dev/dm-0");
    machine.temporary.link("dev/mapper/secret", "../dm-0");
    machine.temporary.link("dev/disk/by-label/My\\x20Stick\\x2f\\xzz\\x4", "../../sdb1");
    machine.temporary.link("dev/disk/by-label/Secret", "../../dm-0");
    machine.temporary.link("dev/disk/by-label/Broken", "../../gone");
    const BlockDevices devices = machine.devices();
    CHECK(devices.label(mountOfSource("/dev/sdb1")) == "My Stick/\\xzz\\x4");
    CHECK(devices.label(mountOfSource("/dev/mapper/secret")) == "Secret");
    CHECK(devices.label(mountOfSource("/dev/sdc1")).empty());
    CHECK(devices.label(mountOfSource("host:/x")).empty());
    CHECK(BlockDevices({ "/x", "/x", "/x" }).label(mountOfSource("/dev/sdb1")).empty());
}
