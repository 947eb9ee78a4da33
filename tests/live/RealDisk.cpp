#include "tests/live/RealDisk.h"

#include "platform/PathText.h"
#include "tests/support/MovieWriter.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cstdio>
#include <filesystem>
#include <system_error>
#include <utility>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace tests {

using platform::Descriptor;
using platform::ItemKind;
using Kind = platform::PathChange::Kind;

namespace {

    namespace fs = std::filesystem;

    constexpr mode_t closedMode = 0;
    constexpr mode_t openFolderMode = 0755;
    constexpr mode_t openFileMode = 0644;

    ItemKind kindOfMode(mode_t mode)
    {
        return S_ISDIR(mode) ? ItemKind::folder
            : S_ISREG(mode)  ? ItemKind::file
            : S_ISLNK(mode)  ? ItemKind::symbolicLink
                             : ItemKind::other;
    }

    /// A movie's bytes for its size, anything else as it is.
    std::string bytesFor(const std::string& text)
    {
        int width = 0;
        int height = 0;
        const char* const end = text.data() + text.size();
        const std::from_chars_result first = std::from_chars(text.data(), end, width);
        if (first.ec != std::errc() || first.ptr == end || *first.ptr != 'x')
            return text;
        std::from_chars(first.ptr + 1, end, height);
        return movieBytes(width, height);
    }

    void writeTo(const Descriptor& file, std::string_view bytes)
    {
        static_cast<void>(platform::uninterrupted([&] { return write(file.number(), bytes.data(), bytes.size()); }));
    }

    std::array<timespec, 2> timesOf(platform::Date date)
    {
        const timespec time { static_cast<time_t>(date.seconds), static_cast<long>(date.nanoseconds) };
        return { time, time };
    }

} // namespace

RealDisk::RealDisk(std::string top)
    : _top(std::move(top))
{
}

RealDisk::~RealDisk() = default;

std::string RealDisk::systemPath(const std::string& path) const
{
    return path == "/" ? _top : _top + path;
}

std::string RealDisk::ownPath(const std::string& systemPath) const
{
    if (!platform::isSameOrBelow(systemPath, _top))
        return systemPath;
    return systemPath.size() == _top.size() ? "/" : systemPath.substr(_top.size());
}

std::optional<RealDisk::Key> RealDisk::keyOf(const std::string& systemPath)
{
    struct stat facts { };
    if (lstat(systemPath.c_str(), &facts) != 0)
        return std::nullopt;
    return Key { facts.st_dev, facts.st_ino, kindOfMode(facts.st_mode) };
}

std::optional<ItemKind> RealDisk::kindOf(const std::string& path) const
{
    const std::optional<Key> key = keyOf(systemPath(path));
    return key ? std::optional(key->kind) : std::nullopt;
}

std::vector<LiveDisk::Item> RealDisk::itemsIn(const std::string& path) const
{
    std::vector<Item> items;
    if (kindOf(path) != ItemKind::folder)
        return items;
    std::error_code error;
    for (fs::directory_iterator entry(systemPath(path), error); !error && entry != fs::directory_iterator();
         entry.increment(error)) {
        if (const std::optional<Key> key = keyOf(entry->path()))
            items.push_back({ entry->path().filename(), key->kind });
    }
    // The draws of a seed are not to depend on the order in which a disk keeps names.
    std::sort(items.begin(), items.end(), [](const Item& one, const Item& other) { return one.name < other.name; });
    return items;
}

std::string RealDisk::linkTarget(const std::string& path) const
{
    std::error_code error;
    return ownPath(fs::read_symlink(systemPath(path), error));
}

std::string RealDisk::realPath(const std::string& path) const
{
    std::error_code error;
    const fs::path real = fs::weakly_canonical(systemPath(path), error);
    return error ? path : ownPath(real);
}

std::uint64_t RealDisk::numberOf(const std::string& path)
{
    const std::optional<Key> key = keyOf(systemPath(path));
    if (!key)
        return 0;
    _keys.emplace(++_last, *key);
    return _last;
}

std::string RealDisk::pathOf(std::uint64_t number) const
{
    const auto known = _keys.find(number);
    if (known == _keys.end())
        return {};
    std::error_code error;
    fs::recursive_directory_iterator entry(_top, fs::directory_options::skip_permission_denied, error);
    for (; !error && entry != fs::recursive_directory_iterator(); entry.increment(error)) {
        if (keyOf(entry->path()) == known->second)
            return ownPath(entry->path());
    }
    return {};
}

void RealDisk::tell(Kind kind, const std::string& path) const
{
    if (!changed)
        return;
    const std::string folder = realPath(std::string(platform::pathByRemovingLastComponent(path)));
    changed(kind, platform::pathJoined(folder, platform::lastPathComponent(path)));
}

void RealDisk::tellContents(Kind kind, const std::string& path) const
{
    if (kindOf(path) != ItemKind::folder)
        return;
    std::error_code error;
    fs::recursive_directory_iterator entry(systemPath(path), fs::directory_options::skip_permission_denied, error);
    for (; !error && entry != fs::recursive_directory_iterator(); entry.increment(error))
        tell(kind, ownPath(entry->path()));
}

bool RealDisk::makeFolder(const std::string& path)
{
    if (mkdir(systemPath(path).c_str(), openFolderMode) != 0)
        return false;
    tell(Kind::appeared, path);
    return true;
}

std::uint64_t RealDisk::beginFile(const std::string& path)
{
    Descriptor file(open(systemPath(path).c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, openFileMode));
    if (!file.isOpen())
        return 0;
    writeTo(file, "1");
    _written.emplace(++_last, Writing { std::move(file), path });
    tell(Kind::appeared, path);
    return _last;
}

void RealDisk::endFile(std::uint64_t number, const std::string& text, std::optional<platform::Date> date)
{
    const auto written = _written.extract(number);
    if (written.empty())
        return;
    std::string path;
    {
        const Descriptor file = std::move(written.mapped().file);
        static_cast<void>(ftruncate(file.number(), 0));
        static_cast<void>(lseek(file.number(), 0, SEEK_SET));
        writeTo(file, bytesFor(text));
        if (date)
            static_cast<void>(futimens(file.number(), timesOf(*date).data()));
        std::error_code error;
        path = fs::read_symlink("/proc/self/fd/" + std::to_string(file.number()), error);
    }
    tell(Kind::arrivalEnded, ownPath(path));
}

bool RealDisk::writeFile(const std::string& path, const std::string& text)
{
    if (const std::uint64_t number = beginFile(path)) {
        endFile(number, text, std::nullopt);
        return true;
    }
    const bool isFile = kindOf(path) == ItemKind::file;
    Descriptor file(isFile ? open(systemPath(path).c_str(), O_WRONLY | O_TRUNC | O_NOFOLLOW | O_CLOEXEC) : -1);
    if (!file.isOpen())
        return false;
    writeTo(file, bytesFor(text));
    file = {};
    tell(Kind::contentChanged, path);
    return true;
}

bool RealDisk::makeLink(const std::string& path, const std::string& target)
{
    if (symlink(systemPath(target).c_str(), systemPath(path).c_str()) != 0)
        return false;
    tell(Kind::appeared, path);
    return true;
}

bool RealDisk::rename(const std::string& from, const std::string& to)
{
    // As in memory: what stands in the way stays.
    if (renameat2(AT_FDCWD, systemPath(from).c_str(), AT_FDCWD, systemPath(to).c_str(), RENAME_NOREPLACE) != 0)
        return false;
    tell(Kind::disappeared, from);
    tell(Kind::appeared, to);
    tellContents(Kind::found, to);
    return true;
}

bool RealDisk::remove(const std::string& path)
{
    tellContents(Kind::disappeared, path);
    std::error_code error;
    const bool isGone = fs::remove_all(systemPath(path), error) != 0 && !error;
    tell(Kind::disappeared, path);
    return isGone;
}

bool RealDisk::setOpen(const std::string& path, bool isOpen)
{
    const std::optional<ItemKind> kind = kindOf(path);
    const mode_t openMode = kind == ItemKind::folder ? openFolderMode : openFileMode;
    if (!kind || kind == ItemKind::symbolicLink || chmod(systemPath(path).c_str(), isOpen ? openMode : closedMode) != 0)
        return false;
    tell(Kind::attributesChanged, path);
    return true;
}

bool RealDisk::setModified(const std::string& path, platform::Date date)
{
    const std::optional<ItemKind> kind = kindOf(path);
    if (!kind || kind == ItemKind::symbolicLink
        || utimensat(AT_FDCWD, systemPath(path).c_str(), timesOf(date).data(), AT_SYMLINK_NOFOLLOW) != 0)
        return false;
    tell(Kind::attributesChanged, path);
    return true;
}

void RealDisk::storm(const std::string& folder, std::uint64_t reports) const
{
    const std::string one = systemPath(folder) + "/storm";
    const std::string other = one + " too";
    const Descriptor made(open(one.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, openFileMode));
    for (std::uint64_t count = 0; count < reports; count += 4) {
        static_cast<void>(std::rename(one.c_str(), other.c_str()));
        static_cast<void>(std::rename(other.c_str(), one.c_str()));
    }
    unlink(one.c_str());
}

} // namespace tests
