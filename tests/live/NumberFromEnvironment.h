#pragma once

#include <cstdint>
#include <cstdlib>

namespace tests {

/// What whoever runs the tests by hand wants in place of `otherwise`.
inline std::uint64_t numberFromEnvironment(const char* name, std::uint64_t otherwise)
{
    const char* const text = std::getenv(name);
    return text ? std::strtoull(text, nullptr, 10) : otherwise;
}

} // namespace tests
