#include "platform/described/DescribedPlatform.h"

#include "platform/FileProblemText.h"
#include "platform/PathText.h"
#include "platform/PathWatching.h"
#include "platform/Workspace.h"
#include "platform/common/FileMetadataIndex.h"
#include "platform/common/FileMovies.h"
#include "platform/common/FilePreferences.h"
#include "platform/common/LexicalPath.h"
#include "platform/common/LinkedFileSystem.h"
#include "platform/common/UserFolders.h"
#include "platform/common/WholeFile.h"
#include "platform/described/DescribedVolumes.h"
#include "platform/described/MachineDescription.h"

#include <filesystem>
#include <system_error>
#include <utility>

namespace platform {

namespace {

    class DescribedFileSystem : public LinkedFileSystem {
    public:
        DescribedFileSystem(const FileSystem& real, const LinkTable& table, std::optional<std::string> home)
            : LinkedFileSystem(real, table)
            , _home(std::move(home))
        {
        }
        std::optional<std::string> homeFolder() const override { return _home; }

    private:
        const std::optional<std::string> _home;
    };

    /// Knows one application at most, and no icon; what is handed to the desktop goes to the real one. The environment
    /// is that of another machine, so the settings are those in the home folder.
    class DescribedWorkspace : public Workspace {
    public:
        DescribedWorkspace(std::optional<std::string> editorPath, const FileSystem& files, Workspace& desktop)
            : _editorPath(std::move(editorPath))
            , _files(files)
            , _desktop(desktop)
        {
        }
        std::optional<std::string> applicationPath(std::string_view identifier) const override
        {
            return identifier == describedEditorIdentifier ? _editorPath : std::nullopt;
        }
        std::optional<std::string> applicationIconFile(std::string_view) const override { return std::nullopt; }
        std::optional<std::string> videosFolder() const override
        {
            const std::optional<std::string> home = _files.homeFolder();
            return home ? userFolder(_files, pathJoined(*home, ".config"), "XDG_VIDEOS_DIR") : std::nullopt;
        }
        void launchApplication(std::string_view identifier) override
        {
            launchProgram(applicationPath(identifier).value_or(std::string()));
        }
        void launchProgram(std::string_view path) override { _desktop.launchProgram(_files.resolvedPath(path)); }
        void revealFile(std::string_view path) override { _desktop.revealFile(_files.resolvedPath(path)); }
        void observeHandOvers(std::function<void(const HandOver&)> observer) override
        {
            _desktop.observeHandOvers(std::move(observer));
        }

    private:
        const std::optional<std::string> _editorPath;
        const FileSystem& _files;
        Workspace& _desktop;
    };

    std::string absolutePath(const std::string& file)
    {
        std::error_code error;
        return lexicallyAbsolute(file, std::filesystem::current_path(error).string());
    }

} // namespace

struct DescribedPlatform::Roles {
    Roles(const MachineDescription& description, const Platform& base)
        : volumes(description, fileSystem, base.volumes)
        , links(description.links, volumes, base.fileSystem.withoutAddedLinks())
        , fileSystem(base.fileSystem.withoutAddedLinks(), links, description.home)
        , pathWatching(base.pathWatching.withPathsOf(fileSystem, volumes))
        , workspace(description.editorPath, fileSystem, base.workspace)
    {
    }

    DescribedVolumes volumes;
    LinkTable links;
    DescribedFileSystem fileSystem;
    std::unique_ptr<PathWatching> pathWatching;
    DescribedWorkspace workspace;
    FilePreferences preferences { fileSystem };
    FileMovies movies { fileSystem };
    FileMetadataIndex metadataIndex { fileSystem, movies };
};

DescribedPlatform::DescribedPlatform(const MachineDescription& description, const Platform& base)
    : _roles(std::make_unique<Roles>(description, base))
    , _base(base)
{
}

DescribedPlatform::~DescribedPlatform() = default;

Platform DescribedPlatform::platform() const
{
    return {
        .fileSystem = _roles->fileSystem,
        .pathWatching = *_roles->pathWatching,
        .volumes = _roles->volumes,
        .workspace = _roles->workspace,
        .preferences = _roles->preferences,
        .metadataIndex = _roles->metadataIndex,
        .movies = _roles->movies,
        .notifications = _base.notifications,
        .workspaceNotifications = _base.workspaceNotifications,
        .clock = _base.clock,
        .calendar = _base.calendar,
        .threads = _base.threads,
        .mainRunLoop = _base.mainRunLoop,
        .console = _base.console,
        .bundles = _base.bundles,
        .languages = _base.languages,
    };
}

DescribedPlatformResult describedPlatform(const std::string& file, const Platform& base)
{
    const std::string path = absolutePath(file);
    const OpenResult opened = base.fileSystem.openPlainFile(path);
    if (!opened.file)
        return { nullptr, file + ": cannot be read: " + std::string(textOfFileProblem(opened.problem)) };
    const std::string bytes = readBytes(*opened.file, largestMachineDescription + 1);
    MachineDescriptionResult result = readMachineDescription(bytes, pathByRemovingLastComponent(path));
    if (!result.problem.empty())
        return { nullptr, file + ":" + result.problem };
    return { std::make_unique<DescribedPlatform>(std::move(result.description), base), {} };
}

} // namespace platform
