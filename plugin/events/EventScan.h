#pragma once

#include "plugin/OBMontaroPlugin.h"
#include "plugin/ScanReport.h"
#include "plugin/events/ClipDates.h"

#include "host/OBMediaObject.h"
#include "host/OBMediaObjectList.h"
#include "platform/FileSystem.h"
#include "platform/ThreadSafety.h"

#include <memory>
#include <optional>
#include <string_view>
#include <utility>
#include <vector>

/// Memory in which a folder of clips is read. Taken anew for each folder, it would come to lie scattered among the
/// records that stay.
struct ClipScratch {
    platform::FolderListing listing {};
    std::vector<OBFileOfFolder> files {};
};

/// What threads that read one folder after another keep between them. Any thread.
class ClipScratches {
public:
    ClipScratch take()
    {
        platform::Locked guard(_lock);
        if (_spare.empty())
            return {};
        ClipScratch scratch = std::move(_spare.back());
        _spare.pop_back();
        return scratch;
    }
    void giveBack(ClipScratch scratch)
    {
        platform::Locked guard(_lock);
        _spare.push_back(std::move(scratch));
    }

private:
    platform::Mutex _lock;
    std::vector<ClipScratch> _spare GUARDED_BY(_lock);
};

/// What one scan of the event libraries carries through its folders. Several threads read it.
struct EventScan {
    ScanReport report;
    MontaroFlatGroupList flatGroups;
    std::shared_ptr<const OBMediaObjectKind> clipKind;
    platform::Text clipNameFormat; ///< of clips that carry the date of their recording
    OBImageRef eventIcon;
    OBImageRef calendarIcon;
    std::unique_ptr<ClipScratches> scratches = std::make_unique<ClipScratches>();
};

/// A folder of a library.
struct FoundFolder {
    platform::Text name;
    platform::Text path;
};

/// What the folder of an event's clips held when it was read.
struct EventClips {
    platform::Text folder {};
    platform::FileProblem problem = platform::FileProblem::none;
    OBMediaObjectList clips {};
    ClipDates dates {};
};

/// What a look into a folder of a library told.
struct ReadEvent {
    bool isEvent = false;
    OBMediaGroupRef group {}; ///< null where the folder of clips holds nothing; not yet with its clips
    EventClips clips {};
};

/// The events of one library on their way into the flat list, which shows each as soon as it is known to be one and all
/// before it have been read, its clips unread as yet. Any thread.
class ShownEvents {
public:
    ShownEvents(MontaroFlatGroupList list, std::size_t count)
        : _list(std::move(list))
        , _found(count)
        , _isRead(count)
    {
    }

    /// The folder `index` is an event.
    void found(std::size_t index, const OBMediaGroupRef& event)
    {
        platform::Locked guard(_lock);
        _found[index] = event;
        if (index == _reached)
            addGroup(_list, event);
    }
    /// The folder `index` has been read, and what it holds is set on its event.
    void read(std::size_t index)
    {
        platform::Locked guard(_lock);
        _isRead[index] = true;
        while (_reached < _isRead.size() && _isRead[_reached]) {
            ++_reached;
            if (_reached < _found.size() && _found[_reached])
                addGroup(_list, _found[_reached]);
        }
    }

private:
    const MontaroFlatGroupList _list;
    platform::Mutex _lock;
    std::vector<OBMediaGroupRef> _found GUARDED_BY(_lock);
    std::vector<bool> _isRead GUARDED_BY(_lock);
    std::size_t _reached GUARDED_BY(_lock) = 0; // all before it have been read
};
