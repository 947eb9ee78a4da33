#include "platform/linux/LinuxFileSystem.h"
#include "tests/platform/linux/Environment.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <array>
#include <csignal>
#include <limits>
#include <string>

#include <fcntl.h>
#include <linux/limits.h>
#include <pwd.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

using platform::FileProblem;
using platform::LinuxFileSystem;
using tests::TemporaryFolder;

TEST_CASE("the home folder is HOME where that is absolute, else the user database's")
{
    tests::Environment environment;
    const LinuxFileSystem files;
    environment.set("HOME", "/some/where");
    CHECK(files.homeFolder() == "/some/where");
    const passwd* entry = getpwuid(getuid());
    const auto inDatabase = entry ? std::optional<std::string>(entry->pw_dir) : std::nullopt;
    environment.set("HOME", "relative");
    CHECK(files.homeFolder() == inDatabase);
    environment.set("HOME", "");
    CHECK(files.homeFolder() == inDatabase);
    environment.remove("HOME");
    CHECK(files.homeFolder() == inDatabase);
}

TEST_CASE("a path as long as a path can be works, and one byte more is too long")
{
    const TemporaryFolder temporary;
    std::string path = temporary.path();
    while (path.size() + 201 < PATH_MAX)
        path.append(1, '/').append(199, 'd');
    tests::makeFolder(path);
    const std::string longest = path + '/' + std::string(PATH_MAX - 2 - path.size(), 'f');
    REQUIRE(longest.size() == PATH_MAX - 1);
    tests::writeFile(longest, "text");
    const LinuxFileSystem files;
    CHECK(files.status(longest)->size == 4);
    CHECK(files.openPlainFile(longest).file);
    CHECK(!files.itemFlags(longest).invisible);
    CHECK(files.itemsInFolder(path, {}).size() == 1);
    const std::string tooLong = longest + "f";
    CHECK(files.itemsInFolder(tooLong, {}).problem() == FileProblem::pathTooLong);
    CHECK(files.openPlainFile(tooLong).problem == FileProblem::pathTooLong);
    CHECK(!files.status(tooLong));
    CHECK(!files.linkTarget(tooLong));
}

TEST_CASE("a path that names nothing absolute is missing")
{
    const TemporaryFolder temporary;
    const std::string file = temporary.file("file");
    const LinuxFileSystem files;
    for (const std::string& path :
        { std::string(), std::string("."), std::string("tmp"), file + '\0', file + '\0' + "x" }) {
        CHECK(!files.status(path));
        CHECK(!files.linkStatus(path));
        CHECK(!files.linkTarget(path));
        CHECK(files.itemsInFolder(path, {}).problem() == FileProblem::missing);
        CHECK(files.openPlainFile(path).problem == FileProblem::missing);
        CHECK(!files.itemFlags(path).container);
        CHECK(!files.resolvedPath(path).empty());
    }
}

TEST_CASE("the flags of an item do not depend on how its path is spelled")
{
    const TemporaryFolder temporary;
    temporary.folder("one/two.app");
    temporary.file("one/.hidden", "two.app");
    const LinuxFileSystem files;
    for (const char* spelling :
        { "one/two.app", "one//two.app", "one/two.app/", "one/two.app/.", "one/./two.app//./" }) {
        const platform::ItemFlags flags = files.itemFlags(temporary.path() + '/' + spelling);
        CAPTURE(spelling);
        CHECK(flags.invisible);
        CHECK(flags.container);
        CHECK(flags.package);
    }
    const platform::ItemFlags root = files.itemFlags("/");
    CHECK(root.container);
    CHECK(!root.invisible);
    CHECK(!files.itemFlags(temporary.path("one") + "/..").invisible);
}

TEST_CASE("a copy that keeps its old modification date was created then")
{
    const TemporaryFolder temporary;
    const std::string file = temporary.file("file", "x");
    const platform::Date shot { 1'000'000'000, 123'456'789 };
    tests::setModificationDate(file, shot);
    const LinuxFileSystem files;
    CHECK(files.status(file)->modificationDate == shot);
    CHECK(files.status(file)->creationDate == shot);
    // Dated into the future, it still was made when it was made.
    tests::setModificationDate(file, { 4'000'000'000, 0 });
    CHECK(files.status(file)->creationDate <= files.status(file)->modificationDate);
}

TEST_CASE("dates before 1970 are told")
{
    const TemporaryFolder temporary;
    const std::string file = temporary.file("file");
    tests::setModificationDate(file, { -86'400, 5 });
    CHECK(LinuxFileSystem().status(file)->modificationDate == platform::Date { -86'400, 5 });
}

TEST_CASE("reading far beyond the end of a file reads nothing")
{
    const TemporaryFolder temporary;
    const auto opened = LinuxFileSystem().openPlainFile(temporary.file("file", "text"));
    REQUIRE(opened.file);
    std::array<std::byte, 8> buffer {};
    CHECK(opened.file->read(0, buffer) == 4);
    CHECK(opened.file->read(2, buffer) == 2);
    CHECK(opened.file->read(4, buffer) == 0);
    for (const std::uint64_t offset : { std::uint64_t { 1 } << 40, std::uint64_t { 1 } << 63,
             std::numeric_limits<std::uint64_t>::max(), (std::uint64_t { 1 } << 63) - 1 })
        CHECK(opened.file->read(offset, buffer) == 0);
    CHECK(opened.file->read(0, {}) == 0);
}

TEST_CASE("a file on which somebody holds a lease is waited for and opened")
{
    const TemporaryFolder temporary;
    const std::string path = temporary.file("file", "text");
    int toParent[2];
    REQUIRE(pipe(toParent) == 0);
    const pid_t holder = fork();
    REQUIRE(holder != -1);
    if (holder == 0) {
        sigset_t signals;
        sigemptyset(&signals);
        sigaddset(&signals, SIGIO);
        sigprocmask(SIG_BLOCK, &signals, nullptr);
        const int file = open(path.c_str(), O_RDWR);
        const char isHeld = fcntl(file, F_SETLEASE, F_WRLCK) == 0 ? 'y' : 'n';
        (void)!write(toParent[1], &isHeld, 1);
        int signal = 0;
        if (isHeld == 'y')
            sigwait(&signals, &signal);
        fcntl(file, F_SETLEASE, F_UNLCK);
        _exit(0);
    }
    char isHeld = 'n';
    REQUIRE(read(toParent[0], &isHeld, 1) == 1);
    CHECK(LinuxFileSystem().openPlainFile(path).file);
    if (isHeld != 'y')
        MESSAGE("this file system gives no leases");
    waitpid(holder, nullptr, 0);
    close(toParent[0]);
    close(toParent[1]);
}

TEST_CASE("a link's target is told as stored, whatever it is")
{
    const TemporaryFolder temporary;
    const LinuxFileSystem files;
    const std::string longest(PATH_MAX - 1, 'x');
    temporary.link("long", longest);
    temporary.link("odd", "..//a b\xff/.");
    CHECK(files.linkTarget(temporary.path("long")) == longest);
    CHECK(files.linkTarget(temporary.path("odd")) == "..//a b\xff/.");
    CHECK(!files.linkTarget(temporary.path()));
    CHECK(!files.linkTarget(temporary.file("file")));
}
