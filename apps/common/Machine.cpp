#include "apps/common/Machine.h"

#include "apps/common/StandardError.h"
#include "platform/Threads.h"
#include "platform/described/DescribedPlatform.h"
#include "platform/linux/LinuxPlatform.h"

#include <chrono>
#include <functional>
#include <string>
#include <utility>

namespace apps {
namespace {

    /// Leaves the signals that end the program to the thread that runs it. Handled on another one, a signal would be
    /// lost when the program came to its end in the midst of it, and the run would look complete.
    class ThreadsWithoutSignals final : public platform::Threads {
    public:
        explicit ThreadsWithoutSignals(platform::Threads& threads)
            : _threads(threads)
        {
        }
        bool startDetached(const std::string& name, std::function<void()> body) override
        {
            const EndingSignalsHeld inherited;
            return _threads.startDetached(name, std::move(body));
        }
        void setNiceOfCurrentThread(int nice) override { _threads.setNiceOfCurrentThread(nice); }
        std::chrono::nanoseconds processorTimeOfCurrentThread() const override
        {
            return _threads.processorTimeOfCurrentThread();
        }

    private:
        platform::Threads& _threads;
    };

    class ChosenMachine final : public Machine {
    public:
        platform::Platform platform() override { return described ? described->platform() : realPlatform(); }
        platform::Platform realPlatform()
        {
            const platform::Platform roles = real.platform();
            return { roles.fileSystem, roles.pathWatching, roles.volumes, roles.workspace, roles.preferences,
                roles.metadataIndex, roles.movies, roles.notifications, roles.workspaceNotifications, roles.clock,
                roles.calendar, threads, roles.mainRunLoop, roles.console, roles.bundles, roles.languages };
        }

        platform::LinuxPlatform real;
        ThreadsWithoutSignals threads { real.platform().threads };
        std::unique_ptr<platform::DescribedPlatform> described;
    };

} // namespace

MachineResult chooseMachine(const std::optional<std::string>& descriptionFile)
{
    auto machine = std::make_unique<ChosenMachine>();
    if (descriptionFile) {
        platform::DescribedPlatformResult result
            = platform::describedPlatform(*descriptionFile, machine->realPlatform());
        if (!result.machine)
            return { nullptr, std::move(result.problem) };
        machine->described = std::move(result.machine);
    }
    return { std::move(machine), {} };
}

} // namespace apps
