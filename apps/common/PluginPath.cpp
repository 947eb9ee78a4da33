#include "apps/common/PluginPath.h"

#include "apps/common/Terminal.h"
#include "host/OBConstants.h"
#include "platform/FileProblemText.h"
#include "platform/PathText.h"

#include <algorithm>
#include <filesystem>
#include <string_view>
#include <system_error>

namespace apps {
namespace {

    constexpr const char* variable = "OMBRIX_PLUGIN_PATH";

    /// Bundles are read from when something of them is needed, and the working folder may be another one then.
    std::string absoluteFolder(std::string_view folder)
    {
        std::error_code error;
        const std::filesystem::path absolute = std::filesystem::absolute(folder, error);
        return error ? std::string(folder) : absolute.string();
    }

    bool isBundle(std::string_view name)
    {
        return platform::extensionOfName(name) == OBBundleExtension;
    }

    /// Why no bundle is found in `folder`; empty where one is.
    std::string problemOfFolder(const platform::FileSystem& fileSystem, const std::string& folder)
    {
        const platform::FolderListing listing = fileSystem.itemsInFolder(folder, {});
        if (listing.problem() == platform::FileProblem::notAFolder)
            return "it is no folder";
        if (listing.problem() != platform::FileProblem::none)
            return std::string(platform::textOfFileProblem(listing.problem()));
        for (const platform::FolderItem item : listing) {
            if (isBundle(item.name))
                return {};
        }
        if (isBundle(platform::lastPathComponent(folder)))
            return "it is a bundle itself, name the folder that holds it";
        return "it holds no bundle, no folder NAME." + std::string(OBBundleExtension);
    }

} // namespace

std::vector<std::string> foldersOfPluginPath()
{
    std::vector<std::string> folders;
    std::string_view rest = environmentVariable(variable);
    while (!rest.empty()) {
        const std::string_view folder = rest.substr(0, rest.find(':'));
        rest.remove_prefix(std::min(rest.size(), folder.size() + 1));
        if (!folder.empty())
            folders.push_back(absoluteFolder(folder));
    }
    return folders;
}

std::vector<std::string> problemsOfPluginPath(const platform::FileSystem& fileSystem)
{
    std::vector<std::string> problems;
    for (const std::string& folder : foldersOfPluginPath()) {
        if (const std::string problem = problemOfFolder(fileSystem, folder); !problem.empty())
            problems.push_back(std::string(variable).append(": ").append(folder).append(": ").append(problem));
    }
    return problems;
}

} // namespace apps
