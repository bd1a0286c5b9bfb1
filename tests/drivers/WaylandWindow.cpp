#include "drivers/WaylandWindow.h"

#include <stdexcept>

#ifdef NIB_HAS_WAYLAND

#include <wayland-client.h>
#include <wayland-egl.h>

#include <cstdint>
#include <string_view>

bool CanMakeWaylandWindows()
{
    return true;
}

struct WaylandWindow::Parts
{
    wl_display* display = nullptr;
    wl_registry* registry = nullptr;
    wl_compositor* compositor = nullptr;
    wl_surface* surface = nullptr;
    wl_egl_window* window = nullptr;
};

namespace
{

void BindCompositor(void* compositor, wl_registry* registry, std::uint32_t name,
                    const char* interface, std::uint32_t)
{
    if (std::string_view(interface) == wl_compositor_interface.name)
        *static_cast<wl_compositor**>(compositor) = static_cast<wl_compositor*>(
            wl_registry_bind(registry, name, &wl_compositor_interface, 1));
}

void Forget(void*, wl_registry*, std::uint32_t) {}

constexpr wl_registry_listener kListener = {&BindCompositor, &Forget};

} // namespace

WaylandWindow::WaylandWindow(int width, int height) : m_parts(std::make_unique<Parts>())
{
    m_parts->display = wl_display_connect(nullptr);
    if (m_parts->display == nullptr)
        throw std::runtime_error("there is no Wayland compositor");
    m_parts->registry = wl_display_get_registry(m_parts->display);
    wl_registry_add_listener(m_parts->registry, &kListener, &m_parts->compositor);
    wl_display_roundtrip(m_parts->display);
    if (m_parts->compositor == nullptr)
        throw std::runtime_error("the Wayland compositor makes no surfaces");
    m_parts->surface = wl_compositor_create_surface(m_parts->compositor);
    m_parts->window = wl_egl_window_create(m_parts->surface, width, height);
}

WaylandWindow::~WaylandWindow()
{
    // The connection stays: the EGL display that was made of it lasts as long as the process.
    wl_egl_window_destroy(m_parts->window);
    wl_surface_destroy(m_parts->surface);
    wl_compositor_destroy(m_parts->compositor);
    wl_registry_destroy(m_parts->registry);
    wl_display_roundtrip(m_parts->display);
}

EGLNativeDisplayType WaylandWindow::NativeDisplay() const
{
    return reinterpret_cast<EGLNativeDisplayType>(m_parts->display);
}

EGLNativeWindowType WaylandWindow::NativeWindow() const
{
    return reinterpret_cast<EGLNativeWindowType>(m_parts->window);
}

#else

struct WaylandWindow::Parts
{
};

bool CanMakeWaylandWindows()
{
    return false;
}

WaylandWindow::WaylandWindow(int, int)
{
    throw std::runtime_error("built without Wayland");
}

WaylandWindow::~WaylandWindow() = default;

EGLNativeDisplayType WaylandWindow::NativeDisplay() const
{
    return {};
}

EGLNativeWindowType WaylandWindow::NativeWindow() const
{
    return {};
}

#endif
