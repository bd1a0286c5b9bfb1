#ifndef NIB_TESTS_DRIVERS_WAYLAND_WINDOW_H
#define NIB_TESTS_DRIVERS_WAYLAND_WINDOW_H

#include <EGL/egl.h>

#include <memory>

/// Whether the tests were built with what it takes to make windows of a Wayland compositor.
bool CanMakeWaylandWindows();

/// A window of the compositor that WAYLAND_DISPLAY names, on a connection of the test's own. It has
/// no role, hence is never shown: only its back buffer is drawn into and read.
class WaylandWindow
{
public:
    /// Throws std::runtime_error when the compositor is not there.
    WaylandWindow(int width, int height);
    ~WaylandWindow();
    WaylandWindow(const WaylandWindow&) = delete;
    WaylandWindow& operator=(const WaylandWindow&) = delete;

    /// The connection and the window as EGL takes them.
    EGLNativeDisplayType NativeDisplay() const;
    EGLNativeWindowType NativeWindow() const;

private:
    struct Parts;
    std::unique_ptr<Parts> m_parts;
};

#endif
