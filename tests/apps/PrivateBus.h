#pragma once

#include "tests/apps/ProgramRun.h"

#include <atomic>
#include <mutex>
#include <string>
#include <thread>

struct sd_bus;

namespace tests {

/// What a desktop's services do with a call.
enum class ServiceManner { answers, refuses, keepsSilent };

/// A session bus of this test alone, and a service on it that writes down what it is asked: the desktop's file manager
/// (org.freedesktop.FileManager1) and, under `application`, an application that lets itself be activated.
class PrivateBus {
public:
    /// `folder` holds the bus's files.
    PrivateBus(const std::string& folder, const std::string& application, ServiceManner manner);
    ~PrivateBus();
    PrivateBus(const PrivateBus&) = delete;
    PrivateBus& operator=(const PrivateBus&) = delete;

    /// Why there is none here; empty when it runs.
    const std::string& problem() const { return _problem; }
    const std::string& address() const { return _address; }
    /// Every call so far, a line each: object, interface, method and texts, each ended by a bar.
    std::string calls() const;

    // For the service alone.
    void write(const std::string& call);
    ServiceManner manner() const { return _manner; }

private:
    void connect(const std::string& application);
    void serve();

    const ServiceManner _manner;
    const std::string _address;
    RunningProgram _daemon;
    std::string _problem {};
    sd_bus* _bus = nullptr;
    mutable std::mutex _lock {};
    std::string _calls {};
    std::atomic<bool> _ends { false };
    std::thread _service {};
};

} // namespace tests
