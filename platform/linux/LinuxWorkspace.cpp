#include "platform/linux/LinuxWorkspace.h"

#include "platform/FileSystem.h"
#include "platform/FileUri.h"
#include "platform/PathText.h"
#include "platform/Threads.h"
#include "platform/common/UserFolders.h"
#include "platform/formats/DesktopEntry.h"
#include "platform/linux/DataFolders.h"
#include "platform/linux/DetachedProgram.h"
#include "platform/linux/IconTheme.h"
#include "platform/linux/SessionBus.h"

#include <algorithm>
#include <chrono>
#include <utility>

#include <unistd.h>

namespace platform {

namespace {

    // Less than a person waits before trying again.
    constexpr std::chrono::milliseconds busLimit { 2000 };

    struct Application {
        std::string program;
        std::string icon;
        std::vector<std::string> command {}; // program first; empty where the entry has none
        std::string workingFolder {};
        bool isActivatedByBus = false;
    };

    // An argument of the command line for a start without files (Desktop Entry Specification, "The Exec key"); absent
    // for one that stands for what there is not.
    void addArgument(std::vector<std::string>& command, const std::string& argument, const DesktopEntry& entry)
    {
        if (argument == "%i") {
            if (!entry.icon.empty())
                command.insert(command.end(), { "--icon", entry.icon });
            return;
        }
        std::string text;
        for (std::size_t index = 0; index < argument.size(); ++index) {
            const bool isCode = argument[index] == '%' && index + 1 < argument.size();
            if (!isCode)
                text += argument[index];
            else if (argument[++index] == '%')
                text += '%';
            else if (argument[index] == 'c')
                text += entry.name;
        }
        if (!text.empty() || argument.empty())
            command.push_back(std::move(text));
    }

    std::vector<std::string> commandOfEntry(const DesktopEntry& entry, const std::string& program)
    {
        const ExecArguments exec = splitExec(entry.exec);
        std::vector<std::string> command;
        if (!exec.problem.empty() || exec.arguments.empty())
            return command;
        command.push_back(program);
        for (std::size_t index = 1; index < exec.arguments.size(); ++index)
            addArgument(command, exec.arguments[index], entry);
        return command;
    }

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
            return Application { program, result.entry.icon, commandOfEntry(result.entry, program), result.entry.path,
                result.entry.dBusActivatable };
        }
        return std::nullopt;
    }

} // namespace

LinuxWorkspace::LinuxWorkspace(const FileSystem& files, Threads& threads)
    : _files(files)
    , _threads(threads)
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

std::optional<std::string> LinuxWorkspace::videosFolder() const
{
    const std::vector<std::string> settings = settingsFolders(_files);
    return settings.empty() ? std::nullopt : userFolder(_files, settings.front(), "XDG_VIDEOS_DIR");
}

void LinuxWorkspace::launchApplication(std::string_view identifier)
{
    auto application = findApplication(_files, identifier);
    handOver([application = std::move(application), name = std::string(identifier)]() -> std::string {
        if (!application)
            return name + ": no such application";
        if (application->isActivatedByBus) {
            const BusAnswer answer = activateApplicationOnBus(name, busLimit);
            // One that is slow to start must not be started twice.
            if (answer.problem.empty() || answer.mayStillHappen || application->command.empty())
                return answer.problem;
        }
        return startDetachedProgram(application->command, application->workingFolder);
    });
}

void LinuxWorkspace::launchProgram(std::string_view path)
{
    handOver([program = std::string(path)] { return startDetachedProgram({ program }, {}); });
}

void LinuxWorkspace::revealFile(std::string_view path)
{
    handOver([file = std::string(path)]() -> std::string {
        if (showItemOnBus(fileUri(file), busLimit).problem.empty())
            return {};
        const std::string folder = file.substr(0, std::max<std::size_t>(file.rfind('/'), 1));
        const std::string problem = startDetachedProgram({ "xdg-open", folder }, {});
        return problem.empty() || startDetachedProgram({ "gio", "open", folder }, {}).empty() ? std::string() : problem;
    });
}

void LinuxWorkspace::observeHandOvers(std::function<void(const HandOver&)> observer)
{
    Locked guard(_observed->lock);
    _observed->observer = std::move(observer);
}

/// On a thread of its own, so that neither a bus nor a program keeps the caller waiting.
void LinuxWorkspace::handOver(std::function<std::string()> perform)
{
    const auto tell = [observed = _observed](const std::string& problem) {
        Locked guard(observed->lock);
        if (observed->observer)
            observed->observer({ problem.empty(), problem });
    };
    if (!_threads.startDetached("ob-desktop", [tell, work = std::move(perform)] { tell(work()); }))
        tell("the system gives no thread");
}

} // namespace platform
