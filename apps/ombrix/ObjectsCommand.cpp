// "objects": what a group shows, which for a group of groups is what lies below it.

#include "apps/common/RecordJson.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/Program.h"

namespace ombrix {

int runObjects(Program& program)
{
    const Program::GroupAnswer answer = program.loadGroupOfOption();
    if (!answer.group)
        return answer.status;
    const OBMediaObjectList objects = answer.group->mediaObjects();
    if (program.wantsJson()) {
        apps::printObjects(program.output(), objects);
    } else {
        objects.visit([&program](OBMediaObject& object) {
            if (const platform::Text path = object.path())
                program.printPath(path);
            return program.output().problem().empty();
        });
    }
    program.warnOfUnreadFolders();
    return done;
}

} // namespace ombrix
