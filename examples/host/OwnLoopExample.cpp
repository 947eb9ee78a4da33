// An application whose first thread belongs to something else, such as a toolkit's loop: loads a tree once, counts what
// is in it and ends cleanly. With an argument it does so on the machine that this file describes.

#include "host/OBGroupWalk.h"
#include "host/OBMediaHost.h"
#include "platform/MainRunLoop.h"
#include "platform/described/DescribedPlatform.h"
#include "platform/linux/LinuxPlatform.h"

#include <future>
#include <iostream>
#include <thread>

OBLoadResult load(OBMediaManager& manager)
{
    std::promise<OBLoadResult> answered;
    manager.requestRootMediaGroup([](const std::function<void()>& call) { call(); }, // on whichever thread answers
        [&answered](OBLoadResult result) { answered.set_value(std::move(result)); });
    return answered.get_future().get();
}

int countGroups(const platform::Platform& machine)
{
    std::thread mainThread([&machine] { machine.mainRunLoop.run(); }); // the framework's; a load asks it for pictures
    OBMediaHost host(machine, {});
    OBManagerResult made = host.createManager("org.ombrix.OBMontaroPlugin");
    const OBLoadResult result = made.manager ? load(*made.manager) : OBLoadResult();
    int groups = 0;
    OBWalkGroups(
        result.rootMediaGroup, [&groups](const OBMediaGroupRef&, const OBGroupPlace&) { return ++groups > 0; });
    std::cout << groups << " groups" << made.problem << '\n';

    made.manager = nullptr; // its threads end now, each after what it is doing
    const bool haveEnded = host.waitForThreads(std::chrono::seconds(10)); // or not, where a disk does not answer
    machine.mainRunLoop.quit();
    mainThread.join();
    return result.rootMediaGroup && haveEnded ? 0 : 1;
}

int main(int argumentCount, char** arguments)
{
    platform::LinuxPlatform machine;
    if (argumentCount < 2)
        return countGroups(machine.platform());
    const platform::DescribedPlatformResult described = platform::describedPlatform(arguments[1], machine.platform());
    if (described.machine)
        return countGroups(described.machine->platform());
    std::cerr << described.problem << '\n';
    return 1;
}
