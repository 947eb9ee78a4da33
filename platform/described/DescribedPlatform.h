#pragma once

#include "platform/Platform.h"

#include <memory>
#include <string>

namespace platform {

struct MachineDescription;

/// The machine that a description tells of, laid over another: files, links, volumes, the editor and the preferences
/// are those of the description, everything else is the other machine's.
///
/// File contents stay real. Links that the other machine adds to those on disk do not exist here.
class DescribedPlatform {
public:
    /// The roles of `base` outlive this object.
    DescribedPlatform(const MachineDescription& description, const Platform& base);
    ~DescribedPlatform();

    /// Valid while this object lives.
    Platform platform() const;

private:
    struct Roles;

    const std::unique_ptr<Roles> _roles;
    const Platform _base;
};

/// A described machine, or why there is none.
struct DescribedPlatformResult {
    std::unique_ptr<DescribedPlatform> machine;
    std::string problem; ///< one line that begins with the file's name as it was given, and the line in it; else empty
};

/// Reads the description in `file`, which is absolute or relative to the current folder, and lays it over `base`.
DescribedPlatformResult describedPlatform(const std::string& file, const Platform& base);

} // namespace platform
