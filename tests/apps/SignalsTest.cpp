#include "apps/common/Machine.h"
#include "platform/Threads.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <csignal>
#include <future>
#include <memory>
#include <optional>

namespace {

bool isHeld(int signal)
{
    sigset_t held;
    sigemptyset(&held);
    (void)::pthread_sigmask(SIG_BLOCK, nullptr, &held);
    return sigismember(&held, signal) == 1;
}

} // namespace

TEST_CASE("signals that end the program reach no thread but the one that runs it")
{
    const tests::TemporaryFolder folder;
    for (const std::optional<std::string>& description :
        { std::optional<std::string>(), std::optional(folder.file("machine.json", "{}")) }) {
        const apps::MachineResult chosen = apps::chooseMachine(description);
        REQUIRE(chosen.machine);
        for (const int signal : { SIGINT, SIGTERM, SIGHUP }) {
            const auto held = std::make_shared<std::promise<bool>>();
            REQUIRE(chosen.machine->platform().threads.startDetached(
                "test", [held, signal] { held->set_value(isHeld(signal)); }));
            CHECK(held->get_future().get());
            CHECK_FALSE(isHeld(signal));
        }
    }
}
