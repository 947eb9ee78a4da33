// "menu": what a person is offered for a movie or a group.

#include "apps/common/RecordJson.h"
#include "apps/ombrix/AbsolutePath.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/GroupSearch.h"
#include "apps/ombrix/ObjectSearch.h"
#include "apps/ombrix/Program.h"

namespace ombrix {
namespace {

    platform::Text actionOf(const OBMenuItem& item)
    {
        return item.action ? platform::Text(item.action->name) : platform::Text();
    }

    platform::Value valueOf(const OBMenu& menu)
    {
        platform::Value::List items;
        for (const OBMenuItem& item : menu.items) {
            items.emplace_back(platform::Value::Dictionary {
                { "title", item.title }, { "action", actionOf(item) }, { "keyEquivalent", item.keyEquivalent } });
        }
        return platform::Value::Dictionary { { "title", menu.title }, { "items", std::move(items) } };
    }

    void print(Program& program, const OBMenu& menu)
    {
        program.printLine(program.style().name(menu.title));
        for (const OBMenuItem& item : menu.items) {
            const std::string action = item.action ? "  (" + std::string(item.action->name) + ")" : std::string();
            program.printLine("  " + program.style().name(item.title) + action);
        }
    }

} // namespace

int runMenu(Program& program)
{
    const std::string* object = program.arguments().valueOf("--object");
    const std::string* group = program.arguments().valueOf("--group");
    if (!object == !group)
        return program.failUsage("menu: either --object PATH or --group ID is wanted (\"ombrix help menu\")");
    const std::optional<std::string> path = object ? absolutePath(*object) : std::string();
    if (!path)
        return program.fail(*object, noCurrentFolder);
    const OBMediaGroupRef root = program.load();
    if (!root)
        return failed;
    OBMenuRef menu;
    if (group) {
        menu = program.manager()->contextMenuForMediaGroup(groupWithID(root, *group));
    } else {
        const FoundObject found = objectWithPath(root, *path);
        menu = program.manager()->contextMenuForMediaObject_inMediaGroup(found.object, found.group);
    }
    if (!menu)
        program.printLine("null");
    else if (program.wantsJson())
        apps::printValue(program.output(), valueOf(*menu));
    else
        print(program, *menu);
    return done;
}

} // namespace ombrix
