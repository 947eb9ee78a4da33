// "find": what people come for. A person is shown the best hits, a program gets all of them.

#include "apps/common/DidYouMean.h"
#include "apps/common/HostileNames.h"
#include "apps/common/HumanText.h"
#include "apps/common/NameSearch.h"
#include "apps/common/RecordJson.h"
#include "apps/common/StandardError.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/FindText.h"
#include "apps/ombrix/Program.h"
#include "apps/ombrix/TreeNodes.h"
#include "platform/FileSystem.h"
#include "platform/PathText.h"

#include <algorithm>
#include <charconv>
#include <limits>

namespace ombrix {
namespace {

    constexpr std::size_t shownToPeople = 20;

    /// What was asked for, or what is wrong with it.
    struct Wishes {
        apps::NameQuery query;
        apps::NameKinds kinds = apps::NameKinds::all;
        std::size_t most = std::numeric_limits<std::size_t>::max();
        std::string problem {};
    };

    void readKind(std::string_view typed, Wishes& wishes)
    {
        constexpr std::string_view kinds[] { "group", "object" };
        if (typed == "group")
            wishes.kinds = apps::NameKinds::groups;
        else if (typed == "object")
            wishes.kinds = apps::NameKinds::objects;
        else
            wishes.problem = "option --kind is group or object, not \"" + apps::escapedText(typed) + "\""
                + apps::didYouMean(typed, kinds);
    }

    void readLimit(std::string_view typed, Wishes& wishes)
    {
        const char* const end = typed.data() + typed.size();
        const auto [rest, error] = std::from_chars(typed.data(), end, wishes.most);
        if (error != std::errc() || rest != end || wishes.most == 0)
            wishes.problem = "option --limit is a number from 1 on, not \"" + apps::escapedText(typed) + "\"";
    }

    Wishes readWishes(const Arguments& arguments)
    {
        Wishes wishes { apps::NameQuery(arguments.operands.empty() ? std::string() : arguments.operands[0]) };
        if (arguments.operands.empty())
            wishes.problem = "TEXT is missing (\"ombrix help find\")";
        else if (wishes.query.empty())
            wishes.problem = "TEXT holds no word";
        else if (arguments.has("--json") && arguments.has("-0"))
            wishes.problem = "options -0 and --json exclude each other";
        else if (!arguments.has("--json") && !arguments.has("-0"))
            wishes.most = shownToPeople;
        if (const std::string* kind = arguments.valueOf("--kind"))
            readKind(*kind, wishes);
        if (const std::string* limit = arguments.valueOf("--limit"))
            readLimit(*limit, wishes);
        return wishes;
    }

    std::optional<platform::Date> dateOfHit(
        const apps::NameHit& hit, const OBMediaGroup& group, const platform::FileSystem& fileSystem)
    {
        if (!hit.object)
            return group.modificationDate();
        const std::optional<ShownFacts> facts = shownFacts(*hit.object, kindOf(group), fileSystem);
        return facts ? std::optional(facts->date) : std::nullopt;
    }

    void orderNewestFirst(apps::FoundNames& found, const platform::FileSystem& fileSystem)
    {
        apps::orderNewestFirst(found,
            [&](const apps::NameHit& hit) { return dateOfHit(hit, *found.groups[hit.group].group, fileSystem); });
    }

    void printPaths(Program& program, const apps::FoundNames& found, std::size_t count)
    {
        for (std::size_t index = 0; index < count; ++index) {
            const apps::NameHit& hit = found.hits[index];
            if (const platform::Text path = hit.object ? hit.object->path() : found.groups[hit.group].group->path())
                program.printPath(path);
        }
    }

    void printText(Program& program, const apps::FoundNames& found, std::size_t count)
    {
        printFindText(program, found, count);
        const std::size_t all = found.hits.size();
        if (count < all)
            program.printLine(
                "… " + apps::countText(all - count) + " more (\"--limit " + std::to_string(all) + "\" shows all)");
    }

    /// Names are shown without extensions, and people type what a file is called.
    std::string hintAtExtension(const std::string& typed, const OBMediaGroupRef& root, apps::NameKinds kinds)
    {
        const std::string name(platform::nameWithoutExtension(typed));
        const bool isFound = name != typed && !apps::findNames(root, apps::NameQuery(name), kinds).hits.empty();
        return isFound ? "; they have no extensions, and \"" + apps::escapedText(name) + "\" is among them"
                       : std::string();
    }

    void tellThatNothingWasFound(const std::string& typed, const OBMediaGroupRef& root, apps::NameKinds kinds)
    {
        apps::printError("ombrix: find: nothing is called \"" + apps::escapedText(typed) + "\" (looked through "
            + apps::quantityText(apps::countOfNames(root, kinds), "name") + hintAtExtension(typed, root, kinds) + ")");
    }

} // namespace

int runFind(Program& program)
{
    const Arguments& arguments = program.arguments();
    const Wishes wishes = readWishes(arguments);
    if (!wishes.problem.empty())
        return program.failUsage("find: " + wishes.problem);
    const OBMediaGroupRef root = program.load();
    if (!root)
        return failed;
    apps::FoundNames found = apps::findNames(root, wishes.query, wishes.kinds);
    if (arguments.has("--newest"))
        orderNewestFirst(found, program.manager()->platform().fileSystem);
    const std::size_t count = std::min(found.hits.size(), wishes.most);
    if (program.wantsJson())
        apps::printHits(program.output(), found, count);
    else if (found.hits.empty())
        tellThatNothingWasFound(arguments.operands[0], root, wishes.kinds);
    else if (arguments.has("-0"))
        printPaths(program, found, count);
    else
        printText(program, found, count);
    program.output().flush();
    program.warnOfUnreadFolders();
    return done;
}

} // namespace ombrix
