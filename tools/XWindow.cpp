#include "XWindow.h"

#include "UserError.h"

#include <X11/Xlib.h>
#include <X11/Xutil.h>

struct XWindow::Connection
{
    Display* display = nullptr;
    Window window = 0;
    Atom deleteWindow = 0;
    bool isClosed = false;

    ~Connection()
    {
        if (!display)
            return;
        if (window)
            XDestroyWindow(display, window);
        XCloseDisplay(display);
    }
};

XWindow::XWindow(const std::string& title, int width, int height)
    : m_connection(std::make_unique<Connection>())
{
    Display* const display = XOpenDisplay(nullptr);
    if (!display)
        throw UserError("--window: there is no display (DISPLAY is unset, or its server does not "
                        "answer)");
    m_connection->display = display;
    const Window window = XCreateSimpleWindow(
        display, DefaultRootWindow(display), 0, 0, static_cast<unsigned int>(width),
        static_cast<unsigned int>(height), 0, 0, WhitePixel(display, DefaultScreen(display)));
    m_connection->window = window;
    // No background: the server must not clear what the renderer has drawn.
    XSetWindowBackgroundPixmap(display, window, 0);
    XStoreName(display, window, title.c_str());

    XSizeHints hints{};
    hints.flags = PMinSize | PMaxSize;
    hints.min_width = hints.max_width = width;
    hints.min_height = hints.max_height = height;
    XSetWMNormalHints(display, window, &hints);
    m_connection->deleteWindow = XInternAtom(display, "WM_DELETE_WINDOW", False);
    XSetWMProtocols(display, window, &m_connection->deleteWindow, 1);

    XSelectInput(display, window, StructureNotifyMask);
    XMapWindow(display, window);
    for (XEvent event{}; event.type != MapNotify;)
        XWindowEvent(display, window, StructureNotifyMask, &event);
}

XWindow::~XWindow() = default;

void* XWindow::NativeWindow() const
{
    return reinterpret_cast<void*>(m_connection->window);
}

bool XWindow::IsOpen()
{
    while (!m_connection->isClosed && XPending(m_connection->display) > 0)
    {
        XEvent event;
        XNextEvent(m_connection->display, &event);
        if (event.type == ClientMessage &&
            static_cast<Atom>(event.xclient.data.l[0]) == m_connection->deleteWindow)
            m_connection->isClosed = true;
    }
    return !m_connection->isClosed;
}
