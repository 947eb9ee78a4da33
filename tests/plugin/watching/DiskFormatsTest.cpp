#include "tests/plugin/support/SourceMachine.h"

#include "host/OBMediaManagerClass.h"

#include <doctest/doctest.h>

using namespace tests;

TEST_CASE("six types of file systems are refused by their exact names, and what does not exist")
{
    SourceMachine machine;
    const OBMediaManagerClass* const sourceClass = machine.host->managerClass("org.ombrix.OBMontaroPlugin");
    REQUIRE(sourceClass);
    std::optional<std::string> typeOfDisk;
    machine.volumes.typeOfPath = [&typeOfDisk](std::string_view path) {
        CHECK(path == "/Volumes/Disk/a");
        return typeOfDisk;
    };
    const auto isValid = [&](const std::optional<std::string>& type) {
        typeOfDisk = type;
        return sourceClass->validDiskFormat("/Volumes/Disk/a");
    };
    for (const char* type : { "msdos", "ntfs", "nfs", "orbfs", "webdav", "udf" })
        CHECK_FALSE(isValid(type));
    for (const char* type : { "ext4", "exfat", "NTFS", "nfs4", "msdo", "udf ", "", "unknown" })
        CHECK(isValid(type));
    CHECK_FALSE(isValid(std::nullopt));
}
