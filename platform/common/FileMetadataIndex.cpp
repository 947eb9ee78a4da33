#include "platform/common/FileMetadataIndex.h"

#include "platform/FileSystem.h"
#include "platform/Movies.h"
#include "platform/PathText.h"

#include <algorithm>
#include <array>
#include <utility>

namespace platform {

namespace {

    bool isSameLetter(char left, char right)
    {
        const auto lower = [](char letter) {
            return letter >= 'A' && letter <= 'Z' ? static_cast<char>(letter - 'A' + 'a') : letter;
        };
        return lower(left) == lower(right);
    }

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

bool isMovieName(std::string_view name)
{
    constexpr std::array<std::string_view, 4> extensions { "mov", "m4v", "mp4", "3gp" };
    const std::string_view extension = extensionOfName(name);
    return std::any_of(extensions.begin(), extensions.end(), [extension](std::string_view candidate) {
        return std::equal(extension.begin(), extension.end(), candidate.begin(), candidate.end(), isSameLetter);
    });
}

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
    if (status->kind != ItemKind::file || !isMovieName(name))
        return attributes;
    attributes.emplace_back("kMDItemContentType", movieContentType);
    if (const std::optional<MovieHeader> header = _movies.headerOfMovie(path))
        appendMovieAttributes(attributes, *header);
    return attributes;
}

} // namespace platform
