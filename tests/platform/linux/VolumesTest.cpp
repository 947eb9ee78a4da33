#include "platform/linux/LinuxFileSystem.h"
#include "platform/linux/LinuxVolumes.h"
#include "tests/platform/linux/Environment.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <string>
#include <vector>

#include <sys/mount.h>

using platform::LinuxFileSystem;
using platform::LinuxVolumes;
using tests::TemporaryFolder;

namespace {

using Paths = std::vector<std::string>;

/// A machine whose mount table a test writes.
struct Machine {
    explicit Machine(const std::string& table) { temporary.file("proc/self/mountinfo", table); }
    std::string mountPoint(const std::string& name) const { return temporary.path(name); }
    LinuxVolumes volumes() const
    {
        return LinuxVolumes(files, { temporary.path("proc"), temporary.path("sys"), temporary.path("dev") });
    }

    TemporaryFolder temporary;
    LinuxFileSystem files;
};

} // namespace

TEST_CASE("only folders are volumes, and each is listed once")
{
    Machine machine("");
    const std::string disk = machine.temporary.folder("disk");
    const std::string file = machine.temporary.file("file");
    machine.temporary.file("proc/self/mountinfo",
        "900001 0 8:1 / / rw - ext4 /dev/a rw\n900002 900001 8:2 / " + disk
            + " rw - ext4 /dev/b rw\n900003 900002 8:2 / " + disk + " rw - xfs /dev/b rw\n900004 900001 8:3 / " + file
            + " rw - ext4 /dev/c rw\n900005 900001 8:4 / " + machine.mountPoint("missing") + " rw - ext4 /dev/d rw\n");
    CHECK(machine.volumes().localVolumes() == Paths { "/", disk });
}

TEST_CASE("without a mount table there is the root alone, nothing removable, and types still are told")
{
    const LinuxFileSystem files;
    const LinuxVolumes volumes(files, { "/nonexistent", "/nonexistent", "/nonexistent" });
    CHECK(volumes.localVolumes() == Paths { "/" });
    CHECK(volumes.removableMedia().empty());
    CHECK(volumes.displayName("/") == "/");
    CHECK(volumes.displayName("/a/b c/") == "b c");
    CHECK(volumes.fileSystemType("/proc") == "proc");
    CHECK(!volumes.fileSystemType("/nonexistent"));
    CHECK(volumes.generation() == 0);
}

TEST_CASE("removable media are found by the device that the table names")
{
    Machine machine("");
    const std::string stick = machine.temporary.folder("stick");
    machine.temporary.file("proc/self/mountinfo",
        "900001 0 8:1 / / rw - ext4 /dev/a rw\n900002 900001 8:17 / " + stick + " rw - vfat /dev/sdb1 rw\n");
    machine.temporary.file("sys/devices/sdb/removable", "1\n");
    machine.temporary.file("sys/devices/sdb/sdb1/partition", "1\n");
    machine.temporary.link("sys/dev/block/8:17", machine.temporary.path("sys/devices/sdb/sdb1"));
    CHECK(machine.volumes().removableMedia() == Paths { stick });
}

TEST_CASE("a volume goes by its label, any other path by its last component")
{
    Machine machine("");
    const std::string stick = machine.temporary.folder("stick");
    const std::string plain = machine.temporary.folder("plain");
    machine.temporary.file("dev/sdb1");
    machine.temporary.link("dev/disk/by-label/Summer\\x20Trip", "../../sdb1");
    machine.temporary.file("proc/self/mountinfo",
        "900001 0 8:1 / / rw - ext4 /dev/a rw\n900002 900001 8:17 / " + stick
            + " rw - vfat /dev/sdb1 rw\n900003 900001 0:17 / " + plain + " rw - nfs4 /dev/sdb1 rw\n");
    const LinuxVolumes volumes = machine.volumes();
    CHECK(volumes.displayName(stick) == "Summer Trip");
    CHECK(volumes.displayName(stick + "/") == "Summer Trip");
    CHECK(volumes.displayName(stick + "/x") == "x");
    CHECK(volumes.displayName(plain) == "plain");
}

TEST_CASE("the type of a file system is that of the mount that holds the real path")
{
    Machine machine("");
    const std::string stick = machine.temporary.folder("stick");
    machine.temporary.file("stick/folder/file");
    const std::string link = machine.temporary.link("link", "stick/folder");
    const auto typeOf = [&](const std::string& path, const std::string& kernelName) {
        machine.temporary.file("proc/self/mountinfo",
            "900001 0 8:1 / / rw - ext4 /dev/a rw\n900002 900001 8:17 / " + stick + " rw - " + kernelName + " x rw\n");
        return machine.volumes().fileSystemType(path);
    };
    CHECK(typeOf(stick, "vfat") == "msdos");
    CHECK(typeOf(link, "ntfs3") == "ntfs");
    CHECK(typeOf(link + "/file", "fuse.davfs") == "webdav");
    CHECK(typeOf(stick, "exfat") == "exfat");
    CHECK(typeOf(machine.temporary.path("dev/.."), "vfat") == std::nullopt);
    CHECK(typeOf(machine.temporary.path(), "vfat") == "ext4");
    CHECK(typeOf(stick + "/missing", "vfat") == std::nullopt);
}

TEST_CASE("a mount is a change, hides what is below it, and is told by its type")
{
    const TemporaryFolder temporary;
    temporary.folder("place/inner");
    const auto check = [&] {
        const LinuxFileSystem files;
        const LinuxVolumes volumes(files);
        const auto before = volumes.generation();
        if (mount("memory", temporary.path("place").c_str(), "tmpfs", 0, nullptr) != 0)
            return false;
        const auto after = volumes.generation();
        // A disk in memory is no volume, and a folder of a disk mounted elsewhere is none either.
        const auto listed = volumes.localVolumes();
        const bool isListed = std::find(listed.begin(), listed.end(), temporary.path("place")) != listed.end();
        return before != 0 && after != before && volumes.generation() == after && !isListed
            && volumes.fileSystemType(temporary.path("place")) == "tmpfs"
            && !volumes.fileSystemType(temporary.path("place/inner"));
    };
    const tests::ChildAnswer answer = tests::askWithOwnMounts(check);
    if (answer == tests::ChildAnswer::impossible)
        MESSAGE("this system lets nobody have mounts of his own");
    CHECK(answer != tests::ChildAnswer::no);
}
