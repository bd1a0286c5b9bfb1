#ifndef NIB_TOOLS_LATENCY_PEN_PROCESS_H
#define NIB_TOOLS_LATENCY_PEN_PROCESS_H

#include "DrawOptions.h"

#include <string>

/// The ways from ink to the screen that are compared.
enum class PenPath
{
    PlainSwap,     ///< every frame draws and swaps the whole window
    PartialUpdate, ///< as `nib draw --live`: only what changed, as far as the device can
    FrontBuffer    ///< into the window's visible buffer
};

/// A window to draw in, in a process of its own: measured, it does what it does for a user. The
/// destructor ends it.
class PenProcess
{
public:
    /// [blocks] until the empty page is shown. Throws UserError when it cannot be.
    PenProcess(PenPath path, PageSize size);
    ~PenProcess();

    PenProcess(const PenProcess&) = delete;
    PenProcess& operator=(const PenProcess&) = delete;

    /// Why the device does not offer the path; empty when it does, and there is a window.
    const std::string& Obstacle() const { return m_obstacle; }

    unsigned long Window() const { return m_window; }

    /// [blocks] After its window was asked to close: the share of the window's pixels that an
    /// average frame has drawn, 0 to 1.
    double Finish();

private:
    std::string ReadLine();

    int m_process = -1;
    int m_answers = -1; // its lines: what it is ready for, and at its end what it has done
    unsigned long m_window = 0;
    std::string m_obstacle;
};

#endif
