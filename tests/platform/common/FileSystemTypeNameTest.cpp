#include "platform/common/FileSystemTypeName.h"

#include <doctest/doctest.h>

#include <string>

using platform::shortFileSystemTypeName;

TEST_CASE("file systems of one family have one short name")
{
    for (const char* name : { "vfat", "msdos", "fat", "fuse.vfat" })
        CHECK(shortFileSystemTypeName(name) == "msdos");
    for (const char* name : { "ntfs", "ntfs3", "fuseblk", "fuse.ntfs-3g", "fuse.ntfs" })
        CHECK(shortFileSystemTypeName(name) == "ntfs");
    for (const char* name : { "nfs", "nfs4", "nfs3" })
        CHECK(shortFileSystemTypeName(name) == "nfs");
    for (const char* name : { "davfs", "fuse.davfs", "webdav" })
        CHECK(shortFileSystemTypeName(name) == "webdav");
    CHECK(shortFileSystemTypeName("udf") == "udf");
}

TEST_CASE("what has no short name keeps the kernel's, after what says that it is of FUSE")
{
    for (const std::string name : { "ext4", "exfat", "btrfs", "zfs", "", "fuse" })
        CHECK(shortFileSystemTypeName(name) == name);
    CHECK(shortFileSystemTypeName("fuse.sshfs") == "sshfs");
    CHECK(shortFileSystemTypeName("fuse.exfat") == "exfat");
}
