// An application of its own: prints the tree of one source each time it is published, until Ctrl-C.

#include "host/OBMediaHost.h"
#include "platform/MainRunLoop.h"
#include "platform/linux/LinuxPlatform.h"

#include <csignal>
#include <cstdlib>
#include <iostream>
#include <thread>

void print(const OBMediaGroupRef& group, const std::string& indent)
{
    std::cout << indent << group->name().string() << '\n' << std::flush;
    for (const OBMediaGroupRef& child : group->childGroups())
        print(child, indent + "  ");
}

int browse(const platform::Platform& machine)
{
    OBMediaHost host(machine, {}); // finds the installed bundles
    const OBManagerResult made = host.createManager("org.ombrix.OBMontaroPlugin");
    if (!made.manager) {
        std::cerr << made.problem << '\n'; // names the bundle and why
        return 1;
    }
    const OBObservation following = host.followChanges(); // else the tree stays as it is loaded
    const OBExecutor here = [&](std::function<void()> call) { machine.mainRunLoop.post(std::move(call)); };
    const OBObservation listening
        = made.manager->observe(here, { .rootPublished = [](const OBMediaGroupRef& root) { print(root, ""); } });
    made.manager->requestRootMediaGroup(here, [](const OBLoadResult& result) {
        if (result.outcome == OBLoadOutcome::unavailable || !result.problem.empty())
            std::cerr << "nothing to load: " << (result.problem.empty() ? "no editor there" : result.problem) << '\n';
    });
    machine.mainRunLoop.run(); // this thread is the framework's main thread, until somebody calls quit()
    return 0;
}

int main()
{
    sigset_t interrupt {};
    sigaddset(&interrupt, SIGINT);
    pthread_sigmask(SIG_BLOCK, &interrupt, nullptr); // on all threads to come: one of them waits for it
    platform::LinuxPlatform machine;
    std::thread([&interrupt, loop = &machine.platform().mainRunLoop] {
        sigwaitinfo(&interrupt, nullptr);
        loop->quit();
    }).detach();
    std::quick_exit(browse(machine.platform())); // a thread may still wait for a disk, so nothing is torn down
}
