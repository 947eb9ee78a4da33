#pragma once

#include "platform/common/LinkedFileSystem.h"
#include "platform/linux/LinuxFileSystem.h"
#include "tests/support/BareMachine.h"
#include "tests/support/DescribedMachine.h"
#include "tests/support/TemporaryFolder.h"

#include <string>
#include <string_view>

namespace tests {

// The machines on which the rules of the file system are checked. Each has a real folder to work in, `disk`, which
// programs on that machine know as `root`.

/// The kernel's own view.
struct KernelMachine {
    TemporaryFolder disk {};
    platform::LinuxFileSystem files {};
    std::string root = disk.path();
};

/// This machine as programs see it, with links to its volumes, none of which is on the way.
struct MachineWithVolumes {
    TemporaryFolder disk {};
    platform::LinuxFileSystem kernel {};
    ListedVolumes volumes {};
    platform::LinkTable table { {}, volumes, kernel };
    platform::LinkedFileSystem files { kernel, table };
    std::string root = disk.path();
};

/// The same, where everything is reached through the link to a volume.
struct MachineBelowVolume : MachineWithVolumes {
    MachineBelowVolume()
    {
        volumes.local = { { disk.path(), "Ombrix Test Disk" } };
        root = "/Volumes/Ombrix Test Disk";
    }
};

/// A described machine with links, none of which is on the way.
struct DescribedMachineWithLinks {
    TemporaryFolder disk {};
    TemporaryFolder other {};
    DescribedMachine description {};
    platform::LinuxFileSystem kernel {};
    BareMachine base { kernel };
    std::string root = disk.path();
    const platform::FileSystem& files = described();

private:
    const platform::FileSystem& described()
    {
        description.link("/Ombrix Test Link", "/elsewhere").link("/Ombrix Test Root", disk.path());
        return description.platform(other.path("machine.json"), base.platform()).fileSystem;
    }
};

/// The same, where everything is reached through a link of the description.
struct DescribedMachineBelowLink : DescribedMachineWithLinks {
    DescribedMachineBelowLink() { root = "/Ombrix Test Root"; }
};

} // namespace tests

#define OMBRIX_ALL_FILE_MACHINES                                                                                       \
    tests::KernelMachine, tests::MachineWithVolumes, tests::MachineBelowVolume, tests::DescribedMachineWithLinks,      \
        tests::DescribedMachineBelowLink
