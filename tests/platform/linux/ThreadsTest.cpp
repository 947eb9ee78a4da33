#include "platform/linux/LinuxThreads.h"

#include <doctest/doctest.h>

#include <array>
#include <cerrno>
#include <chrono>
#include <functional>
#include <future>
#include <string>

#include <pthread.h>
#include <sys/resource.h>
#include <unistd.h>

using platform::LinuxThreads;

namespace {

/// What `body` answers on a thread of its own.
template <class Answer> Answer onThread(const std::string& name, const std::function<Answer()>& body)
{
    std::promise<Answer> promise;
    auto future = promise.get_future();
    REQUIRE(LinuxThreads().startDetached(name, [&promise, &body] { promise.set_value(body()); }));
    return future.get();
}

int niceOfThread()
{
    errno = 0;
    return getpriority(PRIO_PROCESS, static_cast<id_t>(gettid()));
}

} // namespace

TEST_CASE("a thread bears its name, cut after fifteen bytes")
{
    const std::function<std::string()> name = [] {
        std::array<char, 64> text {};
        pthread_getname_np(pthread_self(), text.data(), text.size());
        return std::string(text.data());
    };
    CHECK(onThread("loading", name) == "loading");
    CHECK(onThread("a name of more than fifteen bytes", name) == "a name of more ");
}

TEST_CASE("a thread's stack holds a folder tree as deep as a path can be")
{
    const std::function<std::size_t()> stackSize = [] {
        pthread_attr_t attributes;
        std::size_t size = 0;
        pthread_getattr_np(pthread_self(), &attributes);
        pthread_attr_getstacksize(&attributes, &size);
        pthread_attr_destroy(&attributes);
        return size;
    };
    CHECK(onThread("stack", stackSize) >= (std::size_t { 64 } << 20));
}

TEST_CASE("the nice value is that of one thread alone, and where it is refused nothing changes")
{
    const int before = niceOfThread();
    const std::function<int()> nicer = [] {
        LinuxThreads().setNiceOfCurrentThread(7);
        return niceOfThread();
    };
    CHECK(onThread("nicer", nicer) == std::max(7, before));
    CHECK(niceOfThread() == before);
}

TEST_CASE("a thread without a body is not started")
{
    CHECK(!LinuxThreads().startDetached("nothing", {}));
}

TEST_CASE("a thread's time on the processor grows while it works, and not while another does")
{
    const LinuxThreads threads;
    const auto before = threads.processorTimeOfCurrentThread();
    const std::function<std::chrono::nanoseconds()> work = [&threads] {
        const auto begin = threads.processorTimeOfCurrentThread();
        auto spent = begin - begin;
        while (spent < std::chrono::milliseconds(200))
            spent = threads.processorTimeOfCurrentThread() - begin;
        return spent;
    };
    CHECK(onThread("busy", work) >= std::chrono::milliseconds(200));
    CHECK(threads.processorTimeOfCurrentThread() - before < std::chrono::milliseconds(150));
    CHECK(work() >= std::chrono::milliseconds(200));
}
