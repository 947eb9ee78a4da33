#pragma once

#include "host/OBConstants.h"
#include "host/OBExport.h"
#include "host/OBImage.h"
#include "host/OBMediaObjectList.h"
#include "host/OBSnapshotList.h"
#include "platform/ThreadSafety.h"
#include "platform/Value.h"

#include <memory>
#include <optional>
#include <string_view>

class OBMediaGroup;
using OBMediaGroupRef = std::shared_ptr<OBMediaGroup>;
using OBMediaGroupList = OBSnapshotList<OBMediaGroupRef>;

/// The location of a group's folder.
struct OBFileLocation {
    platform::Text path;
};

/// What a scan knows of a group from the start.
struct OBMediaGroupFields {
    OBTypeIdentifierRef typeIdentifier = nullptr;
    platform::Text name {};
    platform::Text ID {};
    platform::Text parentID {};
    platform::Text path {};
    OBImageRef icon {};
    std::optional<platform::Date> modificationDate {};
};

/// One node of the media tree.
///
/// A group belongs to whoever made it until it is added to another, whose list then shares it. Adding changes no field
/// of the group that is added. Any thread may read and write: lists are snapshots that are swapped whole, and a reader
/// sees each field before or after a change.
class OB_EXPORT OBMediaGroup {
public:
    explicit OBMediaGroup(OBTypeIdentifierRef identifier);
    explicit OBMediaGroup(OBMediaGroupFields fields);
    ~OBMediaGroup();
    OBMediaGroup(const OBMediaGroup&) = delete;
    OBMediaGroup& operator=(const OBMediaGroup&) = delete;

    /// A new group in which nothing else is set.
    static OBMediaGroupRef initWithTypeIdentifier(OBTypeIdentifierRef identifier);
    /// A new group with `fields`, set in one step.
    static OBMediaGroupRef withFields(OBMediaGroupFields fields);
    /// A new group with the fields and lists that this one has now.
    OBMediaGroupRef copy() const;

    /// The very instance that was set; compared by identity.
    OBTypeIdentifierRef typeIdentifier() const;
    void setTypeIdentifier(OBTypeIdentifierRef identifier);

    /// The texts below are absent until they are set, and may be set to absent again.
    platform::Text name() const;
    void setName(platform::Text name);
    platform::Text ID() const;
    void setID(platform::Text identifier);
    platform::Text parentID() const;
    void setParentID(platform::Text identifier);
    platform::Text path() const;
    void setPath(platform::Text path);
    /// Where the group's folder is: the path last set, or absent with it.
    OBFileLocation URL() const;

    OBImageRef icon() const;
    void setIcon(OBImageRef icon);

    std::optional<platform::Date> modificationDate() const;
    void setModificationDate(std::optional<platform::Date> date);
    /// The modification date of the file or folder at `path`, links followed; absent when nothing is there. May block.
    static std::optional<platform::Date> modDateForFile(std::string_view path);

    /// A dictionary, possibly empty.
    platform::Value::Dictionary attributes() const;
    void setAttributes(platform::Value::Dictionary attributes);
    /// A null value when the group has no such attribute.
    platform::Value attributeForKey(std::string_view key) const;

    OBMediaGroupList childGroups() const;
    void setChildGroups(OBMediaGroupList groups);
    /// Replaces the list in one step if it is still the one that `childGroups` answered as `before`; false, with
    /// nothing changed, when somebody has replaced or extended it since.
    bool replaceChildGroups(const OBMediaGroupList& before, OBMediaGroupList groups);
    /// Appends one group; nothing when it is null.
    void addChildGroup(OBMediaGroupRef group);
    void addChildGroups(const OBMediaGroupList& groups);

    /// The objects to show for this group: those set on it, or, where it has none, those of its descendants in tree
    /// order. A group whose dynamic media objects were switched off answers only its own.
    OBMediaObjectList mediaObjects() const;
    /// The objects set on the group itself.
    OBMediaObjectList ownMediaObjects() const;
    void setMediaObjects(OBMediaObjectList objects);

    /// True unless switched off: the media objects may be those of descendants.
    bool dynamicMediaObjects() const;
    void setDynamicMediaObjects(bool dynamic);

private:
    struct Fields {
        OBTypeIdentifierRef typeIdentifier = nullptr;
        platform::Text name;
        platform::Text identifier;
        platform::Text parentIdentifier;
        platform::Text path;
        OBImageRef icon;
        std::shared_ptr<const platform::Value::Dictionary> attributes; // null while there are none
        OBMediaGroupList childGroups;
        OBMediaObjectList mediaObjects;
        platform::Date modificationDate;
        bool hasModificationDate = false;
        bool dynamicMediaObjects = true;
    };
    Fields fields() const;

    mutable platform::SmallLock _lock;
    Fields _fields GUARDED_BY(_lock);
};
