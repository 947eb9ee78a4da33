#include "tests/house/Layering.h"
#include "tests/house/SourceTree.h"

#include <doctest/doctest.h>

#include <string>
#include <vector>

using namespace house;

namespace {

struct IncludeLine {
    std::string path;
    std::string line;
};

bool mayStand(const IncludeLine& example)
{
    const std::vector<Include> includes = includesIn("#include " + example.line + "\n");
    REQUIRE(includes.size() == 1);
    return !brokenRule(example.path, includes.front()).has_value();
}

} // namespace

TEST_CASE("every file includes only what its folder may know")
{
    std::vector<std::string> complaints;
    std::size_t filesRead = 0;
    for (const SourceFile& file : sourceFiles()) {
        if (!isCode(file.path))
            continue;
        ++filesRead;
        for (const Include& include : includesIn(file.text)) {
            if (const std::optional<std::string> rule = brokenRule(file.path, include))
                complaints.push_back(
                    file.path + ":" + std::to_string(include.line) + ": " + include.name + ": " + *rule);
        }
    }
    CHECK(filesRead > 10);
    CHECK_MESSAGE(complaints.empty(), joined(complaints));
}

TEST_CASE("an include against the arrows is found in every folder")
{
    const std::vector<IncludeLine> forbidden {
        { "platform/FileSystem.h", "\"platform/formats/Json.h\"" },
        { "platform/FileSystem.h", "<sys/stat.h>" },
        { "platform/formats/Json.h", "\"platform/linux/LinuxVolumes.h\"" },
        { "platform/formats/Json.cpp", "<unistd.h>" },
        { "platform/linux/LinuxVolumes.cpp", "\"platform/described/DescribedVolumes.h\"" },
        { "platform/linux/LinuxVolumes.cpp", "\"platform/linux/watching/WatchedFolders.h\"" },
        { "platform/linux/watching/FolderLook.cpp", "\"platform/formats/Json.h\"" },
        { "platform/described/DescribedVolumes.cpp", "\"platform/linux/LinuxVolumes.h\"" },
        { "platform/described/DescribedVolumes.cpp", "\"host/OBLog.h\"" },
        { "host/OBLog.cpp", "\"plugin/OBMontaroPlugin.h\"" },
        { "host/OBLog.cpp", "\"platform/linux/LinuxConsole.h\"" },
        { "host/OBLog.cpp", "<sys/inotify.h>" },
        { "plugin/OBMontaroPlugin.cpp", "\"apps/common/Machine.h\"" },
        { "plugin/OBMontaroPlugin.cpp", "\"plugin/events/EventYears.h\"" },
        { "plugin/projects/ProjectMovies.cpp", "\"plugin/events/EventYears.h\"" },
        { "plugin/projects/ProjectMovies.cpp", "\"platform/linux/LinuxFileSystem.h\"" },
        { "apps/ombrix/Tree.cpp", "\"plugin/OBMontaroPlugin.h\"" },
        { "apps/ombrix/Tree.cpp", "\"platform/described/DescribedPlatform.h\"" },
        { "apps/ombrix/Tree.cpp", "<QWidget>" },
        { "apps/common/Machine.cpp", "\"apps/ombrix/Tree.h\"" },
        { "examples/folders/FoldersPlugin.cpp", "\"host/ManagerState.h\"" },
        { "examples/folders/FoldersPlugin.cpp", "\"platform/linux/LinuxFileSystem.h\"" },
        { "examples/folders/FoldersPlugin.cpp", "\"platform/formats/Json.h\"" },
        { "examples/folders/FoldersPlugin.cpp", "\"plugin/Sorting.h\"" },
        { "examples/folders/FoldersPlugin.cpp", "<unistd.h>" },
        { "examples/host/HostExample.cpp", "\"host/FrameworkCore.h\"" },
        { "tests/plugin/TreeTest.cpp", "\"plugin/events/EventYears.h\"" },
        { "tests/plugin/TreeTest.cpp", "\"tests/host/Builders.h\"" },
        { "host/OBLog.cpp", "\"OBLog.h\"" },
    };
    for (const IncludeLine& each : forbidden) {
        CAPTURE(each.path);
        CAPTURE(each.line);
        CHECK_FALSE(mayStand(each));
    }
}

TEST_CASE("an include along the arrows may stand")
{
    const std::vector<IncludeLine> allowed {
        { "platform/FileSystem.h", "\"platform/Value.h\"" },
        { "platform/FileSystem.h", "<string_view>" },
        { "platform/formats/Json.cpp", "<rapidjson/reader.h>" },
        { "platform/linux/LinuxVolumes.cpp", "<sys/inotify.h>" },
        { "platform/linux/LinuxVolumes.cpp", "\"platform/formats/DesktopEntry.h\"" },
        { "platform/linux/watching/FolderLook.cpp", "\"platform/linux/Descriptor.h\"" },
        { "host/OBLog.cpp", "\"platform/Console.h\"" },
        { "plugin/projects/ProjectMovies.cpp", "\"plugin/OBMontaroPlugin.h\"" },
        { "plugin/projects/ProjectReload.cpp", "\"plugin/events/MontaroSupport.h\"" },
        { "apps/common/Machine.cpp", "\"platform/linux/LinuxPlatform.h\"" },
        { "apps/ombrix/Tree.cpp", "\"apps/common/Machine.h\"" },
        { "examples/folders/FoldersPlugin.cpp", "\"host/OBMediaManager.h\"" },
        { "examples/folders/FoldersPlugin.cpp", "\"platform/Workspace.h\"" },
        { "examples/host/HostExample.cpp", "\"platform/linux/LinuxPlatform.h\"" },
        { "tests/plugin/TreeTest.cpp", "<doctest/doctest.h>" },
        { "tests/plugin/TreeTest.cpp", "\"tests/support/Library.h\"" },
        { "docs/example.cpp", "\"plugin/events/EventYears.h\"" },
    };
    for (const IncludeLine& each : allowed) {
        CAPTURE(each.path);
        CAPTURE(each.line);
        CHECK(mayStand(each));
    }
}

TEST_CASE("an include line is found however it is spaced, and a comment that names one is not")
{
    const std::vector<Include> includes
        = includesIn("#include <a>\n  #  include\t\"b/C.h\" // why\n// #include <d>\n#define include\n#include <e>");
    REQUIRE(includes.size() == 3);
    CHECK(includes[0].name == "a");
    CHECK_FALSE(includes[0].isQuoted);
    CHECK(includes[1].name == "b/C.h");
    CHECK(includes[1].isQuoted);
    CHECK(includes[1].line == 2);
    CHECK(includes[2].line == 5);
}
