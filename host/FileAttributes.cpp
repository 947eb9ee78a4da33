#include "host/FileAttributes.h"

#include "platform/ContentTypes.h"
#include "platform/MetadataIndex.h"
#include "platform/PathText.h"
#include "platform/Platform.h"

#include <algorithm>
#include <array>

namespace {

constexpr std::string_view nameKey = "kMDItemFSName";
constexpr std::string_view pathKey = "kMDItemPath";
constexpr std::string_view contentTypeKey = "kMDItemContentType";
constexpr std::string_view sizeKey = "kMDItemFSSize";
constexpr std::string_view changeDateKey = "kMDItemFSContentChangeDate";
constexpr std::string_view creationDateKey = "kMDItemFSCreationDate";

constexpr std::array<MetadataAttribute, 9> attributes { {
    { nameKey, MetadataKind::text, MetadataOrigin::path },
    { pathKey, MetadataKind::text, MetadataOrigin::path },
    { contentTypeKey, MetadataKind::text, MetadataOrigin::path },
    { sizeKey, MetadataKind::number, MetadataOrigin::status },
    { changeDateKey, MetadataKind::date, MetadataOrigin::status },
    { creationDateKey, MetadataKind::date, MetadataOrigin::status },
    { "kMDItemDurationSeconds", MetadataKind::number, MetadataOrigin::contents },
    { "kMDItemPixelWidth", MetadataKind::number, MetadataOrigin::contents },
    { "kMDItemPixelHeight", MetadataKind::number, MetadataOrigin::contents },
} };

} // namespace

std::span<const MetadataAttribute> metadataAttributes()
{
    return attributes;
}

const MetadataAttribute* metadataAttributeNamed(std::string_view name)
{
    const auto* found = std::find_if(attributes.begin(), attributes.end(),
        [name](const MetadataAttribute& attribute) { return attribute.name == name; });
    return found == attributes.end() ? nullptr : found;
}

std::optional<std::string_view> FileAttributes::text(const MetadataAttribute& attribute) const
{
    if (attribute.name == pathKey)
        return _path;
    const std::string_view name = platform::lastPathComponent(_path);
    if (attribute.name == nameKey)
        return name;
    const std::string_view type = platform::contentTypeOfName(name);
    return type.empty() ? std::nullopt : std::optional(type);
}

platform::Value FileAttributes::fact(const MetadataAttribute& attribute)
{
    if (!_platform)
        return {};
    if (attribute.origin == MetadataOrigin::status)
        return factOfStatus(attribute.name);
    if (!_ofContents)
        _ofContents = _platform->metadataIndex.attributesOfFile(_path);
    return _ofContents->valueForKey(attribute.name);
}

platform::Value FileAttributes::factOfStatus(std::string_view name)
{
    if (!_status)
        _status = _platform->fileSystem.linkStatus(_path);
    if (!_status || _status->kind != platform::ItemKind::file)
        return {};
    if (name == sizeKey)
        return static_cast<std::int64_t>(_status->size);
    return name == changeDateKey ? _status->modificationDate : _status->creationDate;
}
