#include "platform/linux/watching/WatchedFolders.h"

#include <algorithm>
#include <cstring>
#include <vector>

namespace platform {

namespace {

    // Spreads what differs in any bit over the low ones, by which a table is entered.
    std::uint64_t mixed(std::uint64_t value)
    {
        value *= 0x9e3779b97f4a7c15;
        return value ^ (value >> 29);
    }

} // namespace

WatchedFolders::WatchedFolders()
    : _folders(2)
{
}

std::uint64_t WatchedFolders::hashOfName(Number parent, std::string_view name)
{
    return mixed(std::hash<std::string_view>()(name) ^ mixed(parent));
}

std::uint64_t WatchedFolders::hashOfWatch(int watch)
{
    return mixed(static_cast<std::uint64_t>(watch));
}

WatchedFolders::Number WatchedFolders::child(Number folder, std::string_view childName) const
{
    return _byName.find(hashOfName(folder, childName),
        [&](Number candidate) { return _folders[candidate].parent == folder && name(candidate) == childName; });
}

void WatchedFolders::setName(Folder& folder, std::string_view name)
{
    folder.name = std::make_unique<char[]>(name.size());
    std::memcpy(folder.name.get(), name.data(), name.size());
    folder.nameLength = static_cast<std::uint8_t>(name.size());
}

WatchedFolders::Number WatchedFolders::madeChild(Number folder, std::string_view childName)
{
    if (const Number existing = child(folder, childName); existing != none)
        return existing;
    const Number number = _firstFree != none ? _firstFree : static_cast<Number>(_folders.size());
    if (_firstFree != none)
        _firstFree = _folders[number].next;
    else
        _folders.emplace_back();
    _folders[number] = Folder {};
    setName(_folders[number], childName);
    link(number, folder);
    return number;
}

void WatchedFolders::link(Number folder, Number newParent)
{
    Folder& entry = _folders[folder];
    Folder& above = _folders[newParent];
    entry.parent = newParent;
    entry.previous = none;
    entry.next = above.firstChild;
    if (entry.next != none)
        _folders[entry.next].previous = folder;
    above.firstChild = folder;
    _byName.insert(folder, nameHashes());
}

void WatchedFolders::unlink(Number folder)
{
    const Folder& entry = _folders[folder];
    _byName.erase(folder, nameHashes());
    if (entry.previous != none)
        _folders[entry.previous].next = entry.next;
    else
        _folders[entry.parent].firstChild = entry.next;
    if (entry.next != none)
        _folders[entry.next].previous = entry.previous;
}

void WatchedFolders::move(Number folder, Number newParent, std::string_view newName)
{
    unlink(folder);
    setName(_folders[folder], newName);
    link(folder, newParent);
}

void WatchedFolders::remove(Number folder)
{
    unlink(folder);
    _folders[folder] = Folder {};
    _folders[folder].next = _firstFree;
    _firstFree = folder;
}

WatchedFolders::Number WatchedFolders::deepestBelow(Number folder) const
{
    while (_folders[folder].firstChild != none)
        folder = _folders[folder].firstChild;
    return folder;
}

WatchedFolders::Number WatchedFolders::atPath(std::string_view path) const
{
    Number folder = top;
    while (folder != none) {
        path.remove_prefix(std::min(path.find_first_not_of('/'), path.size()));
        if (path.empty())
            break;
        const std::string_view component = path.substr(0, path.find('/'));
        path.remove_prefix(component.size());
        folder = child(folder, component);
    }
    return folder;
}

std::string WatchedFolders::path(Number folder) const
{
    if (folder == top)
        return "/";
    std::size_t length = 0;
    for (Number above = folder; above != top; above = _folders[above].parent)
        length += name(above).size() + 1;
    std::string text(length, '/');
    for (Number above = folder; above != top; above = _folders[above].parent) {
        length -= name(above).size();
        name(above).copy(&text[length], name(above).size());
        --length;
    }
    return text;
}

bool WatchedFolders::isSameOrBelow(Number folder, Number above) const
{
    while (folder != none && folder != above)
        folder = _folders[folder].parent;
    return folder != none;
}

WatchedFolders::Number WatchedFolders::firstWithWatch(int watch) const
{
    return _byWatch.find(hashOfWatch(watch), [&](Number candidate) { return _folders[candidate].watch == watch; });
}

int WatchedFolders::setWatch(Number folder, int watch)
{
    Folder& entry = _folders[folder];
    const int before = entry.watch;
    if (before == watch)
        return noWatch;
    const bool isLast = before != noWatch && leaveWatch(folder);
    entry.watch = watch;
    entry.nextOfWatch = none;
    if (watch == noWatch)
        return isLast ? before : noWatch;
    if (const Number first = firstWithWatch(watch); first != none) {
        entry.nextOfWatch = _folders[first].nextOfWatch;
        _folders[first].nextOfWatch = folder;
    } else {
        _byWatch.insert(folder, watchHashes());
    }
    return isLast ? before : noWatch;
}

// Takes `folder` from those that share its watch; true when it was the only one.
bool WatchedFolders::leaveWatch(Number folder)
{
    const Folder& entry = _folders[folder];
    const Number first = firstWithWatch(entry.watch);
    if (first != folder) {
        Number before = first;
        while (_folders[before].nextOfWatch != folder)
            before = _folders[before].nextOfWatch;
        _folders[before].nextOfWatch = entry.nextOfWatch;
        return false;
    }
    if (entry.nextOfWatch == none) {
        _byWatch.erase(folder, watchHashes());
        return true;
    }
    _byWatch.replace(hashOfWatch(entry.watch), folder, entry.nextOfWatch);
    return false;
}

} // namespace platform
