#include "platform/linux/LinuxLanguages.h"
#include "tests/platform/linux/Environment.h"

#include <doctest/doctest.h>

#include <array>
#include <string>
#include <vector>

using Languages = std::vector<std::string>;

namespace {

Languages languages(const std::array<std::string, 4>& values)
{
    const std::array<std::string, 4> names { "LANGUAGE", "LC_ALL", "LC_MESSAGES", "LANG" };
    tests::Environment environment;
    for (std::size_t index = 0; index < names.size(); ++index) {
        if (values[index].empty())
            environment.remove(names[index]);
        else
            environment.set(names[index], values[index]);
    }
    return platform::LinuxLanguages().preferredLanguages();
}

} // namespace

TEST_CASE("a language loses its encoding and modifier and is followed by what it falls back to")
{
    CHECK(languages({ "", "", "", "de_AT.UTF-8@euro" }) == Languages { "de_AT", "de" });
    CHECK(languages({ "", "", "", "ar" }) == Languages { "ar" });
    CHECK(languages({ "", "", "", "sr@latin" }) == Languages { "sr" });
}

TEST_CASE("LANGUAGE comes first, then LC_ALL, LC_MESSAGES and LANG, each language once")
{
    CHECK(languages({ "ar:de_CH:de", "fr_FR.UTF-8", "de", "en_GB.UTF-8" })
        == Languages { "ar", "de_CH", "de", "fr_FR", "fr", "en_GB", "en" });
}

TEST_CASE("in the C locale LANGUAGE does not count")
{
    CHECK(languages({ "de", "C", "", "de_DE.UTF-8" }).empty());
    CHECK(languages({ "de", "", "POSIX", "" }).empty());
    CHECK(languages({ "de", "", "", "C" }).empty());
    CHECK(languages({ "de", "", "", "C.UTF-8" }) == Languages { "de" });
    CHECK(languages({ "de", "", "", "" }) == Languages { "de" });
    CHECK(languages({ "", "", "", "" }).empty());
}

TEST_CASE("the C locale ends the list wherever it stands")
{
    CHECK(languages({ "de:C:fr", "it", "", "" }) == Languages { "de" });
    CHECK(languages({ "", "fr", "C", "de" }) == Languages { "fr" });
}

TEST_CASE("what is no language code names no language")
{
    CHECK(languages({ "../../etc:de", "a b", "/usr", "en" }) == Languages { "de", "en" });
}
