// "paths": where the source looks. Loads nothing, so it also answers where the editor is missing.

#include "apps/common/DisplayWidth.h"
#include "apps/common/RecordJson.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/Program.h"
#include "apps/ombrix/SearchFolders.h"
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

    constexpr int indent = 2;
    constexpr int gap = 3;
    constexpr int leastPathWidth = 20;

    /// A folder as it is laid out.
    struct Row {
        std::string path;
        std::string state;
    };

    std::vector<Row> rowsOf(Program& program, const Paths& paths)
    {
        std::vector<Row> rows;
        for (const std::string& path : paths) {
            const platform::FileProblem problem = searchProblem(program.session()->platform().fileSystem, path);
            rows.push_back({ program.style().name(path), searchStateText(problem) });
        }
        return rows;
    }

    void printRows(Program& program, std::string_view title, const std::vector<Row>& rows, int width)
    {
        program.printLine(program.style().bold(title));
        for (const Row& row : rows) {
            TextLine line(program.style(), program.columns());
            line.add(indent, apps::cutInMiddle(row.path, width));
            program.printWrapped(line, indent + width + gap, row.state, TextLine::Look::dim);
        }
    }

    void printText(Program& program, const Paths& projects, const Paths& events)
    {
        const std::vector<Row> rows[] { rowsOf(program, projects), rowsOf(program, events) };
        int path = 0;
        int state = 0;
        for (const std::vector<Row>& list : rows) {
            for (const Row& row : list) {
                path = std::max(path, apps::displayWidth(row.path));
                state = std::max(state, apps::displayWidth(row.state));
            }
        }
        if (const std::optional<int> columns = program.columns()) {
            const int beside = *columns - indent - gap - std::min(state, *columns / 3);
            path = std::min(path, std::max(leastPathWidth, beside));
        }
        printRows(program, "projects", rows[0], path);
        printRows(program, "events", rows[1], path);
    }

} // namespace

int runPaths(Program& program)
{
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
    } else if (inspection) {
        printText(program, projects, events);
    } else {
        program.printLine("The source tells of no folder that it searches.");
    }
    return done;
}

} // namespace ombrix
