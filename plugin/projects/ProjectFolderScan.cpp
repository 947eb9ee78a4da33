// Project libraries become folder and project groups.
//
// The one surprise: what comes out is what the libraries hold, merged; the group of a library itself lives for one
// scan, tagged as a project group.

#include "plugin/MontaroConstants.h"
#include "plugin/ScanFindings.h"
#include "plugin/SharedValues.h"
#include "plugin/projects/ProjectScan.h"

#include "host/OBConstants.h"
#include "platform/FileSystem.h"
#include "platform/PathText.h"

#include <utility>

using platform::FileProblem;
using platform::FolderItem;
using platform::FolderListing;
using platform::Locked;
using platform::Text;

namespace {

constexpr std::string_view localizedExtension = "localized";

/// Names and flags of the entries, and of each whether it is a project, since when, and what was shared from it.
constexpr platform::ListingRequest projectListing { MontaroProjectIdentifierPathComponent, true, true,
    sharedItemsFolder };

/// What all movies of all projects share.
std::shared_ptr<const OBMediaObjectKind> movieKind(const OBMontaroPlugin& plugin)
{
    return std::make_shared<const OBMediaObjectKind>(OBMediaObjectKind { OBMediaTypeMovie, OBMediaSourceTypePlugin,
        plugin.pluginIdentifier(), sharedValues().projectIcon.load(), { OBMontaroProjectPathKey },
        Text::joined("/", sharedItemsFolder, "/") });
}

/// What is no project is not left out for that.
bool isProject(const OBMontaroPlugin& plugin, const ScanReport& report, const FolderItem& item, const Text& folder)
{
    if (rules::hasProjectMarker.passes(item))
        return report.passes(rules::hasProjectMarker, item, folder);
    report.found([&] {
        const std::string path = platform::pathJoined(folder, item.name);
        return findings::noProject(
            path, reasonOfMarker(plugin.platform().fileSystem, rules::hasProjectMarker, path).text);
    });
    return false;
}

/// A library that holds `groups`.
OBMediaGroupRef libraryOf(const OBMediaGroupList& groups)
{
    OBMediaGroupRef library = OBMediaGroup::initWithTypeIdentifier(OBMontaroProjectGroupTypeIdentifier);
    library->setChildGroups(groups);
    return library;
}

} // namespace

ProjectScan OBMontaroPlugin::newProjectScan(MontaroFlatGroupList flatGroups)
{
    return { ScanReport(*this), std::move(flatGroups), movieKind(*this), sharedValues().projectIcon.load(),
        sharedValues().emptyProjectIcon.load() };
}

OBMediaGroupList OBMontaroPlugin::_reloadMontaroProjects(bool updateRoot)
{
    _poolingProjectsReload = false;
    const ProjectScan scan = newProjectScan(listOrNew({}));
    const ScanHistory::Number number = _projectScans.begin(_flatProjectGroupsList, scan.flatGroups);
    if (!updateRoot)
        _projectScans.beganForLoad(number);

    std::vector<OBMediaGroupRef> libraries;
    {
        Locked guard(*_MontaroSearchPathsLock);
        const auto isInHome = [this](const Text& path) { return path == _MontaroDefaultPath(); };
        scan.report.walkLibraries(_MontaroSearchPaths.load(), "projects", isInHome, [&](const Text& path) {
            if (const OBMediaGroupRef library = projectsInFolder(path, scan)) {
                library->setName(localizedString("MontaroProjectLibrary"));
                library->setTypeIdentifier(OBMontaroProjectGroupTypeIdentifier);
                library->setParentID(OBMontaro);
                library->setID(path);
                library->setIcon(sharedValues().smallAppIcon.load());
                libraries.push_back(library);
            }
            _watchPath(path);
        });
    }

    const bool isWhole = !libraries.empty() && !isCancelLoadRequestPending();
    if (isWhole && updateRoot) {
        for (std::size_t index = 1; index < libraries.size(); ++index)
            libraries.front()->addChildGroups(libraries[index]->childGroups());
        _projectScans.keep(number, libraries.front());
        publish([&] { return replaceProjects(libraries.front(), number); });
    }

    OBMediaGroupList result;
    for (const OBMediaGroupRef& library : libraries)
        result = result.appending(library->childGroups());
    if (isWhole && !updateRoot)
        _projectScans.keep(number, libraryOf(result));
    return result;
}

bool OBMontaroPlugin::_isMTProject(std::string_view path)
{
    return platform().fileSystem.exists(platform::pathJoined(path, MontaroProjectIdentifierPathComponent));
}

OBMediaGroupRef OBMontaroPlugin::_createMontaroProjectsFolderForPath(const Text& path)
{
    return projectsInFolder(path, newProjectScan(listOrNew(_flatProjectGroupsList.load())));
}

OBMediaGroupRef OBMontaroPlugin::projectsInFolder(const Text& path, const ProjectScan& scan)
{
    if (!path)
        return nullptr;
    const std::string_view name = platform::lastPathComponent(path);

    // A folder may be known to people by a name with an extension that it does not have on disk.
    Text listed = path;
    FolderListing listing = listFolder(path, projectListing);
    OBMediaGroupRef folder = OBMediaGroup::withFields({ OBMontaroFolderGroupTypeIdentifier, name, path,
        platform::pathByRemovingLastComponent(path), path, scan.projectIcon,
        listing.folderStatus() ? std::optional(listing.folderStatus()->modificationDate)
                               : OBMediaGroup::modDateForFile(path) });
    if (listing.problem() != FileProblem::none && platform::extensionOfName(name) == localizedExtension) {
        scan.report.found([&] { return findings::listedFolder(platform().fileSystem, path, listing); });
        listed = Text(path.view().substr(0, path.size() - localizedExtension.size() - 1));
        listing = listFolder(listed, projectListing);
    }

    scan.report.found([&] { return findings::listedFolder(platform().fileSystem, listed, listing); });
    for (const FolderItem item : listing) {
        if (!scan.report.passes(rules::nameIsNotHidden, item, listed)
            || !scan.report.passes(rules::isVisible, item, listed))
            continue;
        if (isProject(*this, scan.report, item, listed)) {
            folder->addChildGroup(projectGroup(listed, listing, item, scan));
        } else if (scan.report.passes(rules::isContainer, item, listed)
            && scan.report.passes(rules::isNotPackage, item, listed)) {
            const OBMediaGroupRef subfolder = projectsInFolder(Text::joined(listed, "/", item.name), scan);
            subfolder->setParentID(folder->ID());
            folder->addChildGroup(subfolder);
        }
    }

    if (folder->childGroups().empty()) {
        const OBMediaGroupRef placeholder
            = OBMediaGroup::withFields({ listed == _MontaroDefaultPath() ? OBMontaroProjectLibraryGroupTypeIdentifier
                                                                         : OBMontaroFolderGroupTypeIdentifier,
                platform::lastPathComponent(listed), listed, listed, listed, scan.projectIcon,
                listed == path ? folder->modificationDate() : OBMediaGroup::modDateForFile(listed) });
        addGroup(scan.flatGroups, placeholder);
    }
    _createMontaroProjectsFolderMediaObjects(folder);
    return folder;
}

/// One project of `listedFolder`. It shows in the flat list before its movies are known.
OBMediaGroupRef OBMontaroPlugin::projectGroup(
    const Text& listedFolder, const FolderListing& listing, const FolderItem& item, const ProjectScan& scan)
{
    const Text path = Text::joined(listedFolder, "/", item.name);
    OBMediaGroupRef project = OBMediaGroup::withFields(
        { OBMontaroProjectGroupTypeIdentifier, platform::nameWithoutExtension(item.name), path, listedFolder, path,
            scan.projectIcon, item.modificationDate ? item.modificationDate : OBMediaGroup::modDateForFile(path) });
    addGroup(scan.flatGroups, project);

    if (item.subfolder)
        noteFoldersDone(1);
    const SharedMovies movies = item.subfolder ? sharedMoviesOfListedProject(scan.report, path, listing, item)
                                               : sharedMoviesOfProject(*this, scan.report, path);
    project->setMediaObjects(OBMediaObjectBatch::objects(scan.movieKind, movies.project, movies.files));
    project->setIcon(movies.files.empty() ? scan.emptyProjectIcon : scan.projectIcon);
    noteItemsFound(movies.files.size());
    return project;
}
