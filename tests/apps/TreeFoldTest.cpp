#include "apps/ombrix/TreeFold.h"
#include "apps/common/DisplayWidth.h"
#include "apps/ombrix/TreeText.h"
#include "host/OBConstants.h"
#include "platform/linux/LinuxPlatform.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <set>
#include <string>
#include <vector>

using namespace ombrix;

namespace {

OBMediaGroupRef makeGroup(OBTypeIdentifierRef type, const std::string& name)
{
    OBMediaGroupRef group = OBMediaGroup::initWithTypeIdentifier(type);
    group->setName(name);
    group->setID(name);
    return group;
}

/// A root with `folders` folders of `projects` projects each, and an empty events library.
OBMediaGroupRef makeTree(int folders, int projects)
{
    OBMediaGroupRef root = makeGroup(OBMontaroRootGroupTypeIdentifier, "Montaro");
    for (int folder = 0; folder < folders; ++folder) {
        const OBMediaGroupRef group = makeGroup(OBMontaroFolderGroupTypeIdentifier, "Folder " + std::to_string(folder));
        for (int project = 0; project < projects; ++project)
            group->addChildGroup(makeGroup(OBMontaroProjectGroupTypeIdentifier, "Project " + std::to_string(project)));
        root->addChildGroup(group);
    }
    root->addChildGroup(makeGroup(OBMontaroEventLibraryGroupTypeIdentifier, "Events"));
    return root;
}

std::vector<TreeNode> nodesOf(const OBMediaGroupRef& root, const std::vector<OBLoadProblem>& problems = {})
{
    static platform::LinuxPlatform machine;
    return treeNodes(root, machine.platform().fileSystem, problems);
}

std::string joined(const std::vector<std::string>& lines)
{
    std::string text;
    for (const std::string& line : lines)
        text += line + "\n";
    return text;
}

std::vector<std::string> textOf(
    const std::vector<TreeNode>& nodes, const std::vector<TreeLine>& lines, std::optional<int> columns)
{
    apps::StyleWishes look;
    look.isTerminal = columns.has_value();
    const apps::Style style(look);
    TreeTextWishes wishes { style, columns, { 1794657600, 0 } };
    wishes.emptyMessage = [](const OBMediaGroupRef& group) {
        return group->path() ? platform::Text("nothing in " + group->path().string()) : platform::Text();
    };
    wishes.unfoldingCommand = [](const OBMediaGroupRef& group) { return "unfold " + group->name().string(); };
    wishes.linkTarget = [](std::string_view path) { return std::string(path); };
    std::vector<std::string> text;
    printTreeText(nodes, lines, wishes, [&text](std::string_view line) { text.emplace_back(line); });
    return text;
}

int columnOf(const std::string& line, const std::string& text)
{
    const std::size_t at = line.rfind(text);
    REQUIRE(at != std::string::npos);
    return apps::displayWidth(std::string_view(line).substr(0, at));
}

} // namespace

TEST_CASE("a tree that fits is not folded")
{
    const std::vector<TreeNode> nodes = nodesOf(makeTree(2, 2));
    REQUIRE(nodes.size() == 8);
    CHECK(foldedLines(nodes, 8).size() == 8);
    CHECK(joined(textOf(nodes, foldedLines(nodes, 8), std::nullopt))
        == "Montaro           4 projects\n"
           "├─ Folder 0       2 projects\n"
           "│  ├─ Project 0\n"
           "│  └─ Project 1\n"
           "├─ Folder 1       2 projects\n"
           "│  ├─ Project 0\n"
           "│  └─ Project 1\n"
           "└─ Events         0 events\n");
}

TEST_CASE("a folded tree has no more lines than there is room for and always shows the last group")
{
    for (const auto& [folders, projects] : { std::pair(3, 50), std::pair(50, 3), std::pair(0, 0), std::pair(1, 500) }) {
        const std::vector<TreeNode> nodes = nodesOf(makeTree(folders, projects));
        for (std::size_t most = 4; most < 40; ++most) {
            const std::vector<TreeLine> lines = foldedLines(nodes, most);
            CAPTURE(most);
            CHECK(lines.size() <= most);
            CHECK(nodes[lines.back().node].group->name().view() == "Events");
            CHECK(lines.back().isLast);
        }
    }
}

TEST_CASE("the lines of a folded tree and what they hide are all of its groups")
{
    const std::vector<TreeNode> nodes = nodesOf(makeTree(7, 9));
    for (std::size_t most = 3; most < nodes.size(); ++most) {
        std::size_t count = 0;
        for (const TreeLine& line : foldedLines(nodes, most)) {
            std::size_t node = line.firstHidden;
            for (std::size_t hidden = 0; hidden < line.hidden; ++hidden) {
                count += nodes[node].end - node;
                node = nodes[node].end;
            }
            if (line.hidden == 0)
                count += line.isFolded ? nodes[line.node].end - line.node : 1;
        }
        CAPTURE(most);
        CHECK(count == nodes.size());
    }
}

TEST_CASE("what is folded says how many are hidden and how to see them")
{
    const std::vector<TreeNode> nodes = nodesOf(makeTree(1, 1200));
    const std::vector<std::string> text = textOf(nodes, foldedLines(nodes, 6), 80);
    REQUIRE(text.size() == 6);
    CHECK(text[4].find("│  └─ … 1,198 more") == 0);
    CHECK(text[4].find("unfold Folder 0") != std::string::npos);
}

TEST_CASE("no line is wider than the terminal, and facts line up at every width")
{
    const OBMediaGroupRef root = makeTree(2, 2);
    root->childGroups()[0]->setName(
        "東京の夜 and a name that is much too long for any terminal 👩‍👩‍👧‍👦");
    root->childGroups()[1]->setName("Zu\u0308rich");
    const std::vector<TreeNode> nodes = nodesOf(root);
    for (const int columns : { 40, 60, 80, 120 }) {
        CAPTURE(columns);
        int column = -1;
        for (const std::string& line : textOf(nodes, unfoldedLines(nodes), columns)) {
            CAPTURE(line);
            CHECK(apps::displayWidth(line) <= columns);
            const std::size_t fact = line.find("2 projects");
            if (fact == std::string::npos)
                continue;
            const int found = apps::displayWidth(std::string_view(line).substr(0, fact));
            CHECK((column < 0 || column == found));
            column = found;
        }
    }
}

TEST_CASE("counts, dates and summaries each stand in one column, however deep and long the names are")
{
    const tests::TemporaryFolder folder;
    const OBMediaObjectRef movie = OBMediaObject::initWithMediaType_name(3, "a");
    movie->setPath(folder.file("a.mov", "movie"));
    const OBMediaGroupRef root = makeGroup(OBMontaroRootGroupTypeIdentifier, "Montaro");
    OBMediaGroupRef innermost = root;
    for (const char* name : { "A", "東京の夜", "a folder with quite a long name", "D" }) {
        const OBMediaGroupRef project
            = makeGroup(OBMontaroProjectGroupTypeIdentifier, std::string(90, 'x') + name + ".project");
        project->setMediaObjects(OBMediaObjectList({ movie }));
        const OBMediaGroupRef child = makeGroup(OBMontaroFolderGroupTypeIdentifier, name);
        innermost->addChildGroup(project);
        innermost->addChildGroup(child);
        innermost = child;
    }
    innermost->addChildGroup(makeGroup(OBMontaroProjectGroupTypeIdentifier, "Draft"));
    const std::vector<TreeNode> nodes = nodesOf(root);
    for (const std::optional<int> columns :
        { std::optional(60), std::optional(80), std::optional(120), std::optional<int>() }) {
        std::set<int> movies;
        std::set<int> projects;
        for (const std::string& line : textOf(nodes, unfoldedLines(nodes), columns)) {
            CAPTURE(line);
            CHECK((!columns || apps::displayWidth(line) <= *columns));
            CHECK((columns || line.find("…") == std::string::npos));
            if (line.find("1 movie ") != std::string::npos)
                movies.insert(columnOf(line, "1 movie "));
            else if (line.find("─ ") != std::string::npos && line.find("Draft") == std::string::npos)
                projects.insert(columnOf(line, line.substr(line.find(" project") - 1, 1) + " project"));
        }
        CHECK(movies.size() == 1);
        CHECK(projects.size() == 1);
    }
}

TEST_CASE("a command that unfolds is never cut, and the lines of the terminal that it needs are counted")
{
    const std::vector<TreeNode> nodes = nodesOf(makeTree(1, 1200));
    const std::vector<TreeLine> lines = foldedLines(nodes, 6);
    const std::string command = "ombrix tree 'Folder 0' --machine " + std::string(100, 'x') + "/machine.json";
    for (const int columns : { 60, 80, 120 }) {
        const apps::Style style { apps::StyleWishes() };
        TreeTextWishes wishes { style, columns };
        wishes.emptyMessage = [](const OBMediaGroupRef&) { return platform::Text(); };
        wishes.unfoldingCommand = [&](const OBMediaGroupRef&) { return std::string(command); };
        std::string text;
        std::size_t height = 0;
        const std::size_t told = printTreeText(nodes, lines, wishes, [&](std::string_view line) {
            text.append(line).append("\n");
            height += static_cast<std::size_t>(1 + (apps::displayWidth(line) - 1) / columns);
        });
        CHECK(text.find("… 1,198 more") != std::string::npos);
        CHECK(text.find(" " + command + "\n") != std::string::npos);
        CHECK(told == height);
        CHECK(told > lines.size());
    }
}

TEST_CASE("lines of a tree that is deeper than the terminal is wide still fit")
{
    const OBMediaGroupRef root = makeGroup(OBMontaroRootGroupTypeIdentifier, "Montaro");
    OBMediaGroupRef innermost = root;
    for (int level = 0; level < 300; ++level) {
        const OBMediaGroupRef child = makeGroup(OBMontaroFolderGroupTypeIdentifier, "Folder");
        innermost->addChildGroup(child);
        innermost = child;
    }
    const std::vector<TreeNode> nodes = nodesOf(root);
    for (const std::string& line : textOf(nodes, unfoldedLines(nodes), 80)) {
        CAPTURE(line);
        CHECK(apps::displayWidth(line) <= 80);
    }
    CHECK(textOf(nodes, unfoldedLines(nodes), std::nullopt).size() == 301);
}

TEST_CASE("a project counts its movies, their size and the newest of their days")
{
    const tests::TemporaryFolder folder;
    std::vector<OBMediaObjectRef> movies;
    for (const char* name : { "a.mov", "b.mov" }) {
        movies.push_back(OBMediaObject::initWithMediaType_name(3, name));
        movies.back()->setPath(folder.file(name, std::string(1500, 'x')));
    }
    tests::setModificationDate(folder.path("a.mov"), { 1299146400, 0 });
    tests::setModificationDate(folder.path("b.mov"), { 1288146400, 0 });
    const OBMediaGroupRef root = makeTree(1, 1);
    root->childGroups()[0]->childGroups()[0]->setMediaObjects(OBMediaObjectList(movies));
    const std::vector<TreeNode> nodes = nodesOf(root);
    CHECK(joined(textOf(nodes, unfoldedLines(nodes), std::nullopt))
        == "Montaro                               1 project · 2 movies · 3.0 kB\n"
           "├─ Folder 0                           1 project\n"
           "│  └─ Project 0   2 movies   3.0 kB   3 Mar 2011\n"
           "└─ Events                             0 events\n");
}

TEST_CASE("a folder that could not be read is marked, and a project whose movies could not")
{
    const OBMediaGroupRef root = makeTree(2, 1);
    root->childGroups()[0]->setPath("/a/Folder 0");
    root->childGroups()[1]->setPath("/a/Folder 1");
    root->childGroups()[1]->childGroups()[0]->setPath("/a/Folder 1/Project 0");
    const std::vector<TreeNode> nodes = nodesOf(root,
        { { "/a/Folder 0", platform::FileProblem::notPermitted },
            { "/a/Folder 1/Project 0/Shared Items", platform::FileProblem::readError } });
    std::vector<std::string> marked;
    for (const TreeNode& node : nodes) {
        if (node.isUnreadable)
            marked.push_back(node.group->path().string());
    }
    CHECK(marked == std::vector<std::string> { "/a/Folder 0", "/a/Folder 1/Project 0" });
    CHECK(textOf(nodes, unfoldedLines(nodes), std::nullopt)[1].find("unreadable") != std::string::npos);
}

TEST_CASE("the root tells of an unreadable library, for which no group stands")
{
    const std::vector<TreeNode> nodes
        = nodesOf(makeTree(1, 1), { { "/home/Montaro Projects", platform::FileProblem::notPermitted } });
    CHECK(textOf(nodes, unfoldedLines(nodes), std::nullopt)[0].find("1 folder unreadable") != std::string::npos);
}

TEST_CASE("of an unreadable group that only its source knows the source's own text is told, if it has one")
{
    static constexpr OBTypeIdentifier listType("ListGroup");
    const OBMediaGroupRef root = makeTree(1, 1);
    root->childGroups()[0]->setPath("/list");
    for (const char* path : { "/list", "/mute" }) {
        const OBMediaGroupRef group = makeGroup(&listType, path);
        group->setPath(path);
        root->addChildGroup(group);
    }
    const std::vector<TreeNode> nodes = nodesOf(
        root, { { "/list", platform::FileProblem::readError }, { "/mute", platform::FileProblem::readError } });
    nodes.back().group->setPath({});
    const std::vector<std::string> text = textOf(nodes, unfoldedLines(nodes), std::nullopt);
    CHECK(text[1].ends_with("Folder 0       unreadable"));
    CHECK(text[4].ends_with("/list          unreadable: nothing in /list"));
    CHECK(text[5].ends_with("/mute          unreadable"));
}
