#include "platform/formats/Suggestion.h"

#include <doctest/doctest.h>

#include <string>

using namespace platform;

namespace {

constexpr std::array<std::string_view, 5> keys { "home", "localVolumes", "removableMedia", "links", "editor" };

std::string suggested(std::string_view word)
{
    return std::string(suggestionFor(word, keys).value_or("none"));
}

} // namespace

TEST_CASE("an edit inserts, removes, replaces or swaps a letter")
{
    CHECK(editDistance("", "") == 0);
    CHECK(editDistance("abc", "") == 3);
    CHECK(editDistance("tree", "tree") == 0);
    CHECK(editDistance("Tree", "tree") == 0);
    CHECK(editDistance("tre", "tree") == 1);
    CHECK(editDistance("teer", "tree") == 2);
    CHECK(editDistance("rtee", "tree") == 1);
    CHECK(editDistance("kitten", "sitting") == 3);
    CHECK(editDistance(std::string(70, 'a'), "a") == 70);
    CHECK(editDistance(std::string(63, 'a'), std::string(63, 'b')) == 63);
}

TEST_CASE("the nearest word is suggested, and none where none is near")
{
    CHECK(suggested("hmoe") == "home");
    CHECK(suggested("link") == "links");
    CHECK(suggested("LocalVolume") == "localVolumes");
    CHECK(suggested("volumes") == "localVolumes");
    CHECK(suggested("media") == "removableMedia");
    CHECK(suggested("colour") == "none");
    CHECK(suggested("") == "none");
    CHECK(suggested("x") == "none");
    CHECK(suggested("home") == "none");
}
