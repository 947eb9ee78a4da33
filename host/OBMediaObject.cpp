#include "host/OBMediaObject.h"

#include "host/FrameworkCore.h"
#include "host/MediaObjectParts.h"
#include "host/OBConstants.h"
#include "platform/FileSystem.h"
#include "platform/Immortal.h"
#include "platform/MetadataIndex.h"
#include "platform/Platform.h"

#include <algorithm>
#include <utility>

using platform::Locked;
using platform::Text;
using platform::Value;

namespace {

/// Room for what a source usually sets, so that it takes one allocation.
constexpr std::size_t attributesUsually = 4;

/// Made once, so that whoever asks for the attributes of many objects does not make them for each.
struct HeaderKeys {
    Text resolution = OBMediaObjectResolutionKey;
    Text duration = OBMediaObjectDurationKey;
};

} // namespace

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

OBMediaObject::OBMediaObject(
    const OBMediaObjectOrigin& origin, std::uint32_t nameOffset, std::uint16_t nameLength, bool pathIsReal)
    : _origin(origin)
    , _nameOffset(nameOffset)
    , _nameLength(nameLength)
    , _pathIsReal(pathIsReal)
    , _thumbnailProduced(false)
{
}

OBMediaObject::~OBMediaObject() = default;

OBMediaObject::OwnFields& OBMediaObject::own()
{
    if (!_own) {
        const OBMediaObjectKind& kind = _origin.kind();
        _own = std::make_unique<OwnFields>(OwnFields { kind.mediaType, kind.mediaSourceType,
            _origin.nameOfObject(*this), _origin.pathOfObject(*this), kind.sourcePluginIdentifier, _origin.icon() });
        _own->facts = _origin.factsOfFile(*this);
    }
    return *_own;
}

Text OBMediaObject::pathLocked() const
{
    return _own ? _own->path : _origin.pathOfObject(*this);
}

int OBMediaObject::mediaType() const
{
    Locked guard(_lock);
    return _own ? _own->mediaType : _origin.kind().mediaType;
}

Text OBMediaObject::name() const
{
    Locked guard(_lock);
    return _own ? _own->name : _origin.nameOfObject(*this);
}

int OBMediaObject::mediaSourceType() const
{
    Locked guard(_lock);
    return _own ? _own->mediaSourceType : _origin.kind().mediaSourceType;
}

void OBMediaObject::setMediaSourceType(int code)
{
    Locked guard(_lock);
    own().mediaSourceType = code;
}

Text OBMediaObject::sourcePluginIdentifier() const
{
    Locked guard(_lock);
    return _own ? _own->sourcePluginIdentifier : _origin.kind().sourcePluginIdentifier;
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
    own().facts.reset();
    _pathIsReal = false;
}

void OBMediaObject::setPathOfObject(const OBMediaObject& other)
{
    Text path;
    std::optional<platform::FileFacts> facts;
    bool isReal = false;
    {
        Locked guard(other._lock);
        path = other.pathLocked();
        facts = other.factsLocked();
        isReal = other._pathIsReal;
    }
    Locked guard(_lock);
    std::swap(own().path, path);
    own().facts = facts;
    _pathIsReal = isReal;
}

std::optional<platform::FileFacts> OBMediaObject::fileFacts() const
{
    Locked guard(_lock);
    return factsLocked();
}

void OBMediaObject::setFileFacts(std::optional<platform::FileFacts> facts)
{
    Locked guard(_lock);
    own().facts = facts;
}

std::optional<platform::FileFacts> OBMediaObject::factsLocked() const
{
    return _own ? _own->facts : _origin.factsOfFile(*this);
}

Text OBMediaObject::aliasResolvedPath() const
{
    const Text path = this->path();
    const auto core = FrameworkCore::current();
    if (!core || path.isAbsent())
        return {};
    const platform::FileSystem& fileSystem = core->platform().fileSystem;
    return fileSystem.exists(path) ? Text(fileSystem.resolvedPath(path)) : Text();
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
        path = _origin.pathOfObject(*this);
        if (!path)
            path = pathLocked();
    }
    return marvexProperties(std::move(path));
}

void OBMediaObject::setMarvexProperties(OBMarvexPropertiesRef properties)
{
    Locked guard(_lock);
    std::swap(own().marvexProperties, properties);
}

/// What was set on the object comes first: it hides what else is told under the same key.
Value OBMediaObject::attributeForKey(std::string_view key) const
{
    Locked guard(_lock);
    if (_own) {
        for (const auto& [name, value] : _own->attributes) {
            if (name == key)
                return value;
        }
    }
    return attributeBesideOwn(key);
}

bool OBMediaObject::isRepresentative() const
{
    return !attributeForKey(OBMediaObjectRepresentativeKey).isNull();
}

Value OBMediaObject::attributeBesideOwn(std::string_view key) const
{
    const OBMediaObjectKind& kind = _origin.kind();
    for (const Text& name : kind.ownPathKeys) {
        if (name == key)
            return _origin.pathOfObject(*this);
    }
    if (kind.groupPathKey == key)
        return _origin.groupPath();
    for (const auto& [name, value] : kind.attributes) {
        if (name == key)
            return value;
    }
    if (key == OBMediaObjectResolutionKey) {
        if (const std::optional<platform::Size> resolution = _origin.resolution())
            return *resolution;
    }
    return attributeOfMovie(key);
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
    Locked guard(_lock);
    return attributesLocked(_origin.pathOfObject(*this));
}

Value::Dictionary OBMediaObject::attributesLocked(const Text& firstPath) const
{
    static platform::Immortal<HeaderKeys> keys;
    const OBMediaObjectKind& kind = _origin.kind();
    Value::Dictionary result;
    if (_own)
        result = _own->attributes;
    else
        result.reserve(attributesUsually);
    const auto addMissing = [&result](const Text& key, Value value) {
        const auto isKey = [&key](const Value::Entry& entry) { return entry.first == key; };
        if (!value.isNull() && std::none_of(result.begin(), result.end(), isKey))
            result.emplace_back(key, std::move(value));
    };
    for (const Text& key : kind.ownPathKeys)
        addMissing(key, firstPath);
    if (kind.groupPathKey)
        addMissing(kind.groupPathKey, _origin.groupPath());
    addMissing(keys->resolution, attributeBesideOwn(OBMediaObjectResolutionKey));
    for (const auto& [key, value] : kind.attributes)
        addMissing(key, value);
    addMissing(keys->duration, attributeBesideOwn(OBMediaObjectDurationKey));
    return result;
}

OBMediaObjectRecord OBMediaObject::record() const
{
    Locked guard(_lock);
    OBMediaObjectRecord record;
    const OBMediaObjectKind& kind = _origin.kind();
    record.mediaType = _own ? _own->mediaType : kind.mediaType;
    record.name = _own ? _own->name : _origin.nameOfObject(*this);
    record.mediaSourceType = _own ? _own->mediaSourceType : kind.mediaSourceType;
    record.sourcePluginIdentifier = _own ? _own->sourcePluginIdentifier : kind.sourcePluginIdentifier;
    record.path = pathLocked();
    record.pathIsReal = _pathIsReal;
    record.isAsMade = isAsMadeLocked();
    record.icon = _own ? handedOut(_own->icon) : _origin.icon();
    record.attributes = attributesLocked(_own ? _origin.pathOfObject(*this) : record.path);
    return record;
}

bool OBMediaObject::isAsMade() const
{
    Locked guard(_lock);
    return isAsMadeLocked();
}

OBImageRef OBMediaObject::icon() const
{
    Locked guard(_lock);
    return _own ? handedOut(_own->icon) : _origin.icon();
}

void OBMediaObject::setIcon(OBImageRef icon)
{
    icon = withoutCycle(icon);
    Locked guard(_lock);
    std::swap(own().icon, icon);
}
