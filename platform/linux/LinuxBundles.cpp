#include "platform/linux/LinuxBundles.h"

#include "platform/FileProblemText.h"
#include "platform/FileSystem.h"
#include "platform/PathText.h"
#include "platform/common/WholeFile.h"
#include "platform/formats/Manifest.h"
#include "platform/formats/PropertyList.h"
#include "platform/linux/PathResolution.h"
#include "platform/linux/PictureSize.h"
#include "platform/linux/SharedLibraryCheck.h"

#include <algorithm>
#include <utility>

#include <dlfcn.h>
#include <fcntl.h>
#include <link.h>

namespace platform {

namespace {

    constexpr std::string_view pluginsFolder = "ombrix/plugins";
    constexpr std::string_view frameworkLibrary = "libombrix.so";

    struct Content {
        std::string bytes;
        std::string problem; // names the file; empty when read
    };

    Content readContent(const FileSystem& files, const std::string& path, std::size_t sizeAtMost)
    {
        const OpenResult opened = files.openPlainFile(path);
        if (!opened.file)
            return { {}, path + ": cannot be read: " + std::string(textOfFileProblem(opened.problem)) };
        Content content { readBytes(*opened.file, sizeAtMost + 1), {} };
        if (content.bytes.size() > sizeAtMost)
            return { {}, path + ": it is larger than " + std::to_string(sizeAtMost >> 20) + " MiB" };
        if (content.bytes.size() < opened.file->status().size)
            return { {}, path + ": cannot be read: " + std::string(textOfFileProblem(FileProblem::readError)) };
        return content;
    }

    bool isFileName(std::string_view name)
    {
        return !name.empty() && name.find('/') == std::string_view::npos && name.find('\0') == std::string_view::npos;
    }

    std::string resourcePath(std::string_view folder, std::string_view name, std::string_view suffix)
    {
        return pathJoined(folder, "resources/").append(name).append(suffix);
    }

    // The loader's messages are one line, but may hold what a damaged library holds.
    std::string loaderProblem(const std::string& path)
    {
        const char* message = dlerror();
        std::string problem = message ? message : "the loader gives no reason";
        std::replace_if(
            problem.begin(), problem.end(), [](char byte) { return byte == '\n' || byte == '\r'; }, ' ');
        return problem.substr(0, path.size()) == path ? problem : path + ": " + problem;
    }

    int takeLibrary(dl_phdr_info* information, std::size_t, void* libraries)
    {
        if (information->dlpi_name && information->dlpi_name[0] == '/')
            static_cast<std::vector<std::string>*>(libraries)->emplace_back(information->dlpi_name);
        return 0;
    }

    std::vector<std::string> loadedLibraries()
    {
        std::vector<std::string> libraries;
        dl_iterate_phdr(takeLibrary, &libraries);
        return libraries;
    }

    // The kernel tells where the program lies; without /proc the loader does, if it was started by an absolute path.
    std::string pathOfProgram()
    {
        if (const auto target = readLink(AT_FDCWD, "/proc/self/exe"))
            return *target;
        Dl_info information {};
        const bool isKnown = dladdr(reinterpret_cast<const void*>(&pathOfProgram), &information) != 0;
        return isKnown && information.dli_fname && information.dli_fname[0] == '/' ? information.dli_fname
                                                                                   : std::string();
    }

} // namespace

LinuxBundles::LinuxBundles(const FileSystem& files)
    : _files(files)
{
}

ManifestAnswer LinuxBundles::readManifest(std::string_view folder) const
{
    constexpr std::size_t largestManifest = 1 << 20;
    const std::string path = pathJoined(folder, "manifest.json");
    Content content = readContent(_files, path, largestManifest);
    if (!content.problem.empty())
        return { {}, std::move(content.problem) };
    ManifestAnswer answer = platform::readManifest(content.bytes);
    if (!answer.problem.empty())
        answer.problem = path + ':' + answer.problem;
    return answer;
}

StringTableAnswer LinuxBundles::readStringTable(std::string_view folder, std::string_view language) const
{
    constexpr std::size_t largestTable = 16 << 20;
    const std::string path = resourcePath(folder, language, ".strings.plist");
    if (!isFileName(language))
        return { {}, path + ": this is no language" };
    Content content = readContent(_files, path, largestTable);
    if (!content.problem.empty())
        return { {}, std::move(content.problem) };
    PropertyListResult list = readPropertyList(content.bytes);
    if (!list.problem.empty())
        return { {}, path + ": " + list.problem };
    const Value::Dictionary* table = list.value.dictionary();
    if (!table)
        return { {}, path + ": it is no dictionary" };
    for (const auto& [key, text] : *table) {
        if (!text.text())
            return { {}, path + ": the value of \"" + key.string() + "\" is no text" };
    }
    return { std::move(list.value), {} };
}

std::optional<ImageResource> LinuxBundles::imageResource(std::string_view folder, std::string_view name) const
{
    constexpr std::size_t headLength = 64 * 1024;
    std::string path = resourcePath(folder, name, ".svg");
    const OpenResult opened = isFileName(name) ? _files.openPlainFile(path) : OpenResult();
    if (!opened.file)
        return std::nullopt;
    return ImageResource { std::move(path), sizeOfVectorPicture(readBytes(*opened.file, headLength)) };
}

LibraryAnswer LinuxBundles::loadLibrary(const std::string& path, const char* symbol)
{
    const OpenResult opened = _files.openPlainFile(path);
    if (!opened.file)
        return { nullptr, path + ": cannot be read: " + std::string(textOfFileProblem(opened.problem)) };
    if (std::string problem = problemOfSharedLibrary(*opened.file); !problem.empty())
        return { nullptr, path + ": " + problem };
    // Never unloaded: objects of its classes may live as long as the process.
    const std::string realPath = _files.resolvedPath(path);
    void* library = dlopen(realPath.c_str(), RTLD_NOW | RTLD_LOCAL | RTLD_NODELETE);
    if (!library)
        return { nullptr, loaderProblem(path) };
    dlerror();
    void* entryPoint = dlsym(library, symbol);
    if (!entryPoint)
        return { nullptr, loaderProblem(path) };
    return { entryPoint, {} };
}

std::string LinuxBundles::installedPluginsFolder() const
{
    const std::vector<std::string> folders = possiblePluginsFolders(pathOfProgram(), loadedLibraries());
    const auto found = std::find_if(folders.begin(), folders.end(), [this](const std::string& folder) {
        const auto status = _files.status(folder);
        return status && status->kind == ItemKind::folder;
    });
    return _files.resolvedPath(found == folders.end() ? folders.front() : *found);
}

std::vector<std::string> possiblePluginsFolders(std::string_view program, const std::vector<std::string>& libraries)
{
    std::vector<std::string> folders;
    for (const std::string& library : libraries) {
        if (lastPathComponent(library).substr(0, frameworkLibrary.size()) == frameworkLibrary)
            folders.push_back(pathJoined(pathByRemovingLastComponent(library), pluginsFolder));
    }
    const std::string_view prefix = pathByRemovingLastComponent(pathByRemovingLastComponent(program));
    const std::string libraryFolder = pathJoined(prefix.empty() ? "/usr" : prefix, "lib");
    folders.push_back(pathJoined(libraryFolder, pluginsFolder));
    folders.push_back(pathJoined(pathJoined(libraryFolder, OMBRIX_LIBRARY_ARCHITECTURE), pluginsFolder));
    return folders;
}

} // namespace platform
