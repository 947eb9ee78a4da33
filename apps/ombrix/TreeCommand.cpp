// "tree": the one command whose text is folded to the terminal. A part that was asked for by name is never folded, so
// that the command which a folded place suggests shows what it promises.

#include "apps/common/HostileNames.h"
#include "apps/common/HumanText.h"
#include "apps/common/RecordJson.h"
#include "apps/common/StandardError.h"
#include "apps/common/Terminal.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/GroupSearch.h"
#include "apps/ombrix/Program.h"
#include "apps/ombrix/ShellWord.h"
#include "apps/ombrix/SkippedItems.h"
#include "apps/ombrix/TextLine.h"
#include "apps/ombrix/TreeText.h"
#include "host/OBSourceInspection.h"
#include "platform/Clock.h"
#include "platform/PathText.h"

#include <algorithm>

namespace ombrix {
namespace {

    constexpr int standardOutput = 1;
    constexpr int standardError = 2;
    /// Below a folded tree stand the footer and the shell's next prompt.
    constexpr int linesBelowTree = 2;

    OBMediaGroupRef groupCalled(const OBMediaGroupRef& root, const std::string& text)
    {
        OBMediaGroupRef group = groupWithID(root, text);
        return group ? group : groupWithName(root, text);
    }

    /// The command that shows all of `group`: by its name where that finds it, else by its ID.
    std::string unfoldingCommand(const OBMediaGroupRef& root, const OBMediaGroupRef& group)
    {
        if (group != root) {
            for (const platform::Text& text : { group->name(), group->ID() }) {
                if (!text.empty() && text.view().front() != '-' && groupCalled(root, text.string()) == group)
                    return "ombrix tree " + shellWord(text);
            }
        }
        return "ombrix tree --all";
    }

    void printSkipped(Program& program, const SkippedItems& skipped, const OBMediaGroupRef& group, bool isPart)
    {
        const platform::Text folder = group->path();
        program.printLine("");
        std::size_t count = 0;
        for (const OBScanDecision& decision : skipped.decisions()) {
            if (isPart && (folder.isAbsent() || !platform::isSameOrBelow(decision.path, folder)))
                continue;
            ++count;
            TextLine line(program.style(), program.columns());
            line.addBehind(program.style().name(decision.path));
            const std::string reason = decision.text.empty() ? std::string(decision.rule) : decision.text;
            const std::string remedy = decision.remedy.empty() ? std::string() : "; to list it, " + decision.remedy;
            program.printLine(line.text());
            TextLine why(program.style(), program.columns());
            program.printLine(why.add(4, program.style().name(reason + remedy), TextLine::Look::dim).text());
        }
        program.printLine(count == 0 ? "nothing was skipped" : apps::quantityText(count, "item") + " skipped");
    }

    void printFooter(Program& program, OBMediaManager& manager)
    {
        std::string footer = apps::durationText(program.loadDuration());
        if (OBSourceInspection* inspection = manager.inspection()) {
            std::size_t absent = 0;
            std::vector<std::string> folders = inspection->projectSearchPaths();
            const std::vector<std::string> forEvents = inspection->eventSearchPaths();
            folders.insert(folders.end(), forEvents.begin(), forEvents.end());
            for (const std::string& folder : folders)
                absent += !manager.platform().fileSystem.exists(folder);
            footer += " · " + apps::quantityText(folders.size(), "folder") + " searched";
            if (absent > 0)
                footer += ", " + apps::countText(absent) + " absent";
        }
        if (const std::uint64_t skipped = manager.loadProgress().itemsSkipped)
            footer += " · " + apps::quantityText(skipped, "item") + " skipped (\"ombrix tree --skipped\")";
        const apps::Style style(
            apps::Style::wishesFor(standardError, program.arguments().color, program.arguments().hyperlink));
        const int columns = apps::sizeOfTerminal(standardError).columns;
        apps::printError(TextLine(style, columns).add(0, footer, TextLine::Look::dim).text());
    }

    void printText(Program& program, OBMediaManager& manager, const OBMediaGroupRef& root, const OBMediaGroupRef& group)
    {
        const platform::Platform& platform = manager.platform();
        const std::vector<TreeNode> nodes = treeNodes(group, platform.fileSystem, manager.loadProblems());
        const bool isFolded = program.columns() && group == root && !program.arguments().has("--all");
        const auto most
            = static_cast<std::size_t>(std::max(3, apps::sizeOfTerminal(standardOutput).lines - linesBelowTree));
        const std::vector<TreeLine> lines = isFolded ? foldedLines(nodes, most) : unfoldedLines(nodes);
        TreeTextWishes wishes { program.style(), program.columns(), platform.clock.now() };
        wishes.emptyMessage = [&manager](const OBMediaGroupRef& empty) { return manager.defaultNoDataMessage(empty); };
        wishes.unfoldingCommand = [&root](const OBMediaGroupRef& folded) { return unfoldingCommand(root, folded); };
        wishes.linkTarget = [&platform](std::string_view path) { return platform.fileSystem.resolvedPath(path); };
        printTreeText(nodes, lines, wishes, [&program](std::string_view line) { program.printLine(line); });
    }

} // namespace

int runTree(Program& program)
{
    const Arguments& arguments = program.arguments();
    const bool listsSkipped = arguments.has("--skipped") && !program.wantsJson();
    const auto skipped = listsSkipped ? std::make_shared<SkippedItems>() : nullptr;
    const OBMediaGroupRef root = program.load(skipped);
    if (!root)
        return failed;
    const bool isPart = !arguments.operands.empty();
    const OBMediaGroupRef group = isPart ? groupCalled(root, arguments.operands[0]) : root;
    if (!group) {
        const std::string& typed = arguments.operands[0];
        return program.fail(typed, "no group has this ID or name" + suggestedIDOrName(root, typed));
    }
    if (program.wantsJson()) {
        apps::printGroup(program.output(), group);
        program.warnOfUnreadFolders();
        return done;
    }
    const std::shared_ptr<OBMediaManager> manager = program.manager();
    printText(program, *manager, root, group);
    if (skipped)
        printSkipped(program, *skipped, group, isPart);
    program.output().flush();
    program.warnOfUnreadFolders();
    if (program.columns() && apps::isTerminal(standardError))
        printFooter(program, *manager);
    return done;
}

} // namespace ombrix
