#include "platform/formats/Manifest.h"

#include "tests/platform/formats/Damage.h"

#include <doctest/doctest.h>

using namespace platform;

namespace {

const std::string rightManifest = R"({
  "identifier": "org.example.Source",
  "version": "1.2",
  "hostInterface": { "minimum": 1, "maximum": 3 },
  "library": "Source.so",
  "class": "ExampleSource",
  "languages": ["en", "de"]
})";

std::string problemWith(const std::string& from, const std::string& to)
{
    std::string text = rightManifest;
    const std::size_t place = text.find(from);
    REQUIRE(place != std::string::npos);
    return readManifest(text.replace(place, from.size(), to)).problem;
}

} // namespace

TEST_CASE("a manifest is read whole")
{
    const ManifestAnswer answer = readManifest(rightManifest);
    CHECK(answer.problem == "");
    CHECK(answer.manifest.identifier == "org.example.Source");
    CHECK(answer.manifest.version == "1.2");
    CHECK(answer.manifest.hostInterfaceMinimum == 1);
    CHECK(answer.manifest.hostInterfaceMaximum == 3);
    CHECK(answer.manifest.library == "Source.so");
    CHECK(answer.manifest.className == "ExampleSource");
    CHECK(answer.manifest.languages == std::vector<std::string> { "en", "de" });
}

TEST_CASE("a manifest with an unknown, missing, repeated or wrongly typed key is refused on its line")
{
    CHECK(problemWith("\"version\"", "\"versoin\"") == "3: unknown key \"versoin\" (did you mean \"version\"?)");
    CHECK(problemWith("  \"version\": \"1.2\",\n", "") == "1: key \"version\" is missing");
    CHECK(problemWith("\"version\"", "\"identifier\"") == "3: key \"identifier\" occurs twice");
    CHECK(problemWith("\"1.2\"", "1.2") == "3: key \"version\" must be a text, not a number");
    CHECK(
        problemWith("\"maximum\": 3", "\"maximum\": \"3\"") == "4: key \"maximum\" must be a whole number, not a text");
    CHECK(problemWith("\"maximum\": 3", "\"maximun\": 3") == "4: unknown key \"maximun\" (did you mean \"maximum\"?)");
    CHECK(problemWith(", \"maximum\": 3", "") == "4: key \"maximum\" is missing");
    CHECK(problemWith("{ \"minimum\": 1, \"maximum\": 3 }", "1")
        == "4: key \"hostInterface\" must be an object, not a whole number");
    CHECK(problemWith("\"de\"", "7") == "7: a language must be a text, not a whole number");
    CHECK(readManifest("[]").problem == "1: the manifest must be an object, not a list");
    CHECK(readManifest("").problem == "1: the document is empty");
}

TEST_CASE("a range of host interface versions that holds none is refused")
{
    CHECK(problemWith("\"maximum\": 3", "\"maximum\": 0") == "4: key \"maximum\" is less than \"minimum\"");
    CHECK(problemWith("\"minimum\": 1", "\"minimum\": -1") == "4: key \"minimum\" is out of range");
    CHECK(problemWith("\"maximum\": 3", "\"maximum\": 4294967297") == "4: key \"maximum\" is out of range");
}

TEST_CASE("a library or a language that leads out of the bundle is refused")
{
    for (const char* library : { "\"../x.so\"", "\"/x.so\"", "\"lib/x.so\"", "\"..\"", "\".\"", "\"a\\u0000b\"" }) {
        CAPTURE(library);
        CHECK(problemWith("\"Source.so\"", library).substr(0, 3) == "5: ");
    }
    CHECK(problemWith("\"Source.so\"", "\"\"") == "5: key \"library\" holds no name");
    CHECK(problemWith("\"de\"", "\"../de\"") == "7: \"../de\" is no language");
}

TEST_CASE("a damaged manifest is read or refused, and a refused one is empty")
{
    forEachDamage(rightManifest, [](const std::string& damaged) {
        const ManifestAnswer answer = readManifest(damaged);
        CHECK(answer.manifest.library.empty() != answer.problem.empty());
        CHECK(answer.problem.find('\n') == std::string::npos);
    });
}
