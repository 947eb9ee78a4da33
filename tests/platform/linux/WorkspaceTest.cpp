#include "platform/linux/LinuxFileSystem.h"
#include "platform/linux/LinuxThreads.h"
#include "platform/linux/LinuxWorkspace.h"
#include "tests/platform/linux/Environment.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <optional>
#include <string>

#include <sys/stat.h>

using platform::LinuxFileSystem;
using platform::LinuxWorkspace;

namespace {

/// A desktop whose data folders are `own`, `first` and `second`.
struct Desktop {
    Desktop()
    {
        environment.set("HOME", temporary.path("home"));
        environment.set("XDG_DATA_HOME", temporary.path("own"));
        environment.set("XDG_DATA_DIRS", temporary.path("first") + ":relative::" + temporary.path("second"));
        environment.set("PATH", "relative:" + temporary.path("bin"));
    }
    void entry(const std::string& folder, const std::string& identifier, const std::string& lines) const
    {
        temporary.file(folder + "/applications/" + identifier + ".desktop",
            "[Desktop Entry]\nType=Application\nName=Editor\n" + lines);
    }
    std::optional<std::string> pathFor(const std::string& lines) const
    {
        entry("own", "org.example.Editor", lines);
        return workspace.applicationPath("org.example.Editor");
    }
    std::string program(const std::string& path) const
    {
        std::string file = temporary.file(path);
        chmod(file.c_str(), 0755);
        return file;
    }

    tests::TemporaryFolder temporary;
    tests::Environment environment;
    LinuxFileSystem files;
    platform::LinuxThreads threads {};
    LinuxWorkspace workspace { files, threads };
};

} // namespace

TEST_CASE("an application is the program that its entry starts, whether or not that exists")
{
    const Desktop desktop;
    CHECK(desktop.pathFor("Exec=/opt/editor/bin/editor --new %U\n") == "/opt/editor/bin/editor");
    CHECK(desktop.pathFor("Exec=\"/opt/my editor/run\" %f\n") == "/opt/my editor/run");
    CHECK(desktop.pathFor("TryExec=/opt/tried\n") == "/opt/tried");
    CHECK(desktop.pathFor("Exec=/opt/started\nTryExec=/opt/tried\n") == "/opt/started");
    CHECK(desktop.pathFor("Exec=\"/opt/unfinished\nTryExec=/opt/tried\n") == "/opt/tried");
    CHECK(desktop.pathFor("Name=Only\n") == std::nullopt);
    CHECK(desktop.pathFor("Exec=\n") == std::nullopt);
}

TEST_CASE("a bare name is looked up in PATH, and what PATH does not find is taken to be in /usr/bin")
{
    const Desktop desktop;
    const std::string found = desktop.program("bin/found");
    desktop.temporary.file("bin/noprogram");
    desktop.temporary.folder("bin/folder");
    CHECK(desktop.pathFor("Exec=found %U\n") == found);
    CHECK(desktop.pathFor("Exec=noprogram\n") == "/usr/bin/noprogram");
    CHECK(desktop.pathFor("Exec=folder\n") == "/usr/bin/folder");
    CHECK(desktop.pathFor("Exec=missing\n") == "/usr/bin/missing");
}

TEST_CASE("a relative path is taken from the working folder that the entry names")
{
    const Desktop desktop;
    CHECK(desktop.pathFor("Exec=bin/editor\nPath=/opt/editor\n") == "/opt/editor/bin/editor");
    CHECK(desktop.pathFor("Exec=bin/editor\n") == std::nullopt);
    CHECK(desktop.pathFor("Exec=bin/editor\nTryExec=/opt/tried\n") == "/opt/tried");
}

TEST_CASE("the user's own entry comes before the system's, and a hidden one takes it back")
{
    const Desktop desktop;
    desktop.entry("second", "a", "Exec=/second\n");
    CHECK(desktop.workspace.applicationPath("a") == "/second");
    desktop.entry("first", "a", "Exec=/first\n");
    CHECK(desktop.workspace.applicationPath("a") == "/first");
    desktop.entry("own", "a", "Exec=/own\n");
    CHECK(desktop.workspace.applicationPath("a") == "/own");
    desktop.entry("own", "a", "Exec=/own\nHidden=true\n");
    CHECK(desktop.workspace.applicationPath("a") == std::nullopt);
}

TEST_CASE("what is no entry is passed over")
{
    const Desktop desktop;
    desktop.temporary.file("own/applications/a.desktop", "no entry at all\n");
    desktop.temporary.pipe("first/applications/a.desktop");
    desktop.entry("second", "a", "Exec=/second\n");
    CHECK(desktop.workspace.applicationPath("a") == "/second");
}

TEST_CASE("a link or a folder is no application")
{
    const Desktop desktop;
    CHECK(desktop.pathFor("Type=Link\nURL=x\nExec=/x\n") == std::nullopt);
}

TEST_CASE("an identifier that is no file name is registered nowhere")
{
    const Desktop desktop;
    desktop.temporary.file("own/x.desktop", "[Desktop Entry]\nType=Application\nExec=/x\n");
    for (const std::string& identifier :
        { std::string(), std::string("../x"), std::string("x\0y", 3), std::string(300, 'x') })
        CHECK(!desktop.workspace.applicationPath(identifier));
}

TEST_CASE("without variables the data folders are those that the XDG specification lays down")
{
    Desktop desktop;
    desktop.environment.remove("XDG_DATA_HOME");
    desktop.environment.set("XDG_DATA_DIRS", "");
    desktop.entry("home/.local/share", "a", "Exec=/home-program\n");
    CHECK(desktop.workspace.applicationPath("a") == "/home-program");
}

TEST_CASE("an application has the icon of its entry")
{
    const Desktop desktop;
    const std::string picture = desktop.temporary.file("pictures/editor.png");
    desktop.entry("own", "a", "Exec=/opt/a\nIcon=" + picture + "\n");
    desktop.entry("own", "b", "Exec=/opt/b\n");
    CHECK(desktop.workspace.applicationIconFile("/opt/a") == std::nullopt);
    REQUIRE(desktop.workspace.applicationPath("a") == "/opt/a");
    REQUIRE(desktop.workspace.applicationPath("b") == "/opt/b");
    CHECK(desktop.workspace.applicationIconFile("/opt/a") == picture);
    CHECK(desktop.workspace.applicationIconFile("/opt/b") == std::nullopt);
    CHECK(desktop.workspace.applicationIconFile("/opt/c") == std::nullopt);
}
