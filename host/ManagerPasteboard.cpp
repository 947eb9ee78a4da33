// What the framework itself writes for objects and groups that a person copies or drags.

#include "host/OBMediaManager.h"
#include "host/PasteboardTypes.h"
#include "platform/Pasteboard.h"

#include <utility>

namespace {

bool write(PasteboardFiles files, platform::Pasteboard& pasteboard, const void* owner)
{
    pasteboard.declareTypes({}, owner);
    if (files.empty())
        return false;
    pasteboard.addTypes({ std::string(uriListType), std::string(copiedFilesType), std::string(plainTextType) }, owner);
    pasteboard.setData(std::move(files.uriList), uriListType);
    pasteboard.setData(std::move(files.copiedFiles), copiedFilesType);
    pasteboard.setData(std::move(files.plainText), plainTextType);
    return true;
}

void addTo(PasteboardFiles& files, const OBMediaObjectList& objects)
{
    objects.visit([&](OBMediaObject& object) {
        files.add(object);
        return true;
    });
}

} // namespace

bool OBMediaManager::writeMediaObjects_toPasteboard(const OBMediaObjectList& objects, platform::Pasteboard& pasteboard)
{
    PasteboardFiles files;
    addTo(files, objects);
    return write(std::move(files), pasteboard, this);
}

bool OBMediaManager::writeMediaGroups_toPasteboard(const OBMediaGroupList& groups, platform::Pasteboard& pasteboard)
{
    PasteboardFiles files;
    for (const OBMediaGroupRef& group : groups) {
        if (group)
            addTo(files, group->mediaObjects());
    }
    return write(std::move(files), pasteboard, this);
}
