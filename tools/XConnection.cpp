#include "XConnection.h"

#include "UserError.h"

#include <poll.h>
#include <X11/Xutil.h>

namespace
{

/// A window or a device may end between an event and the question that it leads to.
int IgnoreError(Display*, XErrorEvent*)
{
    return 0;
}

/// Xlib's own prints a line; what follows is up to the exit handler.
int IgnoreBreak(Display*)
{
    return 0;
}

void FixSize(Display* display, Window window, int width, int height)
{
    XSizeHints hints{};
    hints.flags = PMinSize | PMaxSize;
    hints.min_width = hints.max_width = width;
    hints.min_height = hints.max_height = height;
    XSetWMNormalHints(display, window, &hints);
}

} // namespace

XConnection::XConnection(const std::string& option, const std::string& title, int width, int height,
                         Sizing sizing)
    : m_display(XOpenDisplay(nullptr))
{
    if (!m_display)
        throw UserError(option + ": there is no display (DISPLAY is unset, or its server does not "
                                 "answer)");
    XSetErrorHandler(IgnoreError);
    XSetIOErrorHandler(IgnoreBreak);
    XSetIOErrorExitHandler(
        m_display, [](Display*, void* isBroken) { *static_cast<bool*>(isBroken) = true; },
        &m_isBroken);

    XSetWindowAttributes attributes{};
    attributes.background_pixmap = 0;          // the server must not clear what is drawn,
    attributes.bit_gravity = NorthWestGravity; // nor lose it when the window's size changes
    m_window = XCreateWindow(m_display, DefaultRootWindow(m_display), 0, 0,
                             static_cast<unsigned int>(width), static_cast<unsigned int>(height), 0,
                             CopyFromParent, InputOutput, nullptr, CWBackPixmap | CWBitGravity,
                             &attributes);
    XStoreName(m_display, m_window, title.c_str());
    if (sizing == Sizing::Fixed)
        FixSize(m_display, m_window, width, height);
    m_deleteWindow = XInternAtom(m_display, "WM_DELETE_WINDOW", False);
    XSetWMProtocols(m_display, m_window, &m_deleteWindow, 1);
}

XConnection::~XConnection()
{
    if (!m_isBroken && !m_isWindowGone)
        XDestroyWindow(m_display, m_window);
    XCloseDisplay(m_display);
}

void XConnection::Show(long events)
{
    XSelectInput(m_display, m_window, StructureNotifyMask | events);
    XMapWindow(m_display, m_window);
    for (XEvent event{}; event.type != MapNotify && !IsOver();)
    {
        XWindowEvent(m_display, m_window, StructureNotifyMask, &event);
        Watch(event);
    }
    XSync(m_display, False);
    for (XEvent event{}; XCheckTypedWindowEvent(m_display, m_window, Expose, &event);)
        continue; // nothing has been drawn yet that could be lost
}

int XConnection::Pending()
{
    const int count = m_isBroken ? 0 : XPending(m_display);
    return m_isBroken ? QLength(m_display)
                      : count; // what had come in before the break still counts
}

void XConnection::Wait()
{
    while (!IsOver() && Pending() == 0 && !m_isBroken)
    {
        pollfd connection{ConnectionNumber(m_display), POLLIN, 0};
        poll(&connection, 1, -1);
    }
}

void XConnection::Watch(const XEvent& event)
{
    if (event.type == ClientMessage && static_cast<Atom>(event.xclient.data.l[0]) == m_deleteWindow)
        m_isAskedToClose = true;
    else if (event.type == DestroyNotify)
        m_isWindowGone = true;
}
