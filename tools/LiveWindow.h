#ifndef NIB_TOOLS_LIVE_WINDOW_H
#define NIB_TOOLS_LIVE_WINDOW_H

#include "LiveEvent.h"

#include <memory>
#include <string>
#include <vector>

/// A window of the X server that DISPLAY names, to draw in with a mouse or a pen (XInput 2) and a
/// few keys. Shown when the constructor returns. Used on one thread.
class LiveWindow
{
public:
    /// Samples count their time from @p startTime, in seconds. Throws UserError, which names
    /// @p option, when there is no display, or one without XInput 2.
    LiveWindow(const std::string& option, const std::string& title, int width, int height,
               double startTime);
    ~LiveWindow();

    LiveWindow(const LiveWindow&) = delete;
    LiveWindow& operator=(const LiveWindow&) = delete;

    /// The window as the library takes it.
    void* NativeWindow() const;

    /// [blocks] Waits for the user, then puts into @p events everything that has come in by then,
    /// in its order: what comes in while a frame is drawn is there the next time, none is left
    /// out. False once the window is closed or gone; then, too, @p events are to be handled.
    bool WaitForEvents(std::vector<LiveEvent>& events);

private:
    class Input;
    std::unique_ptr<Input> m_input;
};

#endif
