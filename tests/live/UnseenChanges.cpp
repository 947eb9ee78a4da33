#include "tests/live/UnseenChanges.h"

#include "apps/common/Output.h"
#include "apps/common/RecordJson.h"
#include "host/OBConstants.h"
#include "host/OBMediaObject.h"
#include "host/OBMediaObjectList.h"
#include "platform/PathText.h"
#include "plugin/MontaroConstants.h"
#include "plugin/events/MontaroSupport.h"

#include <algorithm>
#include <cstdio>
#include <utility>

#include <unistd.h>

namespace tests {

namespace {

    /// A child of the root with what the root shows for it.
    struct Child {
        OBMediaGroupRef group;
        std::vector<OBMediaObjectRef> objects {};
    };

    bool isRepresentativeOf(const OBMediaObjectRef& object, const OBMediaGroupRef& project)
    {
        const platform::Value path = object->attributeForKey(OBMontaroProjectPathKey);
        return path.text() && *path.text() == project->path();
    }

    /// How many of the root's objects, from `next` on, are those of `child`.
    std::size_t objectsOf(const OBMediaGroupRef& child, const OBMediaObjectList& objects, std::size_t next)
    {
        if (child->typeIdentifier() != OBMontaroProjectGroupTypeIdentifier)
            return std::min(child->mediaObjects().size(), objects.size() - next);
        return next < objects.size() && isRepresentativeOf(objects[next], child) ? 1 : 0;
    }

    std::vector<Child> childrenOf(const OBMediaGroup& root, OBMediaObjectList& left)
    {
        std::vector<Child> children;
        std::size_t next = 0;
        const OBMediaObjectList objects = root.ownMediaObjects();
        for (const OBMediaGroupRef& group : root.childGroups()) {
            Child& child = children.emplace_back(Child { group });
            for (std::size_t count = objectsOf(group, objects, next); count != 0; --count)
                child.objects.push_back(objects[next++]);
        }
        for (; next < objects.size(); ++next)
            left = left.appending(objects[next]);
        return children;
    }

    bool isOfOneTree(const Child& child, const std::vector<std::string>& foldersOfOneTree)
    {
        const platform::Text path = child.group->path();
        return path && std::any_of(foldersOfOneTree.begin(), foldersOfOneTree.end(), [&](const std::string& folder) {
            return platform::isSameOrBelow(path, folder);
        });
    }

    bool isEmptyEventLibrary(const Child& child)
    {
        return child.group->typeIdentifier() == OBMontaroEventLibraryGroupTypeIdentifier
            && child.group->mediaObjects().empty();
    }

    bool standsBefore(const Child& left, const Child& right)
    {
        const bool leftIsLast = left.group->typeIdentifier() == OBMontaroEventLibraryGroupTypeIdentifier;
        const bool rightIsLast = right.group->typeIdentifier() == OBMontaroEventLibraryGroupTypeIdentifier;
        if (leftIsLast || rightIsLast)
            return !leftIsLast;
        const int order = MontaroSupport::_MontaroRootGroupComparison(*left.group, *right.group);
        return order != 0 ? order < 0 : left.group->ID().view() < right.group->ID().view();
    }

    std::string jsonOf(const OBMediaGroupRef& group)
    {
        std::FILE* const file = std::tmpfile();
        {
            apps::Output output(::fileno(file));
            apps::printGroup(output, group);
            output.flush();
        }
        std::string text(static_cast<std::size_t>(::lseek(::fileno(file), 0, SEEK_END)), '\0');
        const ssize_t length = ::pread(::fileno(file), text.data(), text.size(), 0);
        std::fclose(file);
        text.resize(static_cast<std::size_t>(std::max<ssize_t>(length, 0)));
        return text;
    }

    bool isBelowFolderCalled(std::string_view path, std::string_view name)
    {
        const std::string component = "/" + std::string(name) + "/";
        return (std::string(path) + "/").find(component) != std::string::npos;
    }

} // namespace

void UnseenChanges::note(Reason, std::string_view path)
{
    _projects = _projects || isBelowFolderCalled(path, MontaroProjectsFolderName);
    _events = _events || isBelowFolderCalled(path, MontaroEventsFolderName);
}

std::string comparableTree(const OBMediaGroupRef& root, const std::vector<std::string>& foldersOfOneTree)
{
    if (!root)
        return "no tree";
    OBMediaObjectList ofNoChild;
    std::vector<Child> children = childrenOf(*root, ofNoChild);
    std::erase_if(children,
        [&](const Child& child) { return isEmptyEventLibrary(child) || isOfOneTree(child, foldersOfOneTree); });
    std::stable_sort(children.begin(), children.end(), standsBefore);
    const OBMediaGroupRef ordered = root->copy();
    std::vector<OBMediaGroupRef> groups;
    OBMediaObjectList objects;
    for (const Child& child : children) {
        groups.push_back(child.group);
        for (const OBMediaObjectRef& object : child.objects)
            objects = objects.appending(object);
    }
    ordered->setChildGroups(OBMediaGroupList(std::move(groups)));
    ordered->setMediaObjects(objects.appending(ofNoChild));
    return jsonOf(ordered);
}

} // namespace tests
