#ifndef NIB_TESTS_DRIVERS_X_WINDOW_H
#define NIB_TESTS_DRIVERS_X_WINDOW_H

struct ANativeWindow;
struct _XDisplay;

/// A colour as the X server shows it.
struct ShownColor
{
    int r = -1;
    int g = -1;
    int b = -1;
};

/// Whether the two differ by no more than 1 in each part: drivers round differently.
bool Near(const ShownColor& a, const ShownColor& b);

/// Whether EGL draws in windows of an X server, and there is one.
bool HasXServer();

/// A window on the X server, on a connection of the test's own: what it shows is asked of the
/// server, not of GL.
class XWindow
{
public:
    XWindow(int width, int height);
    ~XWindow();
    XWindow(const XWindow&) = delete;
    XWindow& operator=(const XWindow&) = delete;

    /// The window as render threads take it.
    ANativeWindow* Native() const;

    void Resize(int width, int height);

    /// The pixel (x, y), y growing downward.
    ShownColor At(int x, int y) const;

    /// The pixel once it shows @p expected; what it shows then after 20 seconds. Frames travel on
    /// another connection than this one, so the last may still be under way when a render thread is
    /// done with it.
    ShownColor AtOnceNear(int x, int y, const ShownColor& expected) const;

private:
    _XDisplay* m_display;
    unsigned long m_window;
};

#endif
