#include "plugin/ScanHistory.h"

#include <doctest/doctest.h>

#include <memory>

namespace {

using List = std::shared_ptr<int>;

OBMediaGroupRef libraryCalled(const char* name)
{
    return OBMediaGroup::withFields({ .name = name });
}

} // namespace

TEST_CASE("the list that is shown is that of the scan that began last")
{
    ScanHistory scans;
    platform::Snapshot<List> shown;
    const List first = std::make_shared<int>(1);
    const List second = std::make_shared<int>(2);
    const ScanHistory::Number one = scans.begin(shown, first);
    CHECK(shown.load() == first);
    const ScanHistory::Number two = scans.begin(shown, second);
    CHECK(shown.load() == second);
    CHECK(one < two);
}

TEST_CASE("what a scan found stays until one that began later has ended, in whichever order they end")
{
    ScanHistory scans;
    platform::Snapshot<List> shown;
    const ScanHistory::Number one = scans.begin(shown, List());
    const ScanHistory::Number two = scans.begin(shown, List());
    CHECK(scans.latest().number == 0);
    CHECK_FALSE(scans.isSuperseded(one));

    SUBCASE("the later one first")
    {
        scans.keep(two, libraryCalled("two"));
        CHECK(scans.isSuperseded(one));
        scans.keep(one, libraryCalled("one"));
    }
    SUBCASE("the earlier one first")
    {
        scans.keep(one, libraryCalled("one"));
        CHECK(scans.latest().library->name() == platform::Text("one"));
        CHECK_FALSE(scans.isSuperseded(one));
        scans.keep(two, libraryCalled("two"));
    }
    CHECK(scans.latest().library->name() == platform::Text("two"));
    CHECK(scans.isSuperseded(one));
    CHECK_FALSE(scans.isSuperseded(two));
    CHECK_FALSE(scans.isSuperseded(ScanHistory::latestScan));
}
