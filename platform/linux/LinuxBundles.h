#pragma once

#include "platform/Bundles.h"

namespace platform {

class FileSystem;

/// Bundles as folders, with shared libraries that the system's loader loads. Any thread.
class LinuxBundles : public Bundles {
public:
    /// `files` outlives this object.
    explicit LinuxBundles(const FileSystem& files);

    ManifestAnswer readManifest(std::string_view folder) const override;
    StringTableAnswer readStringTable(std::string_view folder, std::string_view language) const override;
    std::optional<ImageResource> imageResource(std::string_view folder, std::string_view name) const override;
    LibraryAnswer loadLibrary(const std::string& path, const char* symbol) override;
    /// `ombrix/plugins` beside the framework's library; else below the `lib` folder that belongs to the program's
    /// `bin`.
    std::string installedPluginsFolder() const override;

private:
    const FileSystem& _files;
};

/// Where bundles may be installed for a program at `program` that has loaded the libraries `libraries`, all absolute;
/// the likeliest first. Asks the disk nothing.
std::vector<std::string> possiblePluginsFolders(std::string_view program, const std::vector<std::string>& libraries);

} // namespace platform
