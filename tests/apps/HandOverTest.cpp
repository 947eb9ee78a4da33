// What the desktop gets when a person opens or reveals: through a session bus, and where that does not help.

#include "tests/apps/PrivateBus.h"
#include "tests/apps/ProgramRun.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <chrono>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <thread>
#include <vector>

#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

using namespace tests;

namespace {

const std::string editor = "org.ombrix.Montaro";
const std::string activation = "/org/ombrix/Montaro|org.freedesktop.Application|Activate|\n";

/// A person's own desktop: an entry of the editor, and programs that write down how they were started.
struct DesktopOfPerson {
    DesktopOfPerson()
    {
        recordingProgram("montaro");
        recordingProgram("xdg-open");
    }
    void recordingProgram(const std::string& name)
    {
        const std::string file = disk.file("bin/" + name,
            "#!/bin/sh\n{ echo \"${0##*/}\"; pwd; ps -o sid= -p $$ | tr -s ' ' >'" + family
                + "'; for argument; do printf '%s\\0' \"$argument\"; done; } > '" + started + ".new'\nmv '" + started
                + ".new' '" + started + "'\necho noise\n");
        std::filesystem::permissions(file, std::filesystem::perms::owner_all);
    }
    void entry(const std::string& lines) const
    {
        disk.file("home/.local/share/applications/" + editor + ".desktop",
            "[Desktop Entry]\nType=Application\nName=The Montaro\nIcon=reel\n" + lines);
    }
    ProgramRun run(std::vector<std::string> arguments, const std::string& bus) const
    {
        RunWishes wishes { std::move(arguments) };
        wishes.environment = { { "HOME", disk.path("home") }, { "XDG_DATA_HOME", disk.path("home/.local/share") },
            { "PATH", disk.path("bin") + ":/usr/bin:/bin" }, { "DBUS_SESSION_BUS_ADDRESS", bus } };
        return runProgram(wishes);
    }
    /// What was started, once it has run; nothing after a long time.
    std::string whatStarted() const
    {
        const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(30);
        while (!std::filesystem::exists(started) && std::chrono::steady_clock::now() < end)
            std::this_thread::yield();
        std::ifstream file(started, std::ios::binary);
        return { std::istreambuf_iterator<char>(file), {} };
    }
    bool hasStarted() const { return std::filesystem::exists(started); }

    TemporaryFolder disk {};
    const std::string started = disk.path("started");
    const std::string family = disk.path("family");
    const std::string noBus = "unix:path=" + disk.path("no-bus");
};

/// A socket that takes every connection and says nothing.
class SilentBus {
public:
    explicit SilentBus(const std::string& path)
    {
        sockaddr_un address {};
        address.sun_family = AF_UNIX;
        std::strncpy(address.sun_path, path.c_str(), sizeof(address.sun_path) - 1);
        isThere = bind(_socket, reinterpret_cast<const sockaddr*>(&address), sizeof(address)) == 0
            && listen(_socket, 4) == 0;
    }
    ~SilentBus() { close(_socket); }
    SilentBus(const SilentBus&) = delete;
    SilentBus& operator=(const SilentBus&) = delete;

    bool isThere = false;

private:
    const int _socket = socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0);
};

void checkDone(const ProgramRun& run)
{
    CHECK(run.status == 0);
    CHECK(run.output.empty());
    CHECK(run.errors.empty());
}

} // namespace

TEST_CASE("a file is revealed by the file manager, which gets its name byte for byte")
{
    const DesktopOfPerson desktop;
    const PrivateBus bus(desktop.disk.path(), editor, ServiceManner::answers);
    REQUIRE(bus.problem() == "");
    const std::string movie = desktop.disk.file("home/a b%20\"'#?\n\xC3\xA9\xFF;&=.mov");
    checkDone(desktop.run({ "reveal", movie }, bus.address()));
    CHECK(bus.calls()
        == "/org/freedesktop/FileManager1|org.freedesktop.FileManager1|ShowItems|file://" + desktop.disk.path("home")
            + "/a%20b%2520%22%27%23%3F%0A%C3%A9%FF%3B%26%3D.mov||\n");
    CHECK_FALSE(desktop.hasStarted());
}

TEST_CASE("the folder is opened where the file manager refuses, stays silent, or no bus answers")
{
    const DesktopOfPerson desktop;
    const std::string movie = desktop.disk.file("home/a b%\xFF\n/clip.mov");
    const std::string expected = "xdg-open\n/\n" + desktop.disk.path("home/a b%\xFF\n") + '\0';
    SUBCASE("refuses")
    {
        const PrivateBus bus(desktop.disk.path(), editor, ServiceManner::refuses);
        REQUIRE(bus.problem() == "");
        checkDone(desktop.run({ "reveal", movie }, bus.address()));
        CHECK(bus.calls().find("ShowItems") != std::string::npos);
    }
    SUBCASE("stays silent")
    {
        const PrivateBus bus(desktop.disk.path(), editor, ServiceManner::keepsSilent);
        REQUIRE(bus.problem() == "");
        checkDone(desktop.run({ "reveal", movie }, bus.address()));
        CHECK(bus.calls().find("ShowItems") != std::string::npos);
    }
    SUBCASE("a bus that takes the connection and says nothing")
    {
        const SilentBus bus(desktop.disk.path("silent"));
        REQUIRE(bus.isThere);
        checkDone(desktop.run({ "reveal", movie }, "unix:path=" + desktop.disk.path("silent")));
    }
    SUBCASE("no bus")
    {
        checkDone(desktop.run({ "reveal", movie }, desktop.noBus));
    }
    CHECK(desktop.whatStarted() == expected);
}

TEST_CASE("an editor that asks for it is activated over the bus, and no program is started")
{
    const DesktopOfPerson desktop;
    desktop.entry("Exec=montaro %U\nDBusActivatable=true\n");
    const PrivateBus bus(desktop.disk.path(), editor, ServiceManner::answers);
    REQUIRE(bus.problem() == "");
    checkDone(desktop.run({ "open" }, bus.address()));
    CHECK(bus.calls() == activation);
    CHECK_FALSE(desktop.hasStarted());
}

TEST_CASE("an editor that cannot be activated is started as its entry says")
{
    const DesktopOfPerson desktop;
    desktop.entry("Exec=montaro --from \"a b\" %i %c %% %U\nDBusActivatable=true\n");
    const PrivateBus bus(desktop.disk.path(), editor, ServiceManner::refuses);
    REQUIRE(bus.problem() == "");
    checkDone(desktop.run({ "open" }, bus.address()));
    CHECK(bus.calls() == activation);
    std::string expected = "montaro\n/\n--from|a b|--icon|reel|The Montaro|%|";
    std::replace(expected.begin(), expected.end(), '|', '\0');
    CHECK(desktop.whatStarted() == expected);
}

TEST_CASE("an editor that is slow to answer is not started a second time")
{
    const DesktopOfPerson desktop;
    desktop.entry("Exec=montaro\nDBusActivatable=true\n");
    const PrivateBus bus(desktop.disk.path(), editor, ServiceManner::keepsSilent);
    REQUIRE(bus.problem() == "");
    const ProgramRun run = desktop.run({ "open" }, bus.address());
    CHECK(run.status == 1);
    CHECK(run.errors == "ombrix: editor: no answer in time\n");
    CHECK(bus.calls() == activation);
    CHECK_FALSE(desktop.hasStarted());
}

TEST_CASE("a file behind a link and back is revealed where the system finds it")
{
    const DesktopOfPerson desktop;
    const PrivateBus bus(desktop.disk.path(), editor, ServiceManner::answers);
    REQUIRE(bus.problem() == "");
    desktop.disk.file("far/away/inside");
    desktop.disk.file("far/clip.mov");
    desktop.disk.link("link", "far/away");
    checkDone(desktop.run({ "reveal", desktop.disk.path("link/../clip.mov") }, bus.address()));
    CHECK(bus.calls().find(desktop.disk.path("far/clip.mov")) != std::string::npos);
}

TEST_CASE("an editor that does not ask for it is never activated")
{
    const DesktopOfPerson desktop;
    desktop.entry("Exec=montaro\nPath=" + desktop.disk.path("home") + "\n");
    const PrivateBus bus(desktop.disk.path(), editor, ServiceManner::answers);
    REQUIRE(bus.problem() == "");
    checkDone(desktop.run({ "open" }, bus.address()));
    CHECK(desktop.whatStarted() == "montaro\n" + desktop.disk.path("home") + "\n");
    CHECK(bus.calls().empty());
}

TEST_CASE("what is started has a session of its own")
{
    const DesktopOfPerson desktop;
    desktop.entry("Exec=montaro\n");
    checkDone(desktop.run({ "open" }, desktop.noBus));
    REQUIRE_FALSE(desktop.whatStarted().empty());
    std::ifstream family(desktop.family);
    long session = 0;
    family >> session;
    CHECK(session != 0);
    CHECK(session != getsid(0));
}
