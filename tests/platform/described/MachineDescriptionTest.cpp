#include "platform/described/MachineDescription.h"

#include <doctest/doctest.h>

#include <string>

using platform::AddedLink;
using platform::DescribedVolume;
using platform::MachineDescription;
using platform::readMachineDescription;

namespace {

constexpr std::string_view example = R"({
  "home": "/abs/home",
  "localVolumes":   [{"path": "/", "displayName": "Boot"}, {"path": "/Volumes/Stick", "displayName": "Stick", "fileSystem": "ext4"}],
  "removableMedia": [{"path": "/Volumes/Stick", "displayName": "Stick"}],
  "links": {"/Volumes/Stick": "/abs/stick", "/Montaro Events": "/abs/boot/Montaro Events"},
  "editor": {"path": "/abs/opt/montaro"}
}
)";

MachineDescription described(std::string_view text)
{
    const auto result = readMachineDescription(text, "/folder/of file");
    CHECK(result.problem.empty());
    return result.description;
}

std::string problemOf(std::string_view text)
{
    return readMachineDescription(text, "/folder").problem;
}

} // namespace

TEST_CASE("a whole description is read")
{
    const MachineDescription machine = described(example);
    CHECK(machine.home == std::string("/abs/home"));
    CHECK(machine.localVolumes
        == std::vector<DescribedVolume> { { "/", "Boot", {} }, { "/Volumes/Stick", "Stick", "ext4" } });
    CHECK(machine.removableMedia == std::vector<DescribedVolume> { { "/Volumes/Stick", "Stick", {} } });
    REQUIRE(machine.links.size() == 2);
    CHECK(machine.links[0].path == "/Volumes/Stick");
    CHECK(machine.links[0].target == "/abs/stick");
    CHECK(machine.links[1].path == "/Montaro Events");
    CHECK(machine.editorPath == std::string("/abs/opt/montaro"));
}

TEST_CASE("everything may be left out, and home and editor may be null")
{
    for (const char* text : { "{}", R"({"home": null, "editor": null})",
             R"({"localVolumes": [], "removableMedia": [], "links": {}})", "\xEF\xBB\xBF{}" }) {
        CAPTURE(text);
        const MachineDescription machine = described(text);
        CHECK_FALSE(machine.home);
        CHECK_FALSE(machine.editorPath);
        CHECK(machine.localVolumes.empty());
        CHECK(machine.removableMedia.empty());
        CHECK(machine.links.empty());
    }
}

TEST_CASE("relative paths begin at the folder of the file, wherever they stand")
{
    const MachineDescription machine = described(R"({"home": "home/ann/", "localVolumes": [{"path": "./mnt//Stick"}],
        "removableMedia": [{"path": "../other"}], "links": {"key": "target/.", "/x/../y/": "/z/"}, "editor": {"path": "bin/montaro"}})");
    CHECK(machine.home == std::string("/folder/of file/home/ann"));
    CHECK(machine.localVolumes == std::vector<DescribedVolume> { { "/folder/of file/mnt/Stick", "Stick", {} } });
    CHECK(machine.removableMedia == std::vector<DescribedVolume> { { "/folder/other", "other", {} } });
    REQUIRE(machine.links.size() == 2);
    CHECK(machine.links[0].path == "/folder/of file/key");
    CHECK(machine.links[0].target == "/folder/of file/target");
    CHECK(machine.links[1].path == "/y");
    CHECK(machine.links[1].target == "/z");
    CHECK(machine.editorPath == std::string("/folder/of file/bin/montaro"));
}

TEST_CASE("a display name that is left out is the last component, and an empty one stays empty")
{
    const MachineDescription machine = described(
        R"({"localVolumes": [{"path": "/media/My Disk/"}, {"path": "/"}, {"path": "/x", "displayName": ""}]})");
    CHECK(machine.localVolumes
        == std::vector<DescribedVolume> { { "/media/My Disk", "My Disk", {} }, { "/", "/", {} }, { "/x", "", {} } });
}

TEST_CASE("each mistake is told with its line and its key")
{
    struct Mistake {
        const char* text;
        const char* problem;
    };
    constexpr Mistake mistakes[] = {
        { "{\n\n\"volumes\": []}", "3: unknown key \"volumes\" (did you mean \"localVolumes\"?)" },
        { "{\"hom\": null}", "1: unknown key \"hom\" (did you mean \"home\"?)" },
        { "{\"Home\": null}", "1: unknown key \"Home\" (did you mean \"home\"?)" },
        { "{\"qwxz\": 1}", "1: unknown key \"qwxz\"" },
        { "{\"home\":\n 5}", "2: key \"home\" must be a text or null, not a whole number" },
        { "{\"home\": [\"/a\"]}", "1: key \"home\" must be a text or null, not a list" },
        { "{\"home\": \"\"}", "1: key \"home\" must not be empty" },
        { "{\"home\": \"/a\\u0000b\"}", "1: key \"home\" holds a zero byte" },
        { "{\"home\": \"/a\",\n\"home\": \"/b\"}", "2: key \"home\" occurs twice" },
        { "{\"home\":\n\"/a\nb\"}", "2: key \"home\": a text holds a line break or another control character" },
        { "{\"home\": null,\n\"edi\ntor\": null}",
            "2: key \"edi\": a text holds a line break or another control character" },
        { "{\"home\": \"\\ud800\"}", "1: key \"home\": a text has a wrong escape" },
        { "{\"\\ud800\": null}", "1: key \"\\ud800\": a text has a wrong escape" },
        { "{\"links\": {\n\"/a\": \"\\udc00\"}}", "2: key \"/a\": a text has a wrong escape" },
        { "{\"localVolumes\": [\n{\"path\": \"/\\x\"}]}", "2: key \"path\": a text has a wrong escape" },
        { "{\"localVolumes\": [\n\"\\x\"]}", "2: key \"localVolumes\": a text has a wrong escape" },
        { "{\"home\": \"\xff\"}", "1: key \"home\": the document is not UTF-8" },
        { "{\"home\": 1e999}", "1: key \"home\": a number is too big or incomplete" },
        { "{\"home\": nul}", "1: key \"home\": this is no JSON value" },
        { "{\"home\": \"/a\"\n\"editor\": null}", "2: key \"editor\": a comma or a closing brace is missing" },
        { "{\"localVolumes\": {}}", "1: key \"localVolumes\" must be a list, not an object" },
        { "{\"localVolumes\": null}", "1: key \"localVolumes\" must be a list, not null" },
        { "{\"localVolumes\": [\n\"/\"]}", "2: an item of key \"localVolumes\" must be an object, not a text" },
        { "{\"localVolumes\": [{}]}", "1: key \"path\" is missing" },
        { "{\"localVolumes\": [\n{\"path\": \"/\"},\n{\"displayName\": \"x\"}]}", "3: key \"path\" is missing" },
        { "{\"localVolumes\": [{\"path\": null}]}", "1: key \"path\" must be a text, not null" },
        { "{\"localVolumes\": [{\"path\": \"\"}]}", "1: key \"path\" must not be empty" },
        { "{\"localVolumes\": [{\"path\": \"/\",\n\"displayname\": \"x\"}]}",
            "2: unknown key \"displayname\" (did you mean \"displayName\"?)" },
        { "{\"localVolumes\": [{\"path\": \"/\", \"displayName\": 1}]}",
            "1: key \"displayName\" must be a text, not a whole number" },
        { "{\"localVolumes\": [{\"path\": \"/\", \"displayName\": \"\\u0000\"}]}",
            "1: key \"displayName\" holds a zero byte" },
        { "{\"localVolumes\": [{\"path\": \"/\", \"fileSystem\": true}]}",
            "1: key \"fileSystem\" must be a text, not true or false" },
        { "{\"localVolumes\": [{\"path\": \"/\", \"fileSystem\": \"\"}]}", "1: key \"fileSystem\" must not be empty" },
        { "{\"localVolumes\": [{\"path\": \"/\", \"path\": \"/\"}]}", "1: key \"path\" occurs twice" },
        { "{\"removableMedia\": 1.5}", "1: key \"removableMedia\" must be a list, not a number" },
        { "{\"removableMedia\": [{\"path\": \"/\", \"type\": \"x\"}]}", "1: unknown key \"type\"" },
        { "{\"links\": []}", "1: key \"links\" must be an object, not a list" },
        { "{\"links\": {\"/a\": null}}", "1: key \"/a\" must be a text, not null" },
        { "{\"links\": {\"/a\": \"/b\",\n\"/c\": 1}}", "2: key \"/c\" must be a text, not a whole number" },
        { "{\"links\": {\"/a\": \"\"}}", "1: key \"/a\" must not be empty" },
        { "{\"links\": {\"\": \"/a\"}}", "1: a key of \"links\" must not be empty" },
        { "{\"links\": {\"/\": \"/a\"}}", "1: key \"/\" is the root, which cannot be a link" },
        { "{\"links\": {\"..\": \"/a\"}}", "1: key \"..\" is the root, which cannot be a link" },
        { "{\"links\": {\"/a\": \"/b\",\n \"/a/\": \"/c\"}}", "2: key \"/a/\" names the same path as a key before it" },
        { "{\"links\": {\"/a\": \"/b\", \"/a\": \"/c\"}}", "1: key \"/a\" occurs twice" },
        { "{\"editor\": \"/a\"}", "1: key \"editor\" must be an object or null, not a text" },
        { "{\"editor\": {}}", "1: key \"path\" is missing" },
        { "{\"editor\": {\"path\": \"/a\", \"icon\": \"/b\"}}", "1: unknown key \"icon\"" },
        { "{\"editor\": {\"path\": \"\"}}", "1: key \"path\" must not be empty" },
        { "[]", "1: the description must be an object, not a list" },
        { "\n\nnull", "3: the description must be an object, not null" },
    };
    for (const Mistake& mistake : mistakes) {
        CAPTURE(mistake.text);
        CHECK(problemOf(mistake.text) == mistake.problem);
    }
}

TEST_CASE("what is not JSON is told with its line")
{
    for (const char* text : { "", "\n\n", "{", "{\"home\" \"/a\"}", "{\"home\": '/a'}", "{\"home\": \"/a\",}", "{} x",
             "{\"home\": \"\xff\"}", "// comment\n{}", "{\"home\": nul}", "{\"home\": \"\\ud800\"}", "hello" }) {
        CAPTURE(text);
        const std::string problem = problemOf(text);
        REQUIRE_FALSE(problem.empty());
        CHECK(problem.find_first_not_of("0123456789") == problem.find(": "));
        CHECK(problem.find('\n') == std::string::npos);
    }
    CHECK(problemOf("{\n\"home\": nul\n}").substr(0, 3) == "2: ");
}

TEST_CASE("a description that is cut short anywhere is refused")
{
    const std::string_view whole = example.substr(0, example.rfind('}') + 1);
    for (std::size_t length = 0; length < whole.size(); ++length) {
        CAPTURE(length);
        CHECK_FALSE(problemOf(whole.substr(0, length)).empty());
    }
    CHECK(problemOf(whole).empty());
}

TEST_CASE("a description with one byte changed is read or refused with a line, never worse")
{
    for (std::size_t index = 0; index < example.size(); ++index) {
        for (char byte : { '\0', '"', '}', ']', ',', '\\', '\x80', '7' }) {
            std::string text(example);
            text[index] = byte;
            const std::string problem = problemOf(text);
            CHECK((problem.empty() || problem.find(": ") != std::string::npos));
        }
    }
}

TEST_CASE("a hostile description costs bounded time")
{
    CHECK_FALSE(problemOf(std::string(200'000, '[')).empty());
    std::string keys = "{\"links\": {";
    for (int number = 0; number < 50'000; ++number)
        keys += "\"/k" + std::to_string(number) + "\": \"/t\", ";
    CHECK(readMachineDescription(keys + "\"/last\": \"/t\"}}", "/folder").description.links.size() == 50'001);
    CHECK_FALSE(problemOf("{\"home\": \"/" + std::string(platform::largestMachineDescription, 'x') + "\"}").empty());
}
