#include "apps/common/ClipboardOffer.h"

#include <doctest/doctest.h>

#include <cstdint>
#include <string>
#include <vector>

using apps::ClipboardItem;
using apps::readOffer;
using apps::writtenOffer;

namespace {

const std::vector<ClipboardItem> items { { "text/plain", std::string("a\0b\xff\n", 5) }, { "text/uri-list", "" },
    { "application/x-other", std::string(100'000, 'x') } };

} // namespace

TEST_CASE("an offer is read as it was written, whatever its bytes are")
{
    CHECK(readOffer(writtenOffer(items)) == items);
    CHECK(readOffer(writtenOffer({})) == std::vector<ClipboardItem> {});
}

TEST_CASE("an offer is read only once all of it has arrived")
{
    const std::string written = writtenOffer({ items[0], items[1] });
    for (std::size_t length = 0; length < written.size(); ++length)
        CHECK_FALSE(readOffer(written.substr(0, length)).has_value());
}

TEST_CASE("bytes that lead beyond their end are no offer")
{
    std::string written = writtenOffer({ items[0] });
    written[sizeof(std::uint64_t)] = '\x7f'; // the length of the first type
    CHECK_FALSE(readOffer(written).has_value());
    CHECK_FALSE(readOffer(std::string(64, '\xff')).has_value());
}
