#ifndef NIB_TOOLS_X_WINDOW_H
#define NIB_TOOLS_X_WINDOW_H

#include <memory>
#include <string>

class XConnection;

/// A window of the X server that DISPLAY names, of a fixed size, shown when the constructor
/// returns. Used on one thread.
class XWindow
{
public:
    /// Throws UserError when there is no display.
    XWindow(const std::string& title, int width, int height);
    ~XWindow();

    XWindow(const XWindow&) = delete;
    XWindow& operator=(const XWindow&) = delete;

    /// The window as the library takes it.
    void* NativeWindow() const;

    /// Handles what came in since the last call. False once the user has closed the window.
    bool IsOpen();

private:
    std::unique_ptr<XConnection> m_connection;
};

#endif
