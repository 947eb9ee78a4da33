#pragma once

#include "tests/live/LiveMachine.h"

#include <string>
#include <string_view>

namespace tests {

/// Where on the disks of a machine something is to happen, drawn from the seed.
class RandomPlaces {
public:
    /// `machine` outlives this object.
    explicit RandomPlaces(LiveMachine& machine)
        : _machine(machine)
        , _chance(machine.chance())
        , _disk(machine.disk())
    {
    }

    /// A folder called `kind` where libraries may lie, whether or not it exists.
    std::string library(std::string_view kind);
    /// A library, a folder in one, or one elsewhere.
    std::string anyFolder();
    /// Something in a folder, or at times a whole library.
    std::string anyItem();
    /// One of a few, so that names meet again.
    std::string newName();
    std::string freePath();
    /// A folder of movies or clips more often than not.
    std::string folderOfFiles();
    /// What a file holds that may be a movie.
    std::string movie();

private:
    const LiveMachine& _machine;
    Chance& _chance;
    const LiveDisk& _disk;
};

} // namespace tests
