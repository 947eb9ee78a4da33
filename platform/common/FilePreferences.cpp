#include "platform/common/FilePreferences.h"

#include "platform/FileProblemText.h"
#include "platform/FileSystem.h"
#include "platform/PathText.h"
#include "platform/common/WholeFile.h"
#include "platform/formats/PropertyList.h"

#include <cstddef>
#include <utility>

namespace platform {

namespace {

    /// A thousand times what a program stores; the rest is a mistake, or malice.
    constexpr std::size_t largestDomain = std::size_t { 16 } << 20;

    bool isFileName(std::string_view domain)
    {
        return !domain.empty() && domain.find('/') == std::string_view::npos
            && domain.find('\0') == std::string_view::npos;
    }

    bool isNeverStored(FileProblem problem)
    {
        return problem == FileProblem::missing || problem == FileProblem::notAFolder;
    }

    PropertyListResult readValues(const OpenFile& file)
    {
        const std::string bytes = readBytes(file, largestDomain + 1);
        if (bytes.size() > largestDomain)
            return { {}, "it is larger than 16 MiB" };
        if (bytes.size() < file.status().size)
            return { {}, std::string(textOfFileProblem(FileProblem::readError)) };
        PropertyListResult result = readPropertyList(bytes);
        if (result.problem.empty() && !result.value.dictionary())
            result = { {}, "its outermost value is no dictionary" };
        return result;
    }

} // namespace

FilePreferences::FilePreferences(const FileSystem& files)
    : _files(files)
{
}

PreferencesAnswer FilePreferences::valuesOfDomain(std::string_view domain) const
{
    const std::optional<std::string> home = _files.homeFolder();
    if (!home || !isFileName(domain))
        return {};
    const std::string path = pathJoined(*home, "Library/Preferences/" + std::string(domain) + ".plist");
    const OpenResult opened = _files.openPlainFile(path);
    if (!opened.file) {
        if (isNeverStored(opened.problem))
            return {};
        return { {}, path + ": cannot be read: " + std::string(textOfFileProblem(opened.problem)) };
    }
    PropertyListResult values = readValues(*opened.file);
    if (!values.problem.empty())
        return { {}, path + ": " + values.problem };
    return { std::move(values.value), {} };
}

} // namespace platform
