// "tree": the one command whose text is folded to the terminal. A part that was asked for by name is never folded, so
// that the command which a folded place suggests shows what it promises.

#include "apps/common/DisplayWidth.h"
#include "apps/common/HostileNames.h"
#include "apps/common/HumanText.h"
#include "apps/common/RecordJson.h"
#include "apps/common/StandardError.h"
#include "apps/common/Terminal.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/GroupSearch.h"
#include "apps/ombrix/Program.h"
#include "apps/ombrix/SearchFolders.h"
#include "apps/ombrix/SkippedItems.h"
#include "apps/ombrix/SuggestedCommand.h"
#include "apps/ombrix/TextLine.h"
#include "apps/ombrix/TreeText.h"
#include "host/OBSourceInspection.h"
#include "platform/Clock.h"
#include "platform/PathText.h"

#include <algorithm>
#include <map>

namespace ombrix {
namespace {

    constexpr int standardOutput = 1;
    constexpr int standardError = 2;

    OBMediaGroupRef groupCalled(const OBMediaGroupRef& root, const std::string& text)
    {
        OBMediaGroupRef group = groupWithID(root, text);
        return group ? group : groupWithName(root, text);
    }

    /// The command that shows all of `group`: by its name where that finds it, else by its ID.
    std::string unfoldingCommand(const Arguments& arguments, const OBMediaGroupRef& root, const OBMediaGroupRef& group)
    {
        if (group != root) {
            for (const platform::Text& text : { group->name(), group->ID() }) {
                if (!text.empty() && groupCalled(root, text.string()) == group)
                    return suggestedCommand(arguments, "tree", text);
            }
        }
        return suggestedCommand(arguments, "tree --all");
    }

    /// What was kept out of the tree, or of the part of it that `group` is.
    std::vector<OBScanDecision> decisionsFor(const SkippedItems& skipped, const OBMediaGroupRef& group, bool isPart)
    {
        const platform::Text folder = group->path();
        std::vector<OBScanDecision> decisions = skipped.decisions();
        const auto isElsewhere = [&](const OBScanDecision& decision) {
            return isPart && (folder.isAbsent() || !platform::isSameOrBelow(decision.path, folder));
        };
        decisions.erase(std::remove_if(decisions.begin(), decisions.end(), isElsewhere), decisions.end());
        return decisions;
    }

    std::string reasonOf(const OBScanDecision& decision)
    {
        const std::string reason = decision.text.empty() ? std::string(decision.rule) : decision.text;
        return reason + (decision.remedy.empty() ? std::string() : "; to list it, " + decision.remedy);
    }

    void printSkipped(Program& program, const std::vector<OBScanDecision>& decisions)
    {
        program.printLine("");
        for (const OBScanDecision& decision : decisions) {
            const TextLine empty(program.style(), program.columns());
            program.printLine(TextLine(empty).addName(0, program.style().name(decision.path)).text());
            program.printWrapped(empty, 4, program.style().name(reasonOf(decision)), TextLine::Look::dim);
        }
        program.printLine(
            decisions.empty() ? "nothing was skipped" : apps::quantityText(decisions.size(), "item") + " skipped");
    }

    /// Beside a document, which has no place for it.
    void tellSkipped(const std::vector<OBScanDecision>& decisions)
    {
        for (const OBScanDecision& decision : decisions)
            apps::printError("skipped: " + apps::escapedText(decision.path + ": " + reasonOf(decision)));
    }

    std::string foldersText(OBMediaManager& manager, OBSourceInspection& inspection)
    {
        std::vector<std::string> folders = inspection.projectSearchPaths();
        const std::vector<std::string> forEvents = inspection.eventSearchPaths();
        folders.insert(folders.end(), forEvents.begin(), forEvents.end());
        const SearchFolderCounts counts = countSearchFolders(manager.platform().fileSystem, folders);
        std::string text = apps::quantityText(folders.size(), "folder") + " searched";
        if (counts.absent > 0)
            text += ", " + apps::countText(counts.absent) + " absent";
        if (counts.unreadable > 0)
            text += ", " + apps::countText(counts.unreadable) + " not readable";
        return text;
    }

    /// What stands below a tree on a terminal, for people only: on standard error. Absent elsewhere.
    std::optional<std::string> footerOf(Program& program, OBMediaManager& manager)
    {
        if (!program.columns() || !apps::isTerminal(standardError))
            return std::nullopt;
        std::string footer = apps::durationText(program.loadDuration());
        if (OBSourceInspection* inspection = manager.inspection())
            footer += " · " + foldersText(manager, *inspection);
        const std::uint64_t skipped = manager.loadProgress().itemsSkipped;
        if (skipped > 0 && !program.arguments().has("--skipped"))
            footer += " · " + apps::quantityText(skipped, "item") + " skipped (\""
                + suggestedCommand(program.arguments(), "tree --skipped") + "\")";
        return footer;
    }

    void printFooter(Program& program, const std::string& footer)
    {
        const apps::Style style(
            apps::Style::wishesFor(standardError, program.arguments().color, program.arguments().hyperlink));
        apps::printError(style.dim(footer));
    }

    /// As many lines as fit above what stands below the tree; a line may be longer than the terminal is wide.
    std::vector<TreeLine> linesThatFit(const std::vector<TreeNode>& nodes, const TreeTextWishes& wishes, int linesBelow)
    {
        constexpr std::size_t least = 4;
        const int lines = apps::sizeOfTerminal(standardOutput).lines - linesBelow;
        const auto most = std::max(least, static_cast<std::size_t>(std::max(0, lines)));
        for (std::size_t room = most;; --room) {
            std::vector<TreeLine> folded = foldedLines(nodes, room);
            if (room == least || printTreeText(nodes, folded, wishes, [](std::string_view) {}) <= most)
                return folded;
        }
    }

    int linesOf(const std::string& text, int columns)
    {
        return 1 + std::max(0, apps::displayWidth(text) - 1) / columns;
    }

    /// The footer, a warning before it, and the shell's next prompt.
    int linesBelowTree(Program& program, const std::optional<std::string>& footer)
    {
        const int columns = program.columns().value_or(1);
        const std::string unread = program.unreadFoldersText();
        if (!footer)
            return 1;
        return 1 + linesOf(*footer, columns) + (unread.empty() ? 0 : linesOf("ombrix: warning: " + unread, columns));
    }

    void printText(Program& program, OBMediaManager& manager, const OBMediaGroupRef& root, const OBMediaGroupRef& group,
        const std::optional<std::string>& footer)
    {
        const platform::Platform& platform = manager.platform();
        const std::vector<TreeNode> nodes = treeNodes(group, platform.fileSystem, manager.loadProblems());
        const std::optional<int> columns = program.columns();
        TreeTextWishes wishes { program.style(), columns, platform.clock.now() };
        wishes.emptyMessage = [&manager](const OBMediaGroupRef& empty) { return manager.defaultNoDataMessage(empty); };
        // Asked again at every attempt to fit the tree, and each answer searches it for the name.
        std::map<const OBMediaGroup*, std::string> commands;
        wishes.unfoldingCommand = [&](const OBMediaGroupRef& folded) {
            std::string& command = commands[folded.get()];
            if (command.empty())
                command = unfoldingCommand(program.arguments(), root, folded);
            return command;
        };
        wishes.linkTarget = [&platform](std::string_view path) { return platform.fileSystem.resolvedPath(path); };
        const bool isFolded = columns && group == root && !program.arguments().has("--all");
        const std::vector<TreeLine> lines
            = isFolded ? linesThatFit(nodes, wishes, linesBelowTree(program, footer)) : unfoldedLines(nodes);
        (void)printTreeText(nodes, lines, wishes, [&program](std::string_view line) { program.printLine(line); });
    }

} // namespace

int runTree(Program& program)
{
    const Arguments& arguments = program.arguments();
    const auto skipped = arguments.has("--skipped") ? std::make_shared<SkippedItems>() : nullptr;
    const OBMediaGroupRef root = program.load(skipped);
    if (!root)
        return failed;
    const bool isPart = !arguments.operands.empty();
    const OBMediaGroupRef group = isPart ? groupCalled(root, arguments.operands[0]) : root;
    if (!group) {
        const std::string& typed = arguments.operands[0];
        return program.failGroup(typed, "ID or name", suggestedIDOrName(root, typed));
    }
    if (program.wantsJson()) {
        apps::printGroup(program.output(), group);
        if (skipped)
            tellSkipped(decisionsFor(*skipped, group, isPart));
        program.warnOfUnreadFolders();
        return done;
    }
    const std::shared_ptr<OBMediaManager> manager = program.manager();
    const std::optional<std::string> footer = footerOf(program, *manager);
    printText(program, *manager, root, group, footer);
    if (skipped)
        printSkipped(program, decisionsFor(*skipped, group, isPart));
    program.output().flush();
    program.warnOfUnreadFolders();
    if (footer)
        printFooter(program, *footer);
    return done;
}

} // namespace ombrix
