// The movies of a project, and the movies that stand for projects in the list of a folder.
//
// The one surprise: any entry with one of four extensions is a movie, a hidden one or a folder included, while MOV in
// capitals is none.

#include "plugin/MontaroConstants.h"
#include "plugin/RepresentativeMovie.h"
#include "plugin/projects/ProjectScan.h"

#include "host/OBConstants.h"
#include "platform/PathText.h"

#include <utility>

using platform::Text;
using platform::Value;

namespace {

constexpr std::string_view sharedItemsFolder = "/Shared Items";
constexpr const char* projectsPasteboardType = "OBMontaroProjectsPboardType";

} // namespace

Value OBMontaroPlugin::supportedPasteboardTypes()
{
    const Value types = Value::List { projectsPasteboardType };
    return Value::List { types };
}

SharedMovies sharedMoviesOfProject(OBMediaManager& manager, const ScanReport& report, const Text& project)
{
    SharedMovies movies { Text::joined(project, sharedItemsFolder), {}, {} };
    movies.listing = manager.listFolder(movies.folder, {});
    movies.files.reserve(movies.listing.size());
    for (const platform::FolderItem item : movies.listing) {
        if (report.passes(ScanRules::hasMovieExtension, item, movies.folder))
            movies.files.push_back({ item.name, item.kind == platform::ItemKind::file });
    }
    return movies;
}

std::vector<std::string> OBMontaroPlugin::_renderedMoviesPathsForProjectPath(const Text& path)
{
    const SharedMovies movies = sharedMoviesOfProject(*this, ScanReport(*this), path);
    std::vector<std::string> paths;
    for (const OBFileOfFolder& file : movies.files)
        paths.push_back(platform::pathJoined(movies.folder, file.name));
    return paths;
}

std::optional<std::string> OBMontaroPlugin::_previewFileForProjectPath(const Text& path)
{
    const SharedMovies movies = sharedMoviesOfProject(*this, ScanReport(*this), path);
    if (movies.files.empty())
        return std::nullopt;
    return platform::pathJoined(movies.folder, movies.files.front().name);
}

void OBMontaroPlugin::_createMontaroProjectsFolderMediaObjects(const OBMediaGroupRef& folder)
{
    const OBMediaGroupList children = folder->childGroups();
    for (const OBMediaGroupRef& child : children) {
        if (isCancelLoadRequestPending())
            return;
        const OBTypeIdentifierRef type = child->typeIdentifier();
        if (type == OBMontaroProjectLibraryGroupTypeIdentifier)
            continue;
        if (type == OBMontaroFolderGroupTypeIdentifier) {
            // Cancel is asked before each object, and what had been taken by then stays.
            const OBMediaObjectList below = child->ownMediaObjects();
            std::size_t taken = 0;
            while (taken < below.size() && !isCancelLoadRequestPending())
                ++taken;
            folder->setMediaObjects(folder->ownMediaObjects().appending(below.prefix(taken)));
            continue;
        }
        const ChosenMovie chosen = chooseRepresentativeMovie(*this, child->mediaObjects());
        if (chosen.movie) {
            folder->setMediaObjects(folder->ownMediaObjects().appending(makeRepresentative(*this, *child, chosen, {})));
        }
    }
}
