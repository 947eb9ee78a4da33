// "doctor": what keeps the tree from being right or fresh, and the command that mends it. Nothing here touches a disk
// that may not answer, and nothing is changed.

#include "apps/common/ChildProcess.h"
#include "apps/common/RecordJson.h"
#include "apps/ombrix/Checkup.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/Program.h"
#include "apps/ombrix/SuggestedCommand.h"

#include <algorithm>

namespace ombrix {
namespace {

    using platform::Value;

    constexpr std::size_t askedAtOnce = 16;
    constexpr int subjectStart = 6;
    constexpr int textStart = 19;
    constexpr int remedyStart = textStart + 6;

    DiskAnswer answerOf(const apps::ChildAnswer& child)
    {
        const bool isWhole = child.end == apps::ChildAnswer::End::exited && child.status == done;
        return isWhole ? answerOfBytes(child.output) : std::nullopt;
    }

    AskDisks askThroughChildren(const Program& program)
    {
        return [&program](const std::vector<std::vector<std::string>>& questions) {
            std::vector<apps::ChildWishes> children;
            for (const std::vector<std::string>& words : questions) {
                apps::ChildWishes& child = children.emplace_back();
                child.program = apps::thisProgram();
                child.limit = untilSilent;
                child.arguments = { "answer" };
                for (const std::string& argument : machineArguments(program.arguments()))
                    child.arguments.push_back(argument);
                child.arguments.insert(child.arguments.end(), words.begin(), words.end());
            }
            std::vector<DiskAnswer> answers;
            for (const apps::ChildAnswer& child : apps::runChildren(children, askedAtOnce))
                answers.push_back(answerOf(child));
            return answers;
        };
    }

    TextLine::Look lookOf(Severity severity)
    {
        switch (severity) {
        case Severity::fail:
            return TextLine::Look::failure;
        case Severity::warn:
            return TextLine::Look::warning;
        default:
            return TextLine::Look::dim;
        }
    }

    void printFinding(Program& program, const Finding& finding)
    {
        TextLine line(program.style(), program.columns());
        const bool isFailure = finding.severity == Severity::fail;
        line.add(0, isFailure ? "FAIL" : textOfSeverity(finding.severity), lookOf(finding.severity));
        line.add(subjectStart, finding.subject);
        program.printWrapped(line, textStart, program.style().name(finding.text));
        if (finding.remedy.empty())
            return;
        TextLine remedy(program.style(), program.columns());
        remedy.add(textStart, "fix:", TextLine::Look::dim).addWhole(remedyStart, finding.remedy);
        program.printLine(remedy.text());
    }

    Value valueOf(const Finding& finding)
    {
        return Value::Dictionary { { "severity", textOfSeverity(finding.severity) },
            { "subject", std::string_view(finding.subject) }, { "text", std::string_view(finding.text) },
            { "remedy", finding.remedy.empty() ? Value() : Value(std::string_view(finding.remedy)) } };
    }

    void printJson(Program& program, const std::vector<Finding>& findings, bool isHealthy)
    {
        Value::List list;
        for (const Finding& finding : findings) {
            if (finding.severity != Severity::ok)
                list.push_back(valueOf(finding));
        }
        apps::printValue(
            program.output(), Value::Dictionary { { "healthy", isHealthy }, { "findings", std::move(list) } });
    }

} // namespace

int runDoctor(Program& program)
{
    if (!program.managerClass())
        return failed;
    CheckupFacts facts = askForFacts(askThroughChildren(program));
    facts.limits = program.session()->platform().pathWatching.limits(foldersToWatch(facts));
    const std::vector<Finding> findings = findingsOf(facts);
    const bool isHealthy = std::none_of(
        findings.begin(), findings.end(), [](const Finding& finding) { return finding.severity == Severity::fail; });
    if (program.wantsJson())
        printJson(program, findings, isHealthy);
    else
        for (const Finding& finding : findings)
            printFinding(program, finding);
    return isHealthy ? done : failed;
}

} // namespace ombrix
