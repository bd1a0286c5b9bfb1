#include "latency/LatencyProbe.h"

#include "UserError.h"

#include <chrono>
#include <thread>
#include <X11/extensions/XTest.h>
#include <X11/Xlib.h>
#include <X11/Xutil.h>

namespace
{

using Clock = std::chrono::steady_clock;
using Milliseconds = std::chrono::duration<float, std::milli>;

constexpr int kSpacing = 14;    // pixels between two taps, more than a pen's width
constexpr unsigned kTip = 1;    // the button
constexpr int kInkBelow = 0x80; // of 0xFF in red, on white paper
constexpr auto kLongest = std::chrono::seconds(10);

/// Between two taps, so that they meet the drawing process at rest and at no fixed beat.
std::chrono::microseconds Pause(int tap)
{
    return std::chrono::microseconds(3000 + tap * 7919 % 5000);
}

} // namespace

LatencyProbe::LatencyProbe(unsigned long window, PageSize size)
    : m_display(XOpenDisplay(nullptr)), m_window(window), m_size(size)
{
    int event = 0, error = 0, major = 0, minor = 0;
    if (!m_display)
        throw UserError("latency: the X server answers no second connection");
    if (!XTestQueryExtension(m_display, &event, &error, &major, &minor))
    {
        XCloseDisplay(m_display);
        throw UserError("latency: the X server has no XTEST extension");
    }
    ::Window child = 0;
    XTranslateCoordinates(m_display, window, DefaultRootWindow(m_display), 0, 0, &m_left, &m_top,
                          &child);
}

LatencyProbe::~LatencyProbe()
{
    XCloseDisplay(m_display);
}

int LatencyProbe::Columns() const
{
    return (m_size.width - 1) / kSpacing;
}

int LatencyProbe::MostTaps() const
{
    return Columns() * ((m_size.height - 1) / kSpacing);
}

float LatencyProbe::Tap()
{
    const int x = kSpacing / 2 + m_taps % Columns() * kSpacing;
    const int y = kSpacing / 2 + m_taps / Columns() * kSpacing;
    XTestFakeMotionEvent(m_display, DefaultScreen(m_display), m_left + x, m_top + y, CurrentTime);
    XSync(m_display, False);
    std::this_thread::sleep_for(Pause(m_taps++));
    if (IsInk(x, y))
        throw UserError("latency: the page is not empty where it is tapped");

    const Clock::time_point start = Clock::now();
    XTestFakeButtonEvent(m_display, kTip, True, CurrentTime);
    XFlush(m_display);
    bool isShown = false;
    while (!isShown && Clock::now() - start < kLongest)
        isShown = IsInk(x, y);
    const Milliseconds time = Clock::now() - start;
    XTestFakeButtonEvent(m_display, kTip, False, CurrentTime);
    XSync(m_display, False);
    if (!isShown)
        throw UserError(
            "latency: a tap does not show; is the window covered, or its display busy?");
    return time.count();
}

float LatencyProbe::ReadTime()
{
    constexpr int kReads = 100;
    const Clock::time_point start = Clock::now();
    for (int i = 0; i < kReads; ++i)
        IsInk(0, 0);
    return Milliseconds(Clock::now() - start).count() / kReads;
}

void LatencyProbe::AskToClose()
{
    XEvent close{};
    close.xclient.type = ClientMessage;
    close.xclient.window = m_window;
    close.xclient.message_type = XInternAtom(m_display, "WM_PROTOCOLS", False);
    close.xclient.format = 32;
    close.xclient.data.l[0] = static_cast<long>(XInternAtom(m_display, "WM_DELETE_WINDOW", False));
    XSendEvent(m_display, m_window, False, NoEventMask, &close);
    XSync(m_display, False);
}

bool LatencyProbe::IsInk(int x, int y)
{
    XImage* const image = XGetImage(m_display, m_window, x, y, 1, 1, AllPlanes, ZPixmap);
    if (!image)
        throw UserError("latency: the window cannot be read");
    const unsigned long pixel = XGetPixel(image, 0, 0);
    XDestroyImage(image);
    return (pixel >> 16 & 0xFF) < kInkBelow;
}
