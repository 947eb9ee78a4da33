#pragma once

#include "platform/Platform.h"

#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace platform {
class DescribedPlatform;
}

namespace tests {

/// Writes a machine description and runs on it.
///
/// Build first, then ask for the platform: what is told later does not change it.
class DescribedMachine {
public:
    DescribedMachine();
    ~DescribedMachine();

    DescribedMachine& home(const std::string& path);
    DescribedMachine& editor(const std::string& path);
    DescribedMachine& localVolume(const std::string& path, std::optional<std::string> displayName = {},
        std::optional<std::string> fileSystem = {});
    DescribedMachine& removableMedium(const std::string& path, std::optional<std::string> displayName = {},
        std::optional<std::string> fileSystem = {});
    DescribedMachine& link(const std::string& path, const std::string& target);

    /// The description as it stands now.
    std::string json() const;
    /// Writes it to `file`, for `--machine`.
    void write(const std::string& file) const;

    /// The described machine laid over `base`, through a file at `file`. Valid while this object and `base` live.
    platform::Platform platform(const std::string& file, const platform::Platform& base);

private:
    struct Volume {
        std::string path;
        std::optional<std::string> displayName;
        std::optional<std::string> fileSystem;
    };
    struct Link {
        std::string path;
        std::string target;
    };

    static std::string jsonOf(const std::vector<Volume>& volumes);

    std::optional<std::string> _home;
    std::optional<std::string> _editor;
    std::vector<Volume> _localVolumes;
    std::vector<Volume> _removableMedia;
    std::vector<Link> _links;
    std::unique_ptr<platform::DescribedPlatform> _machine;
};

} // namespace tests
