#include "apps/common/Machine.h"

#include "platform/described/DescribedPlatform.h"
#include "platform/linux/LinuxPlatform.h"

#include <utility>

namespace apps {
namespace {

    class ChosenMachine final : public Machine {
    public:
        platform::Platform platform() override { return described ? described->platform() : real.platform(); }

        platform::LinuxPlatform real;
        std::unique_ptr<platform::DescribedPlatform> described;
    };

} // namespace

MachineResult chooseMachine(const std::optional<std::string>& descriptionFile)
{
    auto machine = std::make_unique<ChosenMachine>();
    if (descriptionFile) {
        platform::DescribedPlatformResult result
            = platform::describedPlatform(*descriptionFile, machine->real.platform());
        if (!result.machine)
            return { nullptr, std::move(result.problem) };
        machine->described = std::move(result.machine);
    }
    return { std::move(machine), {} };
}

} // namespace apps
