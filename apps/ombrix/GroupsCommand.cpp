// "groups": the flat list of a source, in its own order.

#include "apps/common/DisplayWidth.h"
#include "apps/common/HumanText.h"
#include "apps/common/RecordJson.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/Program.h"
#include "apps/ombrix/TextLine.h"
#include "apps/ombrix/TreeNodes.h"

#include <algorithm>

namespace ombrix {
namespace {

    constexpr int gap = 3;
    constexpr int widestName = 40;

    struct Row {
        std::string name;
        std::string kind;
        std::string count;
        std::string identifier;
    };

    Row rowOf(const OBMediaGroup& group, const apps::Style& style)
    {
        const NodeKind kind = kindOf(group);
        const platform::Text name = group.name().empty() ? group.ID() : group.name();
        return { style.name(name), std::string(kindText(kind)),
            apps::quantityText(group.ownMediaObjects().size(), mediaUnit(kind)), style.name(group.ID()) };
    }

    void printTable(Program& program, const OBMediaGroupList& groups)
    {
        std::vector<Row> rows;
        int name = 0;
        int kind = 0;
        int count = 0;
        for (const OBMediaGroupRef& group : groups) {
            rows.push_back(rowOf(*group, program.style()));
            name = std::max(name, apps::displayWidth(rows.back().name));
            kind = std::max(kind, apps::displayWidth(rows.back().kind));
            count = std::max(count, apps::displayWidth(rows.back().count));
        }
        if (const std::optional<int> columns = program.columns())
            name = std::min({ name, widestName, *columns / 3 });
        const int countEnd = name + gap + kind + gap + count;
        for (Row& row : rows) {
            TextLine line(program.style(), program.columns());
            line.addBehind(apps::cutInMiddle(row.name, name), TextLine::Look::bold);
            line.add(name + gap, row.kind, TextLine::Look::dim);
            line.add(countEnd - apps::displayWidth(row.count), row.count, TextLine::Look::dim);
            // It is there to be typed again, so it is longer than the line rather than cut.
            program.printLine(line.text() + std::string(gap, ' ') + program.style().plain(row.identifier));
        }
    }

} // namespace

int runGroups(Program& program)
{
    if (!program.load())
        return failed;
    const OBMediaGroupList groups = program.manager()->mediaGroups();
    if (program.wantsJson())
        apps::printGroups(program.output(), groups);
    else
        printTable(program, groups);
    program.warnOfUnreadFolders();
    return done;
}

} // namespace ombrix
