#pragma once

#include "host/OBMediaManager.h"
#include "host/OBSourceInspection.h"
#include "plugin/ScanHistory.h"

#include "platform/Notifications.h"
#include "platform/Snapshot.h"
#include "platform/ThreadSafety.h"

#include <atomic>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

struct ClipScratch;
struct EventScan;
struct FoundFolder;
struct ProjectScan;
struct ReadEvent;

/// An ordered list of folders to search; immutable, replaced whole. Null until it has been prepared.
using MontaroSearchPaths = std::shared_ptr<const std::vector<platform::Text>>;

/// The groups that one scan found, in the order found. A scan extends the list that it made, and only that.
using MontaroFlatGroupList = std::shared_ptr<platform::Snapshot<OBMediaGroupList>>;

inline MontaroFlatGroupList listOrNew(const MontaroFlatGroupList& list)
{
    return list ? list : std::make_shared<platform::Snapshot<OBMediaGroupList>>();
}

inline void addGroup(const MontaroFlatGroupList& list, const OBMediaGroupRef& group)
{
    list->update([&group](const OBMediaGroupList& groups) { return groups.appending(group); });
}

/// The source of the video editor Montaro: its project and event libraries as a live tree of groups and movies.
///
/// Threads: the framework's load thread runs `performLoadData` and the scans below it; reloads run on whatever thread
/// heard of a change; thumbnails are produced on the main thread, which therefore never waits for a scan. No two of the
/// four locks are ever held at once.
///
/// Contents, each section in its own file:
///   identity and lifecycle   OBMontaroPlugin.cpp
///   load cycle               LoadCycle.cpp
///   editor                   EditorDiscovery.cpp
///   projects                 projects/ProjectSearchPaths.cpp, ProjectFolderScan.cpp, ProjectMovies.cpp,
///                            ProjectReload.cpp
///   pasteboard               projects/PasteboardExport.cpp
///   events                   events/EventSearchPaths.cpp, EventFolderScan.cpp, EventClips.cpp, EventYears.cpp,
///                            EventOrder.cpp, EventPreference.cpp, EventReload.cpp
///   watching                 watching/PathWatching.cpp, VolumeMounts.cpp, DiskFormats.cpp
///   user interaction         ui/Icons.cpp, ContextMenus.cpp
///   operators' questions     Inspection.cpp
class OBMontaroPlugin : public OBMediaManager, public OBMediaManagerPlugin_MustImplement, private OBSourceInspection {
public:
    explicit OBMontaroPlugin(const OBManagerContext& context);
    ~OBMontaroPlugin() override;

    // Identity and lifecycle

    bool init() override;
    void dealloc() override;
    static bool isManagedMediaSource();
    platform::Text displayName() override;
    OBImageRef displayImage() override;
    platform::Text uniqueID() override;
    platform::Text rootMediaGroupTitle() override;
    int mediaTypesSupported() override;

    // Load cycle

    void loadData() override;
    OBMediaGroupRef performLoadData() override;
    void rootMediaGroupInstalled(const OBMediaGroupRef& root) override;
    bool canLoadData() override;
    OBMediaGroupList mediaGroups() override;
    OBMediaGroupList movieGroups() override;
    platform::Text defaultNoDataMessage(const OBMediaGroupRef& group) override;
    /// Builds the root group's own media objects from its direct children: one representative a project, and all
    /// objects of any other group.
    void _setMediaObjectsForRootMediaGroup(const OBMediaGroupRef& root);

    // Editor

    platform::Text getAppPath() override;
    bool appInstalled() override;
    platform::Text applicationVersion() override;

    // Projects

    /// The project folder in the user's home; absent while no home folder is known. Asked for once a process.
    platform::Text _MontaroDefaultPath();
    void _prepareMontaroProjectsSearchPaths();
    /// Scans all project libraries; with `updateRoot`, puts the result into the installed tree too.
    OBMediaGroupList _reloadMontaroProjects(bool updateRoot);
    OBMediaGroupList _reloadMontaroProjects();
    /// Puts the scanned projects in place of the root's old ones; `library` holds those of all libraries.
    void finishReloadMontaroProjects(const OBMediaGroupRef& library);
    /// Whether a folder is a project.
    bool _isMTProject(std::string_view path);
    /// One folder's projects and folders, below a group that stands for it; null for no path. They are added to the
    /// flat list, as in a scan.
    OBMediaGroupRef _createMontaroProjectsFolderForPath(const platform::Text& path);
    /// Gives a folder group one representative movie a project below it.
    void _createMontaroProjectsFolderMediaObjects(const OBMediaGroupRef& folder);
    /// The movies that were shared from the project, in listing order.
    std::vector<std::string> _renderedMoviesPathsForProjectPath(const platform::Text& path);
    /// The first of them; absent when there is none.
    std::optional<std::string> _previewFileForProjectPath(const platform::Text& path);

    // Pasteboard

    /// A list that holds the list of the private type's name.
    static platform::Value supportedPasteboardTypes();
    bool writeMediaObjects_toPasteboard(const OBMediaObjectList& objects, platform::Pasteboard& pasteboard) override;
    bool writeMediaGroups_toPasteboard(const OBMediaGroupList& groups, platform::Pasteboard& pasteboard) override;
    /// The projects of the installed tree at `paths`, in tree order; one that occurs twice there comes twice.
    OBMediaGroupList projectGroupsForPaths(const std::vector<platform::Text>& paths);
    static void projectGroupsForPaths_currentGroup_resultsArray(const std::vector<platform::Text>& paths,
        const OBMediaGroupRef& currentGroup, std::vector<OBMediaGroupRef>& results);
    /// The property list that names projects and what was rendered of them; a dictionary, possibly empty.
    static platform::Value dictionaryWithProjects(const OBMediaGroupList& projects);

    // Events

    /// The event folder in the user's home; absent while no home folder is known. Asked for once a process.
    platform::Text _MontaroDefaultEventsFolderPath();
    void _prepareMontaroEventsSearchPaths();
    /// Scans all event libraries into one library group; null when the walk was cancelled. With `updateRoot`, puts it
    /// into the installed tree too.
    OBMediaGroupRef _reloadMontaroEvents_updateRootMediaGroup(const platform::Text& parentID, bool updateRoot);
    OBMediaGroupRef _reloadMontaroEvents();
    /// One library's events, below a group that carries them; null for a folder that lists nothing. They are added to
    /// the flat list, as in a scan.
    OBMediaGroupRef _createMontaroEventsFolderForPath(const platform::Text& path);
    /// Whether a folder is an event.
    bool _isMTEvent(std::string_view path);
    /// When a clip was recorded, where its file says so; it then bears that date for a name. Any thread.
    virtual std::optional<platform::Date> _dateFromExtendedFileAttributeAtPath(std::string_view path);
    /// Puts the scanned events in place of the root's old ones, or nothing when they hold no media object. `library`
    /// may be null.
    void finishReloadMontaroEvents(const OBMediaGroupRef& library);
    /// Reads the editor's choice of order.
    void _checkMontaroPreferences();

    // Watching

    void _watchPath(const platform::Text& path);
    void watchedPathChanged_fileChangedEventFlags(std::string_view path, std::uint64_t flags) override;
    void watchedQueryChanged_queryScope(
        const platform::Notification& notification, const std::vector<std::string>& scope) override;
    /// A volume was mounted: a thread of its own adds its event folder to those that are searched.
    void _fileSystemMounted(const platform::Notification& notification);
    void _fileSystemMountedThreaded(const platform::Notification& notification);
    /// Whether the volume that holds `path` is of a type that is fit to hold the editor's libraries; false where
    /// nothing exists.
    static bool validDiskFormat(std::string_view path);

    // User interaction

    OBImageRef rootMediaGroupIcon() override;
    void _grabMontaroIcons();
    OBMenuRef contextMenuForMediaObject_inMediaGroup(
        const OBMediaObjectRef& object, const OBMediaGroupRef& group) override;
    OBMenuRef contextMenuForMediaGroup(const OBMediaGroupRef& group) override;
    /// Opens the editor, whatever was chosen.
    void contextMenuOpen(const OBMenuItem& item);
    /// Shows the file of the movie that the menu was built for.
    void contextMenuReveal(const OBMenuItem& item);

    // Operators' questions

    OBSourceInspection* inspection() override;

private:
    std::vector<std::string> projectSearchPaths() override;
    std::vector<std::string> eventSearchPaths() override;
    std::optional<bool> mostRecentEventFirst() const override;
    std::vector<std::string> preferencesDomains() const override;
    std::optional<double> pluginVersionNumber() const override;
    std::optional<std::string> pluginVersionString() const override;
    std::optional<OBUnsearchedPlace> whyUnsearched(const std::string& path) const override;

    void registerQueries();
    OBMediaObjectList mediaObjectsOfRoot(const OBMediaGroupList& children);
    void refreshThumbnailOfRootObject(std::string_view path);
    void projectsChanged();
    void eventsChanged();
    bool replaceProjects(const OBMediaGroupRef& library, ScanHistory::Number scan);
    bool replaceEvents(const OBMediaGroupRef& library, ScanHistory::Number scan);
    void publish(const std::function<bool()>& replace);
    bool addEventsSearchPath(const platform::Text& path);
    /// An absolute path for one that begins with "~"; absent while no home folder is known.
    platform::Text expandingTilde(std::string_view path) const;
    void writeProjects(const OBMediaGroupList& projects, platform::Pasteboard& pasteboard);
    template <class Represented>
    void addItem(
        OBMenu& menu, std::string_view titleKey, const OBMenuAction& action, const Represented& representedObject);
    void postWillOpenOrReveal();
    void dropAppIcon() NO_THREAD_SAFETY_ANALYSIS;
    OBMediaGroupRef projectGroup(const platform::Text& listedFolder, const platform::FolderListing& listing,
        const platform::FolderItem& item, const ProjectScan& scan);
    ProjectScan newProjectScan(MontaroFlatGroupList flatGroups);
    OBMediaGroupRef projectsInFolder(const platform::Text& path, const ProjectScan& scan);

    class ClipReader;
    void walkEventLibraries(OBMediaGroup& collected, const EventScan& scan);
    EventScan newEventScan(MontaroFlatGroupList flatGroups);
    OBMediaGroupRef eventsInFolder(const platform::Text& path, const EventScan& scan);
    using EventFound = std::function<void(const OBMediaGroupRef& event)>;
    OBMediaGroupRef eventToShow(const FoundFolder& found, const ReadEvent& read, const EventScan& scan);
    ReadEvent readEvent(
        const platform::Text& library, const FoundFolder& folder, const EventScan& scan, const EventFound& found);
    ReadEvent readEventWith(ClipScratch& scratch, const platform::Text& library, const FoundFolder& folder,
        const EventScan& scan, const EventFound& found);
    void groupEventsByYear(OBMediaGroup& library, const OBMediaGroupList& events, const EventScan& scan);
    void sortEventsWithinYears(const OBMediaGroup& library);

    // In the order in which they are declared. The locks exist from `init` to `dealloc`.

    std::unique_ptr<platform::RecursiveMutex> _appIconLock;
    OBImageRef _appIcon GUARDED_BY(*_appIconLock);
    platform::Snapshot<MontaroSearchPaths> _MontaroSearchPaths; // replaced under its lock, tested for null without
    platform::Snapshot<MontaroSearchPaths> _MontaroEventsSearchPaths; // likewise
    platform::Text _MontaroAppVersionString; // the version is a fixed text; this stays absent
    std::atomic<bool> _missingMontaroDefaultPath { false };
    std::atomic<bool> _mostRecentEventFirst { false }; // written under _updatePreferencesLock
    std::unique_ptr<platform::Mutex> _updatePreferencesLock;
    platform::Snapshot<MontaroFlatGroupList> _flatEventGroupsList;
    platform::Snapshot<MontaroFlatGroupList> _flatProjectGroupsList;
    std::unique_ptr<platform::Mutex> _MontaroSearchPathsLock; // held for a whole projects scan
    std::unique_ptr<platform::Mutex> _MontaroEventsSearchPathsLock; // held for a whole events folder walk
    std::atomic<bool> _poolingProjectsReload { false };
    std::atomic<bool> _poolingEventsReload { false };
    ScanHistory _projectScans;
    ScanHistory _eventScans;
    std::map<std::string, OBImageRef> cachedIcons; // images are shared by the class instead; this stays empty
};
