#include "InkView.h"

#include "PostTask.h"

#include <android/log.h>

#include <utility>

namespace
{

constexpr Ink::Colour kPaper{1.0f, 1.0f, 1.0f, 1.0f};

} // namespace

InkView::InkView()
    : m_surface(Nib::RendererFactory::CreateSurfaceRenderer("ink", Nib::RenderThreadGL::High))
{
    m_surface->Start();
    if (!Nib::IsFBRSupported())
        return;
    m_front.reset(
        Nib::RendererFactory::CreateFBRSurfaceRenderer(m_surface->GetMsgQueue(), "ink front"));
    if (!m_front->Start())
        m_front.reset();
}

InkView::~InkView()
{
    if (m_stopped)
        Start(); // what is kept without a context is ended with one
    SurfaceDestroyed();
    m_session.reset();
    m_front.reset();
}

// ---- the screen ---------------------------------------------------------------------------------

void InkView::SurfaceChanged(ANativeWindow* window, int width, int height)
{
    m_window.reset(window);
    const bool isResized = width != m_width || height != m_height;
    m_width = width;
    m_height = height;
    if (m_stopped)
        return; // Start attaches it
    if (!m_session)
        m_session = std::make_unique<Ink::InkSession>(DrawingThread(), width, height, kPaper);
    else if (isResized)
    {
        Detach();
        m_session->Resize(width, height);
        Redraw();
    }
    Attach();
}

void InkView::SurfaceDestroyed()
{
    if (IsShown())
        Detach();
    m_window.reset();
}

void InkView::Detach()
{
    Ink::Post(*DrawingThread().GetMsgQueue(), [latency = m_latency] { latency->Forget(); });
    m_event = 0; // its ink is shown whenever the page is again
    m_session->DetachWindow();
}

void InkView::Attach()
{
    m_session->AttachWindow(m_window.get());
    m_session->Present();
}

void InkView::Stop()
{
    if (std::exchange(m_stopped, true) || !m_session)
        return;
    if (m_window)
        Detach();
    if (m_front)
        m_session->Pause(); // a surface thread keeps its context, which costs nothing unused
}

void InkView::Start()
{
    if (!std::exchange(m_stopped, false))
        return;
    if (m_session && m_front)
        m_session->Resume();
    if (!m_window)
        return; // a surface comes yet
    if (!m_session)
        m_session = std::make_unique<Ink::InkSession>(DrawingThread(), m_width, m_height, kPaper);
    else
        m_session->Resize(m_width, m_height); // it may have changed meanwhile
    Redraw();
    Attach();
}

// ---- the pen ------------------------------------------------------------------------------------

void InkView::Event(Nib::EglTime time)
{
    if (m_event == 0)
        m_event = time;
}

void InkView::Pen(Phase phase, const Ink::Sample& sample)
{
    if (phase == Phase::Down)
    {
        m_document.Begin(sample);
        m_stroke = Ink::InkStroke(m_style);
    }
    else if (m_document.IsWriting())
        m_document.Add(sample);
    else
        return; // the rest of a stroke that was undone
    m_stroke.Add(Ink::ToPage(sample, Ink::Placement(), m_style));
    if (phase == Phase::Up)
    {
        m_document.End();
        m_stroke.End();
        LogLatency();
    }
    Paint();
}

void InkView::Undo()
{
    if (m_document.Undo())
        Redraw();
}

void InkView::Clear()
{
    if (m_document.Clear())
        Redraw();
}

void InkView::Present()
{
    if (!IsShown())
        return;
    MeasureFrame();
    m_session->Present();
}

// ---- what it took -------------------------------------------------------------------------------

void InkView::MeasureFrame()
{
    const Nib::EglTime event = std::exchange(m_event, 0);
    if (event == 0 || m_front)
        return; // nothing new, or nothing that is presented
    Ink::Post(*m_surface->GetMsgQueue(),
              [latency = m_latency, event] { latency->BeginFrame(event); });
}

void InkView::LogLatency()
{
    if (m_front)
        return;
    Ink::Post(
        *m_surface->GetMsgQueue(), [latency = m_latency]
        { __android_log_print(ANDROID_LOG_INFO, "nib_ink", "%s", latency->Summary().c_str()); });
}

// ---- the page -----------------------------------------------------------------------------------

/// Puts onto the page what the stroke has gained.
void InkView::Paint()
{
    Ink::InkPiece piece = m_stroke.Take();
    if (m_session && !m_stopped && !piece.IsEmpty())
        m_session->Draw(std::move(piece));
}

/// Brings a blank page up to the document.
void InkView::Redraw()
{
    if (!m_session || m_stopped)
        return; // Start does it
    m_session->Clear();
    for (const Ink::Stroke& stroke : m_document.Strokes())
    {
        m_stroke = Ink::InkStroke(m_style);
        for (const Ink::Sample& sample : stroke)
            m_stroke.Add(Ink::ToPage(sample, Ink::Placement(), m_style));
        if (!m_document.IsWriting() || &stroke != &m_document.Strokes().back())
            m_stroke.End();
        Paint();
    }
}
