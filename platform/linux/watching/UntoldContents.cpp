#include "platform/linux/watching/UntoldContents.h"

namespace platform {

namespace {

    constexpr std::size_t filesAtMost = 4096;

} // namespace

void UntoldContents::add(const FileKey& file, Instant due)
{
    if (const auto found = _byFile.find(file); found != _byFile.end()) {
        if (found->second->first <= due)
            return;
        end(file);
    }
    _byFile.emplace(file, _byTime.emplace(due, file));
}

void UntoldContents::end(const FileKey& file)
{
    if (const auto found = _byFile.find(file); found != _byFile.end()) {
        _byTime.erase(found->second);
        _byFile.erase(found);
    }
}

void UntoldContents::move(const FileKey& from, const FileKey& to)
{
    end(to);
    const auto found = _byFile.find(from);
    if (found == _byFile.end())
        return;
    const Instant due = found->second->first;
    end(from);
    add(to, due);
}

void UntoldContents::forgetFolder(WatchedFolders::Number folder)
{
    for (auto entry = _byTime.begin(); entry != _byTime.end();) {
        const auto next = std::next(entry);
        if (entry->second.folder == folder)
            end(FileKey(entry->second));
        entry = next;
    }
}

void UntoldContents::clear()
{
    _byTime.clear();
    _byFile.clear();
}

std::optional<UntoldContents::Instant> UntoldContents::nextDue() const
{
    if (_byTime.empty())
        return std::nullopt;
    return _byTime.size() > filesAtMost ? Instant {} : _byTime.begin()->first;
}

std::vector<FileKey> UntoldContents::takeDue(Instant now)
{
    std::vector<FileKey> due;
    while (!_byTime.empty() && (_byTime.begin()->first <= now || _byTime.size() > filesAtMost)) {
        due.push_back(_byTime.begin()->second);
        end(due.back());
    }
    return due;
}

} // namespace platform
