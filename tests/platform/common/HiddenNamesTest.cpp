#include "platform/common/HiddenNames.h"
#include "platform/FileSystem.h"

#include <doctest/doctest.h>

#include <string>

using platform::HiddenNames;

TEST_CASE("a list of hidden names hides its lines byte for byte, and a full stop hides without one")
{
    const HiddenNames names(std::string("plain\nwith space\n\ncarriage\r\nlast"));
    for (const char* hidden : { "plain", "with space", "last", "carriage\r", ".dotted" }) {
        CAPTURE(hidden);
        CHECK(names.hide(hidden));
    }
    for (const char* shown : { "Plain", "with", "plain\n", "carriage", "dotted" }) {
        CAPTURE(shown);
        CHECK_FALSE(names.hide(shown));
    }
    CHECK(HiddenNames().hide(".dotted"));
    CHECK_FALSE(HiddenNames().hide("plain"));
}

TEST_CASE("a list of hidden names may hold 16 MiB, and of a larger one the line that is cut names nothing")
{
    std::string text(HiddenNames::sizeAtMost - 4, '\n');
    text += "last";
    CHECK(HiddenNames(text).hide("last"));
    text += "s";
    CHECK_FALSE(HiddenNames(text).hide("last"));
    CHECK_FALSE(HiddenNames(text).hide("lasts"));
    text.back() = '\n';
    CHECK_FALSE(HiddenNames(text).hide("last"));
    CHECK(HiddenNames(std::string(HiddenNames::sizeAtMost + 1, 'x')).empty());
}

TEST_CASE("a list of hidden names tells each item of a listing anew whether it is invisible")
{
    platform::FolderListing listing;
    for (const char* name : { "listed", "shown", ".dotted" }) {
        platform::FolderItem item;
        item.name = name;
        item.flags.invisible = item.name == "shown";
        listing.append(item);
    }
    HiddenNames(std::string("listed\nelsewhere\n")).applyTo(listing);
    CHECK(listing[0].flags.invisible);
    CHECK_FALSE(listing[1].flags.invisible);
    CHECK(listing[2].flags.invisible);
}
