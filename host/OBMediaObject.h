#pragma once

#include "host/OBExport.h"
#include "host/OBImage.h"
#include "platform/ThreadSafety.h"
#include "platform/Value.h"

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace platform {
struct FileFacts;
struct Platform;
}

class OBMarvexProperties;
class OBMediaObject;
class OBMediaObjectBatch;
class OBMediaObjectOrigin;
using OBMediaObjectRef = std::shared_ptr<OBMediaObject>;
using OBMarvexPropertiesRef = std::shared_ptr<const OBMarvexProperties>;

/// What many media objects have in common; made once and shared by all of them.
struct OBMediaObjectKind {
    int mediaType = 0;
    int mediaSourceType = 0;
    platform::Text sourcePluginIdentifier {};
    OBImageRef icon {};
    /// Attributes whose value is the path that the object was made with.
    std::vector<platform::Text> ownPathKeys {};
    /// What stands between the path of the folder that the objects of files are made for, and a file's name: "/", or
    /// where the files lie below that folder, "/Below/".
    platform::Text beforeFileName { "/" };
    /// Of an object that stands for a group: the attribute whose value is the group's path, and those that are the
    /// same for all objects of the kind.
    platform::Text groupPathKey {};
    platform::Value::Dictionary attributes {};
};

/// The metadata-search properties of one file, by the attributes of the query language (kMDItemFSName and so on).
/// Answered at once; the file is read when the first property is. Any thread; reading may block.
class OB_EXPORT OBMarvexProperties {
public:
    explicit OBMarvexProperties(platform::Text path);

    platform::Text path() const { return _path; }
    /// A dictionary; null when nothing exists at the path.
    platform::Value all() const;
    platform::Value valueForKey(std::string_view key) const;

private:
    const platform::Text _path;
    mutable platform::Mutex _lock;
    mutable std::optional<platform::Value> _read GUARDED_BY(_lock);
};

/// All fields of a media object at one moment.
struct OBMediaObjectRecord {
    int mediaType = 0;
    platform::Text name {};
    int mediaSourceType = 0;
    platform::Text sourcePluginIdentifier {};
    platform::Text path {};
    bool pathIsReal = false; ///< the path was seen to hold no symbolic link: it is its own real path
    bool isAsMade = false; ///< what `OBMediaObject::isAsMade` answers
    OBImageRef icon {};
    platform::Value::Dictionary attributes {};
};

/// One movie file of the tree.
///
/// An object is made by itself with `initWithMediaType_name`, or together with the other files of its folder by
/// `OBMediaObjectBatch`; the latter keeps a file name each and computes paths and attributes when asked.
/// Any thread may read and write; a reader sees each field before or after a change.
class OB_EXPORT OBMediaObject {
public:
    ~OBMediaObject();
    OBMediaObject(const OBMediaObject&) = delete;
    OBMediaObject& operator=(const OBMediaObject&) = delete;

    /// A new object that stands for no file yet.
    static OBMediaObjectRef initWithMediaType_name(int mediaType, platform::Text name);
    /// A new object that shows a group, called `name` and at `groupPath`, by one of its movies: has the path, the
    /// resolution and, for an icon, the thumbnail that `movie` has now, and otherwise what `kind` says.
    static OBMediaObjectRef representative(std::shared_ptr<const OBMediaObjectKind> kind, platform::Text name,
        platform::Text groupPath, const OBMediaObjectRef& movie);

    int mediaType() const;
    /// The display name.
    platform::Text name() const;
    int mediaSourceType() const;
    void setMediaSourceType(int code);
    platform::Text sourcePluginIdentifier() const;
    void setSourcePluginIdentifier(platform::Text identifier);

    /// All of it at once, for whoever prints a million.
    OBMediaObjectRecord record() const;
    /// Whether it is still as it was made: nobody has changed it, nothing is known of its movie, and its path is its
    /// real path. All such objects of a batch differ by their files' names alone.
    bool isAsMade() const;

    /// The file; absent when none was set.
    platform::Text path() const;
    void setPath(platform::Text path);
    /// Takes over the path of another object, and what is known of it.
    void setPathOfObject(const OBMediaObject& other);
    /// The real path: every symbolic link on the way resolved. Absent when nothing exists there. Asks the file system.
    platform::Text aliasResolvedPath() const;

    /// Size and creation date of the file as they were when it was found: asks nothing of the disk. Absent for an
    /// object of whose file nothing was seen.
    std::optional<platform::FileFacts> fileFacts() const;
    void setFileFacts(std::optional<platform::FileFacts> facts);

    /// The properties of the file at `path`, read when first asked for.
    static OBMarvexPropertiesRef marvexProperties(platform::Text path);
    /// Those that were set; else those of the file that the object was made for, or of the one it was given.
    OBMarvexPropertiesRef marvexProperties() const;
    void setMarvexProperties(OBMarvexPropertiesRef properties);

    /// A null value when the object has no such attribute.
    platform::Value attributeForKey(std::string_view key) const;
    void setAttribute_forKey(platform::Value value, platform::Text key);
    /// All attributes, in the order in which they came.
    platform::Value::Dictionary attributes() const;

    /// Whether it only stands for a movie that is an object itself: it has the attribute that says so.
    bool isRepresentative() const;

    /// Null when none was set.
    OBImageRef icon() const;
    void setIcon(OBImageRef icon);

    /// The picture of the movie, produced on first request: reads the movie's header, sets the resolution and duration
    /// attributes, and answers an image whose pixels nobody has read yet; null for a file that is no movie.
    ///
    /// Evaluated on the main thread only: on any other thread the call asks the main thread and waits. Once produced,
    /// every thread gets the same image at once. Null, with nothing set, when the main loop has ended.
    OBImageRef thumbnailImage();
    /// Takes the place of a produced one, and none is produced any more; null clears it. Attributes stay.
    void setThumbnailImage(const OBImageRef& image);
    /// What `thumbnailImage` would answer without producing anything.
    OBImageRef thumbnailIfProduced() const;
    /// Whether the thumbnail has been produced, be it null.
    bool hasProducedThumbnail() const;

private:
    friend class OBMediaObjectBatch;
    struct OwnFields;
    class MovieThumbnail;
    class Lone;
    class Representative;

    /// `nameLength` counts bytes of a file's name; those that the system has fit by far.
    OBMediaObject(
        const OBMediaObjectOrigin& origin, std::uint32_t nameOffset, std::uint16_t nameLength, bool pathIsReal);

    OwnFields& own() REQUIRES(_lock);
    bool isAsMadeLocked() const REQUIRES(_lock) { return !_own && !_movie && _pathIsReal; }
    platform::Text pathLocked() const REQUIRES(_lock);
    std::optional<platform::FileFacts> factsLocked() const REQUIRES(_lock);
    platform::Value::Dictionary attributesLocked(const platform::Text& firstPath) const REQUIRES(_lock);
    platform::Value attributeBesideOwn(std::string_view key) const REQUIRES(_lock);
    platform::Value attributeOfMovie(std::string_view key) const REQUIRES(_lock);
    OBImageRef withoutCycle(const OBImageRef& image) const;
    OBImageRef handedOut(const OBImageRef& kept) const;
    OBImageRef imageOfMovie() const REQUIRES(_lock);
    void produceThumbnail(const platform::Platform& platform);

    // Constant: where the object lies, and where in the names there that of its file stands.
    const OBMediaObjectOrigin& _origin;
    const std::uint32_t _nameOffset;
    const std::uint16_t _nameLength;

    mutable platform::SmallLock _lock;
    bool _pathIsReal : 1 GUARDED_BY(_lock); // the path was seen to hold no symbolic link: it is its own real path
    bool _thumbnailProduced : 7 GUARDED_BY(
        _lock); // all of the byte: making an object reads no memory, and so fetches none
    std::unique_ptr<OwnFields> _own GUARDED_BY(_lock); // in place of what the origin tells
    std::unique_ptr<MovieThumbnail> _movie GUARDED_BY(_lock); // what the header told; null for a file that is no movie
};
