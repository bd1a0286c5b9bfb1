#ifndef NIB_TOOLS_LATENCY_LATENCY_PROBE_H
#define NIB_TOOLS_LATENCY_LATENCY_PROBE_H

#include "DrawOptions.h"

#include <vector>

struct _XDisplay;

/// Looks at a window from outside, on a connection of its own: taps it through the X server's test
/// extension, and asks the server for the pixel there until it is ink. While it works, the pointer
/// is its own.
class LatencyProbe
{
public:
    /// Throws UserError when there is no display, or one without the extension.
    LatencyProbe(unsigned long window, PageSize size);
    ~LatencyProbe();

    LatencyProbe(const LatencyProbe&) = delete;
    LatencyProbe& operator=(const LatencyProbe&) = delete;

    /// How many taps find paper.
    int MostTaps() const;

    /// Taps a place that no tap has been at, and gives the milliseconds from the event until the
    /// ink could be read. Throws UserError when there is none after some seconds.
    float Tap();

    /// The milliseconds that reading a pixel takes: the least difference that can be seen.
    float ReadTime();

    void AskToClose(); ///< as a window manager does

private:
    bool IsInk(int x, int y);
    int Columns() const;

    _XDisplay* m_display;
    unsigned long m_window;
    PageSize m_size;
    int m_left = 0; // of the window on the screen
    int m_top = 0;
    int m_taps = 0;
};

#endif
