#include "tests/house/SourceTree.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <cstddef>
#include <optional>
#include <sstream>
#include <string>
#include <string_view>
#include <vector>

using namespace house;

namespace {

// A text that no file may hold. A '#' in it stands for any digit. Each is written in two pieces, so that this file
// passes.
struct ForbiddenText {
    std::string text;
    std::string reason;
};

const std::vector<ForbiddenText>& forbiddenEverywhere()
{
    const std::string document = "the reason itself stands here, not the document that gave it";
    const std::string ticket = "the reason itself stands here, not a ticket";
    const std::string machine = "a path of one person's machine";
    static const std::vector<ForbiddenText> table {
        { std::string("Part ") + "#.#", document },
        { std::string("Parts ") + "#.#", document },
        { std::string("spec") + ".md", document },
        { std::string("interface") + ".md", document },
        { std::string("style") + ".md", document },
        { std::string("experience") + ".md", document },
        { std::string("libraries") + ".md", document },
        { std::string("performance") + ".md", document },
        { std::string("issue ") + "#", ticket },
        { std::string("Issue ") + "#", ticket },
        { std::string("ticket ") + "#", ticket },
        { std::string("/wo") + "rk/", machine },
        { std::string("/ro") + "ot/", machine },
        { std::string("TO") + "DO", "what is left to do stands in no file" },
        { std::string("FIX") + "ME", "what is left to do stands in no file" },
    };
    return table;
}

const std::vector<ForbiddenText>& forbiddenInTests()
{
    const std::string sleeping = "a test waits for the event, or moves a clock by hand";
    static const std::vector<ForbiddenText> table {
        { std::string("this_thread::") + "sleep", sleeping },
        { std::string("usl") + "eep(", sleeping },
        { std::string("nanosl") + "eep(", sleeping },
    };
    return table;
}

bool isDigit(char c)
{
    return c >= '0' && c <= '9';
}

bool isWordCharacter(char c)
{
    return isDigit(c) || (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_';
}

bool matchesAt(std::string_view text, std::size_t offset, std::string_view pattern)
{
    if (text.size() - offset < pattern.size())
        return false;
    if (offset > 0 && isWordCharacter(text[offset - 1]) && isWordCharacter(pattern.front()))
        return false;
    return std::equal(pattern.begin(), pattern.end(), text.begin() + static_cast<std::ptrdiff_t>(offset),
        [](char wanted, char found) { return wanted == '#' ? isDigit(found) : wanted == found; });
}

// Where the pattern first occurs as words of its own.
std::optional<std::size_t> findPattern(std::string_view text, std::string_view pattern)
{
    for (std::size_t offset = text.find(pattern.front()); offset != std::string_view::npos;
         offset = text.find(pattern.front(), offset + 1)) {
        if (matchesAt(text, offset, pattern))
            return offset;
    }
    return std::nullopt;
}

void addComplaints(
    const SourceFile& file, const std::vector<ForbiddenText>& table, std::vector<std::string>& complaints)
{
    for (const ForbiddenText& forbidden : table) {
        if (const auto offset = findPattern(file.text, forbidden.text))
            complaints.push_back(file.path + ":" + std::to_string(lineNumberAt(file.text, *offset)) + ": \""
                + forbidden.text + "\": " + forbidden.reason);
    }
}

std::vector<std::string> complaintsAbout(const SourceFile& file)
{
    std::vector<std::string> complaints;
    addComplaints(file, forbiddenEverywhere(), complaints);
    if (file.path.starts_with("tests/"))
        addComplaints(file, forbiddenInTests(), complaints);
    return complaints;
}

// The names in a test file; an escaped quote in one is of no interest here.
std::vector<std::string> testNamesIn(std::string_view text)
{
    constexpr std::string_view opening = "TEST_CASE(\"";
    std::vector<std::string> names;
    for (std::size_t at = text.find(opening); at != std::string_view::npos; at = text.find(opening, at + 1)) {
        const std::string_view rest = text.substr(at + opening.size());
        names.emplace_back(rest.substr(0, rest.find('"')));
    }
    return names;
}

} // namespace

TEST_CASE("no file points at a document, a ticket, a machine or work left to do")
{
    std::vector<std::string> complaints;
    for (const SourceFile& file : sourceFiles()) {
        const std::vector<std::string> found = complaintsAbout(file);
        complaints.insert(complaints.end(), found.begin(), found.end());
    }
    CHECK_MESSAGE(complaints.empty(), joined(complaints));
}

TEST_CASE("each forbidden text is found inside a sentence and named with its line")
{
    for (const ForbiddenText& forbidden : forbiddenEverywhere()) {
        std::string text = forbidden.text;
        std::replace(text.begin(), text.end(), '#', '7');
        const auto complaints = complaintsAbout({ "host/Any.cpp", "first line\n// see " + text + " for this\n" });
        REQUIRE(complaints.size() == 1);
        CHECK(complaints.front().starts_with("host/Any.cpp:2: "));
    }
    CHECK(
        complaintsAbout({ "tests/AnyTest.cpp", std::string("std::this_thread::") + "sleep_for(second);" }).size() == 1);
    CHECK(complaintsAbout({ "tests/AnyTest.cpp", "clock.sleep(second); // a Part of 1.5 issues #include" }).empty());
}

TEST_CASE("no source or header is longer than 400 lines")
{
    std::vector<std::string> complaints;
    for (const SourceFile& file : sourceFiles()) {
        const auto lines = std::count(file.text.begin(), file.text.end(), '\n');
        if (isCode(file.path) && lines > 400)
            complaints.push_back(file.path + ": " + std::to_string(lines) + " lines");
    }
    CHECK_MESSAGE(complaints.empty(), joined(complaints));
}

// The expected texts of tests are as long as they are; what is written about code wraps there too.
TEST_CASE("no line of code is longer than 120 characters, nor any of a comment")
{
    constexpr std::ptrdiff_t most = 120;
    std::vector<std::string> complaints;
    for (const SourceFile& file : sourceFiles()) {
        if (!isCode(file.path))
            continue;
        std::istringstream text(file.text);
        std::size_t number = 0;
        for (std::string line; std::getline(text, line);) {
            ++number;
            const std::size_t start = std::min(line.find_first_not_of(' '), line.size());
            const bool isComment = std::string_view(line).substr(start).starts_with("//");
            // A byte that continues a character is none of its own.
            const auto length
                = std::count_if(line.begin(), line.end(), [](char byte) { return (byte & 0xC0) != 0x80; });
            if (length > most && (isComment || !file.path.starts_with("tests/")))
                complaints.push_back(file.path + ":" + std::to_string(number));
        }
    }
    CHECK_MESSAGE(complaints.empty(), joined(complaints));
}

TEST_CASE("every header is guarded by the pragma")
{
    std::vector<std::string> complaints;
    for (const SourceFile& file : sourceFiles()) {
        if (file.path.ends_with(".h") && file.text.find("#pragma once\n") == std::string::npos)
            complaints.push_back(file.path);
    }
    CHECK_MESSAGE(complaints.empty(), joined(complaints));
}

// The test runner's list cuts a name there, and the half that matches no test passes.
TEST_CASE("no test's name holds a semicolon")
{
    std::vector<std::string> complaints;
    for (const SourceFile& file : sourceFiles()) {
        if (!isCode(file.path))
            continue;
        for (const std::string& name : testNamesIn(file.text)) {
            if (name.find(';') != std::string::npos)
                complaints.push_back(file.path + ": " + name);
        }
    }
    CHECK_MESSAGE(complaints.empty(), joined(complaints));
    CHECK(testNamesIn("TEST_CASE(\"a\") {}\nTEST_CASE(\"b; c\") {}") == std::vector<std::string> { "a", "b; c" });
}
