#ifndef NIB_EXAMPLES_ANDROID_INK_VIEW_H
#define NIB_EXAMPLES_ANDROID_INK_VIEW_H

#include "FrameLatency.h"
#include "InkDocument.h"
#include "InkSession.h"
#include "InkStroke.h"

#include <nib/nib.h>

#include <android/native_window.h>

#include <memory>

/// A page of ink behind a surface of the screen, with its render threads. Used on the main thread.
///
/// Draws into the visible buffer where the device allows it, else frame by frame.
class InkView
{
public:
    enum class Phase
    {
        Down = 0,
        Move = 1,
        Up = 2,
    };

    InkView();
    ~InkView();

    InkView(const InkView&) = delete;
    InkView& operator=(const InkView&) = delete;

    /// Takes over one reference to @p window. Sizes in pixels.
    void SurfaceChanged(ANativeWindow* window, int width, int height);
    void SurfaceDestroyed(); ///< when it returns, nobody draws into the window any more

    void Stop();  ///< leaves the screen: the page is kept
    void Start(); ///< comes back to the screen

    /// An event of the pen has come, the oldest of its samples at @p time, in nanoseconds since the
    /// system's start without sleep. Before its samples.
    void Event(Nib::EglTime time);
    void Pen(Phase phase, const Ink::Sample& sample);
    void Undo();
    void Clear();
    void Present(); ///< shows what was drawn since the last call

private:
    struct ReleaseWindow
    {
        void operator()(ANativeWindow* window) const { ANativeWindow_release(window); }
    };

    Nib::RenderThreadGL& DrawingThread() { return m_front ? *m_front : *m_surface; }
    bool IsShown() const { return m_session && m_window && !m_stopped; }
    void Attach();
    void Detach();
    void Redraw();
    void Paint();
    void MeasureFrame();
    void LogLatency();

    // Ended from the last to the first: the session before its thread, a child before its parent.
    std::unique_ptr<Nib::RenderThreadGL> m_surface;
    std::unique_ptr<Nib::RenderThreadGL> m_front; // null where drawing goes frame by frame
    std::unique_ptr<ANativeWindow, ReleaseWindow> m_window;
    std::unique_ptr<Ink::InkSession> m_session; // from the first surface on
    int m_width = 0;
    int m_height = 0;
    bool m_stopped = false;
    Ink::InkDocument m_document;
    Ink::BrushStyle m_style = Ink::DefaultStyle(Ink::BrushKind::Pen);
    Ink::InkStroke m_stroke{m_style};
    Nib::EglTime m_event = 0; // the oldest that no frame shows yet; 0: none
    std::shared_ptr<Ink::FrameLatency> m_latency = std::make_shared<Ink::FrameLatency>();
};

#endif
