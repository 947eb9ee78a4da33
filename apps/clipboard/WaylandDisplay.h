#pragma once

#include <memory>

#include <wayland-client-core.h>

struct wl_compositor;
struct wl_data_device_manager;
struct wl_registry;
struct wl_seat;
struct wl_shm;
struct xdg_wm_base;

/// A connection to the compositor, with what it offers that a clipboard needs. All of it in its first version, which
/// every compositor has.
class WaylandDisplay {
public:
    /// Null where the compositor cannot be reached or lacks something. Blocks until it has answered.
    static std::unique_ptr<WaylandDisplay> open();
    ~WaylandDisplay();
    WaylandDisplay(const WaylandDisplay&) = delete;
    WaylandDisplay& operator=(const WaylandDisplay&) = delete;

    wl_display* connection() const { return _connection; }
    wl_compositor* compositor() const { return _compositor; }
    wl_shm* sharedMemory() const { return _sharedMemory; }
    wl_seat* seat() const { return _seat; }
    wl_data_device_manager* clipboards() const { return _clipboards; }
    xdg_wm_base* windows() const { return _windows; }

private:
    explicit WaylandDisplay(wl_display* connection);
    bool findAll();
    void bind(wl_registry* registry, unsigned name, const char* interface);

    wl_display* const _connection;
    wl_compositor* _compositor = nullptr;
    wl_shm* _sharedMemory = nullptr;
    wl_seat* _seat = nullptr;
    wl_data_device_manager* _clipboards = nullptr;
    xdg_wm_base* _windows = nullptr;
};
