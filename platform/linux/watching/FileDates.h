#pragma once

#include "platform/Value.h"

#include <cstdint>

#include <sys/stat.h>

namespace platform {

/// When the item was last changed in any way, which nobody can set (inode(7), st_ctim).
inline Date changeDate(const struct stat& facts)
{
    return { facts.st_ctim.tv_sec, static_cast<std::uint32_t>(facts.st_ctim.tv_nsec) };
}

} // namespace platform
