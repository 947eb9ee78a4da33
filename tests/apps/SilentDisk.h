#pragma once

#include <string>

namespace tests {

/// A disk that never answers, mounted at a folder of this thread's own mounts: FUSE without anybody behind it. Whoever
/// asks it waits until this object ends.
class SilentDisk {
public:
    explicit SilentDisk(const std::string& folder);
    ~SilentDisk();
    SilentDisk(const SilentDisk&) = delete;
    SilentDisk& operator=(const SilentDisk&) = delete;

    /// Whether this system lets one be made.
    bool isThere() const { return _isMounted; }

private:
    const std::string _folder;
    int _device = -1;
    bool _isMounted = false;
};

} // namespace tests
