#ifndef NIB_TESTS_SOAK_WINDOW_H
#define NIB_TESTS_SOAK_WINDOW_H

struct _XDisplay;

namespace Soak
{

/// Whether EGL draws in windows of an X server here.
bool HasWindows();

/// A window of the X server, on a connection of its own.
class Window
{
public:
    Window(int width, int height); ///< Throws Failure when the server is gone.
    ~Window();
    Window(const Window&) = delete;
    Window& operator=(const Window&) = delete;

    void* Native() const; ///< as render threads take it
    void Resize(int width, int height);

private:
    _XDisplay* m_display;
    unsigned long m_window;
};

} // namespace Soak

#endif
