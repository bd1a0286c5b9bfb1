#include "faults/DrawingLife.h"

using namespace Nib;

namespace
{

constexpr int kFrontSide = 30; // of the window with the front buffer

} // namespace

void DrawingLife::Live()
{
    m_surface.reset(RendererFactory::CreateSurfaceRenderer("screen", RenderThreadGL::Medium));
    if (!m_surface->Start())
        Note("not started");
    ShowWindow(40, 60);
    OnThread(*m_surface, [this] { m_onScreen.Make(); });
    DrawFrame(0.25f, RectF{0, 0, 40, 60});
    DrawFrame(0.5f, RectF{10, 10, 20, 30});
    StartChild();
    ExportOnThread(*m_child, m_offScreen, 0.125f);
    PauseAndResumeChild();
    ExportOnThread(*m_child, m_offScreen, 0.375f);
    m_surface->OnSurfaceDestroyed();
    DrawFrame(0.625f, RectF{0, 0, 40, 60}); // nobody sees it
    ShowWindow(60, 40);
    DrawFrame(0.75f, RectF{0, 0, 60, 40});
    DrawFrame(0.875f, RectF{5, 5, 55, 20});
    StartFront();
    DrawInFront(0.1875f);
    DrawInFront(0.3125f);
    End();
}

void DrawingLife::ShowWindow(int width, int height)
{
    m_width = width;
    m_height = height;
    m_surface->OnSurfaceChanged(m_driver.Window(width, height), width, height, 1);
}

void DrawingLife::DrawFrame(float shade, const RectF& changed)
{
    m_surface->ApplyUpdateRect(changed, 0);
    OnThread(*m_surface,
             [this, shade]
             {
                 const Owned<IRenderTarget> screen(
                     RendererFactory::CreateRenderTargetFromDefault(m_width, m_height));
                 m_onScreen.DrawOffscreen(shade);
                 m_onScreen.DrawOn(*screen, shade);
             });
    if (!m_surface->Render())
        Note("not rendered");
}

void DrawingLife::StartChild()
{
    m_child.reset(
        RendererFactory::CreateOffscreenRenderer(m_surface->GetMsgQueue(), "pages", true));
    if (!m_child->Start())
        Note("child not started");
    OnThread(*m_child, [this] { m_offScreen.Make(); });
}

void DrawingLife::PauseAndResumeChild()
{
    OnThread(*m_child, [this] { m_offScreen.ReleaseUnmanaged(); });
    m_child->OnPause();
    m_child->OnResume();
    OnThread(*m_child, [this] { m_offScreen.Refill(); });
}

void DrawingLife::StartFront()
{
    m_front.reset(RendererFactory::CreateFBRSurfaceRenderer(m_surface->GetMsgQueue(), "front"));
    if (!m_front->Start())
        Note("front not started");
    m_front->OnSurfaceChanged(m_driver.Window(kFrontSide, kFrontSide), kFrontSide, kFrontSide, 1);
    OnThread(*m_front, [this] { m_inFront.Make(); });
}

void DrawingLife::DrawInFront(float shade)
{
    OnThread(*m_front,
             [this, shade]
             {
                 const Owned<IRenderTarget> screen(
                     RendererFactory::CreateRenderTargetFromDefault(kFrontSide, kFrontSide));
                 m_inFront.DrawOffscreen(shade);
                 m_inFront.DrawOn(*screen, shade);
             });
    if (!m_front->Render())
        Note("front not rendered");
}

void DrawingLife::End()
{
    EndOnThread(*m_front, m_inFront);
    m_front->OnSurfaceDestroyed();
    m_front.reset();
    EndOnThread(*m_child, m_offScreen);
    m_child.reset();
    EndOnThread(*m_surface, m_onScreen);
    m_surface->OnSurfaceDestroyed();
    m_surface.reset();
}
