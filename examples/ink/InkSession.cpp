#include "InkSession.h"

#include "InkPainter.h"

#include <nib/trace.h>

#include <algorithm>
#include <exception>
#include <utility>

namespace Ink
{

struct InkSession::GlState
{
    InkPainter painter;
    std::unique_ptr<Page> page;
    std::unique_ptr<PageView> view;
    std::string error;
};

/// Posts @p work with the GL state; an exception in it is kept for Error(), since the render
/// thread does not catch.
template <typename Work>
void InkSession::PostGuarded(Work work)
{
    ++m_tasks;
    Post(*m_thread.GetMsgQueue(),
         [gl = m_gl, work = std::move(work)]
         {
             try
             {
                 if (gl->error.empty())
                     work(*gl);
             }
             catch (const std::exception& failure)
             {
                 gl->error = failure.what();
             }
         });
}

InkSession::InkSession(Nib::RenderThreadGL& thread, int width, int height, const Colour& paper)
    : m_thread(thread), m_width(width), m_height(height), m_paper(paper),
      m_gl(std::make_shared<GlState>())
{
    PostGuarded([width, height, paper](GlState& gl)
                { gl.page = std::make_unique<Page>(width, height, paper); });
    Invalidate();
}

InkSession::~InkSession()
{
    Post(*m_thread.GetMsgQueue(),
         [gl = m_gl]
         {
             gl->view.reset();
             gl->page.reset();
             gl->painter = InkPainter();
             Nib::ResourceChecker::leakCheckLookup(true); // in engineering builds
         });
    m_thread.GetMsgQueue()->waitForCompleting();
}

void InkSession::AttachWindow(void* window)
{
    m_window = window;
    m_thread.OnSurfaceChanged(window, m_width, m_height, 0);
    PostGuarded(
        [width = m_width, height = m_height](GlState& gl)
        { gl.view = std::make_unique<PageView>(width, height, PageView::Surface::Window); });
    Invalidate();
}

void InkSession::DetachWindow()
{
    m_window = nullptr;
    PostGuarded([](GlState& gl) { gl.view.reset(); });
    m_thread.OnSurfaceDestroyed();
}

void InkSession::AttachScreen()
{
    PostGuarded(
        [width = m_width, height = m_height](GlState& gl)
        { gl.view = std::make_unique<PageView>(width, height, PageView::Surface::Screen); });
    Invalidate();
}

void InkSession::Resize(int width, int height)
{
    m_width = width;
    m_height = height;
    PostGuarded(
        [width, height, paper = m_paper](GlState& gl)
        {
            gl.painter = InkPainter(); // its brushes are made for pages of one size
            gl.page = std::make_unique<Page>(width, height, paper);
        });
    if (m_window)
        AttachWindow(m_window);
    Invalidate();
}

void InkSession::Clear()
{
    PostGuarded([](GlState& gl) { gl.page->Clear(); });
    Invalidate();
}

void InkSession::Invalidate()
{
    m_dirty.Set(0.0f, 0.0f, static_cast<float>(m_width), static_cast<float>(m_height));
}

void InkSession::Draw(InkPiece piece)
{
    if (piece.IsEmpty())
        return;
    m_dirty.Union(piece.Bounds());
    PostGuarded(
        [piece = std::move(piece)](GlState& gl)
        {
            const Nib::TraceScope trace("ink", piece.startsStroke ? "begin stroke" : "paint");
            gl.painter.Paint(piece, *gl.page);
        });
}

namespace
{

/// The rectangle as the render thread takes it. Where a part of the buffer is posted its rows count
/// from the bottom, and no render thread says whether it does so: there, what is named is right both
/// ways up.
Nib::RectF PresentedRect(const Nib::RectF& visible, float height)
{
    Nib::RectF named = visible;
    if (Nib::Egl::GetInstance()->IsEglExtensionSupported("EGL_NV_post_sub_buffer"))
        named.Union({visible.left, height - visible.bottom, visible.right, height - visible.top});
    return named;
}

} // namespace

void InkSession::Present()
{
    Nib::RectF visible(0.0f, 0.0f, static_cast<float>(m_width), static_cast<float>(m_height));
    if (m_dirty.IsEmpty() || !visible.Intersect(m_dirty))
        visible.Set(0.0f, 0.0f, 0.0f, 0.0f);
    const Nib::TraceScope whole("ink", "present");
    visible.ExtendRect(); // a fraction of a pixel would not be presented
    m_dirty.Set(0.0f, 0.0f, 0.0f, 0.0f);

    m_thread.ApplyUpdateRect(PresentedRect(visible, static_cast<float>(m_height)), 0);
    PostGuarded(
        [visible](GlState& gl)
        {
            const Nib::TraceScope trace("ink", "view");
            if (gl.view)
                gl.view->Draw(gl.page->Texture(), visible);
        });
    m_thread.Render();
    m_tasks += 2; // the thread's own, before the view and behind it
}

void InkSession::Pause()
{
    PostGuarded(
        [](GlState& gl)
        {
            gl.page->Suspend();
            gl.painter.Suspend();
            if (gl.view)
                gl.view->Suspend();
        });
    m_thread.OnPause(); // behind the task above; the objects let go of their GL names
}

void InkSession::Resume()
{
    m_thread.OnResume(); // the objects get new names, their contents are ours to bring
    PostGuarded(
        [](GlState& gl)
        {
            gl.page->Resume();
            gl.painter.Resume();
            if (gl.view)
                gl.view->Resume();
        });
    Wait(); // OnResume itself does not wait for the context
}

void InkSession::LoseContext()
{
    Pause();
    Resume();
}

std::vector<std::uint8_t> InkSession::ReadPixels()
{
    return ReadBack([](GlState& gl) { return gl.page->ReadPixels(); });
}

std::vector<std::uint8_t> InkSession::ReadScreen()
{
    return ReadBack([](GlState& gl)
                    { return gl.view ? gl.view->ReadScreen() : std::vector<std::uint8_t>(); });
}

std::vector<std::uint8_t> InkSession::ReadBack(std::vector<std::uint8_t> (*read)(GlState&))
{
    auto pixels = std::make_shared<std::vector<std::uint8_t>>();
    PostGuarded([pixels, read](GlState& gl) { *pixels = read(gl); });
    Wait();
    return std::move(*pixels);
}

SessionFigures InkSession::Figures()
{
    Wait();
    return {m_tasks, m_gl->view ? m_gl->view->RedrawnPixels() : 0};
}

void InkSession::Wait()
{
    m_thread.GetMsgQueue()->waitForCompleting();
}

std::string InkSession::Error()
{
    Wait();
    return m_gl->error;
}

} // namespace Ink
