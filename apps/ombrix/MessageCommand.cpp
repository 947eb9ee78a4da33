// "message": what a window shows in place of an empty group.

#include "apps/ombrix/Commands.h"
#include "apps/ombrix/Program.h"

namespace ombrix {

int runMessage(Program& program)
{
    const Program::GroupAnswer answer = program.loadGroupOfOption();
    if (!answer.group)
        return answer.status;
    if (const platform::Text message = program.manager()->defaultNoDataMessage(answer.group))
        program.printLine(message);
    return done;
}

} // namespace ombrix
