#include "Drawing.h"

#include "FrontBuffer.h"
#include "PageExport.h"
#include "PngFile.h"
#include "Recordings.h"
#include "RenderThreads.h"
#include "UserError.h"

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <optional>
#include <thread>

namespace
{

void Print(const Figures& figures)
{
    std::printf("%d strokes, %d samples, %d frames\n", figures.strokes, figures.samples,
                figures.frames);
    std::fflush(stdout);
}

void WaitUntilClosed(XWindow& window)
{
    while (window.IsOpen())
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
}

} // namespace

Drawing::Drawing(const DrawOptions& options)
    : m_options(options), m_size(ParseSize(options.size)), m_speed(ParseSpeed(options.speed)),
      m_loseContextEvery(ParseLoseContext(options.loseContext)), m_style(StyleOf(options)),
      m_paper(ParseColourOption("--paper", options.paper)),
      m_recording(ReadRecordings(options.files))
{
    if (options.scale == "fit")
        m_placement = Ink::FitToPage(m_recording, m_size.width, m_size.height);
}

void Drawing::Run()
{
    std::unique_ptr<XWindow> window;
    if (m_options.window)
        window = std::make_unique<XWindow>("nib draw", m_size.width, m_size.height);
    else
        setenv("EGL_PLATFORM", "surfaceless", 0); // no display server is needed
    CheckEgl();

    const std::unique_ptr<Nib::RenderThreadGL> parent = StartSurfaceThread();
    std::unique_ptr<Nib::RenderThreadGL> child; // ended before its parent
    if (m_loseContextEvery != 0)
        child.reset(
            Nib::RendererFactory::CreateOffscreenRenderer(parent->GetMsgQueue(), "nib page", true));
    else if (m_options.frontBuffer)
        child = FrontBufferThread(*parent);
    if (child && !child->Start())
        throw UserError("the render thread does not start");
    DrawOn(child ? *child : *parent, *parent, window.get());
}

void Drawing::DrawOn(Nib::RenderThreadGL& thread, Nib::RenderThreadGL& parent,
                     XWindow* window) const
{
    std::optional<PageExport> pages; // ends behind the session: its thread is a child, too
    if (m_options.exportedPages != 0)
        pages.emplace(parent, m_options.output, m_options.exportedPages);

    Ink::InkSession session(thread, m_size.width, m_size.height, m_paper);
    if (window)
        session.AttachWindow(window->NativeWindow());
    CheckDrawn(session.Error());
    if (pages)
        pages->Start(m_recording, m_placement, m_style, m_size, m_paper);
    const Figures figures = Play(session, window);
    CheckDrawn(session.Error());
    if (pages)
        CheckDrawn(pages->Finish());
    if (!m_options.output.empty())
        WritePng(m_options.output, session.ReadPixels(), m_size.width, m_size.height);
    Print(figures);
    if (window && m_options.keep)
        WaitUntilClosed(*window);
    if (window)
        thread.OnSurfaceDestroyed();
}

Figures Drawing::Play(Ink::InkSession& session, XWindow* window) const
{
    Pace pace;
    if (window)
    {
        session.Present(); // the empty page
        pace.speed = m_speed;
        pace.framePerSample = true;
        pace.isWanted = [window] { return window->IsOpen(); };
    }
    if (m_loseContextEvery != 0)
        pace.afterSample = [&session, every = m_loseContextEvery](int samples)
        {
            if (samples % every == 0)
                session.LoseContext();
        };
    return Replay(session, m_recording, m_placement, m_style, pace);
}
