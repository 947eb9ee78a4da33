#pragma once

#include <string>

namespace platform {

// In an ordered collection of paths, what lies below a folder stands together, though not always right behind it: "a b"
// comes between "a" and "a/c".

/// What comes before the first path below `folder` and behind no other one.
inline std::string beforeAllBelow(const std::string& folder)
{
    return folder == "/" ? folder : folder + '/';
}

/// What comes behind the last path below `folder` and before every other one.
inline std::string behindAllBelow(const std::string& folder)
{
    constexpr char afterSlash = '/' + 1;
    return (folder == "/" ? std::string() : folder) + afterSlash;
}

/// Erases `folder` and what lies below it from a map by paths; calls `take` with each entry first.
template <class Map, class Take> void eraseSameOrBelow(Map& map, const std::string& folder, const Take& take)
{
    if (const auto entry = map.find(folder); entry != map.end()) {
        take(*entry);
        map.erase(entry);
    }
    const auto last = map.lower_bound(behindAllBelow(folder));
    for (auto entry = map.lower_bound(beforeAllBelow(folder)); entry != last; entry = map.erase(entry))
        take(*entry);
}

} // namespace platform
