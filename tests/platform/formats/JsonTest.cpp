#include "platform/formats/JsonShape.h"

#include "tests/platform/formats/Damage.h"

#include <doctest/doctest.h>

#include <array>

using namespace platform;
using Kind = JsonNode::Kind;

namespace {

std::string problemOf(std::string_view text)
{
    return readJson(text).problem;
}

int lineOf(const std::string& problem)
{
    return problem.empty() ? 0 : std::stoi(problem);
}

} // namespace

TEST_CASE("a document is read with the place of every value and key")
{
    const JsonResult result
        = readJson("{\n  \"a\": [1, -2.5,\n    true],\n\n  \"b\" : { \"c\":null }, \"d\": \"x\\u00e9\\n\"\n}\n");
    REQUIRE(result.problem == "");
    const JsonNode& root = result.root;
    REQUIRE(root.kind == Kind::object);
    REQUIRE(root.members.size() == 3);
    CHECK(root.line == 1);
    CHECK(root.members[0].line == 2);
    CHECK(root.members[0].column == 3);
    const JsonNode& list = *root.member("a");
    REQUIRE(list.items.size() == 3);
    CHECK(list.line == 2);
    CHECK(list.column == 8);
    CHECK(list.items[0].integer == 1);
    CHECK(list.items[0].column == 9);
    CHECK(list.items[1].kind == Kind::real);
    CHECK(list.items[1].real == -2.5);
    CHECK(list.items[2].boolean);
    CHECK(list.items[2].line == 3);
    CHECK(list.items[2].column == 5);
    CHECK(root.members[1].line == 5);
    CHECK(root.member("b")->column == 9);
    CHECK(root.member("b")->member("c")->kind == Kind::null);
    CHECK(root.member("b")->members[0].column == 11);
    CHECK(root.member("d")->text == "x\xC3\xA9\n");
    CHECK(root.member("e") == nullptr);
}

TEST_CASE("a UTF-8 mark at the start of a document is skipped")
{
    const JsonResult result = readJson("\xEF\xBB\xBF[1]");
    CHECK(result.problem == "");
    CHECK(result.root.items.size() == 1);
    CHECK(result.root.column == 1);
}

TEST_CASE("an integer that 64 bits with a sign do not hold is a real")
{
    CHECK(readJson("9223372036854775807").root.integer == INT64_MAX);
    CHECK(readJson("-9223372036854775808").root.integer == INT64_MIN);
    CHECK(readJson("9223372036854775808").root.kind == Kind::real);
    CHECK(readJson("18446744073709551616").root.real == 18446744073709551616.0);
    CHECK(readJson("1.0").root.kind == Kind::real);
    CHECK(readJson("0.1").root.real == 0.1);
    CHECK(readJson("-0").root.integer == 0);
    CHECK(readJson("0e119").root.real == 0);
    CHECK(problemOf("[\n1e-999]") == "2: a number is out of range");
}

TEST_CASE("what is no JSON is refused on its line")
{
    CHECK(lineOf(problemOf("")) == 1);
    CHECK(lineOf(problemOf("\n\n  ")) == 3);
    CHECK(lineOf(problemOf("{\n\"a\": 1,\n}")) == 3);
    CHECK(lineOf(problemOf("[1,\n2,,3]")) == 2);
    CHECK(lineOf(problemOf("{\n\n\"a\" 1}")) == 3);
    CHECK(lineOf(problemOf("[1]\n[2]")) == 2);
    CHECK(lineOf(problemOf("[1] // why")) == 1);
    CHECK(lineOf(problemOf("[\n/* why */ 1]")) == 2);
    CHECK(lineOf(problemOf("[\nNaN]")) == 2);
    CHECK(lineOf(problemOf("[\n'a']")) == 2);
    CHECK(lineOf(problemOf("[\n01]")) == 2);
    CHECK(lineOf(problemOf("[\n1e999]")) == 2);
    CHECK(lineOf(problemOf("[\n\"a\nb\"]")) == 2);
    CHECK(lineOf(problemOf("[\n\"\\x\"]")) == 2);
    CHECK(lineOf(problemOf("[\n\"\\ud800\"]")) == 2);
    CHECK(lineOf(problemOf("[\n\"\\udc00\"]")) == 2);
    CHECK(lineOf(problemOf("[\n\"\xFF\"]")) == 2);
    CHECK(lineOf(problemOf(std::string("[]\n\0[", 5))) == 2);
    CHECK(lineOf(problemOf("{\"a\": \n\"open")) == 2);
}

TEST_CASE("a key that occurs twice is refused on the line of the second")
{
    CHECK(problemOf("{\"a\": 1,\n \"b\": 2,\n \"a\": 3}") == "3: key \"a\" occurs twice");
    CHECK(problemOf("{\"a\": {\"a\": 1}}") == "");
    CHECK(problemOf("{\"a\":\n1, \"\\u0061\": 2}") == "2: key \"a\" occurs twice");
}

TEST_CASE("a document of 200,000 keys is read, and its repeated key found")
{
    std::string text = "{";
    for (int index = 0; index < 200'000; ++index)
        text += "\"key" + std::to_string(index) + "\": " + std::to_string(index) + ",\n";
    CHECK(readJson(text + "\"last\": 0}").root.members.size() == 200'001);
    CHECK(problemOf(text + "\"key7\": 0}") == "200001: key \"key7\" occurs twice");
}

TEST_CASE("nesting is bounded, and a million brackets are no danger")
{
    CHECK(problemOf(std::string(256, '[') + std::string(256, ']')) == "");
    CHECK(problemOf(std::string(257, '[') + std::string(257, ']')) == "1: the document is nested too deeply");
    CHECK(problemOf(std::string(1'000'000, '[')) == "1: the document is nested too deeply");
    std::string objects;
    for (int level = 0; level < 100'000; ++level)
        objects += "{\"a\":";
    CHECK(problemOf(objects) == "1: the document is nested too deeply");
}

TEST_CASE("a document that is too large is refused")
{
    CHECK(problemOf(std::string(largestJsonDocument + 1, ' ')) == "1: the document is larger than 16 MiB");
    std::string many = "[0";
    for (int index = 0; index < 1'000'000; ++index)
        many += ",0";
    CHECK(problemOf(many + "]") == "1: the document holds too many values");
}

TEST_CASE("a damaged document is read or refused with one line, never both")
{
    const std::string text = "{\"home\": \"/h\\u00e9\", \"n\": [1, 2.5e3, null, true], \"o\": {\"k\": \"\xC3\xA9\"}}";
    REQUIRE(problemOf(text) == "");
    forEachDamage(text, [](const std::string& damaged) {
        const JsonResult result = readJson(damaged);
        CHECK(result.problem.find('\n') == std::string::npos);
        if (!result.problem.empty())
            CHECK(result.root.kind == Kind::null);
    });
}

TEST_CASE("a shape names the first thing that is wrong with an object, and its line")
{
    static constexpr std::array<JsonKey, 3> keys { { { "path" },
        { "displayName", JsonTypes::text, JsonPresence::optional },
        { "size", JsonTypes::number | JsonTypes::null, JsonPresence::optional } } };
    const auto problem = [](std::string_view text) { return shapeProblem(readJson(text).root, keys, "a volume"); };
    CHECK(problem("{\"path\": \"/\"}") == "");
    CHECK(problem("{\"path\": \"/\", \"size\": null}") == "");
    CHECK(problem("{\"path\": \"/\", \"size\": 3}") == "");
    CHECK(problem("{\"path\": \"/\", \"size\": 3.5}") == "");
    CHECK(problem("{\n\"path\": \"/\",\n\"paths\": 1}") == "3: unknown key \"paths\" (did you mean \"path\"?)");
    CHECK(problem("{\n\"colour\": 1}") == "2: unknown key \"colour\"");
    CHECK(problem("{\"path\":\n1}") == "2: key \"path\" must be a text, not a whole number");
    CHECK(problem("{\"path\": \"\", \"size\": []}") == "1: key \"size\" must be a number or null, not a list");
    CHECK(problem("\n{}") == "2: key \"path\" is missing");
    CHECK(problem("\n[]") == "2: a volume must be an object, not a list");
    CHECK(typeProblem(readJson("1.5").root, JsonTypes::integer, "a count")
        == "1: a count must be a whole number, not a number");
}
