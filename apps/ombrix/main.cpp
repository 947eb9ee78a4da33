#include "apps/common/Memory.h"
#include "apps/common/StandardError.h"
#include "apps/common/Terminal.h"
#include "apps/ombrix/Arguments.h"
#include "apps/ombrix/Help.h"
#include "apps/ombrix/Program.h"

#include <exception>
#include <string_view>
#include <utility>
#include <vector>

namespace {

int run(ombrix::Program& program)
{
    const ombrix::Arguments& arguments = program.arguments();
    if (arguments.wantsVersion)
        program.output().write(ombrix::versionText());
    else if (arguments.wantsHelp)
        program.output().write(arguments.command ? ombrix::helpText(*arguments.command) : ombrix::helpText());
    else
        return arguments.command->run(program);
    return ombrix::done;
}

// What a source throws is said in one line.
int runGuarded(ombrix::Program& program)
{
    try {
        return run(program);
    } catch (const std::exception& error) {
        return program.fail(program.arguments().source, error.what());
    } catch (...) {
        return program.fail(program.arguments().source, "an unknown error");
    }
}

} // namespace

int main(int count, char** words)
{
    apps::takeMemoryInLargeSteps();
    apps::guardStandardDescriptors();
    apps::eraseProgressOnSignals();
    const std::vector<std::string_view> typed(words + (count > 0 ? 1 : 0), words + count);
    ombrix::ParsedArguments parsed = ombrix::parseArguments(typed);
    if (!parsed.problem.empty()) {
        apps::printError("ombrix: " + parsed.problem);
        apps::endProcess(ombrix::wrongUsage);
    }
    ombrix::Program program(std::move(parsed.arguments));
    const int status = runGuarded(program);
    // A thread may still wait for a disk that does not answer, so nothing is torn down.
    apps::endProcess(program.finish(status));
}
