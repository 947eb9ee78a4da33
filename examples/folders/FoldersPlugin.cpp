// A source of its own: the folders of movies that OMBRIX_FOLDERS names, as a tree that follows the disk.

#include "host/OBMediaManager.h"
#include "host/OBMediaManagerClass.h"
#include "host/OBTextComparison.h"
#include "platform/ContentTypes.h"
#include "platform/PathText.h"
#include "platform/ThreadSafety.h"
#include "platform/Workspace.h"

#include <algorithm>
#include <atomic>
#include <cstdlib>
#include <sstream>

using platform::Text;

namespace {

// The kinds of groups. Who compares them compares these instances, not their texts.
constexpr OBTypeIdentifier rootType("FoldersRootGroup");
constexpr OBTypeIdentifier folderType("FoldersFolderGroup");
constexpr const char* rootID = "Folders";

/// The folders that the person names, each once. What is no absolute path is left out.
std::vector<std::string> namedFolders()
{
    const char* const list = std::getenv("OMBRIX_FOLDERS");
    std::istringstream names(list ? list : "");
    std::vector<std::string> folders;
    for (std::string name; std::getline(names, name, ':');) {
        const std::string folder(platform::pathWithoutTrailingSlashes(name));
        if (folder.starts_with('/') && std::find(folders.begin(), folders.end(), folder) == folders.end())
            folders.push_back(folder);
    }
    return folders;
}

/// The plain files with a movie's extension that are not hidden, by name. They point into the listing.
std::vector<OBFileOfFolder> moviesIn(const platform::FolderListing& listing)
{
    std::vector<OBFileOfFolder> movies;
    for (const platform::FolderItem item : listing) {
        if (item.kind == platform::ItemKind::file && !item.flags.invisible && platform::isMovieName(item.name))
            movies.push_back({ item.name, true, item.facts });
    }
    std::stable_sort(movies.begin(), movies.end(), [](const OBFileOfFolder& left, const OBFileOfFolder& right) {
        return OBCaseInsensitiveCompare(left.name, right.name) < 0;
    });
    return movies;
}

/// Shows what the menu was built for in the desktop's file manager; nothing where that is gone.
void reveal(OBMediaManager& source, const OBMenuItem& item)
{
    const auto* const object = std::get_if<OBMediaObjectRef>(&item.representedObject);
    const auto* const group = std::get_if<OBMediaGroupRef>(&item.representedObject);
    const Text path = object ? (*object)->path() : group ? (*group)->path() : Text();
    const platform::Platform& machine = source.platform();
    if (!path || !machine.fileSystem.exists(path))
        return;
    machine.notifications.post({ OBWillOpenOrRevealInSourceNotification, &source });
    machine.workspace.revealFile(machine.fileSystem.resolvedPath(path));
}

constexpr OBMenuAction revealAction { "contextMenuReveal:", reveal };

class FoldersPlugin final : public OBMediaManager, public OBMediaManagerPlugin_MustImplement {
public:
    using OBMediaManager::OBMediaManager;

    bool init() override
    {
        const bool isReady = OBMediaManager::init();
        setNeedsReload(true);
        setAutoReloadEnabled(true); // whoever observes gets a tree without asking for one
        return isReady;
    }

    Text displayName() override { return localizedString("Folders"); }
    Text rootMediaGroupTitle() override { return displayName(); }
    OBImageRef rootMediaGroupIcon() override { return _icon; }
    int mediaTypesSupported() override { return OBMediaTypesMovies; }

    /// Watched first and listed second, so that nothing changes unseen in between.
    OBMediaGroupRef performLoadData() override
    {
        if (const auto watcher = OBPathWatcher::sharedPathWatcher()) {
            for (const std::string& folder : namedFolders())
                watcher->watchPath_observer(folder, this);
        }
        platform::Locked guard(_scanLock);
        _hasReloaded = false;
        return scan();
    }

    /// A reload that went by while the load scanned may have seen more than the load.
    void rootMediaGroupInstalled(const OBMediaGroupRef&) override
    {
        if (_hasReloaded)
            reload();
    }

    /// A burst of changes is awaited on a thread of its own: this may be the main thread, which must not sleep.
    void watchedPathChanged_fileChangedEventFlags(std::string_view, std::uint64_t) override
    {
        const auto answer = [this] {
            if (sleep(std::chrono::seconds(2)))
                performReload("folders", [this] { reload(); });
        };
        if (!_reloadIsDue.exchange(true) && !startThread("folders-reload", answer))
            _reloadIsDue = false;
    }

    OBMediaGroupList mediaGroups() override
    {
        return rootMediaGroup() ? rootMediaGroup()->childGroups() : OBMediaGroupList();
    }
    OBMediaGroupList movieGroups() override { return mediaGroups(); }

    Text defaultNoDataMessage(const OBMediaGroupRef& group) override
    {
        const bool isEmpty = group && group->childGroups().empty() && group->mediaObjects().empty();
        const char* const reason = group && group->modificationDate() ? "NoMovies" : "NoSuchFolder";
        return isEmpty ? localizedString(group == rootMediaGroup() ? "NoFolders" : reason) : Text();
    }

    OBMenuRef contextMenuForMediaObject_inMediaGroup(const OBMediaObjectRef& object, const OBMediaGroupRef&) override
    {
        return menuFor(object);
    }
    OBMenuRef contextMenuForMediaGroup(const OBMediaGroupRef& group) override { return menuFor(group); }

private:
    template <class Represented> OBMenuRef menuFor(const Represented& represented)
    {
        const Text title = localizedString("Reveal");
        if (!represented || !represented->path() || !title)
            return nullptr;
        const OBMenuItem item { title, &revealAction, "", represented, weak_from_this() };
        return std::make_shared<OBMenu>(OBMenu { displayName(), false, { item } });
    }

    /// Null, which leaves the tree as it is, when somebody cancels.
    OBMediaGroupRef scan()
    {
        OBMediaGroupRef root = OBMediaGroup::withFields(
            { .typeIdentifier = &rootType, .name = rootMediaGroupTitle(), .ID = rootID, .icon = _icon });
        for (const std::string& folder : namedFolders()) {
            if (isCancelLoadRequestPending())
                return nullptr;
            root->addChildGroup(folderGroup(folder));
        }
        return root;
    }

    OBMediaGroupRef folderGroup(const Text& path)
    {
        const platform::FolderListing listing = listFolder(path, { .fileFacts = true });
        const std::vector<OBFileOfFolder> movies = moviesIn(listing);
        OBMediaGroupRef group = OBMediaGroup::withFields({ &folderType, platform::lastPathComponent(path), path, rootID,
            path, _icon, OBMediaGroup::modDateForFile(path) });
        group->setMediaObjects(OBMediaObjectBatch::objects(_movieKind, { path, listing.pathIsReal() }, movies));
        noteItemsFound(movies.size());
        return group;
    }

    void reload()
    {
        platform::Locked guard(_scanLock);
        _reloadIsDue = false; // what changes from now on may be missed by this scan
        _hasReloaded = true;
        if (const OBMediaGroupRef root = scan())
            setRootMediaGroup(root);
    }

    const OBImageRef _icon = pluginBundle().imageNamed("FolderIcon", "folderIcon");
    const std::shared_ptr<const OBMediaObjectKind> _movieKind = std::make_shared<OBMediaObjectKind>(
        OBMediaObjectKind { OBMediaTypeMovie, OBMediaSourceTypePlugin, pluginIdentifier() });
    std::atomic<bool> _reloadIsDue { false };
    std::atomic<bool> _hasReloaded { false }; // since the last load began to scan
    platform::Mutex _scanLock; // held for a whole scan: what was seen last is shown last
};

class FoldersPluginClass final : public OBMediaManagerClass {
public:
    std::unique_ptr<OBMediaManager> alloc(const OBManagerContext& context) const override
    {
        return std::make_unique<FoldersPlugin>(context);
    }
};

} // namespace

extern "C" OB_EXPORT const OBMediaManagerClass* OBPluginMediaManagerClass()
{
    static const FoldersPluginClass pluginClass;
    return &pluginClass;
}
