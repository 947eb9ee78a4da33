#include "platform/linux/watching/FileArrivals.h"

namespace platform {

void FileArrivals::begin(const FileKey& file, State state)
{
    end(file);
    if (_entries.size() >= _filesAtMost) {
        _someWereDropped = true;
        if (_entries.empty())
            return;
        _byFile.erase(_entries.front().first);
        _entries.pop_front();
    }
    _entries.emplace_back(file, state);
    _byFile.emplace(file, std::prev(_entries.end()));
}

FileArrivals::State FileArrivals::state(const FileKey& file) const
{
    if (const auto found = _byFile.find(file); found != _byFile.end())
        return found->second->second;
    return _someWereDropped ? State::unknown : State::none;
}

FileArrivals::State FileArrivals::end(const FileKey& file)
{
    const State before = state(file);
    if (const auto found = _byFile.find(file); found != _byFile.end()) {
        _entries.erase(found->second);
        _byFile.erase(found);
    }
    return before;
}

void FileArrivals::move(const FileKey& from, const FileKey& to)
{
    const bool isKnown = _byFile.find(from) != _byFile.end();
    const State before = end(from);
    end(to);
    if (isKnown)
        begin(to, before);
}

void FileArrivals::forgetFolder(WatchedFolders::Number folder)
{
    for (auto entry = _entries.begin(); entry != _entries.end();) {
        const auto next = std::next(entry);
        if (entry->first.folder == folder)
            end(FileKey(entry->first));
        entry = next;
    }
}

void FileArrivals::drop()
{
    _someWereDropped = _someWereDropped || !_entries.empty();
    _entries.clear();
    _byFile.clear();
}

} // namespace platform
