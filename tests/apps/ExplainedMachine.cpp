#include "tests/apps/ExplainedMachine.h"

#include "platform/formats/Json.h"

#include <doctest/doctest.h>

#include <sstream>

namespace tests {
namespace {

    using platform::JsonNode;

    std::string textOf(const JsonNode& node, std::string_view key)
    {
        const JsonNode* member = node.member(key);
        REQUIRE(member != nullptr);
        return member->kind == JsonNode::Kind::null ? "null" : member->text;
    }

    ExplainAnswer answerOf(const std::string& line)
    {
        CAPTURE(line);
        const platform::JsonResult document = platform::readJson(line);
        REQUIRE(document.problem.empty());
        const JsonNode& root = document.root;
        ExplainAnswer answer { textOf(root, "path"), root.member("listed")->boolean };
        for (const JsonNode& group : root.member("groups")->items)
            answer.groups.push_back(group.text);
        for (const JsonNode& object : root.member("objects")->items)
            answer.objects.push_back(textOf(object, "group") + " | " + textOf(object, "path"));
        const std::vector<JsonNode>& steps = root.member("steps")->items;
        REQUIRE_FALSE(steps.empty());
        for (const JsonNode& step : steps)
            answer.rules.push_back(textOf(step, "rule"));
        answer.lastRule = answer.rules.back();
        answer.lastPath = textOf(steps.back(), "path");
        answer.reason = textOf(steps.back(), "text");
        answer.remedy = textOf(root, "remedy");
        CHECK(steps.back().member("passed")->boolean == answer.listed);
        return answer;
    }

} // namespace

ExplainedMachine::ExplainedMachine()
    : projects(folder.folder("home/Movies/Montaro Projects"))
    , events(folder.folder("home/Movies/Montaro Events"))
    , stick(folder.folder("stick/Montaro Events"))
{
    description.home(folder.path("home")).localVolume("/").localVolume("/Volumes/Stick");
    description.link("/Volumes/Stick", folder.path("stick"));
}

RunWishes ExplainedMachine::wishes(std::vector<std::string> arguments)
{
    if (hasEditor)
        description.editor(folder.file("editor"));
    description.write(folder.path("machine.json"));
    arguments.insert(arguments.begin(), { "--machine", folder.path("machine.json"), "explain" });
    return { arguments, {}, {} };
}

std::vector<ExplainAnswer> ExplainedMachine::answers(std::vector<std::string> paths)
{
    paths.push_back("--json");
    const ProgramRun run = runProgram(wishes(paths));
    CHECK(run.status == 0);
    std::vector<ExplainAnswer> answers;
    std::istringstream lines(run.output);
    for (std::string line; std::getline(lines, line);)
        answers.push_back(answerOf(line));
    return answers;
}

ExplainAnswer ExplainedMachine::answer(const std::string& path)
{
    const std::vector<ExplainAnswer> all = answers({ path });
    REQUIRE(all.size() == 1);
    return all.front();
}

void checkUnlisted(
    const ExplainAnswer& answer, const std::string& rule, const std::string& reason, const std::string& remedy)
{
    CAPTURE(answer.path);
    CHECK_FALSE(answer.listed);
    CHECK(answer.groups.empty());
    CHECK(answer.objects.empty());
    CHECK(answer.lastRule == rule);
    CHECK(answer.reason == reason);
    CHECK(answer.remedy == remedy);
}

} // namespace tests
