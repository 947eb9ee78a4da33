#include "platform/common/HiddenNames.h"

#include "platform/FileSystem.h"
#include "platform/common/WholeFile.h"

#include <algorithm>
#include <unordered_map>
#include <utility>

namespace platform {

namespace {

    template <class Take> void forEachLine(std::string_view text, const Take& take)
    {
        while (!text.empty()) {
            const std::string_view line = text.substr(0, text.find('\n'));
            take(line);
            text.remove_prefix(std::min(text.size(), line.size() + 1));
        }
    }

} // namespace

HiddenNames::HiddenNames(std::string text)
    : _text(std::move(text))
{
    // The line that the limit cuts through names nothing.
    if (_text.size() > sizeAtMost)
        _text.resize(_text.rfind('\n', sizeAtMost - 1) + 1);
}

HiddenNames::HiddenNames(const OpenFile& file)
    : HiddenNames(readBytes(file, sizeAtMost + 1))
{
}

bool HiddenNames::hide(std::string_view name) const
{
    bool isHidden = name.starts_with('.');
    if (!isHidden)
        forEachLine(_text, [&](std::string_view line) { isHidden = isHidden || line == name; });
    return isHidden;
}

// Looks up each line among the items, not each item among the lines: the folder bounds the memory, not the file.
void HiddenNames::applyTo(FolderListing& listing) const
{
    std::unordered_map<std::string_view, bool> isHidden(listing.size());
    for (const FolderItem item : listing)
        isHidden.emplace(item.name, item.name.starts_with('.'));
    forEachLine(_text, [&](std::string_view line) {
        if (const auto found = isHidden.find(line); found != isHidden.end())
            found->second = true;
    });
    for (std::size_t index = 0; index < listing.size(); ++index) {
        FolderItem item = listing[index];
        item.flags.invisible = isHidden.find(item.name)->second;
        listing.setItem(index, item);
    }
}

} // namespace platform
