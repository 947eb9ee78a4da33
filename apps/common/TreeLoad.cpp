#include "apps/common/TreeLoad.h"

#include "apps/common/LoadWatch.h"
#include "platform/Clock.h"
#include "platform/MainRunLoop.h"

#include <utility>

namespace apps {

TreeLoad loadTree(const std::shared_ptr<OBMediaManager>& manager)
{
    platform::MainRunLoop& mainLoop = manager->platform().mainRunLoop;
    const platform::Clock& clock = manager->platform().clock;
    const std::chrono::nanoseconds started = clock.monotonic();
    const auto load = std::make_shared<TreeLoad>();
    const LoadWatch watch(manager);
    manager->requestRootMediaGroup([&mainLoop](std::function<void()> call) { mainLoop.post(std::move(call)); },
        [load, &mainLoop](OBLoadResult result) {
            load->result = std::move(result);
            mainLoop.quit();
        });
    mainLoop.run();
    load->duration = clock.monotonic() - started;
    return *load;
}

} // namespace apps
