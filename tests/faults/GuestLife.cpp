#include "faults/GuestLife.h"

using namespace Nib;

GuestLife::GuestLife(SimDriver& driver)
    : m_ui(driver, [this](const std::string& text) { Note(text); })
{
}

void GuestLife::Live()
{
    m_ui.Do([this] { m_ui.MakeContext(); });
    m_guest.reset(RendererFactory::CreateHWUIRenderer(m_ui.Callback(), "guest"));
    m_ui.SetGuest(m_guest.get());
    OnThread(*m_guest, [this] { m_things.Make(); });
    DrawAndExport(0.25f);
    DrawInsideAFrame(0.5f);
    PauseAndResume();
    DrawAndExport(0.75f);
    End();
}

void GuestLife::DrawAndExport(float shade)
{
    OnThread(*m_guest,
             [this, shade]
             {
                 Draw(shade);
                 m_things.Export();
             });
}

void GuestLife::Draw(float shade)
{
    const Owned<IRenderTarget> screen(
        RendererFactory::CreateRenderTargetFromDefault(UiThread::kSide, UiThread::kSide));
    m_things.DrawOffscreen(shade);
    m_things.DrawOn(*screen, shade);
}

/// The UI waits for its guest in the middle of a frame: the task runs at once.
void GuestLife::DrawInsideAFrame(float shade)
{
    m_ui.Do(
        [this, shade]
        {
            if (!m_ui.HasContext())
                return; // a UI calls its guest with its context alone
            OnThread(*m_guest, [this, shade] { Draw(shade); });
            m_ui.DrawFrame();
        });
}

void GuestLife::PauseAndResume()
{
    OnThread(*m_guest, [this] { m_things.ReleaseUnmanaged(); });
    m_guest->OnPause();
    m_ui.Do(
        [this]
        {
            m_ui.EndContext();
            m_ui.MakeContext();
        });
    m_guest->OnResume();
    OnThread(*m_guest, [this] { m_things.Refill(); });
}

void GuestLife::End()
{
    EndOnThread(*m_guest, m_things);
    m_ui.Do(
        [this]
        {
            m_things.Release(); // when there was no frame to do it in
            m_guest.reset();
            m_ui.EndContext();
        });
}
