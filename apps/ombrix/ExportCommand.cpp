// "export": what the source writes when a person copies or drags, and the desktop's clipboard for it.

#include "apps/common/DesktopClipboard.h"
#include "apps/common/ExportedProjects.h"
#include "apps/ombrix/AbsolutePath.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/GroupSearch.h"
#include "apps/ombrix/ObjectSearch.h"
#include "apps/ombrix/Program.h"

#include <utility>
#include <vector>

namespace ombrix {
namespace {

    constexpr std::string_view projectsType = "OBMontaroProjectsPboardType";

    /// A path that was typed, and the ID of the group that the object is to be set on, where one was typed.
    struct WantedObject {
        std::string path;
        std::optional<std::string> group {};
    };

    /// What was typed, or what is wrong with it.
    struct Selection {
        std::vector<WantedObject> objects {};
        std::vector<std::string> groups {};
        std::string problem {};
    };

    Selection selectionOf(const Arguments& arguments)
    {
        Selection selection;
        for (const auto& [option, value] : arguments.options) {
            if (option == "--object")
                selection.objects.push_back({ value });
            else if (option == "--group")
                selection.groups.push_back(value);
            else if (option == "--in" && (selection.objects.empty() || selection.objects.back().group))
                selection.problem = "option --in belongs behind the --object that it is about";
            else if (option == "--in")
                selection.objects.back().group = value;
        }
        if (selection.problem.empty() && !selection.objects.empty() && !selection.groups.empty())
            selection.problem = "objects and groups are exported apart";
        else if (selection.problem.empty() && selection.objects.empty() && selection.groups.empty())
            selection.problem = "--object PATH or --group ID is missing (\"ombrix help export\")";
        return selection;
    }

    /// False after having said why.
    bool addObject(
        Program& program, const OBMediaGroupRef& root, const WantedObject& wanted, OBMediaObjectList& objects)
    {
        const std::optional<std::string> path = absolutePath(wanted.path);
        if (!path) {
            program.fail(wanted.path, noCurrentFolder);
            return false;
        }
        const OBMediaGroupRef group = wanted.group ? groupWithID(root, *wanted.group) : nullptr;
        if (wanted.group && !group) {
            program.failGroup(*wanted.group, "ID", suggestedID(root, *wanted.group));
            return false;
        }
        OBMediaObjectRef object = group ? ownObjectWithPath(*group, *path) : objectWithPath(root, *path).object;
        if (!object) {
            program.fail(*path, group ? "no object of that group has this path" : "no object has this path");
            return false;
        }
        objects = objects.appending(std::move(object));
        return true;
    }

    bool addGroup(
        Program& program, const OBMediaGroupRef& root, const std::string& identifier, OBMediaGroupList& groups)
    {
        OBMediaGroupRef group = groupWithID(root, identifier);
        if (!group) {
            program.failGroup(identifier, "ID", suggestedID(root, identifier));
            return false;
        }
        groups = groups.appending(std::move(group));
        return true;
    }

    /// Absent after having said why.
    std::optional<apps::Exported> exported(Program& program, const Selection& selection)
    {
        const OBMediaGroupRef root = program.load();
        if (!root)
            return std::nullopt;
        OBMediaObjectList objects;
        for (const WantedObject& wanted : selection.objects) {
            if (!addObject(program, root, wanted, objects))
                return std::nullopt;
        }
        OBMediaGroupList groups;
        for (const std::string& identifier : selection.groups) {
            if (!addGroup(program, root, identifier, groups))
                return std::nullopt;
        }
        const auto write = [&](platform::Pasteboard& pasteboard) {
            if (groups.empty())
                program.manager()->writeMediaObjects_toPasteboard(objects, pasteboard);
            else
                program.manager()->writeMediaGroups_toPasteboard(groups, pasteboard);
        };
        return apps::exportedBy(write, projectsType);
    }

    /// False after having said why.
    bool offer(Program& program, apps::DesktopClipboard& clipboard, const std::vector<apps::ClipboardItem>& items)
    {
        if (items.empty()) {
            program.warn("nothing to copy: no file of the selection is there, so the clipboard is left as it was");
            return true;
        }
        const auto problem = clipboard.offer(items);
        if (problem)
            program.fail(problem->place, problem->what);
        return !problem;
    }

} // namespace

int runExport(Program& program)
{
    const Selection selection = selectionOf(program.arguments());
    if (!selection.problem.empty())
        return program.failUsage("export: " + selection.problem);
    const bool isForClipboard = program.arguments().has("--clipboard");
    apps::DesktopClipboard clipboard;
    if (isForClipboard) {
        // Before the load, so that nobody waits for a large library in vain.
        if (const auto problem = clipboard.open())
            return program.fail(problem->place, problem->what);
    }
    const std::optional<apps::Exported> written = exported(program, selection);
    if (!written || (isForClipboard && !offer(program, clipboard, written->items)))
        return failed;
    if (written->propertyList)
        program.output().write(*written->propertyList);
    return done;
}

} // namespace ombrix
