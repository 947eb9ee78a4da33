#pragma once

#include "platform/FileSystem.h"
#include "platform/Value.h"

#include <cstdint>
#include <optional>
#include <span>
#include <string_view>

namespace platform {
struct Platform;
}

/// What the values of an attribute are.
enum class MetadataKind : std::uint8_t { text, number, date };

/// Where a plain file's attribute comes from, the cheapest first.
enum class MetadataOrigin : std::uint8_t {
    path, ///< the path tells; nothing is asked
    status, ///< the file system is asked
    contents, ///< the file is opened
};

/// An attribute that a query may ask for.
struct MetadataAttribute {
    std::string_view name;
    MetadataKind kind;
    MetadataOrigin origin;
};

/// The attributes of the platform's metadata index.
std::span<const MetadataAttribute> metadataAttributes();
/// Null when there is none of that name.
const MetadataAttribute* metadataAttributeNamed(std::string_view name);

/// The attributes of one plain file, each read when it is asked for. One thread; `path` outlives this object.
class FileAttributes {
public:
    /// Knows what the path tells, and nothing else.
    explicit FileAttributes(std::string_view path)
        : _path(path)
    {
    }
    /// `status` where it has been asked for already.
    FileAttributes(
        std::string_view path, const platform::Platform& platform, std::optional<platform::ItemStatus> status = {})
        : _path(path)
        , _platform(&platform)
        , _status(status)
    {
    }

    /// A text; absent when the file has none. Valid while the path is.
    std::optional<std::string_view> text(const MetadataAttribute& attribute) const;
    /// A number or a date; null when the file has none.
    platform::Value fact(const MetadataAttribute& attribute);

private:
    platform::Value factOfStatus(std::string_view name);

    const std::string_view _path;
    const platform::Platform* const _platform = nullptr;
    std::optional<platform::ItemStatus> _status {};
    std::optional<platform::Value> _ofContents {};
};
