#include "Window.h"

#include "Failure.h"

#include <X11/Xlib.h>

#include <cstdint>
#include <cstdlib>
#include <string_view>

namespace Soak
{

bool HasWindows()
{
    const char* const platform = std::getenv("EGL_PLATFORM");
    return platform != nullptr && std::string_view(platform) == "x11";
}

Window::Window(int width, int height) : m_display(XOpenDisplay(nullptr))
{
    Require(m_display != nullptr, "the X server that DISPLAY names does not answer");
    m_window =
        XCreateSimpleWindow(m_display, DefaultRootWindow(m_display), 0, 0,
                            static_cast<unsigned>(width), static_cast<unsigned>(height), 0, 0, 0);
    XMapRaised(m_display, m_window);
    XSync(m_display, False);
}

Window::~Window()
{
    XDestroyWindow(m_display, m_window);
    XCloseDisplay(m_display);
}

void* Window::Native() const
{
    return reinterpret_cast<void*>(static_cast<std::uintptr_t>(m_window));
}

void Window::Resize(int width, int height)
{
    XResizeWindow(m_display, m_window, static_cast<unsigned>(width), static_cast<unsigned>(height));
    XSync(m_display, False);
}

} // namespace Soak
