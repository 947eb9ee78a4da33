#include "tests/support/ListingText.h"

#include <algorithm>

namespace tests {

using platform::FolderItem;
using platform::ItemKind;
using platform::MarkerAnswer;

namespace {

    const char* textOf(ItemKind kind)
    {
        switch (kind) {
        case ItemKind::file:
            return "";
        case ItemKind::folder:
            return " folder";
        case ItemKind::symbolicLink:
            return " link";
        case ItemKind::other:
            return " other";
        }
        return " ?";
    }

    const char* textOf(MarkerAnswer marker)
    {
        switch (marker) {
        case MarkerAnswer::absent:
            return "";
        case MarkerAnswer::present:
            return " holder";
        case MarkerAnswer::link:
            return " holder-of-link";
        }
        return " ?";
    }

} // namespace

std::string lineOf(const FolderItem& item)
{
    std::string line(item.name);
    line += textOf(item.kind);
    line += item.flags.invisible ? " invisible" : "";
    line += item.flags.container ? " container" : "";
    line += item.flags.package ? " package" : "";
    line += textOf(item.marker);
    if (item.modificationDate)
        line += " @" + std::to_string(item.modificationDate->seconds);
    return line;
}

std::vector<std::string> linesOf(const platform::FolderListing& listing)
{
    std::vector<std::string> lines;
    for (const FolderItem item : listing)
        lines.push_back(lineOf(item));
    std::sort(lines.begin(), lines.end());
    return lines;
}

} // namespace tests
