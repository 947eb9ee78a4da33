#include "apps/common/ExportedProjects.h"
#include "platform/Pasteboard.h"

#include <doctest/doctest.h>

using apps::ClipboardItem;
using apps::exportedBy;

TEST_CASE("what was written goes to the clipboard in its order, a property list under a MIME type of its own")
{
    const apps::Exported exported = exportedBy(
        [](platform::Pasteboard& pasteboard) {
            pasteboard.declareTypes({ "text/plain", "Empty" }, nullptr);
            pasteboard.addTypes({ "Private" }, nullptr);
            pasteboard.setData("a\n", "text/plain");
            pasteboard.setPropertyList("text", "Private");
        },
        "Private");
    REQUIRE(exported.propertyList.has_value());
    CHECK(exported.propertyList->find("<string>text</string>") != std::string::npos);
    CHECK(exported.items
        == std::vector<ClipboardItem> {
            { "text/plain", "a\n" }, { "application/x-ombrix-Private", *exported.propertyList } });
}

TEST_CASE("where nothing was written, there is nothing to print or to offer")
{
    const apps::Exported exported = exportedBy([](platform::Pasteboard&) {}, "Private");
    CHECK_FALSE(exported.propertyList.has_value());
    CHECK(exported.items.empty());
}
