// The movies of a project, and the movies that stand for projects in the list of a folder.
//
// The one surprise: any entry with one of four extensions is a movie, a hidden one or a folder included, while MOV in
// capitals is none.

#include "plugin/MontaroConstants.h"
#include "plugin/RepresentativeMovie.h"
#include "plugin/projects/ProjectScan.h"

#include "host/OBConstants.h"
#include "platform/PathText.h"

#include <algorithm>
#include <utility>

using platform::Text;
using platform::Value;

namespace {

/// Whether a child of a folder is one whose movies it shows: neither a library nor a folder.
bool isProject(const OBMediaGroupRef& child)
{
    const OBTypeIdentifierRef type = child->typeIdentifier();
    return type != OBMontaroProjectLibraryGroupTypeIdentifier && type != OBMontaroFolderGroupTypeIdentifier;
}

void addRepresentatives(OBMediaManager& manager, OBMediaGroup& folder, std::span<const OBMediaGroupRef> projects)
{
    const std::shared_ptr<const OBMediaObjectKind> kind = representativeKind(manager, {});
    while (!projects.empty() && !manager.isCancelLoadRequestPending()) {
        const std::vector<ChosenMovie> chosen = chooseRepresentativeMovies(manager, projects);
        for (std::size_t index = 0; index < chosen.size(); ++index) {
            if (chosen[index].movie)
                folder.setMediaObjects(
                    folder.ownMediaObjects().appending(makeRepresentative(kind, *projects[index], chosen[index])));
        }
        projects = projects.subspan(chosen.size());
    }
}

} // namespace

SharedMovies sharedMoviesOfProject(OBMediaManager& manager, const ScanReport& report, const Text& project)
{
    SharedMovies movies(project);
    movies.listing = manager.listFolder(movies.folder(), {});
    movies.project.pathIsReal = movies.listing.pathIsReal();
    if (movies.listing.empty())
        report.found([&] {
            return findings::listedFolder(
                manager.platform().fileSystem, movies.folder(), movies.listing, "share the project in Montaro");
        });
    movies.take(report, movies.listing);
    return movies;
}

SharedMovies sharedMoviesOfListedProject(const ScanReport& report, const Text& project,
    const platform::FolderListing& library, const platform::FolderItem& item)
{
    SharedMovies movies(project);
    movies.project.pathIsReal = library.pathIsReal() && item.kind == platform::ItemKind::folder;
    movies.take(report, *item.subfolder);
    return movies;
}

std::vector<std::string> OBMontaroPlugin::_renderedMoviesPathsForProjectPath(const Text& path)
{
    const SharedMovies movies = sharedMoviesOfProject(*this, ScanReport(*this), path);
    std::vector<std::string> paths;
    for (const OBFileOfFolder& file : movies.files)
        paths.push_back(platform::pathJoined(movies.folder(), file.name));
    return paths;
}

std::optional<std::string> OBMontaroPlugin::_previewFileForProjectPath(const Text& path)
{
    const SharedMovies movies = sharedMoviesOfProject(*this, ScanReport(*this), path);
    if (movies.files.empty())
        return std::nullopt;
    return platform::pathJoined(movies.folder(), movies.files.front().name);
}

void OBMontaroPlugin::_createMontaroProjectsFolderMediaObjects(const OBMediaGroupRef& folder)
{
    const OBMediaGroupList children = folder->childGroups();
    for (auto child = children.begin(); child != children.end() && !isCancelLoadRequestPending();) {
        const OBTypeIdentifierRef type = (*child)->typeIdentifier();
        if (type == OBMontaroProjectLibraryGroupTypeIdentifier) {
            ++child;
        } else if (type == OBMontaroFolderGroupTypeIdentifier) {
            // Cancel is asked before each object, and what had been taken by then stays.
            const OBMediaObjectList below = (*child)->ownMediaObjects();
            std::size_t taken = 0;
            while (taken < below.size() && !isCancelLoadRequestPending())
                ++taken;
            folder->setMediaObjects(folder->ownMediaObjects().appending(below.prefix(taken)));
            ++child;
        } else {
            const auto end = std::find_if_not(child, children.end(), isProject);
            addRepresentatives(*this, *folder, { child, end });
            child = end;
        }
    }
}
