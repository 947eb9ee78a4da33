// "disk-format": what a source's class says of a disk. No manager is made and nothing is loaded.

#include "apps/common/HostileNames.h"
#include "apps/ombrix/AbsolutePath.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/Program.h"

namespace ombrix {

int runDiskFormat(Program& program)
{
    const std::vector<std::string>& operands = program.arguments().operands;
    if (operands.empty())
        return program.failUsage("disk-format: PATH is missing (\"ombrix help disk-format\")");
    const std::optional<std::string> path = operands[0].empty() ? operands[0] : absolutePath(operands[0]);
    if (!path)
        return program.fail(operands[0], noCurrentFolder);
    const OBMediaManagerClass* managerClass = program.managerClass();
    if (!managerClass)
        return failed;
    program.printLine(managerClass->validDiskFormat(*path) ? "true" : "false");
    return done;
}

} // namespace ombrix
