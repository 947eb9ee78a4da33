#include "apps/clipboard/WaylandDisplay.h"

#include <string_view>

#include <wayland-client.h>
#include <xdg-shell-client-protocol.h>

namespace {

template <class Object> void take(Object*& object, wl_registry* registry, unsigned name, const wl_interface& interface)
{
    if (!object)
        object = static_cast<Object*>(wl_registry_bind(registry, name, &interface, 1));
}

// Who does not answer counts as hung.
constexpr xdg_wm_base_listener alive {
    .ping = [](void*, xdg_wm_base* windows, uint32_t serial) { xdg_wm_base_pong(windows, serial); },
};

} // namespace

std::unique_ptr<WaylandDisplay> WaylandDisplay::open()
{
    wl_display* const connection = wl_display_connect(nullptr);
    if (!connection)
        return nullptr;
    std::unique_ptr<WaylandDisplay> display(new WaylandDisplay(connection));
    return display->findAll() ? std::move(display) : nullptr;
}

WaylandDisplay::WaylandDisplay(wl_display* connection)
    : _connection(connection)
{
}

WaylandDisplay::~WaylandDisplay()
{
    wl_display_disconnect(_connection);
}

bool WaylandDisplay::findAll()
{
    static constexpr wl_registry_listener listener {
        .global = [](void* self, wl_registry* registry, uint32_t name, const char* interface,
                      uint32_t) { static_cast<WaylandDisplay*>(self)->bind(registry, name, interface); },
        .global_remove = [](void*, wl_registry*, uint32_t) {},
    };
    wl_registry_add_listener(wl_display_get_registry(_connection), &listener, this);
    const bool hasAnswered = wl_display_roundtrip(_connection) >= 0;
    if (!hasAnswered || !_compositor || !_sharedMemory || !_seat || !_clipboards || !_windows)
        return false;
    xdg_wm_base_add_listener(_windows, &alive, nullptr);
    return true;
}

void WaylandDisplay::bind(wl_registry* registry, unsigned name, const char* interface)
{
    const std::string_view wanted = interface;
    if (wanted == wl_compositor_interface.name)
        take(_compositor, registry, name, wl_compositor_interface);
    else if (wanted == wl_shm_interface.name)
        take(_sharedMemory, registry, name, wl_shm_interface);
    else if (wanted == wl_seat_interface.name)
        take(_seat, registry, name, wl_seat_interface);
    else if (wanted == wl_data_device_manager_interface.name)
        take(_clipboards, registry, name, wl_data_device_manager_interface);
    else if (wanted == xdg_wm_base_interface.name)
        take(_windows, registry, name, xdg_wm_base_interface);
}
