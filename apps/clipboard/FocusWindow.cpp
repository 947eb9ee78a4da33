#include "apps/clipboard/FocusWindow.h"

#include <sys/mman.h>
#include <unistd.h>

#include <wayland-client.h>
#include <xdg-shell-client-protocol.h>

namespace {

/// One transparent pixel: a surface without a picture is never shown.
wl_buffer* madePicture(wl_shm* memory)
{
    constexpr int pixel = 4;
    const int file = ::memfd_create("pixel", MFD_CLOEXEC);
    static_cast<void>(::ftruncate(file, pixel));
    wl_shm_pool* const pool = wl_shm_create_pool(memory, file, pixel);
    wl_buffer* const picture = wl_shm_pool_create_buffer(pool, 0, 1, 1, pixel, WL_SHM_FORMAT_ARGB8888);
    wl_shm_pool_destroy(pool);
    ::close(file);
    return picture;
}

// One pixel is all it will ever be, and it goes by itself.
constexpr xdg_toplevel_listener unmoved {
    .configure = [](void*, xdg_toplevel*, int32_t, int32_t, wl_array*) {},
    .close = [](void*, xdg_toplevel*) {},
    .configure_bounds = nullptr,
    .wm_capabilities = nullptr,
};

} // namespace

FocusWindow::FocusWindow(const WaylandDisplay& display)
    : _surface(wl_compositor_create_surface(display.compositor()))
    , _role(xdg_wm_base_get_xdg_surface(display.windows(), _surface))
    , _window(xdg_surface_get_toplevel(_role))
    , _picture(madePicture(display.sharedMemory()))
{
    static constexpr xdg_surface_listener listener {
        .configure = [](void* self, xdg_surface*, uint32_t serial) { static_cast<FocusWindow*>(self)->show(serial); },
    };
    xdg_surface_add_listener(_role, &listener, this);
    xdg_toplevel_add_listener(_window, &unmoved, nullptr);
    xdg_toplevel_set_title(_window, "ombrix");
    wl_surface_commit(_surface);
}

FocusWindow::~FocusWindow()
{
    xdg_toplevel_destroy(_window);
    xdg_surface_destroy(_role);
    wl_surface_destroy(_surface);
    wl_buffer_destroy(_picture);
}

void FocusWindow::show(unsigned serial)
{
    xdg_surface_ack_configure(_role, serial);
    wl_surface_attach(_surface, _picture, 0, 0);
    wl_surface_damage(_surface, 0, 0, 1, 1);
    wl_surface_commit(_surface);
}
