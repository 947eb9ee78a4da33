#include "platform/linux/LinuxPlatform.h"

#include "platform/Clock.h"
#include "platform/FileSystem.h"
#include "platform/MetadataIndex.h"
#include "platform/Preferences.h"
#include "platform/Volumes.h"
#include "tests/platform/linux/Environment.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <string>

#include <sys/stat.h>

TEST_CASE("a volume can be reached by the name that a person sees, and its type told under that name")
{
    platform::LinuxPlatform machine;
    const platform::Platform roles = machine.platform();
    for (const std::string& volume : roles.volumes.localVolumes()) {
        const std::string name = roles.volumes.displayName(volume);
        if (volume == "/" || name.find('/') != std::string::npos)
            continue;
        CHECK(roles.fileSystem.resolvedPath("/Volumes/" + name) == volume);
    }
    CHECK(roles.volumes.fileSystemType("/") != std::nullopt);
    CHECK(roles.volumes.fileSystemType("/Volumes/No such volume") == std::nullopt);
}

TEST_CASE("the machine works with a home that cannot be read")
{
    const tests::TemporaryFolder temporary;
    temporary.file("home/Library/Preferences/org.example.A.plist", "x");
    chmod(temporary.path().c_str(), 0755);
    chmod(temporary.path("home").c_str(), 0);
    tests::Environment environment;
    environment.set("HOME", temporary.path("home"));
    const auto check = [] {
        platform::LinuxPlatform machine;
        const platform::Platform roles = machine.platform();
        const auto preferences = roles.preferences.valuesOfDomain("org.example.A");
        const std::string home = *roles.fileSystem.homeFolder();
        return preferences.values.isNull() && !preferences.problem.empty()
            && roles.fileSystem.itemsInFolder(home, {}).problem() == platform::FileProblem::notPermitted
            && roles.metadataIndex.attributesOfFile(home + "/x.mov").isNull() && !roles.volumes.localVolumes().empty();
    };
    CHECK(tests::askAsOrdinaryUser(check) == tests::ChildAnswer::yes);
    chmod(temporary.path("home").c_str(), 0755);
}

TEST_CASE("now is a date of this century, and time goes on")
{
    platform::LinuxPlatform machine;
    const platform::Clock& clock = machine.platform().clock;
    CHECK(clock.now().seconds > 1'600'000'000);
    CHECK(clock.now().nanoseconds < 1'000'000'000);
    const auto before = clock.monotonic();
    CHECK(clock.monotonic() >= before);
    platform::WakeSignal wake;
    CHECK(clock.sleep(std::chrono::milliseconds(1), wake));
    CHECK(clock.monotonic() - before >= std::chrono::milliseconds(1));
    wake.raise();
    CHECK(!clock.sleep(std::chrono::nanoseconds::max(), wake));
}
