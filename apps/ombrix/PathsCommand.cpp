// "paths": where the source looks. Loads nothing, so it also answers where the editor is missing.

#include "apps/common/DisplayWidth.h"
#include "apps/common/RecordJson.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/Program.h"
#include "apps/ombrix/TextLine.h"
#include "host/OBSourceInspection.h"
#include "platform/FileSystem.h"

#include <algorithm>

namespace ombrix {
namespace {

    using Paths = std::vector<std::string>;

    platform::Value listOf(const Paths& paths)
    {
        platform::Value::List list;
        for (const std::string& path : paths)
            list.emplace_back(std::string_view(path));
        return list;
    }

    std::string_view stateOf(const platform::FileSystem& fileSystem, const std::string& path)
    {
        const std::optional<platform::ItemStatus> status = fileSystem.status(path);
        if (!status)
            return "absent";
        return status->kind == platform::ItemKind::folder ? "exists" : "not a folder";
    }

    void printPaths(Program& program, std::string_view title, const Paths& paths, int width)
    {
        program.printLine(program.style().bold(title));
        for (const std::string& path : paths) {
            TextLine line(program.style(), std::nullopt);
            line.add(2, program.style().name(path));
            line.add(2 + width + 3, stateOf(program.session()->platform().fileSystem, path), TextLine::Look::dim);
            program.printLine(line.text());
        }
    }

    void printText(Program& program, const Paths& projects, const Paths& events)
    {
        int width = 0;
        for (const Paths* paths : { &projects, &events }) {
            for (const std::string& path : *paths)
                width = std::max(width, apps::displayWidth(program.style().name(path)));
        }
        printPaths(program, "projects", projects, width);
        printPaths(program, "events", events, width);
    }

} // namespace

int runPaths(Program& program)
{
    if (program.wantsJson() && program.arguments().has("-0"))
        return program.failUsage("paths: options -0 and --json exclude each other");
    const std::shared_ptr<OBMediaManager> manager = program.manager();
    if (!manager)
        return failed;
    OBSourceInspection* inspection = manager->inspection();
    const Paths projects = inspection ? inspection->projectSearchPaths() : Paths();
    const Paths events = inspection ? inspection->eventSearchPaths() : Paths();
    if (program.wantsJson()) {
        apps::printValue(program.output(),
            platform::Value::Dictionary { { "projects", listOf(projects) }, { "events", listOf(events) } });
    } else if (program.arguments().has("-0")) {
        for (const Paths* paths : { &projects, &events }) {
            for (const std::string& path : *paths)
                program.printPath(path);
        }
    } else {
        printText(program, projects, events);
    }
    return done;
}

} // namespace ombrix
