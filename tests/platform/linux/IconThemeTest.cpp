#include "platform/linux/IconTheme.h"
#include "platform/linux/LinuxFileSystem.h"
#include "tests/platform/linux/Environment.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <string>

namespace {

struct Desktop {
    Desktop()
    {
        environment.set("HOME", temporary.path("home"));
        environment.set("XDG_DATA_HOME", temporary.path("own"));
        environment.set("XDG_DATA_DIRS", temporary.path("system"));
        environment.set("XDG_CONFIG_HOME", temporary.path("settings"));
        environment.set("XDG_CONFIG_DIRS", temporary.path("system-settings"));
    }
    void theme(const std::string& name, const std::string& inherits, const std::string& folders) const
    {
        temporary.file("system/icons/" + name + "/index.theme",
            "[Icon Theme]\nName=x\nInherits=" + inherits + "\nDirectories=" + folders
                + "\n[8]\nSize=8\nType=Fixed\n[16]\nSize=16\nType=Fixed\n[18]\nSize=18\n[32]\nSize=32\nType=Fixed\n"
                  "[16x2]\nSize=16\nScale=2\nType=Fixed\n"
                  "[any]\nSize=128\nMinSize=8\nMaxSize=256\nType=Scalable\n");
    }
    void choose(const std::string& theme) const
    {
        temporary.file("settings/gtk-3.0/settings.ini", "[Settings]\ngtk-icon-theme-name=" + theme + "\n");
    }
    std::string found(const std::string& name) const
    {
        const auto file = platform::iconFile(files, name);
        return file ? file->substr(temporary.path().size() + 1) : std::string("none");
    }

    tests::TemporaryFolder temporary;
    tests::Environment environment;
    platform::LinuxFileSystem files;
};

} // namespace

TEST_CASE("an icon is looked up in the theme that is set, in those it inherits from, in hicolor, among the pixmaps")
{
    const Desktop desktop;
    desktop.temporary.file("system/pixmaps/editor.xpm");
    CHECK(desktop.found("editor") == "system/pixmaps/editor.xpm");
    desktop.theme("hicolor", "", "16");
    desktop.temporary.file("system/icons/hicolor/16/editor.png");
    CHECK(desktop.found("editor") == "system/icons/hicolor/16/editor.png");
    desktop.theme("Parent", "hicolor", "16");
    desktop.theme("Child", "Parent", "16");
    desktop.choose("Child");
    CHECK(desktop.found("editor") == "system/icons/hicolor/16/editor.png");
    desktop.temporary.file("system/icons/Parent/16/editor.svg");
    CHECK(desktop.found("editor") == "system/icons/Parent/16/editor.svg");
    desktop.temporary.file("own/icons/Child/16/editor.png");
    CHECK(desktop.found("editor") == "own/icons/Child/16/editor.png");
    CHECK(desktop.found("other") == "none");
}

TEST_CASE("the picture made for sixteen points wins, then the nearest")
{
    const Desktop desktop;
    desktop.theme("hicolor", "", "32,8,16x2,18,16,any");
    const auto add
        = [&](const std::string& folder) { desktop.temporary.file("system/icons/hicolor/" + folder + "/e.png"); };
    add("16x2");
    CHECK(desktop.found("e") == "system/icons/hicolor/16x2/e.png");
    add("32");
    CHECK(desktop.found("e") == "system/icons/hicolor/32/e.png");
    add("8");
    CHECK(desktop.found("e") == "system/icons/hicolor/8/e.png");
    add("any");
    CHECK(desktop.found("e") == "system/icons/hicolor/any/e.png");
    add("16");
    CHECK(desktop.found("e") == "system/icons/hicolor/16/e.png");
    add("18");
    CHECK(desktop.found("e") == "system/icons/hicolor/18/e.png");
}

TEST_CASE("themes that inherit from one another in circles come to an end")
{
    const Desktop desktop;
    desktop.theme("A", "B,A", "16");
    desktop.theme("B", "A", "16");
    desktop.choose("A");
    CHECK(desktop.found("e") == "none");
}

TEST_CASE("an icon given by its path is that file, where it exists")
{
    const Desktop desktop;
    desktop.temporary.file("picture.png");
    desktop.temporary.folder("folder.png");
    CHECK(desktop.found(desktop.temporary.path("picture.png")) == "picture.png");
    CHECK(desktop.found(desktop.temporary.path("folder.png")) == "none");
    CHECK(desktop.found(desktop.temporary.path("missing.png")) == "none");
}

TEST_CASE("a name may carry a picture's extension, but never leads out of the theme")
{
    const Desktop desktop;
    desktop.theme("hicolor", "", "16");
    desktop.temporary.file("system/icons/hicolor/16/org.example.Editor.png");
    desktop.temporary.file("system/icons/hicolor/secret.png");
    CHECK(desktop.found("org.example.Editor") == "system/icons/hicolor/16/org.example.Editor.png");
    CHECK(desktop.found("org.example.Editor.png") == "system/icons/hicolor/16/org.example.Editor.png");
    CHECK(desktop.found("../secret") == "none");
    CHECK(desktop.found("") == "none");
}
