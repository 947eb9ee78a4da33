#include "host/OBMediaGroup.h"

#include "host/FrameworkCore.h"
#include "platform/FileSystem.h"
#include "platform/Platform.h"

#include <utility>
#include <vector>

using platform::Date;
using platform::Locked;
using platform::Text;
using platform::Value;

OBMediaGroup::OBMediaGroup(OBTypeIdentifierRef identifier)
{
    _fields.typeIdentifier = identifier;
}

OBMediaGroup::OBMediaGroup(OBMediaGroupFields fields)
{
    _fields.typeIdentifier = fields.typeIdentifier;
    _fields.name = std::move(fields.name);
    _fields.identifier = std::move(fields.ID);
    _fields.parentIdentifier = std::move(fields.parentID);
    _fields.path = std::move(fields.path);
    _fields.icon = std::move(fields.icon);
    _fields.hasModificationDate = fields.modificationDate.has_value();
    _fields.modificationDate = fields.modificationDate.value_or(Date {});
}

/// Releases what hangs below level by level: a tree as deep as a path can be must not be released by recursion.
OBMediaGroup::~OBMediaGroup()
{
    std::vector<OBMediaGroupList> lists;
    lists.push_back(std::exchange(_fields.childGroups, {}));
    while (!lists.empty()) {
        const OBMediaGroupList groups = std::exchange(lists.back(), {});
        lists.pop_back();
        if (!groups.isSoleOwner())
            continue;
        for (const OBMediaGroupRef& group : groups) {
            if (group && group.use_count() == 1) {
                Locked guard(group->_lock);
                lists.push_back(std::exchange(group->_fields.childGroups, {}));
            }
        }
    }
}

OBMediaGroupRef OBMediaGroup::initWithTypeIdentifier(OBTypeIdentifierRef identifier)
{
    return std::make_shared<OBMediaGroup>(identifier);
}

OBMediaGroupRef OBMediaGroup::withFields(OBMediaGroupFields fields)
{
    return std::make_shared<OBMediaGroup>(std::move(fields));
}

OBMediaGroupRef OBMediaGroup::copy() const
{
    OBMediaGroupRef result = initWithTypeIdentifier(nullptr);
    Fields now = fields();
    Locked guard(result->_lock);
    result->_fields = std::move(now);
    return result;
}

OBMediaGroup::Fields OBMediaGroup::fields() const
{
    Locked guard(_lock);
    return _fields;
}

OBTypeIdentifierRef OBMediaGroup::typeIdentifier() const
{
    Locked guard(_lock);
    return _fields.typeIdentifier;
}

void OBMediaGroup::setTypeIdentifier(OBTypeIdentifierRef identifier)
{
    Locked guard(_lock);
    _fields.typeIdentifier = identifier;
}

// What a setter replaces is swapped into its argument, so that it is released after the lock is.

Text OBMediaGroup::name() const
{
    Locked guard(_lock);
    return _fields.name;
}

void OBMediaGroup::setName(Text name)
{
    Locked guard(_lock);
    std::swap(_fields.name, name);
}

Text OBMediaGroup::ID() const
{
    Locked guard(_lock);
    return _fields.identifier;
}

void OBMediaGroup::setID(Text identifier)
{
    Locked guard(_lock);
    std::swap(_fields.identifier, identifier);
}

Text OBMediaGroup::parentID() const
{
    Locked guard(_lock);
    return _fields.parentIdentifier;
}

void OBMediaGroup::setParentID(Text identifier)
{
    Locked guard(_lock);
    std::swap(_fields.parentIdentifier, identifier);
}

Text OBMediaGroup::path() const
{
    Locked guard(_lock);
    return _fields.path;
}

void OBMediaGroup::setPath(Text path)
{
    Locked guard(_lock);
    std::swap(_fields.path, path);
}

OBFileLocation OBMediaGroup::URL() const
{
    return { path() };
}

OBImageRef OBMediaGroup::icon() const
{
    Locked guard(_lock);
    return _fields.icon;
}

void OBMediaGroup::setIcon(OBImageRef icon)
{
    Locked guard(_lock);
    std::swap(_fields.icon, icon);
}

std::optional<Date> OBMediaGroup::modificationDate() const
{
    Locked guard(_lock);
    return _fields.hasModificationDate ? std::optional(_fields.modificationDate) : std::nullopt;
}

void OBMediaGroup::setModificationDate(std::optional<Date> date)
{
    Locked guard(_lock);
    _fields.hasModificationDate = date.has_value();
    _fields.modificationDate = date.value_or(Date {});
}

std::optional<Date> OBMediaGroup::modDateForFile(std::string_view path)
{
    const auto core = FrameworkCore::current();
    const auto status = core ? core->platform().fileSystem.status(path) : std::nullopt;
    return status ? std::optional(status->modificationDate) : std::nullopt;
}

Value::Dictionary OBMediaGroup::attributes() const
{
    Locked guard(_lock);
    return _fields.attributes ? *_fields.attributes : Value::Dictionary {};
}

void OBMediaGroup::setAttributes(Value::Dictionary attributes)
{
    auto shared = attributes.empty() ? nullptr : std::make_shared<const Value::Dictionary>(std::move(attributes));
    Locked guard(_lock);
    std::swap(_fields.attributes, shared);
}

Value OBMediaGroup::attributeForKey(std::string_view key) const
{
    Locked guard(_lock);
    if (_fields.attributes) {
        for (const auto& [name, value] : *_fields.attributes) {
            if (name == key)
                return value;
        }
    }
    return {};
}

OBMediaGroupList OBMediaGroup::childGroups() const
{
    Locked guard(_lock);
    return _fields.childGroups;
}

void OBMediaGroup::setChildGroups(OBMediaGroupList groups)
{
    Locked guard(_lock);
    std::swap(_fields.childGroups, groups);
}

bool OBMediaGroup::replaceChildGroups(const OBMediaGroupList& before, OBMediaGroupList groups)
{
    Locked guard(_lock);
    if (!_fields.childGroups.isSameAs(before))
        return false;
    std::swap(_fields.childGroups, groups);
    return true;
}

void OBMediaGroup::addChildGroup(OBMediaGroupRef group)
{
    if (!group)
        return;
    OBMediaGroupList before; // released after the lock
    Locked guard(_lock);
    before = _fields.childGroups;
    _fields.childGroups = before.appending(std::move(group));
}

void OBMediaGroup::addChildGroups(const OBMediaGroupList& groups)
{
    OBMediaGroupList before;
    Locked guard(_lock);
    before = _fields.childGroups;
    _fields.childGroups = before.appending(groups);
}

OBMediaObjectList OBMediaGroup::mediaObjects() const
{
    OBMediaObjectList own;
    OBMediaGroupList children;
    {
        Locked guard(_lock);
        own = _fields.mediaObjects;
        if (own.empty() && _fields.dynamicMediaObjects)
            children = _fields.childGroups;
    }
    for (const OBMediaGroupRef& child : children)
        own = child ? own.appending(child->mediaObjects()) : own;
    return own;
}

OBMediaObjectList OBMediaGroup::ownMediaObjects() const
{
    Locked guard(_lock);
    return _fields.mediaObjects;
}

void OBMediaGroup::setMediaObjects(OBMediaObjectList objects)
{
    Locked guard(_lock);
    std::swap(_fields.mediaObjects, objects);
}

bool OBMediaGroup::dynamicMediaObjects() const
{
    Locked guard(_lock);
    return _fields.dynamicMediaObjects;
}

void OBMediaGroup::setDynamicMediaObjects(bool dynamic)
{
    Locked guard(_lock);
    _fields.dynamicMediaObjects = dynamic;
}
