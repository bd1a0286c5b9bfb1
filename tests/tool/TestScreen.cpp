#include "TestScreen.h"

#include <chrono>
#include <X11/Xutil.h>

TestScreen::TestScreen() : m_display(XOpenDisplay(nullptr)) {}

TestScreen::~TestScreen()
{
    if (m_display)
        XCloseDisplay(m_display);
}

std::optional<Window> TestScreen::WindowNamed(const std::string& name) const
{
    Window root = 0, parent = 0, *children = nullptr;
    unsigned int count = 0;
    std::optional<Window> found;
    XQueryTree(m_display, DefaultRootWindow(m_display), &root, &parent, &children, &count);
    for (unsigned int i = 0; i < count && !found; ++i)
    {
        char* title = nullptr;
        if (XFetchName(m_display, children[i], &title) && title && title == name)
            found = children[i];
        XFree(title);
    }
    XFree(children);
    return found;
}

Picture TestScreen::Content(Window window, int width, int height) const
{
    XImage* const image = XGetImage(m_display, window, 0, 0, static_cast<unsigned>(width),
                                    static_cast<unsigned>(height), AllPlanes, ZPixmap);
    Picture picture{width, height, {}};
    for (int y = 0; image && y < height; ++y)
        for (int x = 0; x < width; ++x)
        {
            const unsigned long pixel = XGetPixel(image, x, y);
            for (const int shift : {16, 8, 0})
                picture.pixels.push_back(static_cast<std::uint8_t>(pixel >> shift));
            picture.pixels.push_back(255);
        }
    if (image)
        XDestroyImage(image);
    return picture;
}

Picture TestScreen::ContentOnceEqual(Window window, const Picture& expected) const
{
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(20);
    Picture shown;
    do
        shown = Content(window, expected.width, expected.height);
    while (LargestDifference(shown, expected) > 1 && std::chrono::steady_clock::now() < deadline);
    return shown;
}

void TestScreen::AskToClose(Window window) const
{
    XEvent close{};
    close.xclient.type = ClientMessage;
    close.xclient.window = window;
    close.xclient.message_type = XInternAtom(m_display, "WM_PROTOCOLS", False);
    close.xclient.format = 32;
    close.xclient.data.l[0] = static_cast<long>(XInternAtom(m_display, "WM_DELETE_WINDOW", False));
    XSendEvent(m_display, window, False, NoEventMask, &close);
    XSync(m_display, False);
}
