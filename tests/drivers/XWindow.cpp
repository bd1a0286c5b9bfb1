#include "drivers/XWindow.h"

#include <gtest/gtest.h>

#include <X11/Xlib.h>
#include <X11/Xutil.h>

#include <chrono>
#include <cstdint>
#include <cstdlib>
#include <stdexcept>
#include <string_view>

bool Near(const ShownColor& a, const ShownColor& b)
{
    return std::abs(a.r - b.r) <= 1 && std::abs(a.g - b.g) <= 1 && std::abs(a.b - b.b) <= 1;
}

namespace
{

const char* Setting(const char* name)
{
    const char* value = std::getenv(name);
    return value != nullptr ? value : "";
}

/// A test server starts anew when its last client goes, and then answers nobody for a moment.
Display* OpenDisplay()
{
    if (std::string_view(Setting("DISPLAY")).empty())
        return nullptr;
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(5);
    Display* display = XOpenDisplay(nullptr);
    while (display == nullptr && std::chrono::steady_clock::now() < deadline)
        display = XOpenDisplay(nullptr);
    return display;
}

/// Makes each test program a client before EGL looks for the server.
class ClientFromTheStart : public testing::Environment
{
public:
    void SetUp() override { HasXServer(); }
};

[[maybe_unused]] const auto* const s_client =
    testing::AddGlobalTestEnvironment(new ClientFromTheStart);

} // namespace

bool HasXServer()
{
    if (std::string_view(Setting("EGL_PLATFORM")) != "x11")
        return false;
    static const Display* const kept = OpenDisplay(); // the process stays a client to its end
    return kept != nullptr;
}

XWindow::XWindow(int width, int height) : m_display(OpenDisplay())
{
    if (m_display == nullptr)
        throw std::runtime_error("the X server is gone");
    XSetWindowAttributes attributes = {};
    attributes.override_redirect = True; // no window manager moves or hides it
    attributes.background_pixel = 0;
    m_window =
        XCreateWindow(m_display, DefaultRootWindow(m_display), 0, 0, static_cast<unsigned>(width),
                      static_cast<unsigned>(height), 0, CopyFromParent, InputOutput, nullptr,
                      CWOverrideRedirect | CWBackPixel, &attributes);
    XMapRaised(m_display, m_window);
    XSync(m_display, False);
}

XWindow::~XWindow()
{
    XDestroyWindow(m_display, m_window);
    XCloseDisplay(m_display);
}

ANativeWindow* XWindow::Native() const
{
    return reinterpret_cast<ANativeWindow*>(static_cast<std::uintptr_t>(m_window));
}

void XWindow::Resize(int width, int height)
{
    XResizeWindow(m_display, m_window, static_cast<unsigned>(width), static_cast<unsigned>(height));
    XSync(m_display, False);
}

ShownColor XWindow::At(int x, int y) const
{
    XImage* image = XGetImage(m_display, m_window, x, y, 1, 1, AllPlanes, ZPixmap);
    if (image == nullptr)
        return {};
    const unsigned long pixel = XGetPixel(image, 0, 0);
    XDestroyImage(image);
    return {static_cast<int>(pixel >> 16 & 255), static_cast<int>(pixel >> 8 & 255),
            static_cast<int>(pixel & 255)};
}

ShownColor XWindow::AtOnceNear(int x, int y, const ShownColor& expected) const
{
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(20);
    ShownColor shown = At(x, y);
    while (!Near(shown, expected) && std::chrono::steady_clock::now() < deadline)
        shown = At(x, y);
    return shown;
}
