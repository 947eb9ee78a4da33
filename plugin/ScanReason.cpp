#include "plugin/ScanReason.h"

#include "platform/PathText.h"

#include <algorithm>

using platform::FileSystem;
using platform::FolderItem;
using platform::ItemKind;

namespace {

/// Of an item that could be named but not looked at, so that no rule about its kind says anything.
constexpr ScanFailure folderIsClosed { "its folder may be listed but not searched, so nothing is known of it",
    "permit searching its folder (chmod +x)" };

std::string lowerCase(std::string_view text)
{
    std::string lower(text);
    std::transform(lower.begin(), lower.end(), lower.begin(),
        [](char letter) { return letter >= 'A' && letter <= 'Z' ? static_cast<char>(letter - 'A' + 'a') : letter; });
    return lower;
}

} // namespace

ScanReason scanReason(
    const FileSystem& fileSystem, const ScanRule& rule, const FolderItem& item, const std::string& path)
{
    if (!rule.marker.empty())
        return reasonOfMarker(fileSystem, rule, path);
    if (!rule.remedyOfDeadLink.empty()) {
        if (fileSystem.isOutOfReach(path))
            return folderIsClosed;
        if (item.kind == ItemKind::symbolicLink && !fileSystem.exists(path))
            return { "it is a symbolic link that leads nowhere", rule.remedyOfDeadLink };
    }
    ScanReason reason = rule.failureOf ? rule.failureOf(item) : ScanReason(rule.failure);
    if (const std::string name = rules::nameWithLowerCaseExtension(item.name); &rule == &rules::hasMovieExtension
        && !name.empty()
        && fileSystem.linkStatus(platform::pathJoined(platform::pathByRemovingLastComponent(path), name)))
        reason.remedy
            = "give it another name, one that is free and ends in ." + std::string(platform::extensionOfName(name));
    return reason;
}

ScanReason reasonOfMarker(const FileSystem& fileSystem, const ScanRule& rule, const std::string& path)
{
    const std::string marker = platform::pathJoined(path, rule.marker);
    if (fileSystem.isOutOfReach(marker)) {
        const std::string unknown = ", so whether it holds " + std::string(rule.marker) + " is not known";
        if (fileSystem.isOutOfReach(path))
            return { "its folder may be listed but not searched" + unknown, folderIsClosed.remedy };
        return { "it may not be searched" + unknown, "permit searching it (chmod +x)" };
    }
    if (fileSystem.linkStatus(marker))
        return { "its " + std::string(rule.marker) + " is a symbolic link that leads nowhere", rule.failure.remedy };
    return rule.failure;
}

ScanReason rules::reasonOfExtension(std::string_view name)
{
    const std::string_view extension = platform::extensionOfName(name);
    if (extension.empty())
        return hasMovieExtension.failure;
    const std::string renamed = nameWithLowerCaseExtension(name);
    return { "the extension \"" + std::string(extension)
            + "\" is not one of mov, m4v, mp4, 3gp (case matters for project movies)",
        renamed.empty() ? std::string(hasMovieExtension.failure.remedy) : "rename it to " + renamed };
}

std::string rules::nameWithLowerCaseExtension(std::string_view name)
{
    const std::string lower = lowerCase(platform::extensionOfName(name));
    const bool isOnlyCase = std::find(movieExtensions.begin(), movieExtensions.end(), lower) != movieExtensions.end();
    return isOnlyCase ? std::string(platform::nameWithoutExtension(name)) + "." + lower : std::string();
}
