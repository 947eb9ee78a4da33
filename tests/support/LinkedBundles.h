#pragma once

#include "platform/linux/LinuxBundles.h"

#include <string>

namespace tests {

/// Bundles on disk whose code is linked into the test program, so that the test reaches the plug-in's own functions.
class LinkedBundles : public platform::LinuxBundles {
public:
    /// `entryPoint` is the C entry point of the plug-in.
    LinkedBundles(const platform::FileSystem& kernel, void* entryPoint)
        : LinuxBundles(kernel)
        , _entryPoint(entryPoint)
    {
    }
    platform::LibraryAnswer loadLibrary(const std::string&, const char*) override { return { _entryPoint, {} }; }

private:
    void* const _entryPoint;
};

} // namespace tests
