#include "Drawing.h"

#include "FrontBuffer.h"
#include "PageExport.h"
#include "PngFile.h"
#include "Progress.h"
#include "Recordings.h"
#include "RenderThreads.h"
#include "ReplacementFile.h"
#include "Replay.h"
#include "UserError.h"

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <optional>
#include <thread>

namespace
{

/// @p json: nothing, "-" for standard output, or a file's name.
void Report(const Figures& figures, const std::string& json)
{
    if (json != "-")
        std::printf("%s\n", Summary(figures).c_str());
    else
        std::printf("%s\n", ToJson(figures).c_str());
    std::fflush(stdout);
    if (!json.empty() && json != "-")
        WriteTextFile(json, ToJson(figures) + "\n");
}

void WaitUntilClosed(XWindow& window)
{
    while (window.IsOpen())
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
}

} // namespace

Drawing::Drawing(const DrawOptions& options)
    : m_options(options), m_size(ParseSize(options.size)),
      m_speed(ParseSpeed(options.speed.value_or("1"))),
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
    else if (ShowsFrames())
        session.AttachScreen();
    CheckDrawn(session.Error());
    if (pages)
        pages->Start(m_recording, m_placement, m_style, m_size, m_paper);
    Figures figures = Play(session, window);
    CheckDrawn(session.Error());
    if (pages)
        CheckDrawn(pages->Finish());
    if (!m_options.output.empty())
        WritePng(m_options.output, session.ReadPixels(), m_size.width, m_size.height);
    figures.programs = Ink::Program::Counts();
    Report(figures, m_options.json);
    if (window && m_options.keep)
        WaitUntilClosed(*window);
    if (window)
        thread.OnSurfaceDestroyed();
}

/// Draws the recording; frame by frame where there is something to show them on.
Figures Drawing::Play(Ink::InkSession& session, XWindow* window) const
{
    Pace pace;
    pace.loseContextEvery = m_loseContextEvery;
    if (window)
        pace.isWanted = [window] { return window->IsOpen(); };
    if (ShowsFrames())
    {
        pace.speed = m_speed;
        pace.framePerSample = true;
        session.Present(); // the empty page
    }
    const long long before = session.Figures().redrawnPixels;
    Progress progress(SampleCount(m_recording));
    pace.afterSample = [&progress](int samples) { progress.Show(samples); };
    Figures figures = Replay(session, m_recording, m_placement, m_style, pace);
    const Ink::SessionFigures done = session.Figures();
    figures.tasks = done.tasks;
    if (figures.frames > 0)
        figures.redrawn = static_cast<double>(done.redrawnPixels - before) / figures.frames /
                          m_size.width / m_size.height;
    return figures;
}

bool Drawing::ShowsFrames() const
{
    return m_options.window || m_options.speed;
}
