// On a terminal a hit is one line. The path is what there may be no room for; the name links to it.

#include "apps/ombrix/FindText.h"

#include "apps/common/DisplayWidth.h"
#include "apps/ombrix/TextLine.h"
#include "apps/ombrix/TreeNodes.h"
#include "platform/FileSystem.h"

#include <algorithm>
#include <string>
#include <vector>

namespace ombrix {
namespace {

    constexpr int gap = 3;
    constexpr int widestCell = 40;
    constexpr int leastPathWidth = 24;
    constexpr std::string_view below = " › ";

    struct Row {
        std::string name;
        std::string kind;
        std::string place;
        platform::Text path;
    };

    std::string shownName(const OBMediaGroup& group, const apps::Style& style)
    {
        const platform::Text name = group.name();
        return style.name(name.empty() ? group.ID() : name);
    }

    /// The groups around a hit, from the outermost one in. The root is told only where nothing else is: it is around
    /// all.
    std::string placeOf(const apps::FoundNames& found, const apps::NameHit& hit, const apps::Style& style)
    {
        const bool isRoot = !hit.object && hit.group == 0;
        if (isRoot)
            return {};
        std::size_t around = hit.object ? hit.group : found.groups[hit.group].parent;
        std::string place = shownName(*found.groups[around].group, style);
        for (around = found.groups[around].parent; around != 0; around = found.groups[around].parent)
            place.insert(0, below).insert(0, shownName(*found.groups[around].group, style));
        return place;
    }

    Row rowOf(const apps::FoundNames& found, const apps::NameHit& hit, const apps::Style& style)
    {
        const OBMediaGroup& group = *found.groups[hit.group].group;
        const NodeKind kind = kindOf(group);
        const int widest = style.isTerminal() ? widestCell : 1 << 20;
        return { apps::cutInMiddle(hit.object ? style.name(hit.object->name()) : shownName(group, style), widest),
            std::string(hit.object ? mediaUnit(kind) : kindText(kind)),
            apps::cutInMiddle(placeOf(found, hit, style), widest), hit.object ? hit.object->path() : group.path() };
    }

    /// The path as far as there is room behind `column`; empty where that is too little to be of use.
    std::string pathBehind(int column, const Row& row, const Program& program)
    {
        std::string path = program.style().name(row.path);
        if (!program.columns())
            return path;
        const int room = *program.columns() - column;
        return room < std::min(leastPathWidth, apps::displayWidth(path)) ? std::string()
                                                                         : apps::cutInMiddle(path, room);
    }

} // namespace

void printFindText(Program& program, const apps::FoundNames& found, std::size_t count)
{
    std::vector<Row> rows;
    int name = 0;
    int kind = 0;
    int place = 0;
    for (std::size_t index = 0; index < count; ++index) {
        rows.push_back(rowOf(found, found.hits[index], program.style()));
        name = std::max(name, std::min(widestCell, apps::displayWidth(rows.back().name)));
        kind = std::max(kind, apps::displayWidth(rows.back().kind));
        place = std::max(place, std::min(widestCell, apps::displayWidth(rows.back().place)));
    }
    const int placeColumn = name + gap + kind + gap;
    const platform::FileSystem& fileSystem = program.session()->platform().fileSystem;
    for (const Row& row : rows) {
        TextLine line(program.style(), program.columns());
        // A link leads to where the file lies, not by the name of a volume that only this system resolves.
        const bool isLink = program.style().hasLinks() && row.path;
        line.addBehind(row.name, TextLine::Look::bold, isLink ? fileSystem.resolvedPath(row.path) : std::string());
        line.add(name + gap, row.kind, TextLine::Look::dim).add(placeColumn, row.place);
        const int pathColumn = placeColumn + place + gap;
        program.printLine(line.add(pathColumn, pathBehind(pathColumn, row, program), TextLine::Look::dim).text());
    }
}

} // namespace ombrix
