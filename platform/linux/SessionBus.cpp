#include "platform/linux/SessionBus.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <memory>
#include <optional>

#include <dlfcn.h>
#include <poll.h>
#include <systemd/sd-bus.h>

namespace platform {

namespace {

    using Clock = std::chrono::steady_clock;

    // The library is loaded when somebody first asks for the bus: linking it would cost every start of the program more
    // than a scan of a small library.
    class BusLibrary {
    public:
        static const BusLibrary* load()
        {
            static const BusLibrary library;
            return library._isWhole ? &library : nullptr;
        }

        decltype(&sd_bus_open_user) openUser = nullptr;
        decltype(&sd_bus_close_unref) closeUnref = nullptr;
        decltype(&sd_bus_message_new_method_call) newMethodCall = nullptr;
        decltype(&sd_bus_message_append) append = nullptr;
        decltype(&sd_bus_message_unref) messageUnref = nullptr;
        decltype(&sd_bus_call_async) callAsync = nullptr;
        decltype(&sd_bus_process) process = nullptr;
        decltype(&sd_bus_get_fd) getFd = nullptr;
        decltype(&sd_bus_get_events) getEvents = nullptr;
        decltype(&sd_bus_get_timeout) getTimeout = nullptr;
        decltype(&sd_bus_is_ready) isReady = nullptr;
        decltype(&sd_bus_message_get_error) getError = nullptr;

    private:
        BusLibrary()
        {
            void* const handle = dlopen("libsystemd.so.0", RTLD_NOW | RTLD_LOCAL);
            if (!handle)
                return;
            _isWhole = find(handle, "sd_bus_open_user", openUser) && find(handle, "sd_bus_close_unref", closeUnref)
                && find(handle, "sd_bus_message_new_method_call", newMethodCall)
                && find(handle, "sd_bus_message_append", append) && find(handle, "sd_bus_message_unref", messageUnref)
                && find(handle, "sd_bus_call_async", callAsync) && find(handle, "sd_bus_process", process)
                && find(handle, "sd_bus_get_fd", getFd) && find(handle, "sd_bus_get_events", getEvents)
                && find(handle, "sd_bus_get_timeout", getTimeout) && find(handle, "sd_bus_is_ready", isReady)
                && find(handle, "sd_bus_message_get_error", getError);
        }
        template <class Function> static bool find(void* handle, const char* name, Function& function)
        {
            function = reinterpret_cast<Function>(dlsym(handle, name));
            return function != nullptr;
        }

        bool _isWhole = false;
    };

    /// What came back; absent while nothing has.
    struct Answer {
        const BusLibrary* library;
        std::optional<std::string> problem {};
    };

    int takeAnswer(sd_bus_message* message, void* data, sd_bus_error*)
    {
        auto& answer = *static_cast<Answer*>(data);
        const sd_bus_error* const error = answer.library->getError(message);
        answer.problem = !error ? std::string() : std::string(error->message ? error->message : error->name);
        return 1;
    }

    struct Place {
        std::string destination;
        std::string path;
        const char* interface;
        const char* member;
    };

    std::string systemText(int answer)
    {
        return std::strerror(-answer);
    }

    int waitTime(const BusLibrary& library, sd_bus* bus, Clock::time_point end)
    {
        auto wait = std::chrono::duration_cast<std::chrono::microseconds>(end - Clock::now());
        std::uint64_t instant = 0; // of the monotonic clock, in microseconds
        if (library.getTimeout(bus, &instant) >= 0 && instant != UINT64_MAX) {
            const auto now = std::chrono::duration_cast<std::chrono::microseconds>(Clock::now().time_since_epoch());
            wait = std::min(wait, std::chrono::microseconds(instant) - now);
        }
        return static_cast<int>(std::max<std::int64_t>(0, wait.count() / 1000 + 1));
    }

    // The bus's own limit does not hold before it has let us in, so the whole exchange has one.
    BusAnswer exchange(const BusLibrary& library, sd_bus* bus, Answer& answer, Clock::time_point end)
    {
        while (!answer.problem) {
            const int processed = library.process(bus, nullptr);
            if (processed < 0)
                return { systemText(processed) };
            if (processed > 0)
                continue;
            if (Clock::now() >= end)
                return { "no answer in time", library.isReady(bus) > 0 };
            pollfd waiting { library.getFd(bus), static_cast<short>(library.getEvents(bus)), 0 };
            poll(&waiting, 1, waitTime(library, bus, end));
        }
        return { *answer.problem };
    }

    template <class... Arguments>
    BusAnswer call(const Place& place, std::chrono::milliseconds limit, const char* types, Arguments... arguments)
    {
        const BusLibrary* const library = BusLibrary::load();
        if (!library)
            return { "libsystemd.so.0 is not installed" };
        const Clock::time_point end = Clock::now() + limit;
        sd_bus* opened = nullptr;
        if (const int result = library->openUser(&opened); result < 0)
            return { "there is no session bus: " + systemText(result) };
        const std::unique_ptr<sd_bus, decltype(library->closeUnref)> bus(opened, library->closeUnref);
        sd_bus_message* made = nullptr;
        int result = library->newMethodCall(
            bus.get(), &made, place.destination.c_str(), place.path.c_str(), place.interface, place.member);
        if (result < 0)
            return { systemText(result) };
        const std::unique_ptr<sd_bus_message, decltype(library->messageUnref)> message(made, library->messageUnref);
        result = library->append(message.get(), types, arguments...);
        Answer answer { library };
        // The exchange has its own limit, which comes first.
        const auto microseconds = static_cast<std::uint64_t>(std::chrono::microseconds(2 * limit).count());
        if (result >= 0)
            result = library->callAsync(bus.get(), nullptr, message.get(), takeAnswer, &answer, microseconds);
        return result < 0 ? BusAnswer { systemText(result) } : exchange(*library, bus.get(), answer, end);
    }

} // namespace

BusAnswer showItemOnBus(const std::string& uri, std::chrono::milliseconds limit)
{
    const Place place { "org.freedesktop.FileManager1", "/org/freedesktop/FileManager1", "org.freedesktop.FileManager1",
        "ShowItems" };
    return call(place, limit, "ass", 1, uri.c_str(), "");
}

BusAnswer activateApplicationOnBus(const std::string& identifier, std::chrono::milliseconds limit)
{
    // Desktop Entry Specification, "D-Bus Activation": the object's path is the identifier, with other signs.
    std::string path = "/" + identifier;
    std::replace(path.begin(), path.end(), '.', '/');
    std::replace(path.begin(), path.end(), '-', '_');
    return call({ identifier, path, "org.freedesktop.Application", "Activate" }, limit, "a{sv}", 0);
}

} // namespace platform
