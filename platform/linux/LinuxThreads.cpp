#include "platform/linux/LinuxThreads.h"

#include <cstddef>
#include <ctime>
#include <memory>
#include <utility>

#include <pthread.h>
#include <sys/resource.h>
#include <unistd.h>

namespace platform {

namespace {

    constexpr std::size_t stackSize = std::size_t { 64 } << 20;
    constexpr std::size_t longestName = 15;

    struct Start {
        std::string name;
        std::function<void()> body;
    };

    // What the body throws must end the program and not unwind into the system's thread code.
    void* runThread(void* argument) noexcept
    {
        const std::unique_ptr<Start> start(static_cast<Start*>(argument));
        pthread_setname_np(pthread_self(), start->name.c_str());
        start->body();
        return nullptr;
    }

} // namespace

bool LinuxThreads::startDetached(const std::string& name, std::function<void()> body)
{
    if (!body)
        return false;
    auto start = std::make_unique<Start>(Start { name.substr(0, longestName), std::move(body) });
    pthread_attr_t attributes;
    if (pthread_attr_init(&attributes) != 0)
        return false;
    pthread_t thread {};
    const bool isStarted = pthread_attr_setdetachstate(&attributes, PTHREAD_CREATE_DETACHED) == 0
        && pthread_attr_setstacksize(&attributes, stackSize) == 0
        && pthread_create(&thread, &attributes, runThread, start.get()) == 0;
    if (isStarted)
        (void)start.release();
    pthread_attr_destroy(&attributes);
    return isStarted;
}

void LinuxThreads::setNiceOfCurrentThread(int nice)
{
    // On Linux the nice value belongs to the thread, whatever POSIX says of processes.
    setpriority(PRIO_PROCESS, static_cast<id_t>(gettid()), nice);
}

std::chrono::nanoseconds LinuxThreads::processorTimeOfCurrentThread() const
{
    timespec time {};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
    return std::chrono::seconds(time.tv_sec) + std::chrono::nanoseconds(time.tv_nsec);
}

} // namespace platform
