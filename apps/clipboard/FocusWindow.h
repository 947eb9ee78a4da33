#pragma once

#include "apps/clipboard/WaylandDisplay.h"

struct wl_buffer;
struct wl_surface;
struct xdg_surface;
struct xdg_toplevel;

/// A window of one pixel, shown for as long as it lives: a compositor lets only a program whose window has the focus
/// set the clipboard.
class FocusWindow {
public:
    explicit FocusWindow(const WaylandDisplay& display);
    ~FocusWindow();
    FocusWindow(const FocusWindow&) = delete;
    FocusWindow& operator=(const FocusWindow&) = delete;

private:
    void show(unsigned serial);

    wl_surface* const _surface;
    xdg_surface* const _role;
    xdg_toplevel* const _window;
    wl_buffer* const _picture;
};
