#include "host/OBMediaObject.h"

#include "host/FrameworkCore.h"
#include "host/OBConstants.h"
#include "platform/FileSystem.h"
#include "platform/MainRunLoop.h"
#include "platform/MetadataIndex.h"
#include "platform/Movies.h"
#include "platform/PathText.h"
#include "platform/Platform.h"

#include <algorithm>
#include <utility>

using platform::Locked;
using platform::Text;
using platform::Value;

/// Room for what a source usually sets, so that it takes one allocation.
constexpr std::size_t attributesUsually = 4;

/// The fields of an object made by itself, or of one that was changed after its folder made it.
struct OBMediaObject::OwnFields {
    int mediaType = 0;
    int mediaSourceType = 0;
    Text name;
    Text path;
    Text sourcePluginIdentifier;
    OBImageRef icon;
    OBImageRef thumbnail; // set by somebody, in place of the produced one
    OBMarvexPropertiesRef marvexProperties;
    Value::Dictionary attributes;
};

/// What a movie's header told, and the picture that stands for the movie. Refers to the folder's block instead of
/// keeping a path of its own; never to the object, which owns it.
class OBMediaObject::MovieThumbnail final : public OBImage {
public:
    MovieThumbnail(const platform::MovieHeader& header, std::shared_ptr<const OBMediaFolder> folder, Text path,
        std::uint32_t nameOffset, std::uint32_t nameLength)
        : OBImage(header.resolution.value_or(platform::Size {}))
        , _folder(std::move(folder))
        , _path(std::move(path))
        , _nameOffset(nameOffset)
        , _nameLength(nameLength)
        , _header(header)
    {
    }

    bool hasPicture() const { return _header.resolution.has_value(); }
    Value attributeForKey(std::string_view key) const
    {
        if (key == OBMediaObjectResolutionKey && _header.resolution)
            return *_header.resolution;
        return key == OBMediaObjectDurationKey && _header.duration ? Value(*_header.duration) : Value();
    }
    Text name() const override { return "thumbnail"; }
    OBPixelSource pixelSource() const override
    {
        if (!_folder)
            return { OBPixelSource::Kind::movieFile, _path };
        const std::string_view fileName = std::string_view(_folder->fileNames).substr(_nameOffset, _nameLength);
        return { OBPixelSource::Kind::movieFile, Text::joined(_folder->path, "/", fileName) };
    }

private:
    const std::shared_ptr<const OBMediaFolder> _folder;
    const Text _path;
    const std::uint32_t _nameOffset;
    const std::uint32_t _nameLength;
    const platform::MovieHeader _header;
};

OBMarvexProperties::OBMarvexProperties(Text path)
    : _path(std::move(path))
{
}

Value OBMarvexProperties::all() const
{
    Locked guard(_lock);
    if (!_read) {
        const auto core = FrameworkCore::current();
        _read = core ? core->platform().metadataIndex.attributesOfFile(_path) : Value();
    }
    return *_read;
}

Value OBMarvexProperties::valueForKey(std::string_view key) const
{
    return all().valueForKey(key);
}

OBMediaObject::OBMediaObject() = default;
OBMediaObject::~OBMediaObject() = default;

OBMediaObjectRef OBMediaObject::initWithMediaType_name(int mediaType, Text name)
{
    auto object = std::make_shared<OBMediaObject>();
    Locked guard(object->_lock);
    OwnFields& fields = object->own();
    fields.mediaType = mediaType;
    fields.name = std::move(name);
    return object;
}

OBMediaObject::OwnFields& OBMediaObject::own()
{
    if (!_own) {
        auto fields = std::make_unique<OwnFields>();
        if (_folder) {
            fields->mediaType = _folder->kind->mediaType;
            fields->mediaSourceType = _folder->kind->mediaSourceType;
            fields->name = Text(platform::nameWithoutExtension(fileName()));
            fields->path = pathLocked();
            fields->sourcePluginIdentifier = _folder->kind->sourcePluginIdentifier;
            fields->icon = _folder->kind->icon;
        }
        _own = std::move(fields);
    }
    return *_own;
}

std::string_view OBMediaObject::fileName() const
{
    return std::string_view(_folder->fileNames).substr(_nameOffset, _nameLength);
}

Text OBMediaObject::pathLocked() const
{
    if (_own)
        return _own->path;
    return _folder ? Text::joined(_folder->path, "/", fileName()) : Text();
}

int OBMediaObject::mediaType() const
{
    Locked guard(_lock);
    return _own ? _own->mediaType : _folder->kind->mediaType;
}

Text OBMediaObject::name() const
{
    Locked guard(_lock);
    return _own ? _own->name : Text(platform::nameWithoutExtension(fileName()));
}

int OBMediaObject::mediaSourceType() const
{
    Locked guard(_lock);
    return _own ? _own->mediaSourceType : _folder->kind->mediaSourceType;
}

void OBMediaObject::setMediaSourceType(int code)
{
    Locked guard(_lock);
    own().mediaSourceType = code;
}

Text OBMediaObject::sourcePluginIdentifier() const
{
    Locked guard(_lock);
    return _own ? _own->sourcePluginIdentifier : _folder->kind->sourcePluginIdentifier;
}

void OBMediaObject::setSourcePluginIdentifier(Text identifier)
{
    Locked guard(_lock);
    std::swap(own().sourcePluginIdentifier, identifier);
}

Text OBMediaObject::path() const
{
    Locked guard(_lock);
    return pathLocked();
}

void OBMediaObject::setPath(Text path)
{
    Locked guard(_lock);
    std::swap(own().path, path);
    _pathIsReal = false;
}

void OBMediaObject::setPathOfObject(const OBMediaObject& other)
{
    Text path;
    bool isReal = false;
    {
        Locked guard(other._lock);
        path = other.pathLocked();
        isReal = other._pathIsReal;
    }
    Locked guard(_lock);
    std::swap(own().path, path);
    _pathIsReal = isReal;
}

Text OBMediaObject::aliasResolvedPath() const
{
    Text path;
    {
        Locked guard(_lock);
        path = pathLocked();
        if (_pathIsReal)
            return path;
    }
    const auto core = FrameworkCore::current();
    if (!core || path.isAbsent() || !core->platform().fileSystem.exists(path))
        return {};
    return Text(core->platform().fileSystem.resolvedPath(path));
}

OBMarvexPropertiesRef OBMediaObject::marvexProperties(Text path)
{
    return std::make_shared<const OBMarvexProperties>(std::move(path));
}

OBMarvexPropertiesRef OBMediaObject::marvexProperties() const
{
    Text path;
    {
        Locked guard(_lock);
        if (_own && _own->marvexProperties)
            return _own->marvexProperties;
        path = pathLocked();
    }
    return marvexProperties(std::move(path));
}

void OBMediaObject::setMarvexProperties(OBMarvexPropertiesRef properties)
{
    Locked guard(_lock);
    std::swap(own().marvexProperties, properties);
}

/// What was set on the object comes first: it hides what the folder or the movie tells under the same key.
Value OBMediaObject::attributeForKey(std::string_view key) const
{
    Locked guard(_lock);
    if (_own) {
        for (const auto& [name, value] : _own->attributes) {
            if (name == key)
                return value;
        }
    }
    if (_folder) {
        for (const Text& name : _folder->kind->ownPathKeys) {
            if (name == key)
                return pathLocked();
        }
    }
    return _movie ? _movie->attributeForKey(key) : Value();
}

void OBMediaObject::setAttribute_forKey(Value value, Text key)
{
    Locked guard(_lock);
    Value::Dictionary& attributes = own().attributes;
    const auto existing = std::find_if(
        attributes.begin(), attributes.end(), [&](const Value::Entry& entry) { return entry.first == key; });
    if (existing != attributes.end()) {
        existing->second = std::move(value);
        return;
    }
    if (attributes.empty())
        attributes.reserve(attributesUsually);
    attributes.emplace_back(std::move(key), std::move(value));
}

Value::Dictionary OBMediaObject::attributes() const
{
    Value::Dictionary result;
    Locked guard(_lock);
    if (_own)
        result = _own->attributes;
    const auto addMissing = [&result](std::string_view key, Value value) {
        const auto isKey = [key](const Value::Entry& entry) { return entry.first == key; };
        if (!value.isNull() && std::none_of(result.begin(), result.end(), isKey))
            result.emplace_back(Text(key), std::move(value));
    };
    if (_folder) {
        for (const Text& key : _folder->kind->ownPathKeys)
            addMissing(key, pathLocked());
    }
    for (const std::string_view key : { OBMediaObjectResolutionKey, OBMediaObjectDurationKey }) {
        if (_movie)
            addMissing(key, _movie->attributeForKey(key));
    }
    return result;
}

OBImageRef OBMediaObject::icon() const
{
    Locked guard(_lock);
    return _own ? _own->icon : _folder->kind->icon;
}

void OBMediaObject::setIcon(OBImageRef icon)
{
    Locked guard(_lock);
    std::swap(own().icon, icon);
}

OBImageRef OBMediaObject::thumbnailImage()
{
    if (!hasProducedThumbnail()) {
        if (const auto core = FrameworkCore::current())
            core->platform().mainRunLoop.performAndWait([&] { produceThumbnail(core->platform()); });
    }
    return thumbnailIfProduced();
}

void OBMediaObject::setThumbnailImage(OBImageRef image)
{
    Locked guard(_lock);
    _thumbnailProduced = true;
    if (image == _movie && !(_own && _own->thumbnail))
        return;
    std::swap(own().thumbnail, image);
}

OBImageRef OBMediaObject::thumbnailIfProduced() const
{
    Locked guard(_lock);
    if (_own && _own->thumbnail)
        return _own->thumbnail;
    return _movie && _movie->hasPicture() ? _movie : nullptr;
}

bool OBMediaObject::hasProducedThumbnail() const
{
    Locked guard(_lock);
    return _thumbnailProduced;
}

/// Runs on the main thread alone, so that no movie is read twice.
void OBMediaObject::produceThumbnail(const platform::Platform& platform)
{
    Text file;
    auto known = platform::PathKnowledge::none;
    {
        Locked guard(_lock);
        if (_thumbnailProduced)
            return;
        file = pathLocked();
        known = _pathIsReal ? platform::PathKnowledge::realPlainFile : platform::PathKnowledge::none;
    }
    const auto header = file ? platform.movies.headerOfMovie(file, known) : std::nullopt;

    std::shared_ptr<MovieThumbnail> movie;
    Locked guard(_lock);
    if (header) {
        const bool standsInFolder = _folder && !_own;
        movie = std::make_shared<MovieThumbnail>(*header, standsInFolder ? _folder->shared_from_this() : nullptr,
            standsInFolder ? Text() : file, _nameOffset, _nameLength);
    }
    _movie = std::move(movie);
    _thumbnailProduced = true;
}
