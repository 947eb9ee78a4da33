#include "tests/support/TemporaryFolder.h"

#include "platform/PathText.h"

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <system_error>
#include <vector>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace tests {

namespace {

    namespace fs = std::filesystem;

    [[noreturn]] void cannotArrange(const std::string& what, const std::string& path)
    {
        std::fprintf(stderr, "tests: %s: cannot be %s\n", path.c_str(), what.c_str());
        std::abort();
    }

    void check(const std::error_code& error, const char* what, const std::string& path)
    {
        if (error)
            cannotArrange(what, path);
    }

    /// A folder that a test took the permissions from can be neither emptied nor moved by an ordinary user.
    void giveBackPermissions(const fs::path& folder)
    {
        std::error_code error;
        fs::permissions(folder, fs::perms::owner_all, fs::perm_options::add | fs::perm_options::nofollow, error);
    }

    std::vector<fs::directory_entry> entriesOf(const std::string& folder)
    {
        giveBackPermissions(folder);
        std::error_code error;
        std::vector<fs::directory_entry> entries;
        for (const fs::directory_entry& entry : fs::directory_iterator(folder, error))
            entries.push_back(entry);
        return entries;
    }

    bool isFolder(const fs::directory_entry& entry)
    {
        std::error_code error;
        return entry.is_directory(error) && !entry.is_symlink(error);
    }

    /// Removes the files of `inner` and moves its folders up into `folder`.
    void moveUp(const fs::path& inner, const fs::path& folder, std::size_t& moved, std::error_code& error)
    {
        for (const fs::directory_entry& entry : entriesOf(inner)) {
            if (isFolder(entry)) {
                giveBackPermissions(entry.path());
                fs::rename(entry.path(), folder / ("moved up " + std::to_string(++moved)), error);
            } else {
                fs::remove(entry.path(), error);
            }
        }
    }

    /// Empties a folder of any depth: what lies in its folders is first moved up, so that no path grows.
    void emptyFolder(const std::string& folder)
    {
        std::error_code error;
        std::size_t moved = 0;
        for (auto entries = entriesOf(folder); !entries.empty() && !error; entries = entriesOf(folder)) {
            for (const fs::directory_entry& entry : entries) {
                if (isFolder(entry))
                    moveUp(entry.path(), folder, moved, error);
                fs::remove(entry.path(), error);
            }
        }
        check(error, "emptied", folder);
    }

} // namespace

TemporaryFolder::TemporaryFolder()
{
    std::error_code error;
    std::string pattern = (fs::canonical(fs::temp_directory_path(error), error) / "ombrix-test-XXXXXX").string();
    if (!mkdtemp(pattern.data()))
        cannotArrange("made", pattern);
    _path = pattern;
}

TemporaryFolder::~TemporaryFolder()
{
    removeItem(_path);
}

std::string TemporaryFolder::path(std::string_view relativePath) const
{
    return platform::pathJoined(_path, relativePath);
}

std::string TemporaryFolder::folder(std::string_view relativePath) const
{
    makeFolder(path(relativePath));
    return path(relativePath);
}

std::string TemporaryFolder::file(std::string_view relativePath, std::string_view bytes) const
{
    writeFile(path(relativePath), bytes);
    return path(relativePath);
}

std::string TemporaryFolder::link(std::string_view relativePath, const std::string& target) const
{
    makeLink(path(relativePath), target);
    return path(relativePath);
}

std::string TemporaryFolder::pipe(std::string_view relativePath) const
{
    std::string pipePath = path(relativePath);
    makeFolder(std::string(platform::pathByRemovingLastComponent(pipePath)));
    if (mkfifo(pipePath.c_str(), S_IRUSR | S_IWUSR) != 0)
        cannotArrange("made", pipePath);
    return pipePath;
}

void makeFolder(const std::string& path)
{
    std::error_code error;
    fs::create_directories(path, error);
    check(error, "made", path);
}

void writeFile(const std::string& path, std::string_view bytes)
{
    makeFolder(std::string(platform::pathByRemovingLastComponent(path)));
    std::ofstream file(path, std::ios::binary | std::ios::trunc);
    file.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    if (!file.flush())
        cannotArrange("written", path);
}

void makeLink(const std::string& path, const std::string& target)
{
    makeFolder(std::string(platform::pathByRemovingLastComponent(path)));
    std::error_code error;
    fs::create_symlink(target, path, error);
    check(error, "linked", path);
}

void setModificationDate(const std::string& path, platform::Date date)
{
    const timespec written { static_cast<time_t>(date.seconds), static_cast<long>(date.nanoseconds) };
    const timespec times[] = { written, written };
    if (utimensat(AT_FDCWD, path.c_str(), times, AT_SYMLINK_NOFOLLOW) != 0)
        cannotArrange("dated", path);
}

void removeItem(const std::string& path)
{
    std::error_code error;
    if (isFolder(fs::directory_entry(path, error)))
        emptyFolder(path);
    fs::remove(path, error);
    check(error, "removed", path);
}

std::string makeNestedFolders(const std::string& path, const std::string& name, int levels)
{
    makeFolder(path);
    int folder = open(path.c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC);
    for (int level = 0; level < levels && folder >= 0; ++level) {
        const bool isMade = mkdirat(folder, name.c_str(), S_IRWXU) == 0;
        const int inner = isMade ? openat(folder, name.c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC) : -1;
        close(folder);
        folder = inner;
    }
    if (folder < 0)
        cannotArrange("nested", path);
    close(folder);
    std::string deepest = path;
    for (int level = 0; level < levels; ++level)
        deepest.append(1, '/').append(name);
    return deepest;
}

} // namespace tests
