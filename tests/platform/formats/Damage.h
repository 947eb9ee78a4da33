#pragma once

#include <string>

namespace platform {

/// Calls `visit` with `bytes` cut short after each byte, and with each byte changed in three ways.
template <typename Visit> void forEachDamage(const std::string& bytes, Visit visit)
{
    for (std::size_t length = 0; length < bytes.size(); ++length)
        visit(bytes.substr(0, length));
    for (std::size_t index = 0; index < bytes.size(); ++index) {
        for (int flip : { 0x01, 0x80, 0xFF }) {
            std::string damaged = bytes;
            damaged[index] = static_cast<char>(damaged[index] ^ flip);
            visit(damaged);
        }
    }
}

} // namespace platform
