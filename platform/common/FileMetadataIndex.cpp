#include "platform/common/FileMetadataIndex.h"

#include "platform/ContentTypes.h"
#include "platform/FileSystem.h"
#include "platform/Movies.h"
#include "platform/PathText.h"

#include <utility>

namespace platform {

namespace {

    void appendMovieAttributes(Value::Dictionary& attributes, const MovieHeader& header)
    {
        if (header.duration)
            attributes.emplace_back("kMDItemDurationSeconds", *header.duration);
        if (!header.resolution)
            return;
        attributes.emplace_back("kMDItemPixelWidth", header.resolution->width);
        attributes.emplace_back("kMDItemPixelHeight", header.resolution->height);
    }

} // namespace

FileMetadataIndex::FileMetadataIndex(const FileSystem& files, const Movies& movies)
    : _files(files)
    , _movies(movies)
{
}

Value FileMetadataIndex::attributesOfFile(std::string_view path) const
{
    const std::optional<ItemStatus> status = _files.status(path);
    if (!status)
        return {};
    const std::string_view name = lastPathComponent(path);
    Value::Dictionary attributes;
    attributes.emplace_back("kMDItemFSName", name);
    attributes.emplace_back("kMDItemPath", path);
    if (status->kind == ItemKind::file)
        attributes.emplace_back("kMDItemFSSize", static_cast<std::int64_t>(status->size));
    attributes.emplace_back("kMDItemFSContentChangeDate", status->modificationDate);
    attributes.emplace_back("kMDItemFSCreationDate", status->creationDate);
    const std::string_view contentType = status->kind == ItemKind::file ? contentTypeOfName(name) : std::string_view();
    if (contentType.empty())
        return attributes;
    attributes.emplace_back("kMDItemContentType", contentType);
    if (const std::optional<MovieHeader> header = _movies.headerOfMovie(path))
        appendMovieAttributes(attributes, *header);
    return attributes;
}

} // namespace platform
