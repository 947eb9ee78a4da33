#include "tests/apps/PrivateBus.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <fstream>

#include <systemd/sd-bus.h>

namespace tests {

namespace {

    constexpr std::uint64_t waitInMicroseconds = 20000; // before the service asks whether it is to end

    RunWishes daemonWith(const std::string& folder, const std::string& address)
    {
        const std::string configuration = folder + "/bus.conf";
        std::ofstream(configuration)
            << "<busconfig><type>session</type><listen>" << address
            << "</listen><auth>EXTERNAL</auth><policy context=\"default\">"
               "<allow send_destination=\"*\"/><allow receive_sender=\"*\"/><allow own=\"*\"/></policy></busconfig>\n";
        RunWishes wishes { { "--config-file=" + configuration, "--nofork", "--nopidfile", "--print-address" } };
        wishes.program = "/usr/bin/dbus-daemon";
        return wishes;
    }

    int answer(sd_bus_message* message, void* service, const std::string& texts)
    {
        auto& bus = *static_cast<PrivateBus*>(service);
        bus.write(std::string(sd_bus_message_get_path(message)) + "|" + sd_bus_message_get_interface(message) + "|"
            + sd_bus_message_get_member(message) + "|" + texts);
        switch (bus.manner()) {
        case ServiceManner::answers:
            return sd_bus_reply_method_return(message, "");
        case ServiceManner::refuses:
            return sd_bus_reply_method_errorf(message, SD_BUS_ERROR_FAILED, "not today");
        case ServiceManner::keepsSilent:
            break;
        }
        return 1;
    }

    int takeCall(sd_bus_message* message, void* service, sd_bus_error*)
    {
        if (sd_bus_message_is_method_call(message, nullptr, nullptr) <= 0)
            return 0;
        std::string texts;
        if (sd_bus_message_has_signature(message, "ass") > 0) {
            const char* text = nullptr;
            sd_bus_message_enter_container(message, 'a', "s");
            while (sd_bus_message_read(message, "s", &text) > 0)
                texts += std::string(text) + "|";
            sd_bus_message_exit_container(message);
            sd_bus_message_read(message, "s", &text);
            texts += std::string(text) + "|";
        }
        return answer(message, service, texts);
    }

} // namespace

PrivateBus::PrivateBus(const std::string& folder, const std::string& applicationName, ServiceManner manner)
    : _manner(manner)
    , _address("unix:path=" + folder + "/bus")
    , _daemon(daemonWith(folder, _address))
{
    if (!_daemon.prints("\n")) {
        _problem = "there is no dbus-daemon";
        return;
    }
    connect(applicationName);
    if (_problem.empty())
        _service = std::thread([this] { serve(); });
}

PrivateBus::~PrivateBus()
{
    _ends = true;
    if (_service.joinable())
        _service.join();
    sd_bus_close_unref(_bus);
}

void PrivateBus::connect(const std::string& applicationName)
{
    std::string path = "/" + applicationName;
    std::replace(path.begin(), path.end(), '.', '/');
    const char* const files = "org.freedesktop.FileManager1";
    int result = sd_bus_new(&_bus);
    const auto next = [&result](auto&& step) {
        if (result >= 0)
            result = step();
    };
    next([&] { return sd_bus_set_address(_bus, _address.c_str()); });
    next([&] { return sd_bus_set_bus_client(_bus, 1); });
    next([&] { return sd_bus_start(_bus); });
    next([&] { return sd_bus_add_object(_bus, nullptr, "/org/freedesktop/FileManager1", takeCall, this); });
    next([&] { return sd_bus_add_object(_bus, nullptr, path.c_str(), takeCall, this); });
    next([&] { return sd_bus_request_name(_bus, files, 0); });
    next([&] { return sd_bus_request_name(_bus, applicationName.c_str(), 0); });
    if (result < 0)
        _problem = std::strerror(-result);
}

void PrivateBus::serve()
{
    while (!_ends) {
        if (sd_bus_process(_bus, nullptr) == 0)
            sd_bus_wait(_bus, waitInMicroseconds);
    }
}

void PrivateBus::write(const std::string& call)
{
    const std::lock_guard guard(_lock);
    _calls += call + "\n";
}

std::string PrivateBus::calls() const
{
    const std::lock_guard guard(_lock);
    return _calls;
}

} // namespace tests
