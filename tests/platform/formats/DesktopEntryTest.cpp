#include "platform/formats/DesktopEntry.h"

#include "platform/formats/DesktopFile.h"
#include "tests/platform/formats/Damage.h"

#include <doctest/doctest.h>

using namespace platform;
using Words = std::vector<std::string>;

TEST_CASE("a desktop entry is read with the fields of its first group")
{
    const DesktopEntryResult result = readDesktopEntry(
        "# made by hand\n\n[Desktop Entry]\nType=Application\nName = Cutter \n"
        "Name[de]=Schneider\nExec=/opt/cutter %F\nTryExec=cutter\nIcon=org.example.Cutter\nPath=/tmp\n"
        "DBusActivatable=true\nNoDisplay=false\nHidden=1\nStartupNotify=true\nTerminal=true\n"
        "StartupWMClass=cutter\n[Desktop Action new]\nName=New\nExec=other\n");
    CHECK(result.problem == "");
    CHECK(result.entry.type == "Application");
    CHECK(result.entry.name == "Cutter ");
    CHECK(result.entry.exec == "/opt/cutter %F");
    CHECK(result.entry.tryExec == "cutter");
    CHECK(result.entry.icon == "org.example.Cutter");
    CHECK(result.entry.path == "/tmp");
    CHECK(result.entry.startupWindowClass == "cutter");
    CHECK(result.entry.dBusActivatable);
    CHECK(result.entry.hidden);
    CHECK_FALSE(result.entry.noDisplay);
    CHECK(result.entry.startupNotify);
    CHECK(result.entry.terminal);
}

TEST_CASE("bad lines are skipped, and lines may end with CR LF")
{
    const std::string text = "\xEF\xBB\xBFstray\r\n[Desktop Entry]\r\nName=A\r\nno equals "
                             "sign\r\n=nothing\r\nExec=a\r\n[broken\r\nExec=b\r\n";
    const DesktopEntryResult result = readDesktopEntry(text);
    CHECK(result.problem == "");
    CHECK(result.entry.name == "A");
    CHECK(result.entry.exec == "a");
    CHECK(DesktopFile(text).firstSkippedLine() == 1);
    CHECK(DesktopFile("[a]\nb=c\n\nbad\n").firstSkippedLine() == 4);
    CHECK(DesktopFile("[a]\nb=c\n").firstSkippedLine() == 0);
}

TEST_CASE("escapes are resolved, and bytes that are no UTF-8 are kept")
{
    const DesktopEntryResult result
        = readDesktopEntry("[Desktop Entry]\nName=\\sa\\nb\\tc\\rd\\\\e\\x\\\nIcon=\xFF\xE9\n");
    CHECK(result.entry.name == " a\nb\tc\rd\\e\\x\\");
    CHECK(result.entry.icon == "\xFF\xE9");
}

TEST_CASE("a file without the group of a desktop entry is refused")
{
    CHECK(readDesktopEntry("").problem == "group [Desktop Entry] is missing");
    CHECK(readDesktopEntry("[Other]\nExec=a\n").problem == "group [Desktop Entry] is missing");
    CHECK(readDesktopEntry(std::string(DesktopFile::largestSize + 1, '#')).problem != "");
    CHECK(readDesktopEntry("[Desktop Entry]").problem == "");
}

TEST_CASE("a file of groups answers values, lists and repeated groups")
{
    const DesktopFile file(
        "[Icon Theme]\nInherits=a, b ,,c\nDirectories=16x16/apps,scalable/apps\n[16x16/apps]\nSize=16\n"
        "[Icon Theme]\nInherits=d\nTypes=x\\;y;z\\\\;\n");
    CHECK(file.hasGroup("16x16/apps"));
    CHECK_FALSE(file.hasGroup("scalable/apps"));
    CHECK(*file.value("16x16/apps", "Size") == "16");
    CHECK(file.value("16x16/apps", "Scale") == nullptr);
    CHECK(file.list("Icon Theme", "Inherits", ',') == Words { "d" });
    CHECK(file.list("Icon Theme", "Directories", ',') == Words { "16x16/apps", "scalable/apps" });
    CHECK(file.list("Icon Theme", "Types", ';') == Words { "x;y", "z\\" });
    CHECK(file.list("Icon Theme", "None", ';').empty());
    CHECK(DesktopFile("[a]\nl= a, b ,,c\n").list("a", "l", ',') == Words { "a", "b", "c" });
    CHECK_FALSE(file.text("None", "None"));
}

TEST_CASE("a command line is split by the quoting rules")
{
    CHECK(splitExec("editor --new %F").arguments == Words { "editor", "--new", "%F" });
    CHECK(splitExec("  editor\t x ").arguments == Words { "editor", "x" });
    CHECK(splitExec("\"/opt/my editor\" \"a \\\"b\\\" \\$c \\` \\\\ \\x\"").arguments
        == Words { "/opt/my editor", "a \"b\" $c ` \\ \\x" });
    CHECK(splitExec("editor \"\" %%").arguments == Words { "editor", "", "%%" });
    CHECK(splitExec("sh -c 'run \"it\" \\now'").arguments == Words { "sh", "-c", "run \"it\" \\now" });
    CHECK(splitExec("/opt/my\\ editor").arguments == Words { "/opt/my editor" });
    CHECK(splitExec("--a=\"b c\"d").arguments == Words { "--a=b cd" });
}

TEST_CASE("a command line with broken quoting has no arguments, and a reason")
{
    for (const char* exec : { "\"open", "a 'open", "a \"b\\\"", "a \\", "", "  " }) {
        CAPTURE(exec);
        CHECK(splitExec(exec).arguments.empty());
        CHECK(splitExec(exec).problem != "");
    }
}

TEST_CASE("a damaged desktop entry is read or refused with one line")
{
    forEachDamage("[Desktop Entry]\r\nName=A\\sb\nExec=\"/opt/a b\" '%F' \\\\\n[Icon]\nl=a\\;b;c\n",
        [](const std::string& damaged) {
            const DesktopEntryResult result = readDesktopEntry(damaged);
            const ExecArguments exec = splitExec(result.entry.exec);
            CHECK(exec.arguments.empty() != exec.problem.empty());
            CHECK(DesktopFile(damaged).list("Icon", "l", ';').size() <= 3);
        });
}
