#include "tests/live/RandomOperations.h"

#include "platform/PathText.h"
#include "plugin/MontaroConstants.h"

#include <algorithm>
#include <array>
#include <chrono>
#include <cstdio>
#include <numeric>
#include <utility>

namespace tests {

using platform::ItemKind;
using platform::pathJoined;
using Kind = platform::PathChange::Kind;
using Reason = UnseenChanges::Reason;

namespace {

    constexpr std::chrono::seconds longestStep { 8 };
    constexpr std::chrono::seconds longestWriting { 30 };
    constexpr std::chrono::minutes longestFault { 1 };

} // namespace

RandomOperations::RandomOperations(LiveMachine& machine)
    : _machine(machine)
    , _chance(machine.chance())
    , _disk(machine.disk())
    , _places(machine)
    , _mayBeUnseen(_chance.oneIn(3))
{
    machine.makeVolume({ "/media/ann/Stick", "Stick", true });
    machine.makeVolume({ "/media/ann/disk-1", "Disk 1" });
    machine.makeVolume({ "/media/ann/Late", "Late" });
    _disk.changed = [this](Kind kind, const std::string& path) { diskChanged(kind, path); };
    machine.setWhenListing([this](std::string_view folder) {
        platform::FileProblem problem = platform::FileProblem::none;
        _machine.alone([&] {
            if (!_failing.contains(std::string(folder)))
                return;
            unseen.note(Reason::failedListing, folder);
            problem = platform::FileProblem::readError;
        });
        return problem;
    });
}

RandomOperations::~RandomOperations()
{
    _machine.setWhenListing(nullptr);
    _disk.changed = nullptr;
}

const std::vector<RandomOperations::Operation>& RandomOperations::operations()
{
    static const std::vector<Operation> table {
        { 3, &RandomOperations::makeLibrary },
        { 12, &RandomOperations::makeProject },
        { 12, &RandomOperations::makeEvent },
        { 12, &RandomOperations::addFile },
        { 5, &RandomOperations::makeFolder },
        { 8, &RandomOperations::renameItem },
        { 10, &RandomOperations::moveItem },
        { 8, &RandomOperations::removeItem },
        { 4, &RandomOperations::replaceItem },
        { 3, &RandomOperations::makeLink },
        { 3, &RandomOperations::closeFolder },
        { 2, &RandomOperations::dateFolder },
        { 3, &RandomOperations::hideNames },
        { 6, &RandomOperations::mountOrUnmount },
        { 1, &RandomOperations::dropReports },
        { 8, &RandomOperations::askForLoad },
        { 1, &RandomOperations::changePreference },
        { 1, &RandomOperations::takeEditor },
        { 2, &RandomOperations::rewriteFile },
        { 1, &RandomOperations::failFolder },
    };
    return table;
}

void RandomOperations::prepare()
{
    for (LiveMachine::Volume& volume : _machine.volumes) {
        if (volume.displayName != "Late" && !_chance.oneIn(4))
            _machine.mount(volume);
    }
    for (const char* const kind : { MontaroProjectsFolderName, MontaroEventsFolderName, MontaroProjectsFolderName })
        _disk.makeFolders(_places.library(kind));
    for (int count = 0; count < 6; ++count) {
        makeProject();
        makeEvent();
        makeFolder();
    }
    _machine.pause(std::chrono::hours(1));
    unseen.forget();
}

void RandomOperations::makeEditor()
{
    _disk.makeFolders("/opt");
    _disk.writeFile("/opt/montaro", "");
}

void RandomOperations::perform()
{
    const std::vector<Operation>& all = operations();
    const int weights = std::accumulate(
        all.begin(), all.end(), 0, [](int sum, const Operation& operation) { return sum + operation.weight; });
    int drawn = static_cast<int>(_chance.below(static_cast<std::size_t>(weights)));
    for (const Operation& operation : all) {
        drawn -= operation.weight;
        if (drawn < 0)
            return (this->*operation.perform)();
    }
}

void RandomOperations::log(const std::string& line)
{
    _machine.alone([&] {
        std::array<char, 32> time {};
        std::snprintf(time.data(), time.size(), "%12.6f  ", std::chrono::duration<double>(_machine.passed()).count());
        _lines.push_back(time.data() + line);
    });
}

void RandomOperations::diskChanged(Kind kind, const std::string& path)
{
    noteLinksThrough(path);
    _machine.alone([&] {
        if (path.find("/Montaro Events/") != std::string::npos && path.find("/Montaro Projects") != std::string::npos)
            unseen.note(Reason::ambiguousPath, path);
        if ((kind == Kind::contentChanged || kind == Kind::arrivalEnded) && _machine.somethingIsPolled())
            unseen.note(Reason::polledContents, path);
    });
}

/// A change behind a link is told by nobody, unless a library itself is the link.
void RandomOperations::noteLinksThrough(const std::string& path)
{
    for (const std::uint64_t number : _links) {
        const std::string link = _disk.pathOf(number);
        if (link.empty())
            continue;
        const std::string text = _disk.linkTarget(link);
        const std::string target = _disk.realPath(text);
        if (platform::isSameOrBelow(path, target) || platform::isSameOrBelow(target, path)
            || platform::isSameOrBelow(text, path))
            _machine.alone([&] { unseen.note(Reason::behindLink, link); });
    }
}

/// One step now, the others a little later each.
void RandomOperations::performSlowly(std::vector<std::function<void()>> steps)
{
    std::chrono::nanoseconds delay {};
    const bool isSlow = _chance.oneIn(3);
    for (std::function<void()>& step : steps) {
        if (delay.count() == 0)
            step();
        else
            _machine.after(delay, std::move(step));
        if (isSlow)
            delay += _chance.time(longestStep);
    }
}

void RandomOperations::writeSlowly(const std::string& path, const std::string& text)
{
    std::optional<platform::Date> date;
    if (_chance.oneIn(3))
        date = { 1'200'000'000 + static_cast<std::int64_t>(_chance.below(400'000'000)), 0 };
    const auto end = [this, number = _disk.beginFile(path), text, date] { _disk.endFile(number, text, date); };
    if (_chance.oneIn(3))
        _machine.after(_chance.time(longestWriting), end);
    else
        end();
}

void RandomOperations::makeLibrary()
{
    const std::string path = _places.library(_chance.oneIn(2) ? MontaroProjectsFolderName : MontaroEventsFolderName);
    log("make the library " + path);
    if (_chance.oneIn(6)) {
        _disk.makeFolders("/elsewhere/library");
        _disk.makeLink(path, "/elsewhere/library");
    }
    _disk.makeFolder(path);
}

void RandomOperations::makeProject()
{
    const std::string path = pathJoined(
        _chance.oneIn(2) ? _places.library(MontaroProjectsFolderName) : _places.anyFolder(), _places.newName());
    log("make the project " + path);
    const std::string movies = path + "/Shared Items";
    std::vector<std::function<void()>> steps { [this, path] { _disk.makeFolder(path); },
        [this, path] { _disk.writeFile(path + "/CurrentVersion.mtrproject", "mark"); } };
    if (!_chance.oneIn(4)) {
        steps.emplace_back([this, movies] { _disk.makeFolder(movies); });
        for (std::size_t count = _chance.below(3); count != 0; --count) {
            steps.emplace_back([this, file = pathJoined(movies, "m" + std::to_string(count) + ".mov"),
                                   text = _places.movie()] { writeSlowly(file, text); });
        }
    }
    performSlowly(std::move(steps));
}

void RandomOperations::makeEvent()
{
    const std::string path = pathJoined(
        _chance.oneIn(2) ? _places.library(MontaroEventsFolderName) : _places.anyFolder(), _places.newName());
    log("make the event " + path);
    const std::string clips = path + "/Original Media";
    std::vector<std::function<void()>> steps { [this, path] { _disk.makeFolder(path); },
        [this, path] { _disk.writeFile(path + "/CurrentVersion.mtrevent", "mark"); },
        [this, clips] { _disk.makeFolder(clips); } };
    for (std::size_t count = 1 + _chance.below(3); count != 0; --count)
        steps.emplace_back(
            [this, file = pathJoined(clips, "c" + std::to_string(count) + ".mov")] { writeSlowly(file, "clip"); });
    performSlowly(std::move(steps));
}

void RandomOperations::addFile()
{
    const std::string path = pathJoined(_places.folderOfFiles(), _places.newName());
    log("write " + path);
    writeSlowly(path, _places.movie());
}

void RandomOperations::makeFolder()
{
    const std::string path = _places.freePath();
    log("make the folder " + path);
    _disk.makeFolder(path);
}

void RandomOperations::renameItem()
{
    const std::string path = _places.anyItem();
    const std::string to = pathJoined(platform::pathByRemovingLastComponent(path), _places.newName());
    if (_disk.rename(path, to))
        log("rename " + path + " to " + to);
}

void RandomOperations::moveItem()
{
    const std::string path = _places.anyItem();
    const std::string name(_chance.oneIn(2) ? std::string(platform::lastPathComponent(path)) : _places.newName());
    const std::string to = pathJoined(_places.anyFolder(), name);
    if (_disk.rename(path, to))
        log("move " + path + " to " + to);
}

void RandomOperations::removeItem()
{
    const std::string path = _places.anyItem();
    log("remove " + path);
    _disk.remove(path);
}

void RandomOperations::replaceItem()
{
    const std::string path = _places.anyItem();
    const bool byFolder = _chance.oneIn(2);
    log("replace " + path + (byFolder ? " by a folder" : " by a file"));
    if (_disk.remove(path))
        byFolder ? _disk.makeFolder(path) : _disk.writeFile(path, _places.movie());
}

void RandomOperations::makeLink()
{
    const std::string path = _places.freePath();
    const std::string target = _chance.oneIn(8) ? "/nowhere" : _places.anyItem();
    if (!_disk.makeLink(path, target))
        return;
    log("link " + path + " to " + target);
    _links.push_back(_disk.numberOf(path));
}

void RandomOperations::closeFolder()
{
    const std::string path = _places.anyFolder();
    if (_disk.kindOf(path) != ItemKind::folder || path == "/elsewhere")
        return;
    const std::uint64_t number = _disk.numberOf(path);
    log("close " + path);
    _disk.setOpen(path, false);
    if (!_chance.oneIn(4)) {
        _machine.after(_chance.time(longestFault), [this, number] {
            const std::string closed = _disk.pathOf(number);
            if (!closed.empty() && _disk.setOpen(closed, true))
                log("open " + closed);
        });
    }
}

void RandomOperations::dateFolder()
{
    const std::string path = _places.anyFolder();
    if (_disk.kindOf(path) != ItemKind::folder)
        return;
    log("date " + path);
    _disk.setModified(path, { static_cast<std::int64_t>(_chance.below(1'500'000'000)), 0 });
}

/// A name that is there more often than not, in a list that is there already if need be.
void RandomOperations::hideNames()
{
    std::string folder = _places.anyFolder();
    for (int attempt = 0; attempt < 4 && !_disk.kindOf(folder + "/.hidden"); ++attempt)
        folder = _places.anyFolder();
    const std::vector<LiveDisk::Item> items = _disk.itemsIn(folder);
    const std::string name = items.empty() ? _places.newName() : _chance.of(items).name;
    log("write " + folder + "/.hidden: " + name);
    _disk.writeFile(folder + "/.hidden", name + "\n" + _places.newName());
}

void RandomOperations::mountOrUnmount()
{
    LiveMachine::Volume& volume = _chance.of(_machine.volumes);
    log((volume.isMounted ? "unmount " : "mount ") + volume.mountPoint);
    const bool isDone = volume.isMounted ? _machine.unmount(volume) : _machine.mount(volume);
    if (!isDone)
        log("refused: " + volume.mountPoint);
    for (const std::uint64_t number : _links) {
        const std::string link = _disk.pathOf(number);
        if (!link.empty() && platform::isSameOrBelow(_disk.linkTarget(link), volume.mountPoint))
            _machine.alone([&] { unseen.note(Reason::behindLink, link); });
    }
}

void RandomOperations::dropReports()
{
    log("drop reports");
    _machine.dropReports();
}

void RandomOperations::askForLoad()
{
    const bool cancelsFirst = !_chance.oneIn(3);
    log(cancelsFirst ? "cancel and load" : "load");
    load(cancelsFirst);
}

void RandomOperations::changePreference()
{
    if (!_mayBeUnseen)
        return;
    const std::string_view value = _chance.oneIn(2) ? "true" : "false";
    log("prefer the newest events first: " + std::string(value));
    _disk.writeFile("/Users/ann/Library/Preferences/org.ombrix.Montaro.plist",
        "<plist version=\"1.0\"><dict><key>ZREventLibraryModule.arrangeEventsByMostRecent</key><" + std::string(value)
            + "/></dict></plist>");
    if (_chance.oneIn(2))
        _disk.writeFile("/Users/ann/Library/Preferences/org.ombrix.Zuno.plist", "shared");
    preferenceChanged = true;
}

void RandomOperations::takeEditor()
{
    if (!_mayBeUnseen)
        return;
    log("take the editor away for a while");
    _disk.remove("/opt/montaro");
    editorWasMissing = true;
    _machine.after(_chance.time(longestFault), [this] {
        log("put the editor back");
        makeEditor();
    });
}

void RandomOperations::rewriteFile()
{
    const std::string path = _places.anyItem();
    if (!_mayBeUnseen || _disk.kindOf(path) != ItemKind::file)
        return;
    log("rewrite " + path);
    _machine.alone([&] { unseen.note(Reason::rewrittenInPlace, path); });
    _disk.writeFile(path, _places.movie());
    _disk.setModified(path, { static_cast<std::int64_t>(_chance.below(1'500'000'000)), 0 });
    _disk.setOpen(path, !_chance.oneIn(4));
}

void RandomOperations::failFolder()
{
    const std::string path = _machine.spelled(_places.anyFolder());
    if (!_mayBeUnseen || _failing.contains(path))
        return;
    log("fail to list " + path);
    _machine.alone([&] { _failing.insert(path); });
    _machine.after(_chance.time(longestFault), [this, path] {
        log("list again " + path);
        _machine.alone([&] { _failing.erase(path); });
    });
}

} // namespace tests
