#include "platform/common/HiddenNames.h"

#include "fuzz/FuzzTarget.h"
#include "platform/FolderListing.h"

#include <algorithm>
#include <string>
#include <vector>

// The first line is what lies in the folder, names between slashes, the rest is its list of hidden names.
int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const std::string_view input = fuzz::text(data, size);
    const std::size_t end = std::min(input.find('\n'), input.size());
    const platform::HiddenNames hidden { std::string(input.substr(std::min(end + 1, input.size()))) };

    platform::FolderListing listing;
    for (std::string_view names = input.substr(0, end); !names.empty();) {
        platform::FolderItem item;
        item.name = names.substr(0, names.find('/'));
        names.remove_prefix(std::min(names.size(), item.name.size() + 1));
        listing.append(item);
    }
    hidden.applyTo(listing);
    for (const platform::FolderItem item : listing)
        fuzz::expect(item.flags.invisible == hidden.hide(item.name));
    return 0;
}
