#include "platform/linux/LinuxWorkspace.h"

#include "platform/FileSystem.h"
#include "platform/PathText.h"
#include "platform/formats/DesktopEntry.h"
#include "platform/linux/DataFolders.h"
#include "platform/linux/IconTheme.h"

#include <algorithm>

#include <unistd.h>

namespace platform {

namespace {

    struct Application {
        std::string program;
        std::string icon;
    };

    bool isProgram(const FileSystem& files, const std::string& path)
    {
        const auto status = files.status(path);
        return status && status->kind == ItemKind::file && access(path.c_str(), X_OK) == 0;
    }

    std::string programCalled(const FileSystem& files, const std::string& name)
    {
        for (const std::string& folder : programFolders()) {
            std::string path = pathJoined(folder, name);
            if (isProgram(files, path))
                return path;
        }
        return "/usr/bin/" + name;
    }

    // Empty for what names no program.
    std::string absoluteProgram(const FileSystem& files, const std::string& program, const std::string& workingFolder)
    {
        if (program.empty() || program.find('\0') != std::string::npos)
            return {};
        if (program.front() == '/')
            return program;
        if (program.find('/') == std::string::npos)
            return programCalled(files, program);
        const bool hasFolder = !workingFolder.empty() && workingFolder.front() == '/';
        return hasFolder ? pathJoined(workingFolder, program) : std::string();
    }

    std::string programOfEntry(const FileSystem& files, const DesktopEntry& entry)
    {
        const ExecArguments command = splitExec(entry.exec);
        const bool isWhole = command.problem.empty() && !command.arguments.empty();
        std::string program = isWhole ? absoluteProgram(files, command.arguments.front(), entry.path) : std::string();
        return program.empty() ? absoluteProgram(files, entry.tryExec, entry.path) : program;
    }

    bool isEntryName(std::string_view identifier)
    {
        return !identifier.empty() && identifier.find('/') == std::string_view::npos
            && identifier.find('\0') == std::string_view::npos;
    }

    // The first entry that can be read decides: a hidden one takes back those after it.
    std::optional<Application> findApplication(const FileSystem& files, std::string_view identifier)
    {
        constexpr std::size_t largestEntry = 4 << 20;
        if (!isEntryName(identifier))
            return std::nullopt;
        const std::string name = "applications/" + std::string(identifier) + ".desktop";
        for (const std::string& folder : dataFolders(files)) {
            const auto bytes = contentOfFile(files, pathJoined(folder, name), largestEntry);
            if (!bytes)
                continue;
            const DesktopEntryResult result = readDesktopEntry(*bytes);
            if (!result.problem.empty())
                continue;
            const std::string program = programOfEntry(files, result.entry);
            const bool isApplication = result.entry.type.empty() || result.entry.type == "Application";
            if (result.entry.hidden || !isApplication || program.empty())
                return std::nullopt;
            return Application { program, result.entry.icon };
        }
        return std::nullopt;
    }

} // namespace

LinuxWorkspace::LinuxWorkspace(const FileSystem& files)
    : _files(files)
{
}

std::optional<std::string> LinuxWorkspace::applicationPath(std::string_view identifier) const
{
    auto application = findApplication(_files, identifier);
    if (!application)
        return std::nullopt;
    remember(identifier);
    return std::move(application->program);
}

std::optional<std::string> LinuxWorkspace::applicationIconFile(std::string_view applicationPath) const
{
    std::vector<std::string> identifiers;
    {
        Locked guard(_lock);
        identifiers = _identifiers;
    }
    for (const std::string& identifier : identifiers) {
        const auto application = findApplication(_files, identifier);
        if (application && application->program == applicationPath)
            return iconFile(_files, application->icon);
    }
    return std::nullopt;
}

void LinuxWorkspace::remember(std::string_view identifier) const
{
    constexpr std::size_t identifiersAtMost = 64;
    Locked guard(_lock);
    if (std::find(_identifiers.begin(), _identifiers.end(), identifier) != _identifiers.end())
        return;
    if (_identifiers.size() == identifiersAtMost)
        _identifiers.erase(_identifiers.begin());
    _identifiers.emplace_back(identifier);
}

} // namespace platform
