#ifndef NIB_TOOLS_X_CONNECTION_H
#define NIB_TOOLS_X_CONNECTION_H

#include <string>
#include <X11/Xlib.h>

/// A connection to the X server that DISPLAY names, with one window of it. The end of either, from
/// wherever it comes, is told and does not end the program. Used on one thread.
class XConnection
{
public:
    enum class Sizing
    {
        Fixed,
        Free
    };

    /// The window is not shown yet. Throws UserError when there is no display; @p option is the
    /// one that wanted it.
    XConnection(const std::string& option, const std::string& title, int width, int height,
                Sizing sizing);
    ~XConnection();

    XConnection(const XConnection&) = delete;
    XConnection& operator=(const XConnection&) = delete;

    /// Shows the window, which reports @p events besides those of its structure, and waits until
    /// it is there.
    void Show(long events);

    Display* Get() const { return m_display; }
    Window Handle() const { return m_window; }

    /// How many events can be taken without waiting.
    int Pending();

    /// Waits until there is an event, or the end.
    void Wait();

    /// Notes what @p event says about the window's end.
    void Watch(const XEvent& event);

    /// Whether the user has closed the window, it was destroyed, or the connection broke.
    bool IsOver() const { return m_isAskedToClose || m_isWindowGone || m_isBroken; }

private:
    Display* m_display;
    Window m_window = 0;
    Atom m_deleteWindow = 0;
    bool m_isAskedToClose = false;
    bool m_isWindowGone = false;
    bool m_isBroken = false;
};

#endif
