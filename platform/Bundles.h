#pragma once

#include "platform/Value.h"

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace platform {

/// What a plug-in bundle says of itself, read without running its code.
struct BundleManifest {
    std::string identifier; ///< such as "org.ombrix.OBMontaroPlugin"
    std::string version; ///< for people
    int hostInterfaceMinimum = 0; ///< the range of host interface versions it was made for
    int hostInterfaceMaximum = 0;
    std::string library; ///< file name inside the bundle
    std::string className; ///< the manager's class, for people and logs
    std::vector<std::string> languages; ///< of its string tables; the first is the one to fall back to
};

/// A manifest, or why there is none.
struct ManifestAnswer {
    BundleManifest manifest;
    std::string problem; ///< one line that names the file and, where it is known, the line in it; empty when read
};

/// A string table: a dictionary of texts, or null, and why.
struct StringTableAnswer {
    Value table;
    std::string problem;
};

/// The entry point of a plug-in's library, or why there is none.
struct LibraryAnswer {
    void* entryPoint = nullptr;
    std::string problem;
};

/// A picture in a bundle.
struct ImageResource {
    std::string file; ///< absolute path
    Size size; ///< natural size in points; zero when the picture does not tell
};

/// Reads bundles and loads the code in them. Any thread. None throws.
class Bundles {
public:
    virtual ~Bundles() = default;

    /// Reads `manifest.json` of the bundle in `folder`. Unknown keys are refused, like missing ones.
    virtual ManifestAnswer readManifest(std::string_view folder) const = 0;

    /// Reads `resources/LANGUAGE.strings.plist` of the bundle in `folder`, a property list of texts.
    virtual StringTableAnswer readStringTable(std::string_view folder, std::string_view language) const = 0;

    /// The picture `resources/NAME.svg` of the bundle in `folder`; absent when there is none. Its pixels are not read.
    virtual std::optional<ImageResource> imageResource(std::string_view folder, std::string_view name) const = 0;

    /// Loads the library at `path`, for good, and answers the function that it exports as `symbol`.
    virtual LibraryAnswer loadLibrary(const std::string& path, const char* symbol) = 0;

    /// The folder in which bundles are installed for the program or library that runs; absolute.
    virtual std::string installedPluginsFolder() const = 0;
};

} // namespace platform
