#pragma once

#include "platform/linux/Descriptor.h"

#include <cstddef>
#include <string_view>

#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>

namespace platform {

/// Calls `take` with the name of each entry of the open `folder`, and whether that is a folder, links not followed.
/// False when the disk fails, or the folder has no end.
template <class Take> bool forEachEntry(int folder, const Take& take)
{
    constexpr std::size_t entriesAtMost = 20'000'000;
    alignas(dirent64) char block[32 * 1024];
    for (std::size_t count = 0; count < entriesAtMost;) {
        const ssize_t length = uninterrupted([&] { return getdents64(folder, block, sizeof(block)); });
        if (length <= 0)
            return length == 0;
        for (ssize_t offset = 0; offset < length; ++count) {
            const auto* entry = reinterpret_cast<const dirent64*>(block + offset);
            offset += entry->d_reclen;
            const std::string_view name = entry->d_name;
            if (name == "." || name == "..")
                continue;
            struct stat facts;
            const bool isTold = entry->d_type != DT_UNKNOWN;
            const bool isFolder = isTold
                ? entry->d_type == DT_DIR
                : fstatat(folder, entry->d_name, &facts, AT_SYMLINK_NOFOLLOW) == 0 && S_ISDIR(facts.st_mode);
            take(name, isFolder);
        }
    }
    return false;
}

} // namespace platform
