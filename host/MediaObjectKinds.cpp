// Media objects that lie in a block of their own: one made by itself, and one that stands for a group.

#include "host/MediaObjectParts.h"
#include "host/OBConstants.h"
#include "platform/Immortal.h"

#include <utility>

using platform::Locked;
using platform::Text;

/// An object that has nothing but what is set on it.
class OBMediaObject::Lone final : public OBMediaObjectOrigin, public std::enable_shared_from_this<Lone> {
public:
    std::shared_ptr<const void> block() const override { return shared_from_this(); }
    const OBMediaObjectKind& kind() const override
    {
        static platform::Immortal<OBMediaObjectKind> nothing;
        return *nothing;
    }
    Text nameOfObject(const OBMediaObject&) const override { return {}; }
    Text pathOfObject(const OBMediaObject&) const override { return {}; }

    OBMediaObject object { *this, 0, 0, false };
};

/// An object that shows a group by a movie. Shares with the group and the movie what they have already.
class OBMediaObject::Representative final : public OBMediaObjectOrigin,
                                            public std::enable_shared_from_this<Representative> {
public:
    Representative(std::shared_ptr<const OBMediaObjectKind> kind, Text name, Text groupPath,
        std::shared_ptr<MovieThumbnail> movie, bool pathIsReal)
        : object(*this, 0, 0, pathIsReal)
        , _kind(std::move(kind))
        , _name(std::move(name))
        , _groupPath(std::move(groupPath))
        , _movie(std::move(movie))
    {
    }

    std::shared_ptr<const void> block() const override { return shared_from_this(); }
    const OBMediaObjectKind& kind() const override { return *_kind; }
    Text nameOfObject(const OBMediaObject&) const override { return _name; }
    Text pathOfObject(const OBMediaObject&) const override { return _movie->file(); }
    Text groupPath() const override { return _groupPath; }
    std::optional<platform::Size> resolution() const override { return _movie->resolution(); }
    OBImageRef icon() const override { return _movie; }

    OBMediaObject object;

private:
    const std::shared_ptr<const OBMediaObjectKind> _kind;
    const Text _name;
    const Text _groupPath;
    const std::shared_ptr<MovieThumbnail> _movie;
};

OBMediaObjectRef OBMediaObject::initWithMediaType_name(int mediaType, Text name)
{
    const auto lone = std::make_shared<Lone>();
    OBMediaObject& object = lone->object;
    Locked guard(object._lock);
    OwnFields& fields = object.own();
    fields.mediaType = mediaType;
    fields.name = std::move(name);
    return { lone, &object };
}

OBMediaObjectRef OBMediaObject::representative(
    std::shared_ptr<const OBMediaObjectKind> kind, Text name, Text groupPath, const OBMediaObjectRef& movie)
{
    MovieThumbnail* thumbnail = nullptr;
    bool pathIsReal = false;
    {
        Locked guard(movie->_lock);
        if (!movie->_own && movie->_movie && movie->_movie->hasPicture())
            thumbnail = movie->_movie.get();
        pathIsReal = movie->_pathIsReal;
    }
    if (thumbnail) {
        const auto made = std::make_shared<Representative>(std::move(kind), std::move(name), std::move(groupPath),
            std::shared_ptr<MovieThumbnail>(movie, thumbnail), pathIsReal);
        return { made, &made->object };
    }
    // A movie that somebody has changed: its fields are copied as they are now.
    OBMediaObjectRef object = initWithMediaType_name(kind->mediaType, std::move(name));
    object->setMediaSourceType(kind->mediaSourceType);
    object->setSourcePluginIdentifier(kind->sourcePluginIdentifier);
    object->setPathOfObject(*movie);
    object->setIcon(movie->thumbnailIfProduced());
    if (kind->groupPathKey)
        object->setAttribute_forKey(std::move(groupPath), kind->groupPathKey);
    object->setAttribute_forKey(movie->attributeForKey(OBMediaObjectResolutionKey), OBMediaObjectResolutionKey);
    for (const auto& [key, value] : kind->attributes)
        object->setAttribute_forKey(value, key);
    return object;
}
