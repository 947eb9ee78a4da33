#include "platform/linux/MountTable.h"

#include "fuzz/FuzzTarget.h"

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const std::vector<platform::Mount> lines = platform::parseMountTable(fuzz::text(data, size));
    const platform::MountTable table(lines);
    fuzz::expect(table.mounts().size() <= lines.size());
    for (const platform::Mount& mount : table.mounts()) {
        fuzz::expect(mount.mountPoint.starts_with('/'));
        fuzz::expect(table.mountAt(mount.mountPoint) == &mount);
        fuzz::expect(table.mountHolding(mount.mountPoint) != nullptr);
        platform::isLocalVolume(mount);
    }
    return 0;
}
