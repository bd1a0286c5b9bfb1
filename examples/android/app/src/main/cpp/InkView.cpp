#include "InkView.h"

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
        m_session->DetachWindow();
        m_session->Resize(width, height);
        Redraw();
    }
    Attach();
}

void InkView::SurfaceDestroyed()
{
    if (IsShown())
        m_session->DetachWindow();
    m_window.reset();
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
        m_session->DetachWindow();
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
    if (IsShown())
        m_session->Present();
}

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
